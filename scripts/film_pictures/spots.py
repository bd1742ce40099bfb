"""The eleven spots: dust, hairs, specks and drops on a background of the picture's key.

A spot is a list of shapes. A shape tells how much of it covers a point (0..1, soft over one pixel); what
it covers goes from the key towards `target`: 0 for dirt on the print, 255 for dust that lay on the
negative. Points are in pixels, the middle of the top-left pixel at (0.5, 0.5). Shapes stay a pixel away
from the border, which keeps the key, so that no rectangle shows.
"""

import math
import random

SUBSAMPLES = 8


def blob(x, y, radius_x, radius_y, turn=0.0, target=0, strength=1.0, seed=0):
    """An ellipse whose outline wanders by 15 %, turned by `turn` degrees."""
    source = random.Random(seed)
    waves = [(n, source.uniform(-0.15, 0.15) / math.sqrt(n), source.uniform(0, 2 * math.pi))
             for n in (2, 3, 5)]
    c, s = math.cos(math.radians(turn)), math.sin(math.radians(turn))

    def covers(px, py):
        u = ((px - x) * c + (py - y) * s) / radius_x
        v = ((py - y) * c - (px - x) * s) / radius_y
        outline = 1 + sum(a * math.cos(n * math.atan2(v, u) + phase) for n, a, phase in waves)
        outside = (math.hypot(u, v) - outline) * min(radius_x, radius_y)
        return min(1.0, max(0.0, 0.5 - outside)) * strength

    return covers, target


def hair(points, thickness=1.2, target=0, strength=1.0):
    """A fibre along the cubic curve of four points, thinner towards its ends."""
    steps = 48
    curve = []
    for i in range(steps + 1):
        t = i / steps
        weights = ((1 - t)**3, 3 * t * (1 - t)**2, 3 * t * t * (1 - t), t**3)
        place = [sum(w * p[axis] for w, p in zip(weights, points)) for axis in (0, 1)]
        curve.append((*place, thickness / 2 * (0.55 + 0.45 * math.sin(math.pi * t))))

    def covers(px, py):
        inside = max(half - math.hypot(px - cx, py - cy) for cx, cy, half in curve)
        return min(1.0, max(0.0, 0.5 + inside)) * strength

    return covers, target


# Width, height, key, shapes.
SPOTS = [
    # dust grain
    (9, 13, 93, [blob(4.4, 5.6, 2.3, 3.2, 15, seed=1), blob(5.2, 8.8, 1.5, 2.0, -20, seed=2)]),
    # long hair
    (9, 18, 93, [hair([(2.2, 2.2), (8.8, 5.0), (0.6, 11.5), (6.4, 15.8)])]),
    # clump of dust with a grain beside it
    (11, 13, 102, [blob(4.4, 5.2, 2.2, 2.9, 30, seed=3), blob(6.8, 7.4, 1.9, 1.6, 0, seed=4),
                   blob(3.6, 10.4, 0.9, 0.8, 0, strength=0.8, seed=5)]),
    # bright grain
    (9, 11, 94, [blob(4.3, 4.8, 2.1, 2.6, -25, 255, seed=6), blob(5.5, 7.6, 1.3, 1.2, 0, 255, 0.8, seed=7)]),
    # speck
    (8, 7, 103, [blob(3.9, 3.5, 1.9, 1.4, -12, seed=8)]),
    # splinter
    (5, 10, 110, [hair([(2.1, 1.9), (3.1, 4.0), (2.0, 6.0), (2.9, 8.1)], 1.3)]),
    # hooked fibre with a crumb of dust on it
    (13, 14, 95, [hair([(2.2, 11.6), (2.6, 5.0), (5.0, 0.6), (8.4, 2.6)]),
                  hair([(8.4, 2.6), (11.6, 4.6), (11.4, 7.4), (9.2, 8.0)], 1.1, strength=0.9),
                  blob(4.0, 6.8, 1.1, 1.4, 30, seed=13)]),
    # bright sliver
    (6, 9, 90, [blob(3.0, 4.5, 1.1, 2.7, 12, 255, 0.9, seed=9)]),
    # short bent hair
    (8, 12, 111, [hair([(5.8, 2.0), (1.0, 3.6), (2.0, 8.0), (5.0, 10.0)], 1.3)]),
    # two specks
    (7, 8, 110, [blob(2.7, 2.9, 1.2, 1.1, 0, seed=10), blob(4.4, 5.3, 0.9, 1.0, 0, strength=0.85, seed=11)]),
    # dried drop: a thin rim, darker on one side, around a faintly cleaned middle
    (13, 11, 118, [blob(6.4, 5.6, 4.0, 3.2, 20, 0, 0.75, seed=14),
                   blob(7.1, 5.2, 3.0, 2.3, 15, 150, 0.9, seed=15)]),
]


def pixel(x, y, width, height, key, shapes):
    """One byte: each shape in turn lays its target over what is below, averaged over the pixel's area."""
    if x in (0, width - 1) or y in (0, height - 1):
        return key
    total = 0.0
    for j in range(SUBSAMPLES):
        for i in range(SUBSAMPLES):
            value = key
            for covers, target in shapes:
                value += (target - value) * covers(x + (i + 0.5) / SUBSAMPLES, y + (j + 0.5) / SUBSAMPLES)
            total += value
    return round(total / SUBSAMPLES**2)


def drawn_spots():
    """Yields (file name, width, height, bytes) of every spot."""
    for index, (width, height, key, shapes) in enumerate(SPOTS):
        pixels = bytes(pixel(x, y, width, height, key, shapes) for y in range(height) for x in range(width))
        yield f"spot-{index}.pgm", width, height, pixels
