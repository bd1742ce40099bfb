"""Every preset through the OpenFX bundle and through reelfx, in 8 bits, 16 bits and float: the same samples.

With --table, prints for each effect and depth how many frames are equal. Environment: REELFX, BUNDLE_FRAMES, BUNDLE.
"""

import array
import json
import os
import sys
import tempfile
import unittest
from concurrent.futures import ThreadPoolExecutor
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "common"))
from clip import ffmpeg, reelfx, run  # noqa: E402

WIDTH, HEIGHT = 80, 60
# depth: (type of a sample, planes as ffmpeg names them, the source and result of reelfx). EXR holds one frame.
DEPTHS = {"8": ("B", "bgra", "mkv", 2), "16": ("H", "gbrap16le", "mkv", 2), "float": ("f", "gbrapf32le", "exr", 1)}


def setUpModule():
    global folder, root, counts, found
    folder = tempfile.TemporaryDirectory()
    root = Path(folder.name)
    for depth in DEPTHS:
        write_source(depth)
    done = run(os.environ["BUNDLE_FRAMES"], os.environ["BUNDLE"], root, WIDTH, HEIGHT)
    assert done.returncode == 0, done.stderr.decode()
    counts = [(effect["name"], effect["presets"]) for effect in json.loads(reelfx("list", "--json").stdout)]
    jobs = [(depth, f"{e}-{p}-{depth}", name, ("-e", name, "-p", preset)) for depth in DEPTHS
            for e, (name, presets) in enumerate(counts) for p, preset in enumerate(presets)]
    fade = ("-e", "Film Damage", "-p", counts[2][1][-1], "--set", "Wear=10@0 60@2")
    jobs += [(depth, f"fade-{depth}", "a fade", fade) for depth in DEPTHS]
    with ThreadPoolExecutor(2) as pool:
        found = list(pool.map(lambda job: (*job[:3], differences(*job)), jobs))


def tearDownModule():
    folder.cleanup()


def pixel(x, y, depth):
    """Gradients, edges and noise; some of it transparent, and in float beyond black and white."""
    noise = (x * 7919 + y * 104729 + x * y * 31) % 997 / 997
    values = [x / WIDTH, y / HEIGHT, noise, 1.0 if x % 5 else noise]
    if (x // 8 + y // 8) % 4 == 0:
        values[:3] = [float(x % 2)] * 3
    if depth == "float":
        return [value * 2.5 - 0.5 for value in values[:3]] + values[3:]
    highest = 255 if depth == "8" else 65535
    return [int(value * highest + 0.5) for value in values]


def write_source(depth):
    kind, planes, ending, frames = DEPTHS[depth]
    pixels = array.array(kind, (v for y in range(HEIGHT) for x in range(WIDTH) for v in pixel(x, y, depth)))
    (root / f"source-{depth}").write_bytes(pixels.tobytes())
    raw = root / "raw"
    raw.write_bytes(coded(pixels, planes).tobytes() * frames)
    ffmpeg("-f", "rawvideo", "-pix_fmt", planes, "-s", f"{WIDTH}x{HEIGHT}", "-r", "25", "-i", raw,
           *(("-c:v", "ffv1") if ending == "mkv" else ()), root / f"clip-{depth}.{ending}")


def coded(pixels, planes):
    """Red, green, blue, alpha in the order of a raw frame."""
    if planes == "bgra":
        out = array.array(pixels.typecode, pixels)
        out[0::4], out[2::4] = pixels[2::4], pixels[0::4]
        return out
    return pixels[1::4] + pixels[2::4] + pixels[0::4] + pixels[3::4]


def decoded(raw, kind, planes):
    """The other way."""
    samples = array.array(kind, raw)
    if planes == "bgra":
        return coded(samples, planes)
    size = WIDTH * HEIGHT
    out = array.array(kind, samples)
    for channel, plane in enumerate((2, 0, 1, 3)):
        out[channel::4] = samples[plane * size:(plane + 1) * size]
    return out


def differences(depth, file, _, choice):
    """The largest difference of each frame, in steps of 8 bits, 16 bits, or as the float is."""
    kind, planes, ending, frames = DEPTHS[depth]
    out = root / f"{file}.{ending}"
    as_is = ("--linear-as-is",) if ending == "exr" else ("--codec", "ffv1")
    done = reelfx("render", root / f"clip-{depth}.{ending}", out, *choice, "--seed", "7", "--depth", depth, *as_is)
    assert done.returncode == 0, done.stderr.decode()
    raw = ffmpeg("-i", out, "-pix_fmt", planes, "-f", "rawvideo", "-")
    out.unlink()
    size = len(raw) // frames
    worst = []
    for frame in range(frames):
        ours = decoded(raw[frame * size:(frame + 1) * size], kind, planes)
        bundle = (root / f"{file}-{frame}").read_bytes()
        theirs = array.array(kind, bundle)
        worst.append(0 if ours.tobytes() == bundle else max(abs(a - b) for a, b in zip(ours, theirs)))
    return worst


class BundleFrames(unittest.TestCase):
    def test_every_frame_has_the_samples_of_reelfx(self):
        for depth, file, name, worst in found:
            with self.subTest(depth=depth, name=name, file=file):
                self.assertEqual([0] * len(worst), worst)

    def test_the_presets_do_something(self):
        sources = {depth: (root / f"source-{depth}").read_bytes() for depth in DEPTHS}
        changed = sum((root / f"{file}-0").read_bytes() != sources[depth] for depth, file, *_ in found)
        self.assertGreater(changed, 3 * 70)


def print_table():
    setUpModule()
    print("| | presets | " + " | ".join(f"{depth}: frames, equal, largest difference" for depth in DEPTHS) + " |")
    for name in [effect for effect, _ in counts] + ["a fade"]:
        cells = []
        for depth in DEPTHS:
            frames = [value for d, _, n, worst in found if d == depth and n == name for value in worst]
            cells.append(f"{len(frames)}, {frames.count(0)}, {max(frames)}")
        presets = sum(1 for d, _, n, _ in found if d == "8" and n == name)
        print(f"| {name} | {presets} | " + " | ".join(cells) + " |")
    tearDownModule()


if __name__ == "__main__":
    print_table() if "--table" in sys.argv else unittest.main()
