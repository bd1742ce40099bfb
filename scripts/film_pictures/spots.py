"""The eleven spots: specks, flakes and one hair on a background of the picture's key.

Most dust is a speck of one to four pixels; flakes are rare and hairs rarer. The renderer shows each picture in six
orientations, so none may look like a letter, a hook or a comma in any of them: specks have no tails, flakes are ragged
all round, the hair is nearly straight. They differ in size, softness and contrast, since identical marks are noticed
at once.

A spot is a list of shapes. A shape covers a point by 0..1 and draws it from the key towards `target`: 0 for dirt
on the print, 255 for dust on the negative. Points are in pixels; the centre of the top-left pixel is (0.5, 0.5). Every
shape fades out a pixel before the border, which keeps the key, so that no rectangle shows.
"""

import math
import random

from .noise import smoothstep

SUBSAMPLES = 8
DIRT, CLEAR = 0, 255


def outline(source, raggedness):
    """The radius by direction, around 1: slow waves make the outline lopsided, fast ones make it ragged."""
    waves = [(n, source.uniform(-1.0, 1.0) * raggedness / n**0.6, source.uniform(0, 2 * math.pi))
             for n in (2, 3, 4, 5, 7, 9)]
    return lambda angle: max(0.3, 1 + sum(a * math.cos(n * angle + phase) for n, a, phase in waves))


def speck(x, y, radius_x, radius_y, target, strength=1.0, turn=0.0, soft=1.0, ragged=0.16, seed=0):
    """A compact particle whose edge is soft over `soft` pixels."""
    edge = outline(random.Random(seed), ragged)
    c, s = math.cos(math.radians(turn)), math.sin(math.radians(turn))

    def covers(px, py):
        u = ((px - x) * c + (py - y) * s) / radius_x
        v = ((py - y) * c - (px - x) * s) / radius_y
        outside = (math.hypot(u, v) - edge(math.atan2(v, u))) * min(radius_x, radius_y)
        return strength * smoothstep(soft / 2, -soft / 2, outside)

    return covers, target


def flake(x, y, radius_x, radius_y, target, strength=1.0, turn=0.0, soft=0.9, ragged=0.26, seed=0):
    """A larger piece, ragged all round and uneven in density."""
    covers, _ = speck(x, y, radius_x, radius_y, target, strength, turn, soft, ragged, seed)
    source = random.Random(seed + 1000)
    bumps = [(x + source.uniform(-radius_x, radius_x), y + source.uniform(-radius_y, radius_y),
              source.uniform(0.8, 1.5), source.uniform(0.1, 0.4)) for _ in range(4)]

    def uneven(px, py):
        thin = sum(depth * math.exp(-((px - bx)**2 + (py - by)**2) / (2 * size * size))
                   for bx, by, size, depth in bumps)
        return covers(px, py) * max(0.25, 1.0 - thin)

    return uneven, target


def hair(points, thickness, target, strength=1.0):
    """A fibre along the cubic curve of four control points, thin and faint towards its ends."""
    steps = 64
    curve = []
    for i in range(steps + 1):
        t = i / steps
        weights = ((1 - t)**3, 3 * t * (1 - t)**2, 3 * t * t * (1 - t), t**3)
        place = [sum(w * p[axis] for w, p in zip(weights, points)) for axis in (0, 1)]
        fullness = math.sin(math.pi * (0.08 + 0.84 * t))**0.7
        curve.append((*place, thickness / 2 * fullness, fullness))

    def covers(px, py):
        return strength * max(full * smoothstep(0.5, -0.5, math.hypot(px - cx, py - cy) - half)
                              for cx, cy, half, full in curve)

    return covers, target


# Width, height, key, shapes.
SPOTS = [
    # a dark speck, nearly opaque
    (9, 13, 93, [speck(4.2, 6.3, 2.1, 1.6, DIRT, 0.95, 25, seed=3)]),
    # the hair
    (9, 18, 93, [hair([(2.6, 2.0), (4.3, 6.5), (3.6, 11.0), (6.2, 15.8)], 0.75, DIRT, 0.72)]),
    # a ragged flake
    (11, 13, 102, [flake(5.4, 6.4, 2.6, 2.2, DIRT, 0.9, 35, ragged=0.22, seed=22)]),
    # a bright speck
    (9, 11, 94, [speck(4.6, 5.2, 1.6, 1.2, CLEAR, 0.95, -30, 0.9, seed=5)]),
    # a grain of dust
    (8, 7, 103, [speck(3.9, 3.4, 1.25, 0.95, DIRT, 0.9, 10, 0.8, seed=6)]),
    # a faint speck out of focus
    (5, 10, 110, [speck(2.5, 5.1, 1.1, 1.6, DIRT, 0.6, 0, 1.4, 0.12, seed=7)]),
    # the largest flake, torn and thin
    (13, 14, 95, [flake(6.3, 7.1, 3.5, 2.9, DIRT, 0.78, -50, 1.1, seed=31)]),
    # a pin hole
    (6, 9, 90, [speck(3.1, 4.4, 1.0, 0.85, CLEAR, 0.9, 0, 0.9, seed=9)]),
    # two grains that touch, one much smaller
    (8, 12, 111, [speck(3.7, 5.6, 1.5, 1.2, DIRT, 0.85, 60, 0.9, seed=10),
                  speck(5.3, 7.1, 0.7, 0.6, DIRT, 0.6, 0, 0.9, seed=11)]),
    # a faint speck
    (7, 8, 110, [speck(3.4, 3.9, 1.6, 1.3, DIRT, 0.5, -20, 1.2, seed=12)]),
    # a bright flake, half transparent
    (13, 11, 118, [flake(6.2, 5.3, 2.5, 1.9, CLEAR, 0.62, 15, 1.0, seed=47)]),
]


def pixel(x, y, width, height, key, shapes):
    """One byte: each shape in turn draws the value below it towards its target, averaged over the pixel's area."""
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
