"""Smooth noise and the small helpers that the pictures are drawn with.

A field is a list of rows of numbers, about 0..1. Every lattice closes on itself by height, so whatever is
built from these functions tiles by height without a seam.
"""

import math
import random


def field(width, height, value):
    return [[value(x, y) for x in range(width)] for y in range(height)]


def smoothstep(low, high, v):
    t = min(1.0, max(0.0, (v - low) / (high - low)))
    return t * t * (3.0 - 2.0 * t)


def lattice(seed, width, height, cell_width, cells_high):
    """Smooth noise, a function (x, y): cells `cell_width` pixels wide, `cells_high` of them in the height."""
    source = random.Random(seed)
    columns = math.ceil(width / cell_width) + 2
    knots = [[source.random() for _ in range(columns)] for _ in range(cells_high)]

    def at(x, y):
        u, v = x / cell_width, y * cells_high / height
        column, row = math.floor(u), math.floor(v)
        s, t = smoothstep(0, 1, u - column), smoothstep(0, 1, v - row)
        left, right = column % columns, (column + 1) % columns
        upper, lower = knots[row % cells_high], knots[(row + 1) % cells_high]
        top = upper[left] + s * (upper[right] - upper[left])
        bottom = lower[left] + s * (lower[right] - lower[left])
        return top + t * (bottom - top)

    return at


def octaves(seed, width, height, cell_width, cells_high, count, gain=0.5):
    """Sum of `count` lattices, each half as coarse and `gain` times as strong as the last, about 0..1."""
    layers = [(lattice(seed * 101 + i, width, height, cell_width / 2**i, cells_high * 2**i), gain**i)
              for i in range(count)]
    total = sum(weight for _, weight in layers)
    return lambda x, y: sum(weight * at(x, y) for at, weight in layers) / total


def warped(seed, at, width, height, cell, reach):
    """The noise `at`, its points moved by up to `reach` pixels; hides the lattice's squares."""
    move_x = octaves(seed, width, height, cell, round(height / cell), 2)
    move_y = octaves(seed + 1, width, height, cell, round(height / cell), 2)
    return lambda x, y: at(x + reach * (2 * move_x(x, y) - 1), y + reach * (2 * move_y(x, y) - 1))


def white(seed, width, height):
    source = random.Random(seed)
    return [[source.random() for _ in range(width)] for _ in range(height)]


def blurred(values):
    """1-2-1 in both directions; wraps by height, and by width since every strip meets another one there."""
    height, width = len(values), len(values[0])

    def sum121(x, y):
        row = values[y % height]
        return row[x - 1] + 2 * row[x] + row[(x + 1) % width]

    return field(width, height, lambda x, y: (sum121(x, y - 1) + 2 * sum121(x, y) + sum121(x, y + 1)) / 16)


def clouds(seed, width, height, size):
    """Noise whose hills are about `size` pixels wide and round (a lattice's are square), of deviation 1."""
    values = white(seed, width, height)
    for _ in range(round(size * size / 4)):
        values = blurred(values)
    mean = sum(map(sum, values)) / (width * height)
    deviation = math.sqrt(sum((v - mean)**2 for row in values for v in row) / (width * height))
    return [[(v - mean) / deviation for v in row] for row in values]


def evened(values, radius):
    """Less the mean of the surroundings: no place stands out, which would show when the strips repeat it."""
    height, width = len(values), len(values[0])
    side = range(-radius, radius + 1)
    across = [[sum(row[(x + i) % width] for i in side) for x in range(width)] for row in values]
    count = len(side)**2
    return field(width, height, lambda x, y:
                 values[y][x] - sum(across[(y + j) % height][x] for j in side) / count)


def highlights(values, low, high):
    """Keeps the brightest part: 0 below the quantile `low`, 1 above the quantile `high`, soft between."""
    ordered = sorted(v for row in values for v in row)
    bottom, top = (ordered[int(q * (len(ordered) - 1))] for q in (low, high))
    return [[smoothstep(bottom, top, v) for v in row] for row in values]


def multiplied(a, b):
    return [[p * q for p, q in zip(row, other)] for row, other in zip(a, b)]


def strip_ends(seed, width, height, margin):
    """1 at the left and right edge, 0 from about `margin` pixels inside, along a ragged line.

    Neighbouring strips never match, so what is worn must end before the edge as if by itself; a straight
    margin would show as a line of its own.
    """
    ragged = octaves(seed, 2, height, 1, height // 6, 2)

    def at(x, y):
        side = 0 if 2 * x < width else 1
        inside = min(x, width - 1 - x)
        return 1.0 - smoothstep(0.0, margin * (0.4 + 1.2 * ragged(side, y)), inside + 0.5)

    return field(width, height, at)
