"""The seven wear pictures: 0 where the film is intact, 1 where it is worn down to the base.

Each function gives one picture as a field of 0..1 that tiles by height. They hold little: about nine tenths
of the film is intact, else wear would read as fog.
"""

import math
import random

from .noise import (blurred, field, highlights, lattice, multiplied, octaves, smoothstep, strip_ends, warped,
                    white)


def wavy(width, height):
    """Long soft streaks that sway together along the film, each coming and going slowly."""
    broad = lattice(11, width, height, width / 7, 3)
    narrow = octaves(12, width, height, width / 15, 6, 2)
    presence = lattice(13, width, height, width / 3, 5)
    ends = strip_ends(14, width, height, 4)

    def streak(x, y):
        turn = 2 * math.pi * y / height
        bent = x + 0.07 * width * math.sin(2 * turn) + 0.04 * width * math.sin(5 * turn + 1)
        return 0.5 * broad(bent, y) + 0.5 * narrow(bent, y) - 0.3 * ends[y][x]

    shown = field(width, height, lambda x, y: smoothstep(0.1, 0.5, presence(x, y)))
    return multiplied(highlights(field(width, height, streak), 0.74, 0.95), shown)


def blotchy(width, height):
    """Soft stains of a dozen pixels with uneven borders."""
    stain = warped(21, octaves(23, width, height, 12, height // 14, 4, 0.6), width, height, 10, 6)
    ends = strip_ends(24, width, height, 5)
    return highlights(field(width, height, lambda x, y: stain(x, y) - 0.15 * ends[y][x]), 0.76, 0.98)


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


def nearest_two(points, width, height):
    """A function (x, y) of the distances to the two nearest points, counted around by height and width."""
    def at(x, y):
        first = second = math.inf
        for px, py in points:
            dx, dy = abs(x - px) % width, abs(y - py) % height
            distance = math.hypot(min(dx, width - dx), min(dy, height - dy))
            if distance < first:
                first, second = distance, first
            elif distance < second:
                second = distance
        return first, second
    return at


def scattered(seed, width, height, columns, rows):
    """One point at a random place in each cell of a grid."""
    source = random.Random(seed)
    return [((i + source.random()) * width / columns, (j + source.random()) * height / rows)
            for j in range(rows) for i in range(columns)]


def splotchy(width, height):
    """Large stains, worn through in flecks and crumbling at their borders."""
    near = nearest_two(scattered(51, width, height, 1, height // 22), width, height)
    closeness = warped(52, lambda x, y: 1 - near(x, y)[0] / 16, width, height, 9, 8)
    flecks = octaves(54, width, height, 5, height // 5, 2, 0.8)
    patches = lattice(55, width, height, 25, height // 40)
    ends = strip_ends(56, width, height, 3)

    def stain(x, y):
        return 0.3 * closeness(x, y) + 0.25 * patches(x, y) + 0.6 * flecks(x, y) - 0.15 * ends[y][x]

    return highlights(field(width, height, stain), 0.83, 0.975)


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
    gap = warped(72, lambda x, y, near=nearest_two(points, width, height): near(x, y)[1] - near(x, y)[0],
                 width, height, 7, 4)
    patches = octaves(74, width, height, 13, height // 13, 3, 0.6)
    ends = strip_ends(75, width, height, 3)

    def crack(x, y):
        opened = smoothstep(0.42, 0.62, patches(x, y)) * (1 - 0.6 * ends[y][x])
        return opened * (1 - smoothstep(0.2, 0.6 + 1.6 * opened, gap(x, y)))

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
