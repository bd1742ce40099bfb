"""The seven wear pictures: 0 where the film is intact, 1 where it is worn down to the base.

Each function gives one picture as a field of 0..1 that tiles by height. They hold little: about nine tenths
of the film is intact, else wear would read as fog.
"""

import math
import random

from .noise import (blurred, clouds, evened, field, highlights, lattice, multiplied, octaves, smoothstep,
                    strip_ends, warped, white)


def wavy(width, height):
    """Long soft streaks that sway together along the film, each coming and going slowly."""
    broad = lattice(11, width, height, width / 7, 3)
    narrow = octaves(12, width, height, width / 14, 5, 2, 0.6)
    presence = octaves(13, width, height, width / 4, 5, 2)
    ends = strip_ends(14, width, height, 3)

    def streak(x, y):
        turn = 2 * math.pi * y / height
        bent = x + 0.06 * width * math.sin(2 * turn) + 0.035 * width * math.sin(5 * turn + 1)
        return 0.35 * broad(bent, y) + 0.65 * narrow(bent, y) - 0.25 * ends[y][x]

    shown = field(width, height, lambda x, y: smoothstep(0.15, 0.6, presence(x, y)))
    return multiplied(highlights(evened(field(width, height, streak), 10), 0.70, 0.97), shown)


def blotchy(width, height):
    """Soft stains of a dozen pixels, many of them hardly begun, none with an edge.

    Evened, so that no large stain tells that the strips repeat.
    """
    large, small, mottle = (clouds(21 + i, width, height, size) for i, size in enumerate((13, 6, 2)))
    ends = strip_ends(25, width, height, 4)
    ground = evened(field(width, height, lambda x, y:
                          large[y][x] + 0.6 * small[y][x] + 0.25 * mottle[y][x]), 11)
    stains = highlights(field(width, height, lambda x, y: ground[y][x] - 0.8 * ends[y][x]), 0.52, 1.0)
    return blurred(multiplied(stains, field(width, height, lambda x, y: 1 - 0.8 * ends[y][x])))


def grainy(width, height):
    """Clumps of grain rubbed open, denser in some places."""
    clumps = lattice(32, width, height, 16, height // 16)
    density = field(width, height, lambda x, y: smoothstep(0.1, 0.7, clumps(x, y)))
    return multiplied(highlights(blurred(white(31, width, height)), 0.81, 0.975), density)


def fine(width, height):
    """Pin holes and short rubs along the film's run."""
    source = random.Random(41)
    area = width * height
    worn = [[0.0] * width for _ in range(height)]
    for _ in range(int(area * 0.028)):
        worn[source.randrange(height)][source.randrange(width)] = 1.0
    for _ in range(int(area * 0.025 / 5)):
        x, y = source.randrange(width), source.randrange(height)
        for run in range(5):
            row = worn[(y + run) % height]
            row[x] = max(row[x], 0.8)
    patches = lattice(42, width, height, 18, height // 20)
    return multiplied(worn, field(width, height, lambda x, y: smoothstep(0.05, 0.65, patches(x, y))))


def cell_border(points, width, height):
    """The distance from (x, y) to the nearest border between the cells of the points, around the edges."""
    def offset(a, b, size):
        return (b - a + size / 2) % size - size / 2

    def at(x, y):
        reach = sorted((math.hypot(dx, dy), dx, dy) for dx, dy in
                       ((offset(x, px, width), offset(y, py, height)) for px, py in points))
        (first, ax, ay), (second, bx, by) = reach[:2]
        return (second**2 - first**2) / (2 * math.hypot(ax - bx, ay - by))

    return at


def scattered(seed, width, height, columns, rows):
    """One point at a random place in each cell of a grid."""
    source = random.Random(seed)
    return [((i + source.random()) * width / columns, (j + source.random()) * height / rows)
            for j in range(rows) for i in range(columns)]


def splotchy(width, height):
    """Large stains drawn out along the film, with lobed borders and mottled inside."""
    source = random.Random(57)
    stains = []
    for i, radius in enumerate((7.5, 2.5, 5.0, 8.5, 3.0, 6.0)):
        inside = min(radius, width / 2 - 2)
        y = (i + source.uniform(0.0, 1.0)) * height / 6
        stains.append((source.uniform(inside, width - inside), y, radius, source.uniform(0.6, 1.0)))
    lobes, flakes, mottle = (clouds(52 + i, width, height, size) for i, size in enumerate((7, 3, 0)))
    ends = strip_ends(55, width, height, 2.5)

    def worn(x, y):
        border = 0.30 * lobes[y][x] + 0.16 * flakes[y][x] + 0.05 * mottle[y][x]
        most = 0.0
        for px, py, radius, strength in stains:
            down = abs(y - py) % height
            away = math.hypot(x - px, min(down, height - down) / 2) / radius
            most = max(most, strength * smoothstep(0.1, 0.7, 1 - away + border))
        return most * (0.75 + 0.25 * smoothstep(-1.5, 1.5, mottle[y][x])) * (1 - ends[y][x])

    return field(width, height, worn)


def lite(width, height):
    """A few faint pin holes."""
    source = random.Random(61)
    worn = [[0.0] * width for _ in range(height)]
    for _ in range(int(width * height * 0.012)):
        worn[source.randrange(height)][source.randrange(width)] = source.uniform(0.25, 0.6)
    return worn


def crackly(width, height):
    """A net of cracks in the emulsion, about half of it open."""
    points = scattered(71, width, height, round(width / 13), round(height / 13))
    border = warped(72, cell_border(points, width, height), width, height, 6, 3)
    patches = octaves(74, width, height, 16, height // 16, 2)
    ends = strip_ends(75, width, height, 2)
    opening = evened(field(width, height, patches), 14)

    def crack(x, y):
        opened = smoothstep(-0.08, 0.06, opening[y][x]) * (1 - 0.5 * ends[y][x])
        return opened * (1 - smoothstep(0.1, 0.4 + 0.6 * opened, border(x, y)))

    return field(width, height, crack)


# Menu value, width, height, drawing function.
PICTURES = [
    (2000, 50, 300, wavy),
    (2001, 50, 300, blotchy),
    (2002, 50, 300, grainy),
    (2003, 50, 300, fine),
    (2004, 25, 150, splotchy),
    (2005, 64, 64, lite),
    (2006, 64, 64, crackly),
]


def drawn_wear():
    """Yields (file name, width, height, bytes) of every wear picture."""
    for value, width, height, draw in PICTURES:
        rows = draw(width, height)
        yield f"wear-{value}.pgm", width, height, bytes(round(255 * v) for row in rows for v in row)
