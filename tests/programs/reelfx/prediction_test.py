#!/usr/bin/env python3
"""Frames of all effects without diffusion and scratches, predicted byte for byte by a second implementation.

Written independently of the renderer, pixel by pixel and with exact arithmetic: the two share the rules, not the code.
Values are rounded to single precision through packed bytes.
"""

import json
import math
import random
import struct
import sys
import tempfile
import unittest
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "common"))
from clip import reelfx  # noqa: E402

PICTURES = Path(__file__).resolve().parents[3] / "render" / "pictures"
WIDTH, HEIGHT, FRAMES = 133, 61, 7
STATE = 0x12345678


def single(x):
    return struct.unpack("<f", struct.pack("<f", x))[0]


def half_away(x):
    return int(x + 0.5) if x >= 0 else -int(-x + 0.5)


def pgm(name):
    data = (PICTURES / name).read_bytes()
    fields = data.split(maxsplit=4)
    width, height = int(fields[1]), int(fields[2])
    return width, height, data[-width * height:]


class Generator:
    def __init__(self, state):
        self.state = state

    def draw(self, a, b):
        a, b = min(a, b), max(a, b)
        self.state = (self.state * 1103515245 + 12345) % 2**32
        return (self.state >> 16 & 0x7FFF) * (b - a) // 32767 + a


class Settings:
    """What the renderer reads from an effect's controls that hold the values `shown`."""

    def __init__(self, effect, shown):
        if effect == "Film Express":  # one jitter for both directions, and its own flicker rate
            jitter = shown.get("Jitter", 0)
            shown = {"Y Jitter": jitter, "X Jitter": jitter, "Flicker Rate": 20, **shown}

        def percent(name):  # 0..1
            slider = single(100.0 * single(shown.get(name, 0) / 100))
            return single(slider / 100)

        def centred(name):  # normalised: half to one, since the slider holds the host's value times its maximum
            slider = single(100.0 * single((shown.get(name, 0) + 100) / 200))
            return single((slider + 100) / 200)

        def signed(name):
            slider = single(100.0 * single((shown.get(name, 0) + 100) / 200))
            return single(2 * single(2 * ((slider + 100) / 200) - 1) - 1)

        self.jitter = [half_away(single(10 * single(shown.get(n, 0) / 10))) for n in ("Y Jitter", "X Jitter")]
        self.flicker = percent("Flicker")
        self.rate = math.floor(percent("Flicker Rate") * 30 + 0.5)
        self.saturation = single(4 * centred("Saturation") - 3)
        self.brightness, self.contrast = signed("Brightness"), signed("Contrast")
        self.gamma = percent("Film Gamma")
        strength = 4 * centred("Tint") - 3
        colour = shown.get("Colour", (0, 0, 0))
        self.tint = [single(0.5 + 0.5 * (c / 255 - 0.5) * strength) for c in colour]  # red, green, blue
        self.border = tuple(reversed(shown.get("Border", (0, 0, 0)))) + (255,)
        self.wear = percent("Wear")
        self.worn_channels = 1 if shown.get("Blue Channel Only") else 3
        self.pattern = 2000 + shown.get("Pattern", 1)
        self.spots = single(100.0 * single(shown.get("Spots", 0) / 100))


def tone_table(s, seconds):
    near = single(0.00001)
    offset = 0.0
    if s.flicker >= near:
        bits = struct.unpack("<I", struct.pack("<f", single(s.saturation + s.flicker)))[0]
        own = Generator(bits)
        for _ in range(max(1, math.ceil(seconds * s.rate - 1e-9))):
            value = own.draw(0, half_away(single(s.flicker * 100))) / 100
        offset = single(min(max(value, 0.0), s.flicker) - 0.5 * s.flicker)
    b, c = 0.5 * s.brightness, 0.5 * s.contrast
    if abs(b) >= near:
        offset = min(max(single(offset + b), -1.0), 1.0)
    table = [i + half_away(single((i if offset <= 0 else 255 - i) * offset)) for i in range(256)]
    if abs(c) >= near:
        gain = 10 * c * c + 1 if c > 0 else 1 + c
        curve = [int(min(max(single(((i / 255 - 0.5) * gain + 0.5) * 255), 0), 255)) for i in range(256)]
        table = [curve[v] for v in table]
    return table


def mixed(s, pixel):
    w = int((0 - s.saturation) * 127)
    blue, green, red, alpha = pixel
    luma = (76 * red + 149 * green + 30 * blue) >> 8
    return tuple(min(max(((127 - w) * x + luma * w) >> 7, 0), 255) for x in (blue, green, red)) + (alpha,)


def tint_tables(s):
    """For blue, green, red; None when the stage has nothing to do."""
    offsets = [math.floor(single(single((t - 0.5) * 0.5 + 0.5) * 510) + 0.5) - 255 for t in s.tint]
    if not any(offsets) and s.gamma == 0:
        return None
    curve = []
    for i in range(256):
        x = single(i * 0.00390625)
        sine = single(math.sin(single(x * math.pi - math.pi / 2)))
        curve.append(int(single(single((sine + 1) * 0.5) * s.gamma + x * (1 - s.gamma)) * 256) & 255)
    tables = []
    for o in reversed(offsets):
        line, value = [0] * (0 if o > 0 else -o + 1), single(o)
        step = single((256 - o) / 255 if o > 0 else 255 / (256 + o))
        if o <= 0:
            value = step
        while len(line) < 256:
            line.append(int(min(max(value + 0.5, 0), 255)))
            value = single(value + step)
        tables.append([curve[line[curve[i]]] for i in range(256)])
    return tables


def shaded(pixel, a):
    if a == 0:
        return pixel
    move = [half_away(single(a * ((255 - c) if a > 0 else c))) for c in pixel[:3]]
    return tuple(c + m & 255 for c, m in zip(pixel, move)) + pixel[3:]


def spot_byte(picture, code, row, column):
    width, height, data = picture
    row, column = {0: (row, column), 1: (row, width - 1 - column), 2: (height - 1 - row, column),
                   4: (height - 1 - row, width - 1 - column), 3: (height - 1 - column, row),
                   5: (column, width - 1 - row)}[code]
    return data[row * width + column]


def predicted(source, s, seconds, numbers):
    """One frame; `source` is rows of (blue, green, red, alpha)."""
    frame = [list(row) for row in source]
    if any(s.jitter):
        dy, dx = (numbers.draw(-j, j) for j in s.jitter)
        frame = [[source[y - dy][x - dx] if 0 <= y - dy < HEIGHT and 0 <= x - dx < WIDTH else s.border
                  for x in range(WIDTH)] for y in range(HEIGHT)]
    tone = tone_table(s, seconds)
    frame = [[(tone[b], tone[g], tone[r], a) for b, g, r, a in row] for row in frame]
    if abs(s.saturation) >= single(0.00001):
        frame = [[mixed(s, pixel) for pixel in row] for row in frame]
    tables = tint_tables(s)
    if tables:
        frame = [[tuple(t[c] for t, c in zip(tables, p)) + p[3:] for p in row] for row in frame]

    numbers.draw(0, 3)
    if s.wear:
        width, height, data = pgm(f"wear-{s.pattern}.pgm")
        for left in range(0, WIDTH, width):
            start = numbers.draw(0, height - 3)
            for y in range(HEIGHT):
                for x in range(left, min(left + width, WIDTH)):
                    byte = data[(start + y) % height * width + x - left]
                    pixel, n = frame[y][x], s.worn_channels
                    frame[y][x] = shaded(pixel, single(single(byte / 255) * s.wear))[:n] + pixel[n:]

    level = math.floor(s.spots + 0.5)
    for _ in range(max(level // 4, 1) if level else 0):
        picture = pgm(f"spot-{numbers.draw(0, 10)}.pgm")
        code = numbers.draw(0, 5)
        strength = single(numbers.draw(level // 8, min(2 * level, 100)) / 100)
        numbers.draw(level // 8, level)
        w, h = picture[:2]
        y = numbers.draw(1 - (h - h // 2), HEIGHT + 1 - h // 2)
        x = numbers.draw(1 - (w - w // 2), WIDTH + 1 - w // 2)
        if code in (3, 5):
            w, h = h, w
        key = picture[2][0]
        for row in range(h):
            for column in range(w):
                v, u = y - h // 2 + row, x - w // 2 + column
                if 0 <= v < HEIGHT and 0 <= u < WIDTH:
                    d = spot_byte(picture, code, row, column) - key
                    frame[v][u] = shaded(frame[v][u], single(strength * (d / (key if d <= 0 else 255 - key))))
    return frame


PRO_CASES = {
    "nothing": {},
    "jitter": {"Y Jitter": 3, "X Jitter": 7},
    "vertical jitter only": {"Y Jitter": 2.1},
    "flicker": {"Flicker": 61.5, "Flicker Rate": 67},
    "flicker without a rate": {"Flicker": 33},
    "tone": {"Brightness": -35, "Contrast": 44},
    "steep tone": {"Brightness": 52, "Contrast": 100},
    "flat tone": {"Contrast": -100, "Flicker": 10, "Flicker Rate": 100},
    "grey": {"Saturation": -100},
    "colourful": {"Saturation": 61, "Brightness": 11},
    "hardly changed": {"Saturation": 0.5},
    "tint": {"Tint": 100, "Colour": (0xA4, 0x70, 0x02)},
    "tint the other way": {"Tint": -84, "Colour": (0xEB, 0xA7, 0x5C), "Film Gamma": 52},
    "gamma": {"Film Gamma": 100},
    "full wear": {"Wear": 100, "Pattern": 4},
    "spots": {"Spots": 100},
    "one spot": {"Spots": 1},
    "everything": {"Y Jitter": 2, "X Jitter": 2, "Flicker": 34, "Flicker Rate": 27, "Colour": (0, 0x68, 0xFF),
                   "Tint": -60, "Saturation": -40, "Brightness": -19, "Contrast": 30, "Film Gamma": 70,
                   "Wear": 56, "Pattern": 6, "Spots": 55},
}
PATTERNS = next(parameter["items"] for effect in json.loads(reelfx("list", "--json").stdout)
                for parameter in effect["parameters"] if parameter["kind"] == "menu")
PRO_CASES |= {f"wear, {text}": {"Wear": 33, "Pattern": i} for i, text in enumerate(PATTERNS)}
CASES = [(name, "Film Pro", shown) for name, shown in PRO_CASES.items()] + [
    ("camera", "Film Camera", {"Y Jitter": 4.9, "X Jitter": 10, "Border": (0xC0, 0x40, 0x08), "Flicker": 75,
                               "Flicker Rate": 97}),
    ("bleached look", "Film Look", {"Tint": 49, "Colour": (255, 255, 255), "Saturation": -57, "Brightness": 11,
                                    "Contrast": -23, "Film Gamma": 85}),
    ("posterized look", "Film Look", {"Tint": 100, "Colour": (0x52, 0x88, 0xA3), "Saturation": 100,
                                      "Contrast": 100, "Film Gamma": 100}),
    ("water damage", "Film Damage", {"Wear": 89, "Pattern": 0, "Blue Channel Only": True, "Spots": 74.5}),
    ("express", "Film Express", {"Jitter": 2.85, "Flicker": 29.5, "Colour": (0, 0x89, 0xFF), "Tint": -54,
                                 "Saturation": -65, "Film Gamma": 86.5, "Wear": 26, "Spots": 35.5}),
]


def control(key, value):
    """A control's name and value as written on the command line."""
    if key in ("Colour", "Border"):
        value = "#%02X%02X%02X" % value
    elif key == "Pattern":
        value = PATTERNS[value]
    elif value is True:
        value = "on"
    return f"{'Tint' if key == 'Colour' else key}={value}"


class Prediction(unittest.TestCase):
    def test_every_byte_is_foretold(self):
        dice = random.Random(7)
        clip = [[[tuple(dice.randrange(256) for _ in range(4)) for _ in range(WIDTH)] for _ in range(HEIGHT)]
                for _ in range(FRAMES)]
        with tempfile.TemporaryDirectory(prefix="velmora-prediction-") as folder:
            source, result = Path(folder) / "in.bgra", Path(folder) / "out.bgra"
            source.write_bytes(bytes(c for frame in clip for row in frame for pixel in row for c in pixel))
            for name, effect, shown in CASES:
                with self.subTest(name):
                    values = [word for pair in shown.items() for word in ("--set", control(*pair))]
                    done = reelfx("render", source, result, "--size", f"{WIDTH}x{HEIGHT}", "--rate", "24", "-e",
                                  effect, "-p", "Reset To None", *values, "--raw-bgra", "--random-state",
                                  f"{STATE:#x}", "-y")
                    self.assertEqual(done.returncode, 0, done.stderr.decode())
                    self.check(clip, Settings(effect, shown), result.read_bytes())

    def check(self, clip, settings, rendered):
        numbers, saved, last = Generator(STATE), STATE, 0
        size = WIDTH * HEIGHT * 4
        for index, source in enumerate(clip):
            number = math.floor(index / 24 * 30 + 1e-12)
            if number == last:
                numbers.state = saved
            saved, last = numbers.state, number
            frame = predicted(source, settings, index / 24, numbers)
            expected = bytes(c for row in frame for pixel in row for c in pixel)
            actual = rendered[index * size:(index + 1) * size]
            wrong = next((i for i in range(size) if expected[i] != actual[i]), None) if expected != actual else None
            if wrong is not None:
                y, x, channel = wrong // 4 // WIDTH, wrong // 4 % WIDTH, wrong % 4
                self.fail(f"frame {index}, row {y}, column {x}, byte {channel}: {expected[wrong]} told, "
                          f"{actual[wrong]} rendered")


if __name__ == "__main__":
    unittest.main()
