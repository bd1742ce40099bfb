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
    global folder, root, ramp, prores, clip
    folder = tempfile.TemporaryDirectory()
    root = Path(folder.name)
    ramp, prores = root / "ramp.png", root / "clip.mov"
    greys = array.array("H", (value for i in range(WIDTH * HEIGHT) for value in (i * 4, i * 4, i * 4, 65535)))
    raw = root / "ramp.raw"
    raw.write_bytes(greys.tobytes())
    source = ("-f", "rawvideo", "-pix_fmt", "rgba64le", "-s", f"{WIDTH}x{HEIGHT}", "-i", raw)
    ffmpeg(*source, "-frames:v", "1", ramp)
    ffmpeg(*source, "-pix_fmt", "yuv422p10le", "-c:v", "prores_ks", prores)
    clip = root / "clip.mkv"
    ffmpeg("-stream_loop", "11", *source, "-pix_fmt", "gbrap16le", "-c:v", "ffv1", clip)


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

    def digests(self, *options):
        done = reelfx("render", clip, "--hash", *options)
        self.assertEqual(0, done.returncode, done.stderr)
        return [line for line in done.stdout.decode().splitlines() if line.startswith("frame")]

    def test_frames_do_not_depend_on_threads_and_sections(self):
        fade = ("-e", "Film Damage", "-p", "Shredded", "--set", "Wear=10@0 60@11", "--set", "Density=80@0 20@11")
        both = (*LOOK, "--mix", "40@0 90@11", "--then", *fade)
        for options in (("-e", "Film Pro", "-p", "Very Old Footage"), both, (*both, "--depth", "16"),
                        (*fade, "--matte", "--depth", "float")):
            with self.subTest(options=options):
                whole = self.digests(*options, "--threads", "1")
                self.assertEqual(12, len(set(whole)))
                self.assertEqual(whole, self.digests(*options, "--threads", "4"))
                self.assertEqual(whole[7:], self.digests(*options, "--frames", "7:"))
                parts = [self.digests(*options, "--farm", f"{n}/3") for n in (1, 2, 3)]
                self.assertEqual(whole, sum(parts, []))

    def test_pictures_of_a_deep_clip(self):
        out = root / "frame.png"
        done = reelfx("frame", clip, out, *LOOK, "--frame", "3", "--overwrite")
        self.assertEqual(0, done.returncode, done.stderr)
        halves = ffmpeg("-i", out, "-pix_fmt", "gray", "-f", "rawvideo", "-")
        self.assertGreater(len(set(halves)), 100)

    def test_refuses_other_depths(self):
        self.assertNotEqual(0, reelfx("render", ramp, root / "x.png", *LOOK, "--depth", "12").returncode)


if __name__ == "__main__":
    unittest.main()
