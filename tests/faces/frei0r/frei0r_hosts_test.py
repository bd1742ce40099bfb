#!/usr/bin/env python3
"""The frei0r plug-ins in real hosts: each must produce exactly the frames that reelfx produces.

Compares its results with the table in docs/hosts.md, or replaces the table with --write.

Environment: REELFX, FREI0R_PATH (the built plug-ins); PRELOAD: a library that the hosts must load first,
such as the runtime of plug-ins built with sanitizers.
"""

import argparse
import os
import sys
import tempfile
import unittest
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "common"))
from clip import CLIP, ffmpeg, reelfx, run_host  # noqa: E402

ROOT = Path(__file__).parents[3]
TABLE_FILE = ROOT / "docs" / "hosts.md"
TABLE_BEGIN, TABLE_END = "<!-- table: tests/faces/frei0r -->\n", "<!-- end of table -->\n"

# Debian 12's FFmpeg pads rows to 64 bytes without telling plug-ins; rows of 320 pixels need no padding.
WIDTH, HEIGHT, FRAMES, SEED = 320, 180, 20, 7
START = 8  # first frame of a partial render

PRESETS = {
    "Film Camera": "Earthquake!",
    "Film Look": "Sepia",
    "Film Damage": "Aged",
    "Film Express": "60's Memories",
    "Film Pro": "Super 8",
}

# Constant rates, including one that is not a whole number.
RATES = ["25", "30000/1001"]


def plugin_name(effect):
    return "velmora_" + effect.lower().replace(" ", "_")


def host(*args):
    environment = dict(os.environ, ASAN_OPTIONS="detect_leaks=0:verify_asan_link_order=0", GST_REGISTRY=str(Work.gst_registry))
    if os.environ.get("PRELOAD"):
        environment["LD_PRELOAD"] = os.environ["PRELOAD"]
    done = run_host(*args, env=environment)
    assert done.returncode == 0, f"{args}\n{done.stderr.decode()}"
    return done


def digests_of_rgba(path):
    """MD5 of each frame as BGRA, as reelfx prints it."""
    text = ffmpeg("-f", "rawvideo", "-pix_fmt", "rgba", "-s", f"{WIDTH}x{HEIGHT}", "-i", path, "-pix_fmt", "bgra",
                  "-f", "framemd5", "-").decode()
    return [line.split(",")[-1].strip() for line in text.splitlines() if not line.startswith("#")]


class Work:
    """The clip at each rate, lossless, and reelfx's result for it."""

    def __init__(self):
        self.folder = tempfile.TemporaryDirectory(prefix="velmora-frei0r-")
        self.root = Path(self.folder.name)
        Work.gst_registry = self.root / "gst.bin"
        self.clips, self.raws = {}, {}
        for rate in RATES:
            name = rate.replace("/", "-")
            self.clips[rate] = self.root / f"{name}.mkv"
            ffmpeg("-i", CLIP, "-an", "-vf", f"scale={WIDTH}:{HEIGHT},setsar=1,setpts=N/({rate})/TB", "-r", rate,
                   "-frames:v", str(FRAMES), "-c:v", "ffv1", "-pix_fmt", "bgra", self.clips[rate])
            self.raws[rate] = self.root / f"{name}.rgba"
            ffmpeg("-i", self.clips[rate], "-pix_fmt", "rgba", "-f", "rawvideo", self.raws[rate])
        self.out = self.root / "out.rgba"

    def expected(self, effect, rate, *settings):
        # Raw, since Matroska's times are rounded to milliseconds.
        raw = self.root / "expected.bgra"
        ffmpeg("-i", self.clips[rate], "-pix_fmt", "bgra", "-f", "rawvideo", raw)
        done = reelfx("render", raw, "--size", f"{WIDTH}x{HEIGHT}", "--rate", rate, "--effect", effect, "--preset",
                      PRESETS[effect], "--seed", str(SEED), "--hash", *settings)
        assert done.returncode == 0, done.stderr.decode()
        return [line.split()[-1] for line in done.stdout.decode().splitlines()]


def in_ffmpeg(work, effect, rate, start=0, more=""):
    # Only a preset's letters and digits count, so its apostrophe needs no quoting.
    preset = "".join(c for c in PRESETS[effect] if c.isalnum())
    graph = f"frei0r={plugin_name(effect)}:{preset}|{SEED}|{start}|{rate}{more}"
    seconds = start * eval_rate(rate)
    host("ffmpeg", "-nostdin", "-v", "error", "-y", "-ss", f"{seconds:.6f}", "-i", work.clips[rate], "-vf", graph,
         "-pix_fmt", "rgba", "-f", "rawvideo", work.out)
    return digests_of_rgba(work.out)


def eval_rate(rate):
    """The time of a frame in seconds."""
    numerator, _, denominator = rate.partition("/")
    return int(denominator or 1) / int(numerator)


def in_melt(work, effect, rate, real_time=-1, start=0, more=()):
    numerator, _, denominator = rate.partition("/")
    # The profile of the first clip would round the rate.
    profile = work.root / "profile"
    profile.write_text(f"description=test\nframe_rate_num={numerator}\nframe_rate_den={denominator or 1}\nwidth={WIDTH}\n"
                       f"height={HEIGHT}\nprogressive=1\nsample_aspect_num=1\nsample_aspect_den=1\n"
                       f"display_aspect_num={WIDTH}\ndisplay_aspect_den={HEIGHT}\ncolorspace=709\n")
    command = ["melt", "-silent", "-profile", profile, work.clips[rate], f"in={start}", f"out={FRAMES - 1}",
               "-attach", f"frei0r.{plugin_name(effect)}", f"preset={PRESETS[effect]}", f"seed={SEED}",
               f"start frame={start}", f"frame rate={rate}", *more, "-consumer", f"avformat:{work.out}", "f=rawvideo",
               "vcodec=rawvideo", "pix_fmt=rgba", "mlt_image_format=rgba", "an=1", f"real_time={real_time}"]
    # Seen once in some hundred runs: melt reported success but had written nothing. Frames that exist are checked.
    for _ in range(3):
        host(*command)
        frames = digests_of_rgba(work.out)
        if frames:
            break
    return frames


def in_gstreamer(work, effect, rate):
    element = "frei0r-filter-" + plugin_name(effect).replace("_", "-")
    host("gst-launch-1.0", "-q", "filesrc", f"location={work.raws[rate]}", f"blocksize={WIDTH * HEIGHT * 4}", "!",
         "rawvideoparse", "format=rgba", f"width={WIDTH}", f"height={HEIGHT}",
         f"framerate={rate if '/' in rate else rate + '/1'}", "!", element, f"preset={PRESETS[effect]}", f"seed={SEED}",
         f"frame-rate={rate}", "!", "filesink", f"location={work.out}")
    return digests_of_rgba(work.out)


HOSTS = {
    "FFmpeg": (0, lambda *args: in_ffmpeg(*args)),
    f"FFmpeg, `-ss`, start frame {START}": (START, lambda *args: in_ffmpeg(*args, start=START)),
    "melt, 1 thread": (0, lambda *args: in_melt(*args)),
    "melt, 4 frame threads": (0, lambda *args: in_melt(*args, real_time=-4)),
    f"melt, 4 frame threads, from frame {START}": (START, lambda *args: in_melt(*args, real_time=-4, start=START)),
    "GStreamer": (0, lambda *args: in_gstreamer(*args)),
}


class Hosts(unittest.TestCase):
    write = False

    @classmethod
    def setUpClass(cls):
        cls.work = Work()
        cls.addClassCleanup(cls.work.folder.cleanup)

    def test_show_the_frames_of_reelfx(self):
        rows = ["| host | " + " | ".join(PRESETS) + " |", "|---" * (len(PRESETS) + 1) + "|"]
        expected = {(e, r): self.work.expected(e, r) for e in PRESETS for r in RATES}
        for name, (start, render) in HOSTS.items():
            cells = []
            for effect in PRESETS:
                wrong = 0
                for rate in RATES:
                    wanted = expected[effect, rate][start:]
                    frames = render(self.work, effect, rate)
                    wrong += sum(a != b for a, b in zip(frames, wanted)) + abs(len(frames) - len(wanted))
                with self.subTest(host=name, effect=effect):
                    self.assertEqual(wrong, 0, "frames differ")
                cells.append("same" if wrong == 0 else f"{wrong} differ")
            rows.append(f"| {name} | " + " | ".join(cells) + " |")
        self.keep_table("\n".join(rows) + "\n")

    def keep_table(self, table):
        text = TABLE_FILE.read_text()
        before, rest = text.split(TABLE_BEGIN)
        after = rest.split(TABLE_END)[1]
        now = before + TABLE_BEGIN + table + TABLE_END + after
        if self.write:
            TABLE_FILE.write_text(now)
        self.assertEqual(now, text if not self.write else now, f"{TABLE_FILE}: run this test with --write")

    def test_presets_give_way_to_what_stands_behind_them(self):
        # Wear at its default and another pattern; by position, by name and by number.
        wanted = self.work.expected("Film Damage", "25", "--set", "Wear=0", "--set", "Pattern=Fine")
        self.assertNotEqual(wanted, self.work.expected("Film Damage", "25"))
        self.assertEqual(in_ffmpeg(self.work, "Film Damage", "25", more="|0|fine"), wanted)
        self.assertEqual(in_melt(self.work, "Film Damage", "25", more=("Wear=0", "Pattern=Fine")), wanted)
        self.assertEqual(in_melt(self.work, "Film Damage", "25", more=("4=0", "5=3")), wanted)

    def test_values_that_a_host_changes_count_in_their_frame(self):
        # Values of a fade are passed frame by frame, by melt's frame threads also for several frames at once.
        wanted = self.work.expected("Film Damage", "25", "--set", "Wear=10@0 60@16", "--set", "Spots=0@4 80@19")
        self.assertEqual(len(set(wanted)), FRAMES)
        for real_time in (-1, -4):
            with self.subTest(real_time=real_time):
                self.assertEqual(in_melt(self.work, "Film Damage", "25", real_time=real_time,
                                         more=("Wear=0=0.1;16=0.6", "Spots=4=0;19=0.8")), wanted)

    def test_slices_of_melt_do_no_harm(self):
        # A slice is a separate picture to a plug-in, but it must come through whole.
        self.assertEqual(len(in_melt(self.work, "Film Pro", "25", more=("threads=4",))), FRAMES)


if __name__ == "__main__":
    parser = argparse.ArgumentParser()
    parser.add_argument("--write", action="store_true", help="replace the table of docs/hosts.md")
    options, rest = parser.parse_known_args()
    Hosts.write = options.write
    unittest.main(argv=[sys.argv[0], *rest])
