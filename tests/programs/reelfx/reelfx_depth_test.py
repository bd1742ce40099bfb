#!/usr/bin/env python3
"""reelfx on clips and stills of more than 8 bits, and --depth. Environment: REELFX."""

import array
import sys
import tempfile
import unittest
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "common"))
from clip import ffmpeg, reelfx  # noqa: E402

LOOK = ("--effect", "Film Look", "--preset", "Sepia")
WIDTH, HEIGHT = 256, 64


def setUpModule():
    global folder, root, ramp, prores
    folder = tempfile.TemporaryDirectory()
    root = Path(folder.name)
    ramp, prores = root / "ramp.png", root / "clip.mov"
    greys = array.array("H", (value for i in range(WIDTH * HEIGHT) for value in (i * 4, i * 4, i * 4, 65535)))
    raw = root / "ramp.raw"
    raw.write_bytes(greys.tobytes())
    source = ("-f", "rawvideo", "-pix_fmt", "rgba64le", "-s", f"{WIDTH}x{HEIGHT}", "-i", raw)
    ffmpeg(*source, "-frames:v", "1", ramp)
    ffmpeg(*source, "-pix_fmt", "yuv422p10le", "-c:v", "prores_ks", prores)


def tearDownModule():
    folder.cleanup()


def red(picture):
    """The red samples of a picture, 16 bits each."""
    return array.array("H", ffmpeg("-i", picture, "-pix_fmt", "rgba64le", "-f", "rawvideo", "-"))[::4]


class Depth(unittest.TestCase):
    def render(self, *options):
        out = root / "out.png"
        done = reelfx("render", ramp, out, *LOOK, "--overwrite", *options)
        self.assertEqual(0, done.returncode, done.stderr)
        return red(out)

    def test_a_deep_still_keeps_its_greys(self):
        bytes_only = self.render("--depth", "8")
        self.assertLessEqual(len(set(bytes_only)), 256)
        for options in ((), ("--depth", "16"), ("--depth", "float")):
            deep = self.render(*options)
            steps = [abs(b - a) for a, b in zip(deep, deep[1:])]
            self.assertGreater(len(set(deep)), 8000, options)
            self.assertLess(max(steps), 40, options)
            self.assertLess(max(abs(a - b) for a, b in zip(deep, bytes_only)), 4 * 257, options)

    def test_says_what_it_works_in(self):
        for source, given, depth in ((ramp, (), "float"), (prores, (), "float"), (prores, ("--depth", "16"), "16 bits"),
                                     (prores, ("--depth", "8"), "8 bits"), (prores, ("--matte",), "8 bits")):
            effect = ("--effect", "Film Damage") if given == ("--matte",) else LOOK
            target = root / ("x.mov" if given == ("--matte",) else "x.mkv")
            done = reelfx("render", source, target, *effect, "--dry-run", *given)
            self.assertIn(f"depth     {depth}\n", done.stdout.decode(), (given, done.stderr))
        self.assertIn("10 bits, effects work in float", reelfx("info", prores).stdout.decode())

    def test_refuses_other_depths(self):
        self.assertNotEqual(0, reelfx("render", ramp, root / "x.png", *LOOK, "--depth", "12").returncode)


if __name__ == "__main__":
    unittest.main()
