"""Noise of a chosen size, and small helper functions for drawing the pictures.

A field is a list of rows of numbers. All noise wraps vertically and horizontally, so anything built from it tiles
vertically without a seam, and no column is special.
"""

import math
import random


def field(width, height, value):
    return [[value(x, y) for x in range(width)] for y in range(height)]


def smoothstep(low, high, v):
    t = min(1.0, max(0.0, (v - low) / (high - low)))
    return t * t * (3.0 - 2.0 * t)


def transposed(values):
    return [list(column) for column in zip(*values)]


def blurred_along(values, sigma):
    """Each row blurred by a Gaussian of deviation `sigma` pixels."""
    reach = max(1, math.ceil(3 * sigma))
    weights = [math.exp(-0.5 * (i / sigma)**2) for i in range(-reach, reach + 1)]
    total = sum(weights)
    taps = [(i - reach, weight / total) for i, weight in enumerate(weights)]
    width = len(values[0])
    return [[sum(row[(x + i) % width] * weight for i, weight in taps) for x in range(width)] for row in values]


def standardised(values):
    """Of mean 0 and deviation 1."""
    count = len(values) * len(values[0])
    mean = sum(map(sum, values)) / count
    deviation = math.sqrt(sum((v - mean)**2 for row in values for v in row) / count)
    return [[(v - mean) / deviation for v in row] for row in values]


def noise(seed, width, height, across, along=None):
    """Gaussian noise whose clumps have a deviation of `across` pixels in width and `along` in height (else the same).

    0 gives white noise in that direction.
    """
    source = random.Random(seed)
    values = [[source.gauss(0.0, 1.0) for _ in range(width)] for _ in range(height)]
    along = across if along is None else along
    if across:
        values = blurred_along(values, across)
    if along:
        values = transposed(blurred_along(transposed(values), along))
    return standardised(values)


def mixed(*layers):
    """The sum of (weight, field) pairs, of deviation 1."""
    weights = [weight for weight, _ in layers]
    rows = zip(*(values for _, values in layers))
    return standardised([[sum(w * v for w, v in zip(weights, place)) for place in zip(*row)] for row in rows])


def faded_to_sides(values, margin):
    """Fades in from 0 at the left and right edge over `margin` pixels.

    Adjacent strips are unrelated. If a layer of large clumps ended abruptly there, the seam would show as a line; fine
    grain hides its own seam.
    """
    width = len(values[0])
    rise = [smoothstep(0.0, margin, min(x, width - 1 - x) + 0.5) for x in range(width)]
    return [[v * share for v, share in zip(row, rise)] for row in values]


def evened(values, radius):
    """Subtracts the local mean: a place that stands out would show when the strips repeat it."""
    height, width = len(values), len(values[0])
    side = range(-radius, radius + 1)
    across = [[sum(row[(x + i) % width] for i in side) for x in range(width)] for row in values]
    count = len(side)**2
    return field(width, height, lambda x, y:
                 values[y][x] - sum(across[(y + j) % height][x] for j in side) / count)
