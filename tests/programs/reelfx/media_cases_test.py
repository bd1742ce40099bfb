"""Runs the table of media_cases.py: reelfx on clips of every kind, and ffprobe on the results."""

import json
import os
import re
import shlex
import shutil
import struct
import sys
import tempfile
import unittest
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "common"))
sys.path.insert(0, str(Path(__file__).resolve().parent))
from clip import ffmpeg, frame_digests, frame_times, reelfx, run  # noqa: E402
from media_cases import CASES, CHAPTERS, INPUTS, SRT  # noqa: E402

COLOURS = {(1, 0, 0): "red", (0, 1, 0): "lime", (0, 0, 1): "blue", (1, 1, 1): "white", (0, 0, 0): "black"}


def setUpModule():
    global folder, inputs
    folder = tempfile.TemporaryDirectory(prefix="velmora-media-")
    inputs = Path(folder.name) / "in"
    (inputs / "folder").mkdir(parents=True)
    (inputs / "text.srt").write_text(SRT)
    (inputs / "chapters.txt").write_text(CHAPTERS)
    (inputs / "font.ttf").write_bytes(b"no font, but an attachment\n" * 20)
    for name, recipe in INPUTS.items():
        ffmpeg(*shlex.split(recipe.format(f=inputs)), inputs / name)
    for orientation in (2, 6):
        write_orientation(inputs / "lying.jpg", inputs / f"exif{orientation}.jpg", orientation)
    for name, parts in (("joined.ts", ("aac.ts", "second.ts")), ("grow.ts", ("grow-a.ts", "grow-b.ts"))):
        (inputs / name).write_bytes(b"".join((inputs / part).read_bytes() for part in parts))
    for name in ("mkv", "ts"):
        whole = (inputs / f"long.{name}").read_bytes()
        (inputs / f"cut.{name}").write_bytes(whole[:len(whole) * 7 // 10 | 1])
    for number in (1001, 1002, 1003):
        for path in (inputs / f"seq-{number}.png", inputs / "folder" / f"{number}.png"):
            shutil.copy(inputs / "rgb48.png", path)


def tearDownModule():
    folder.cleanup()


def write_orientation(source, target, orientation):
    """Adds an EXIF block with nothing but the orientation."""
    block = b"Exif\0\0MM\0*" + struct.pack(">IHHHIHHI", 8, 1, 0x112, 3, 1, orientation, 0, 0)
    jpeg = source.read_bytes()
    target.write_bytes(jpeg[:2] + b"\xff\xe1" + struct.pack(">H", len(block) + 2) + block + jpeg[2:])


def orientation_of(path):
    jpeg = path.read_bytes()
    at = jpeg.find(b"Exif\0\0MM\0*")
    return struct.unpack(">H", jpeg[at + 24:at + 26])[0] if at >= 0 else None


def samples(path, filters, pixels):
    return ffmpeg("-i", path, "-frames:v", "1", "-vf", filters, "-pix_fmt", pixels, "-f", "rawvideo", "-")


def colour_at(raw, width, x, y):
    at = (y * width + x) * 3
    return COLOURS.get(tuple(int(value > 127) for value in raw[at:at + 3]), "?")


def corners(path):
    raw = samples(path, "scale=40:40:flags=neighbor", "rgb24")
    return " ".join(colour_at(raw, 40, x, y) for y in (8, 32) for x in (8, 32))


def step_between_flash_and_beep(path):
    """Seconds from the first bright frame to the first loud sample, as a player shows them."""
    text = ffmpeg("-i", path, "-copyts", "-vf", "signalstats,metadata=print:key=lavfi.signalstats.YAVG:file=-", "-an",
                  "-f", "null", "-").decode()
    lit = re.findall(r"pts_time:(\S+)\n\S+YAVG=(\S+)", text)
    flash = next(float(time) for time, level in lit if float(level) > 120)
    text = ffmpeg("-i", path, "-copyts", "-af", "asetnsamples=480,astats=metadata=1:reset=1,ametadata=print:"
                  "key=lavfi.astats.Overall.Peak_level:file=-", "-vn", "-f", "null", "-").decode()
    loud = re.findall(r"pts_time:(\S+)\n\S+level=(\S+)", text)
    beep = next(float(time) for time, level in loud if level != "-inf" and float(level) > -12)
    return beep - flash


class Probe:
    """What the tools say of a file, by the names used in the table."""

    def __init__(self, path):
        self.path = path
        done = run("ffprobe", "-v", "error", "-show_streams", "-show_format", "-show_chapters", "-count_frames", "-of",
                   "json", path)
        self.all = json.loads(done.stdout or "{}")
        self.streams = self.all.get("streams", [])

    def value(self, key):
        words = key.split(" ")
        if hasattr(self, "look_" + words[0]):
            return getattr(self, "look_" + words[0])()
        kind, number = words[0].split(":")
        of_kind = [s for s in self.streams if s["codec_type"].startswith(kind)]
        found = of_kind[int(number)]
        for word in words[1:]:
            found = {k.lower(): v for k, v in found.items()}.get(word.lower()) if isinstance(found, dict) else None
        return found

    def look_frames(self):
        return int(self.value("v:0 nb_read_frames"))

    def look_kinds(self):
        return " ".join(s["codec_type"] for s in self.streams)

    def look_chapters(self):
        return [c["tags"]["title"] for c in self.all["chapters"]]

    def look_title(self):
        return self.all["format"]["tags"].get("title")

    def look_seconds(self):
        return float(self.all["format"]["duration"])

    def look_times(self):
        return frame_times(self.path)

    def look_turn(self):
        sides = self.value("v:0 side_data_list") or [{}]
        return abs(int(sides[0].get("rotation", 0)))

    def look_corners(self):
        return corners(self.path)

    def look_corner(self):
        return colour_at(samples(self.path, "crop=iw:ih", "rgb24"), self.value("v:0 width"), 12, 12)

    def look_exif(self):
        return orientation_of(self.path)

    def look_alpha(self):
        decoder = ("-c:v", "libvpx-vp9") if self.value("v:0 codec_name") == "vp9" else ()
        return round(ffmpeg(*decoder, "-i", self.path, "-frames:v", "1", "-pix_fmt", "rgba", "-f", "rawvideo", "-")[3] / 4) * 4

    def look_grey(self):
        return samples(self.path, "scale=out_range=full:sws_flags=accurate_rnd+full_chroma_int", "rgb24")[0]

    def look_ramp(self):
        row = samples(self.path, "null", "rgb24")[:256 * 3]
        return row == bytes(value for value in range(256) for _ in range(3))

    def look_digests(self):
        return frame_digests(self.path)

    def look_middle(self):
        """The green sample in the middle, in 8 bits."""
        raw = samples(self.path, "null", "gbrp16le")
        return raw[(24 * 64 + 32) * 2 + 1]

    def look_text(self):
        text = ffmpeg("-i", self.path, "-map", "0:s", "-f", "srt", "-").decode()
        return "A line" if re.search(r"00:00:00,200 --> 00:00:00,700\n(<.*>)?A line", text) else text

    def look_sound(self):
        """Seconds that a player plays: some containers cut the last packet by its length, others by a mark."""
        if "duration" in self.streams[1]:
            return float(self.streams[1]["duration"])
        pcm = ffmpeg("-i", self.path, "-map", "0:a", "-f", "s16le", "-ac", "1", "-ar", "48000", "-")
        return len(pcm) / 2 / 48000

    def look_mastering(self):
        done = run("ffprobe", "-v", "error", "-show_frames", "-read_intervals", "%+#1", "-of", "json", self.path)
        sides = {s["side_data_type"]: s for s in json.loads(done.stdout)["frames"][0]["side_data_list"]}
        peak = sides["Mastering display metadata"]["max_luminance"]
        numerator, denominator = map(int, peak.split("/"))
        return f"{numerator // denominator}/1 {sides['Content light level metadata']['max_content']}"

    def look_step(self):
        return step_between_flash_and_beep(self.path)


class MediaCases(unittest.TestCase):
    def check_program(self, done, wanted):
        text = done.stderr.decode()
        self.assertEqual(done.returncode, wanted.pop("code", 0), text)
        if wanted.pop("quiet", False):
            self.assertEqual(text, "")
        self.assertIn(wanted.pop("says", ""), text)
        self.assertNotIn("Invalid argument", text)
        self.assertIn(wanted.pop("prints", ""), "" if wanted.get("stdout") else done.stdout.decode())

    def check_file(self, source, out, wanted):
        if "files" in wanted:
            self.assertEqual(len(os.listdir(out)), wanted.pop("files"))
        path = next(out.iterdir(), None)
        if not wanted:
            return
        probe = Probe(path)
        for key in wanted.pop("like input", "").split():
            key = key.replace(".", " ", 1)
            self.assertEqual(probe.value(key), Probe(source).value(key), key)
        if "psnr" in wanted:
            graph = "[0:v]format=yuv444p[a];[1:v]format=yuv444p[b];[a][b]psnr"
            done = run("ffmpeg", "-nostdin", "-i", source, "-i", path, "-lavfi", graph, "-f", "null", "-")
            self.assertGreater(float(re.search(rb"PSNR y:(\S+)", done.stderr).group(1)), wanted.pop("psnr"))
        if "step" in wanted:
            self.assertAlmostEqual(probe.value("step"), 0.0, delta=wanted.pop("step"))
        for key, value in wanted.items():
            found = probe.value(key)
            if isinstance(value, tuple):
                self.assertTrue(value[0] <= found <= value[1], f"{key}: {found}")
            else:
                self.assertEqual(found, value, key)

    def test_table(self):
        wish = os.environ.get("MEDIA_CASES", "")
        for number, (name, source, arguments, wanted) in enumerate(CASES):
            if wish and not re.search(wish, name):
                continue
            with self.subTest(case=name):
                out, wanted = Path(folder.name) / f"out{number}", dict(wanted)
                out.mkdir()
                words = [a.replace("{i}", str(inputs / source)).replace("{o}", str(out)).replace("{f}", str(inputs))
                         for a in arguments]
                feed = {"input": (inputs / source).read_bytes()} if wanted.pop("stdin", False) else {}
                done = reelfx(*words, **feed)
                self.check_program(done, wanted)
                if wanted.pop("stdout", False):
                    (out / "stdout").write_bytes(done.stdout)
                self.check_file(inputs / source, out, wanted)


if __name__ == "__main__":
    unittest.main()
