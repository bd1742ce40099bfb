"""The seven wear pictures: 0 where the film is intact, 1 where it is worn down to the base.

A picture appears about 140 times in a large frame, and each strip of it starts at a different row in every frame. A
texture without distinct features therefore looks like live grain; any distinct feature becomes a wallpaper pattern. So
every picture is almost Gaussian grain, and its character lies in the grain's size, strength and density.

Wear lightens dark areas most, so means are low and upper tails short, or deep black would turn to fog.
"""

import math
import random

from .noise import evened, faded_to_sides, field, mixed, noise, smoothstep, standardised


def toned(grain, mean, deviation, most=2.6, skew=0.06):
    """Grain of deviation 1 turned into wear of approximately this mean and deviation.

    The upper tail is a little heavier than a Gaussian's and ends softly at `most` deviations.
    """
    def value(v):
        v += skew * (v * v - 1.0)
        if v > most - 0.6:
            v = most - 0.36 / (v - most + 1.2)
        return min(1.0, max(0.0, mean + deviation * v))

    return [[value(v) for v in row] for row in grain]


def with_density(grain, density, strength):
    """Grain that is stronger where `density` (of deviation 1) is high, by `strength` per deviation."""
    return [[g * max(0.2, 1.0 + strength * d) for g, d in zip(row, densities)]
            for row, densities in zip(grain, density)]


def wavy(width, height):
    """Fine grain that thickens along long soft streaks, which sway together along the film; half of them are absent."""
    grain = mixed((1.0, noise(11, width, height, 0.55)), (0.35, noise(12, width, height, 0.9)))
    streaks = noise(13, width, height, 1.7, 30.0)

    def swaying(x, y):
        turn = 2 * math.pi * y / height
        shift = 3.2 * math.sin(3 * turn) + 1.6 * math.sin(7 * turn + 1)
        left = math.floor(x + shift)
        part = x + shift - left
        return streaks[y][left % width] * (1 - part) + streaks[y][(left + 1) % width] * part

    shown = evened(field(width, height, lambda x, y: smoothstep(-0.2, 2.2, swaying(x, y))), 9)
    density = faded_to_sides(standardised(shown), 5)
    return toned(mixed((1.0, with_density(grain, density, 0.22)), (0.24, density)), 0.145, 0.085)


def blotchy(width, height):
    """Grain of soft clumps over a coarser one, gently mottled."""
    # Three sizes: clumps of one size run together into worms.
    grain = mixed((0.55, noise(24, width, height, 0.45)), (1.0, noise(21, width, height, 0.70)),
                  (0.5, faded_to_sides(noise(22, width, height, 1.3), 3)))
    mottle = faded_to_sides(evened(noise(23, width, height, 3.0), 9), 6)
    return toned(mixed((1.0, with_density(grain, mottle, 0.16)), (0.15, mottle)), 0.205, 0.122)


def grainy(width, height):
    """Strong, crisp grain."""
    grain = mixed((1.0, noise(31, width, height, 0.52)), (0.22, noise(32, width, height, 0.95)))
    return toned(grain, 0.22, 0.145)


def fine(width, height):
    """The finest grain, with a few faint hair-thin rubs along the film's direction of travel."""
    source = random.Random(42)
    rubs = [[0.0] * width for _ in range(height)]
    for _ in range(26):
        x, y, run = source.randrange(2, width - 2), source.randrange(height), source.randrange(10, 60)
        strength = source.uniform(0.3, 0.8)
        for i in range(run):
            rubs[(y + i) % height][x] += strength * smoothstep(0, 6, i + 0.5) * smoothstep(0, 6, run - i - 0.5)
    grain = noise(41, width, height, 0.40)
    return toned([[g + r for g, r in zip(*rows)] for rows in zip(grain, rubs)], 0.145, 0.086)


def splotchy(width, height):
    """Grain on a mottle as strong as possible without a visible repeat."""
    grain = mixed((1.0, noise(51, width, height, 0.62)), (0.4, faded_to_sides(noise(52, width, height, 1.1), 3)))
    mottle = faded_to_sides(evened(noise(53, width, height, 2.2), 7), 4)
    return toned(mixed((1.0, with_density(grain, mottle, 0.30)), (0.50, mottle)), 0.175, 0.096)


def lite(width, height):
    """Very light grain."""
    return toned(mixed((1.0, noise(61, width, height, 0.50)), (0.25, noise(62, width, height, 0.9))), 0.07, 0.044)


def sheared(values, slope):
    """Each column moved down by `slope` pixels more than the one before; a square picture still wraps."""
    height, width = len(values), len(values[0])
    return field(width, height, lambda x, y: values[(y + slope * x) % height][x])


def crackly(width, height):
    """Crisp grain broken by short cracks in all directions, finer than the grain."""
    grain = mixed((1.0, noise(71, width, height, 0.45)), (0.4, noise(72, width, height, 0.9)))
    long = [sheared(noise(73 + i, width, height, *size), slope) for i, (size, slope) in enumerate((
        ((1.3, 0.30), 1), ((1.3, 0.30), -1), ((0.9, 0.30), 2), ((0.9, 0.30), -2), ((1.5, 0.34), 0), ((0.34, 1.5), 0)))]
    cracks = standardised(field(width, height, lambda x, y: max(0.0, max(way[y][x] for way in long) - 1.2)**1.3))
    return toned(mixed((1.0, grain), (0.75, cracks)), 0.165, 0.102, most=3.2)


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
