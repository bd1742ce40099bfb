"""The command-line host with real footage, checked with the media tools' own programs."""

import json
import math
import os
import re
import shutil
import sys
import unittest
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "common"))
from clip import CLIP, Clips, REELFX, ffmpeg, frame_digests, frame_times, luma_psnr, probe, reelfx, run  # noqa: E402

CAMERA = ("--effect", "Film Camera")
TRAIN = (*CAMERA, "--preset", "Train Ride")


def setUpModule():
    global clips
    if not CLIP.exists():
        raise unittest.SkipTest("no clip: the package forensics-samples-files is missing")
    clips = Clips()


def tearDownModule():
    clips.folder.cleanup()


class ReelfxTest(unittest.TestCase):
    def setUp(self):
        self.out = clips.root / self.id()
        self.out.mkdir()

    def render(self, source, target, *options, **more):
        done = reelfx("render", source, self.out / target, *options, **more)
        self.assertEqual(done.returncode, 0, done.stderr)
        # What the target cannot hold is said.
        for line in done.stderr.decode().splitlines():
            self.assertTrue(line.startswith(f"reelfx: {self.out / target}: "), line)
        return self.out / target

    def digests(self, *options, source=None):
        done = reelfx("render", source or clips.small, "--hash", *options)
        self.assertEqual((done.returncode, done.stderr), (0, b""))
        return [line.split(" ")[3] for line in done.stdout.decode().splitlines()]

    def left_over(self):
        return sorted(os.listdir(self.out))


class Listing(ReelfxTest):
    def test_json_names_all_effects_parameters_and_presets(self):
        effects = json.loads(reelfx("list", "--json").stdout)
        counts = {e["name"]: (len(e["parameters"]), len(e["presets"])) for e in effects}
        # Parameters without the group markers.
        self.assertEqual(counts, {"Film Camera": (5, 8), "Film Look": (7, 30), "Film Damage": (9, 8),
                                  "Film Express": (9, 11), "Film Pro": (19, 24)})
        jitter = effects[0]["parameters"][0]
        self.assertEqual((jitter["kind"], jitter["minimum"], jitter["maximum"]), ("slider", 0, 10))

    def test_text_shows_one_effect(self):
        text = reelfx("list", "film look").stdout.decode()
        self.assertTrue(text.startswith("Film Look\n"))
        self.assertIn('"Sepia"', text)


    def test_presets_show_what_they_set(self):
        presets = json.loads(reelfx("presets", "film look", "--json").stdout)
        self.assertEqual(len(presets), 30)
        for preset in presets[::10]:
            with self.subTest(preset=preset["name"]):
                told = [word for p in preset["parameters"] for word in ("-s", f"{p['name']}={p['value']}")]
                self.assertEqual(self.digests("-e", "Film Look", *told, "--frames", ":1"),
                                 self.digests("-e", "Film Look", "-p", preset["name"], "--frames", ":1"))
        text = reelfx("presets", "Film Camera").stdout.decode()
        self.assertIn("Train Ride\n  Y Jitter=", text)

    def test_info_tells_what_probing_tells(self):
        facts = json.loads(reelfx("info", clips.small, "--json").stdout)
        self.assertEqual((facts["width"], facts["height"], facts["frames"], facts["codec"], facts["pixelFormat"]),
                         (320, 180, 41, "h264", "yuv420p"))
        (seconds,), = probe(clips.small, "-select_streams", "v", "-show_entries", "stream=duration")
        self.assertAlmostEqual(facts["seconds"], float(seconds), places=3)
        (matrix, rng), = probe(clips.small, "-select_streams", "v", "-show_entries", "stream=color_space,color_range")[:1]
        self.assertEqual({facts["colour"]["matrix"], facts["colour"]["range"]}, {matrix, rng})
        self.assertEqual([s["codec"] for s in facts["otherStreams"]], ["aac"])
        self.assertIn("320x180", reelfx("info", clips.small).stdout.decode())

    def test_info_notes_what_is_out_of_the_ordinary(self):
        strange = clips.root / "strange.mkv"
        ffmpeg("-f", "lavfi", "-i", "testsrc=size=64x48:rate=25:duration=0.2", "-vf",
               "format=yuv422p10le,setfield=tff,setparams=color_trc=smpte2084", "-flags", "+ildct", "-c:v", "ffv1",
               strange)
        notes = " ".join(json.loads(reelfx("info", strange, "--json").stdout)["notes"])
        for word in ("10 bits", "no colour matrix tagged; assuming smpte170m", "high dynamic range"):
            self.assertIn(word, notes)


class Studio(ReelfxTest):
    def test_the_page_beside_the_program_is_opened(self):
        page = self.out / "share/velmora-reel-effects/reel.html"
        program, opener = self.out / "bin/reelfx", self.out / "bin/xdg-open"
        for place in (page.parent, program.parent):
            place.mkdir(parents=True)
        shutil.copy(REELFX, program)
        self.assertEqual(3, run(program, "studio").returncode, "there is no page yet")
        page.touch()
        environment = dict(os.environ, PATH=str(program.parent))
        self.assertEqual(4, run(program, "studio", env=environment).returncode, "nothing opens it")
        opener.write_text(f'#!/bin/sh\necho "$1" > {self.out}/opened\n')
        opener.chmod(0o755)
        self.assertEqual(0, run(program, "studio", env=environment).returncode)
        self.assertEqual(str(page), (self.out / "opened").read_text().strip())


class Telling(ReelfxTest):
    def test_programs_get_progress_as_json(self):
        done = reelfx("render", clips.small, self.out / "a.mkv", *CAMERA, "--progress", "json", "-j", 1)
        lines = [json.loads(line) for line in done.stderr.decode().splitlines()]
        self.assertEqual([line["progress"] for line in lines], ["continue"] * (len(lines) - 1) + ["end"])
        frames = [line["frame"] for line in lines]
        self.assertEqual((frames, frames[-1], lines[-1]["frames"]), (sorted(frames), 41, 41))
        quiet = reelfx("render", clips.small, self.out / "b.mkv", *CAMERA, env=dict(os.environ, REELFX_PROGRESS="none"))
        self.assertEqual(quiet.stderr, b"")

    def test_a_failure_has_no_end(self):
        done = reelfx("render", clips.small, "/dev/full", "--format", "matroska", *CAMERA, "--progress", "json")
        self.assertEqual(done.returncode, 4)
        self.assertNotIn(b'"end"', done.stderr)

    def test_a_dry_run_tells_and_writes_nothing(self):
        options = ("-e", "film-look", "-p", "sepia", "-s", "tint=60", "--seed", 5, "--frames", "3:9", "-j", 2)
        done = reelfx("render", clips.small, self.out / "a.mp4", *options, "--dry-run")
        self.assertEqual((done.returncode, done.stderr, self.left_over()), (0, b"", []))
        text = done.stdout.decode()
        for words in ("320x180", "frame 3 up to but not including 9 (6 frames)", "Film Look, preset Sepia", "Tint=60",
                      "seed 5", "mp4, libx264 yuv420p, audio aac (copied)"):
            self.assertIn(words, text)

    def test_options_come_from_the_environment_too(self):
        environment = dict(os.environ, REELFX_EFFECT="Film Camera", REELFX_SEED="7", REELFX_CODEC="ffv1",
                           REELFX_PIX_FMT="yuv444p", REELFX_THREADS="1")
        done = reelfx("render", clips.small, self.out / "a.mkv", "--dry-run", env=environment)
        for words in ("Film Camera", "seed 7", "ffv1 yuv444p", "threads   1"):
            self.assertIn(words, done.stdout.decode())


class SameBytes(ReelfxTest):
    def test_threads_pieces_and_order_do_not_matter(self):
        whole = self.digests(*TRAIN, "--seed", 7, "--threads", 1)
        self.assertEqual(len(whole), 41)
        self.assertGreater(len(set(whole)), 30)
        self.assertEqual(self.digests(*TRAIN, "--seed", 7, "--threads", 5), whole)
        self.assertEqual(self.digests(*TRAIN, "--seed", 7, "--frames", "30:"), whole[30:])
        self.assertEqual(self.digests(*TRAIN, "--seed", 7, "--frames", ":12"), whole[:12])
        self.assertNotEqual(self.digests(*TRAIN, "--seed", 8), whole)

    def test_a_start_time_jumps_to_the_same_frames(self):
        whole = self.digests(*TRAIN)
        times = frame_times(clips.small)
        chosen = [d for d, t in zip(whole, times) if 0.9 <= t < 1.2]
        self.assertEqual(self.digests(*TRAIN, "--start", "0.9", "--duration", "0:00.3"), chosen)

    def test_containers_that_count_milliseconds_give_the_same_frames(self):
        nut, mkv = clips.root / "exact.nut", clips.root / "rounded.mkv"
        ffmpeg("-f", "lavfi", "-i", "testsrc=size=160x90:rate=30:duration=2", "-c:v", "ffv1", nut)
        ffmpeg("-i", nut, "-c", "copy", mkv)
        exact = self.digests(*TRAIN, source=nut)
        self.assertEqual(len(exact), 60)
        self.assertEqual(self.digests(*TRAIN, source=mkv), exact)

    def test_files_of_any_thread_count_are_equal(self):
        one = self.render(clips.small, "one.mkv", *TRAIN, "--codec", "ffv1", "--threads", 1)
        five = self.render(clips.small, "five.mkv", *TRAIN, "--codec", "ffv1", "--threads", 5)
        self.assertEqual(one.read_bytes(), five.read_bytes())

    def test_digests_are_those_of_the_raw_frames(self):
        raw = self.render(clips.small, "raw.bgra", *TRAIN, "--raw-bgra")
        source = ("-f", "rawvideo", "-pix_fmt", "bgra", "-s", "320x180", "-i", raw)
        text = ffmpeg(*source, "-f", "framemd5", "-").decode()
        expected = [line.split(",")[-1].strip() for line in text.splitlines() if not line.startswith("#")]
        self.assertEqual(self.digests(*TRAIN), expected)
        neutral = (*CAMERA, "--preset", "Reset To None", "--size", "320x180", "--rate", "30000/1001")
        self.assertEqual(self.digests(*neutral, source=raw), expected)


class Lists(ReelfxTest):
    """Several effects in one pass, their mix, and settings that change over time."""

    LOOK = ("-e", "Film Look", "-p", "Sepia")
    DAMAGE = ("-e", "Film Damage", "-p", "Aged", "--seed", 3)
    RAW = ("--size", "320x180", "--rate", "30")

    @classmethod
    def setUpClass(cls):
        cls.raw = clips.root / "plain.bgra"
        ffmpeg("-i", clips.small, "-fps_mode", "passthrough", "-pix_fmt", "bgra", "-f", "rawvideo", cls.raw)

    def bytes_of(self, *options, source=None):
        out = self.render(source or self.raw, "out.bgra", *self.RAW, "--raw-bgra", "-y", "--frames", ":9", *options)
        return out.read_bytes()

    def test_one_pass_is_as_good_as_several(self):
        looked = self.out / "looked.bgra"
        looked.write_bytes(self.bytes_of(*self.LOOK))
        damaged = self.out / "damaged.bgra"
        damaged.write_bytes(self.bytes_of(*self.DAMAGE, source=looked))
        self.assertEqual(self.bytes_of(*self.LOOK, "--then", *self.DAMAGE), damaged.read_bytes())
        shaken = ("-e", "Film Camera", "-p", "Train Ride", "--mix", 30)
        self.assertEqual(self.bytes_of(*self.LOOK, "--then", *self.DAMAGE, "--then", *shaken),
                         self.bytes_of(*shaken, "--seed", 3, source=damaged), "the seed of the effect before")

    def test_a_mix_lies_between_both(self):
        before, after = self.raw.read_bytes(), self.bytes_of(*self.LOOK)
        half = self.bytes_of(*self.LOOK, "--mix", 50)
        self.assertEqual(half, bytes((a + b + 1) // 2 for a, b in zip(before, after)))
        self.assertEqual(self.bytes_of(*self.LOOK, "--mix", "0@3 50@5"),
                         before[:4 * len(after) // 9] + self.bytes_of(*self.LOOK, "--mix", 25)[4 * len(after) // 9:][:len(after) // 9]
                         + half[5 * len(after) // 9:])

    def test_a_fade_gives_each_frame_its_own_value(self):
        frames = ("Film Damage", "-s", "Spots=50", "--seed", 3)
        fade = self.digests("-e", *frames, "-s", "Wear=0@0 50@20", "-s", "Pattern=Fine@0 Grainy@30")
        constant = {wear: self.digests("-e", *frames, "-s", f"Wear={wear}", "-s", "Pattern=Fine") for wear in (0, 25, 50)}
        self.assertEqual([fade[0], fade[10], *fade[20:30]],
                         [constant[0][0], constant[25][10], *constant[50][20:30]])
        self.assertEqual(fade[30:], self.digests("-e", *frames, "-s", "Wear=50", "-s", "Pattern=Grainy")[30:])
        by_time = [self.digests("-e", *frames, "-s", f"Wear={points}", *self.RAW, source=self.raw)
                   for points in ("20@6 80@36", "20@0.2s 80@1.2s")]
        self.assertEqual(*by_time)

    def test_workers_and_pieces_do_not_matter(self):
        options = (*self.LOOK, "--mix", "0@0 100@1s", "--then", *self.DAMAGE, "-s", "Wear=10@0 60@30", "-s",
                   "Density=0@5 80@35", "-s", "Depth=50", "-s", "Black=on")
        whole = self.digests(*options, "-j", 1)
        self.assertEqual(len(set(whole)), 41)
        self.assertEqual(self.digests(*options, "-j", 5), whole)
        self.assertEqual([d for n in (1, 2, 3) for d in self.digests(*options, "--farm", f"{n}/3")], whole)
        self.assertEqual(self.digests(*options, "--frames", "30:"), whole[30:])
        by_time = (*self.LOOK, "--mix", "0@0 100@1s")
        self.assertEqual(self.digests(*by_time, "--start", frame_times(clips.small)[20]), self.digests(*by_time)[20:])

    def test_a_matte_has_the_damage_of_the_whole_list(self):
        mattes = [self.bytes_of(*options, "--matte") for options in
                  (self.DAMAGE, (*self.LOOK, "--then", *self.DAMAGE, "--then", *CAMERA, "-s", "X Jitter=9"))]
        self.assertEqual(*mattes)
        self.assertNotEqual(mattes[0], self.bytes_of(*self.DAMAGE, "--then", *self.DAMAGE[:4], "--seed", 9, "--matte"))

    def test_samples_are_kept_when_the_whole_list_is_neutral(self):
        neutral = (*CAMERA, "-p", "Reset To None", "--then", *self.LOOK, "--mix", 0)
        out = self.render(clips.small, "out.mkv", *neutral, "--codec", "ffv1")
        self.assertEqual(frame_digests(out), frame_digests(clips.small))
        back = ("-e", "Film Look", "-s", "Saturation=-100", "--then", "-e", "Film Look", "-p", "Reset To None")
        grey = self.render(clips.small, "grey.mkv", *back, "--codec", "ffv1")
        self.assertNotEqual(frame_digests(grey)[0], frame_digests(clips.small)[0])

    def test_a_dry_run_and_a_strip_have_the_whole_list(self):
        options = (*self.LOOK, "--mix", 40, "--then", "-e", "Film Damage", "-s", "Wear=10@38 60@40")
        text = reelfx("render", clips.small, self.out / "a.mp4", *options, "--dry-run").stdout.decode()
        for words in ("Film Look, preset Sepia, mix 40", "Film Damage", "Wear=10@38 60@40"):
            self.assertIn(words, text)
        strip = self.out / "s.png"
        self.assertEqual(reelfx("strip", clips.small, strip, *options, "-n", 38, "--crop", "64x100+32+16").stderr, b"")
        self.render(clips.small, "r-%d.png", *options, "--frames", "38:")
        for place in range(3):
            shown = frame_digests(strip, "-vf", f"crop=64:100:{4 + place * 68}:32", "-pix_fmt", "rgb24")
            self.assertEqual(shown, frame_digests(self.out / f"r-{39 + place}.png", "-vf", "crop=64:100:32:16", "-pix_fmt",
                                                  "rgb24"))


class Batch(ReelfxTest):
    def test_clips_go_into_a_folder_and_a_bad_one_does_not_stop_the_others(self):
        (clips.root / "other").mkdir()
        inputs = [clips.small, clips.odd, clips.root / "bad.mp4", clips.root / "other" / "last.mp4"]
        inputs[2].write_text("no film")
        shutil.copy(clips.small, inputs[3])
        folder, options = self.out / "new", (*TRAIN, "--frames", ":3", "--codec", "ffv1", "--format", "matroska")
        done = reelfx("render", *inputs, "--into", folder, *options)
        self.assertEqual(done.returncode, 3)
        text = done.stderr.decode()
        self.assertEqual(text.count("\n"), 2, text)
        self.assertIn(f"{inputs[2]}: ", text)
        self.assertIn("3 of 4 clips rendered", text)
        self.assertEqual(sorted(os.listdir(folder)), ["last.mkv", "odd.mkv", "small.mkv"])
        self.assertEqual((folder / "small.mkv").read_bytes(),
                         self.render(clips.small, "small.mkv", *options).read_bytes())
        again = reelfx("render", inputs[1], inputs[3], "--into", folder, *options, "--progress", "json")
        self.assertEqual(again.returncode, 4)
        self.assertIn('{"clip":2,"clips":2,"input":"%s","output":"%s"}' % (inputs[3], folder / "last.mkv"),
                      again.stderr.decode())
        self.assertEqual(reelfx("render", inputs[1], "--into", folder, *options, "-y").returncode, 0)

    def test_collisions_are_refused_before_anything_is_rendered(self):
        (self.out / "a").mkdir(), (self.out / "b").mkdir()
        same = [shutil.copy(clips.small, self.out / f"{name}/clip.mp4") for name in "ab"]
        for words, args in ((("both be written", "a/clip.mp4", "b/clip.mp4"), (*same, "--into", self.out / "c")),
                            (("is the input",), (*same[:1], "--into", self.out / "a", "-y")),
                            (("is the input",), (self.out / "a/clip.mp4", clips.odd, "--into", self.out / "b/../a", "-y")),
                            (("no preset \"Nope\"",), (*same[:1], "--into", self.out / "c", "-p", "Nope")),
                            (("--hash",), (*same[:1], "--into", self.out / "c", "--hash")),
                            (("standard input",), ("-", clips.odd, "--into", self.out / "c")),
                            (("--into",), (*same, clips.odd))):
            with self.subTest(args=args):
                done = reelfx("render", *args, *CAMERA)
                self.assertEqual((done.returncode, done.stderr.count(b"\n")), (2, 1), done.stderr)
                for word in words:
                    self.assertIn(word, done.stderr.decode())
        dry = reelfx("render", *same[:1], clips.odd, "--into", self.out / "c", *CAMERA, "--dry-run")
        self.assertEqual((dry.returncode, dry.stdout.count(b"output ")), (0, 2), dry.stderr)
        self.assertEqual(self.left_over(), ["a", "b"])


class Matte(ReelfxTest):
    """The damage matte, composited over the picture by a real compositor, gives the damaged picture."""

    DAMAGE = ("-e", "Film Damage", "-p", "Aged")
    # Up to four roundings apart wherever there is damage: of the wanted picture, the background, alpha and the
    # composition. Each adds a twelfth to the mean square.
    ROUNDED = 10 * math.log10(255**2 / (4 / 12))  # 52.9 dB

    @classmethod
    def setUpClass(cls):
        # RGB on both sides, so that only the matte's own rounding is measured.
        cls.source = clips.root / "rgb.mkv"
        # Without the long first frame, which a constant rate repeats.
        ffmpeg("-i", clips.small, "-fps_mode", "passthrough", "-an", "-vf", "select=gt(n\\,0)", "-pix_fmt", "bgr0",
               "-c:v", "ffv1", cls.source)

    def laid_over(self, under, matte, wanted):
        """PSNR of the composition compared with the damaged picture."""
        graph = ("[0:v]settb=1/25,setpts=N,format=gbrp[u];[1:v]settb=1/25,setpts=N,format=gbrap[m];"
                 "[u][m]overlay=format=gbrp,format=gbrp[c];[2:v]settb=1/25,setpts=N,format=gbrp[w];[c][w]psnr")
        done = run("ffmpeg", "-nostdin", "-i", under, "-i", matte, "-i", wanted, "-lavfi", graph, "-f", "null", "-")
        return float(re.search(r"average:(\S+)", done.stderr.decode()).group(1))

    def test_laid_over_it_is_the_damaged_picture(self):
        lossless = ("--codec", "ffv1", "--pix-fmt", "bgr0", "--seed", 3)
        pro = ("-e", "Film Pro", "-p", "Worn Color Print")
        # Everything else that the effect does lies under the matte.
        clean = (*pro, "-s", "Wear=0", "-s", "Spots=0", "-s", "Density=0")
        # On such a small picture, sixteen scratches cross each other and the brightest and darkest pixels. The
        # scratches leave those pixels alone, but a matte does not.
        rows = (("aged", self.DAMAGE, self.source, self.ROUNDED),
                ("shredded", ("-e", "Film Damage", "-p", "Shredded"), self.source, 52),
                ("pro", pro, self.render(self.source, "clean.mkv", *clean, *lossless), self.ROUNDED))
        for name, options, under, least in rows:
            with self.subTest(name=name):
                wanted = self.render(self.source, name + "-wanted.mkv", *options, *lossless)
                self.assertLess(self.laid_over(under, under, wanted), 40)
                matte = self.render(self.source, name + "-matte.mkv", *options, "--seed", 3, "--matte")
                self.assertGreater(self.laid_over(under, matte, wanted), least)

    def test_formats_that_carry_it(self):
        wanted = self.render(self.source, "wanted.mkv", *self.DAMAGE, "--codec", "ffv1", "--pix-fmt", "bgr0")
        for name, codec, pixels in (("a.mov", (), "yuva444p12le"), ("b.mov", ("--codec", "qtrle"), "argb"),
                                    ("c-%03d.png", (), "rgba"), ("d.avi", (), "bgra")):
            with self.subTest(name=name):
                matte = self.render(self.source, name, *self.DAMAGE, *codec, "--matte")
                (found,), = probe(matte, "-show_entries", "stream=pix_fmt")
                self.assertEqual(found, pixels)
                self.assertGreater(self.laid_over(self.source, matte, wanted), self.ROUNDED)
        webm = self.render(self.source, "e.webm", *self.DAMAGE, "--matte", "--frames", ":9")
        done = ffmpeg("-c:v", "libvpx-vp9", "-i", webm, "-vf", "alphaextract", "-f", "rawvideo", "-pix_fmt", "gray", "-")
        self.assertGreater(sum(value > 100 for value in done), 500)

    def test_a_turned_clip_has_a_turned_matte(self):
        turned = self.out / "turned.mp4"
        ffmpeg("-i", clips.small, "-c", "copy", "-metadata:s:v", "rotate=90", turned)
        upright = self.render(turned, "m.bgra", "-e", "Film Damage", "-s", "Density=100", "-s", "Depth=100", "-s",
                              "Thick=on", "--matte", "--raw-bgra", "--frames", "4:5").read_bytes()
        alpha = [upright[y * 720 + 3:(y + 1) * 720:4] for y in range(320)]
        # Scratches run down the picture, which raw frames hold upright.
        rows = max(sum(value > 60 for value in row) for row in alpha)
        columns = max(sum(row[x] > 60 for row in alpha) for x in range(180))
        self.assertGreater(columns, 150)
        self.assertLess(rows, 100)


class Keeping(ReelfxTest):
    def test_times_sound_and_colours_stay(self):
        out = self.render(clips.small, "out.mp4", *TRAIN)
        self.assertEqual(frame_times(out), frame_times(clips.small))
        for entries in ("width,height,pix_fmt,color_range,color_space,color_primaries,color_transfer,"
                        "chroma_location,time_base,sample_aspect_ratio",):
            wanted = ("-select_streams", "v", "-show_entries", "stream=" + entries)
            self.assertEqual(probe(out, *wanted), probe(clips.small, *wanted))
        sound = [ffmpeg("-i", p, "-map", "0:a", "-c", "copy", "-f", "md5", "-") for p in (clips.small, out)]
        self.assertEqual(sound[0], sound[1])

    def test_sound_that_the_container_does_not_take_is_encoded_anew(self):
        pcm = self.out / "pcm.mkv"
        ffmpeg("-i", clips.small, "-c:v", "copy", "-c:a", "pcm_s16le", pcm)
        out = self.render(pcm, "out.mp4", *CAMERA)
        self.assertEqual(probe(out, "-select_streams", "a", "-show_entries", "stream=codec_name"), [["aac"]])
        ends = [max(float(line[0]) for line in probe(p, "-select_streams", "a", "-show_entries",
                                                     "packet=pts_time")) for p in (pcm, out)]
        self.assertAlmostEqual(ends[0], ends[1], delta=0.1)

    def test_a_piece_carries_its_part_of_the_sound(self):
        out = self.render(clips.small, "out.mp4", *CAMERA, "--start", 0.5, "--duration", 0.5)
        ends = probe(out, "-select_streams", "a", "-show_entries", "packet=pts_time")
        self.assertLess(abs(float(ends[0][0])), 0.05)
        self.assertAlmostEqual(float(ends[-1][0]), 0.5, delta=0.06)

    def test_neutral_settings_keep_every_sample(self):
        out = self.render(clips.small, "out.mkv", *CAMERA, "--preset", "Reset To None", "--codec", "ffv1")
        self.assertEqual(frame_digests(out), frame_digests(clips.small))

    def test_the_road_through_bgra_and_back_is_true(self):
        # With another pixel format every frame is converted both ways. Only values below black are lost.
        source = self.out / "source.mkv"
        ffmpeg("-i", clips.small, "-fps_mode", "passthrough", "-pix_fmt", "yuv444p", "-c:v", "ffv1", source)
        for matrix in ("bt709", "smpte170m", "bt2020nc"):
            with self.subTest(matrix=matrix):
                tagged = self.out / (matrix + ".mkv")
                ffmpeg("-i", source, "-vf", f"setparams=colorspace={matrix}", "-c:v", "ffv1", tagged)
                out = self.render(tagged, matrix + "-out.mkv", *CAMERA, "--codec", "ffv1", "--pix-fmt",
                                  "yuv444p10le")
                self.assertGreater(luma_psnr(tagged, out), 44)

    def test_rotation_is_kept_and_effects_work_upright(self):
        turned = self.out / "turned.mp4"
        ffmpeg("-i", clips.small, "-c", "copy", "-metadata:s:v", "rotate=90", turned)
        out = self.render(turned, "out.mp4", *TRAIN)
        wanted = ("-select_streams", "v", "-show_entries", "stream_side_data=rotation")
        self.assertEqual(probe(out, *wanted), probe(turned, *wanted))
        # A vertical shake of the upright picture leaves a band at its top or bottom.
        raw = self.render(turned, "raw.bgra", *CAMERA, "--set", "Y Jitter=10", "--set", "Border=#00ff00",
                          "--raw-bgra", "--frames", "0:20").read_bytes()
        size, row = 180 * 320 * 4, 180 * 4
        green = b"\x00\xff\x00\xff"
        sides = tops = 0
        for frame in (raw[i:i + size] for i in range(0, len(raw), size)):
            middle = frame[160 * row:161 * row]
            sides += middle.startswith(green) or middle.endswith(green)
            tops += frame[90 * 4:91 * 4] == green or frame[319 * row + 90 * 4:319 * row + 91 * 4] == green
        self.assertGreater(tops, 10)
        self.assertEqual(sides, 0)


class Kinds(ReelfxTest):
    def test_containers_take_odd_sizes(self):
        # In a container of a constant rate, the first frame stands still for six places.
        for name, codec, frames in (("a.mp4", "h264", 5), ("a.mkv", "ffv1", 5), ("a.webm", "vp9", 5),
                                    ("a.avi", "ffv1", 10)):
            with self.subTest(name=name):
                out = self.render(clips.odd, name, *TRAIN, "--frames", "0:5")
                fields = probe(out, "-select_streams", "v", "-count_frames", "-show_entries",
                               "stream=codec_name,width,height,nb_read_frames")
                self.assertEqual(fields, [[codec, "161", "91", str(frames)]])

    def test_image_sequences_and_stills(self):
        self.render(clips.small, "in-%03d.png", *CAMERA, "--frames", "3:8")
        self.assertEqual(self.left_over(), [f"in-00{n}.png" for n in range(4, 9)])
        film = self.render(self.out / "in-%03d.png", "film.mp4", *CAMERA, "--rate", "12.5")
        fields = probe(film, "-count_frames", "-show_entries", "stream=r_frame_rate,nb_read_frames,pix_fmt")
        self.assertEqual(fields, [["yuv444p", "25/2", "5"]])
        still = self.render(self.out / "in-004.png", "still.png", *TRAIN)
        self.assertEqual(probe(still, "-show_entries", "stream=width,height"), [["320", "180"]])

    def test_pipes_speak_yuv4mpeg2(self):
        first = reelfx("render", clips.small, "-", *TRAIN)
        self.assertTrue(first.stdout.startswith(b"YUV4MPEG2 W320 H180"))
        reelfx("render", "-", self.out / "out.mkv", "--codec", "ffv1", *CAMERA, input=first.stdout)
        # The stream has a constant rate.
        direct = self.render(clips.small, "direct.mkv", *TRAIN, "--codec", "ffv1", "--fps", "90000/2999")
        self.assertEqual(frame_digests(self.out / "out.mkv"), frame_digests(direct))

    def test_frame_and_sheet_are_pictures(self):
        for command, name, options in (("frame", "f.png", TRAIN), ("sheet", "s.jpg", ("-e", "Film Camera"))):
            done = reelfx(command, clips.small, self.out / name, *options, "--frame", 5, "--width", 160)
            self.assertEqual((done.returncode, done.stderr), (0, b""))
            (width, height), = probe(self.out / name, "-show_entries", "stream=width,height")
            self.assertGreater(int(width), 320)
            self.assertGreater(int(height), 90)

    def picture(self, command, name, *options, source=None, **more):
        done = reelfx(command, source or clips.small, self.out / name, *options, **more)
        self.assertEqual((done.returncode, done.stderr), (0, b""))
        return self.out / name

    def test_a_sheet_shows_the_middle_unless_told(self):
        options = (*CAMERA, "--width", 64)
        middle = self.picture("sheet", "a.png", *options).read_bytes()
        self.assertEqual(middle, self.picture("sheet", "b.png", *options, "-n", 20).read_bytes())
        self.assertEqual(middle, self.picture("sheet", "c.png", *options, "--start",
                                              frame_times(clips.small)[20] - 0.001).read_bytes())
        raw = ffmpeg("-i", clips.small, "-frames:v", 9, "-f", "yuv4mpegpipe", "-")
        self.picture("sheet", "d.png", *options, source="-", input=raw)
        folder = self.picture("sheet", "sheets", "--all", "--width", 64)
        self.assertEqual(sorted(os.listdir(folder)), [f"film-{name}.png" for name in ("camera", "damage", "express",
                                                                                      "look", "pro")])
        self.assertEqual((folder / "film-camera.png").read_bytes(), middle)
        self.picture("sheet", "%s-x.jpg", "--all", "--width", 64, env=dict(os.environ, REELFX_EFFECT="Film Pro"))
        self.assertTrue((self.out / "film-pro-x.jpg").exists())

    def test_a_strip_shows_frames_as_they_are_rendered(self):
        effect = ("-e", "Film Damage", "-p", "Shredded", "--seed", 3)
        strip = self.picture("strip", "s.png", *effect, "--frame", 38, "--crop", "64x100+32+16")
        self.assertEqual(probe(strip, "-show_entries", "stream=width"), [[str(3 * 68 + 4)]])
        self.render(clips.small, "r-%d.png", *effect, "--frames", "38:")
        for place in range(3):
            shown = frame_digests(strip, "-vf", f"crop=64:100:{4 + place * 68}:32", "-pix_fmt", "rgb24")
            rendered = frame_digests(self.out / f"r-{39 + place}.png", "-vf", "crop=64:100:32:16", "-pix_fmt", "rgb24")
            self.assertEqual(shown, rendered)

    def test_preset_files_carry_settings(self):
        file = self.out / "mine.fxp"
        options = ("-e", "Film Look", "-p", "Sepia", "-s", "Saturation=12.5")
        self.assertEqual(reelfx("preset", "save", file, *options).returncode, 0)
        shown = json.loads(reelfx("preset", "show", file, "--json").stdout)
        values = {(p["name"], p["kind"]): p["value"] for p in shown["parameters"]}
        self.assertEqual((shown["name"], shown["effect"]), ("mine", "Film Look"))
        self.assertEqual(values["Saturation", "slider"], "12.5")
        self.assertEqual(self.digests("--preset-file", file, "--frames", "0:3"),
                         self.digests(*options, "--frames", "0:3"))


class Refusing(ReelfxTest):
    """Each invalid request ends with its exit code and one line, and leaves nothing behind."""

    def check(self, code, words, *args, **options):
        done = reelfx(*args, **options)
        text = done.stderr.decode()
        self.assertEqual(done.returncode, code, text)
        self.assertEqual(text.count("\n"), 1, text)
        for word in words:
            self.assertIn(word, text)

    def test_table(self):
        small, out, text = clips.small, self.out / "out.mp4", self.out / "text.mp4"
        text.write_text("no film")
        silent = clips.root / "sound.m4a"
        ffmpeg("-i", small, "-vn", "-c", "copy", silent)
        truncated = clips.root / "truncated.mp4"
        truncated.write_bytes(small.read_bytes()[:4000])
        picture, links = self.out / "p-1.png", (clips.root / "symbolic.mp4", clips.root / "hard.mp4")
        ffmpeg("-i", small, "-frames:v", 1, picture)
        links[0].symlink_to(small.name)
        links[1].hardlink_to(small)
        render = ("render", small, out)
        rows = [
            (2, ["Film Foo", "Film Pro"], (*render, "-e", "Film Foo")),
            (2, ["Nope", "Train Ride"], (*render, *CAMERA, "-p", "Nope")),
            (2, ["Wobble", "X Jitter"], (*render, *CAMERA, "-s", "Wobble=3")),
            (2, ["0 to 10", "11"], (*render, *CAMERA, "-s", "X Jitter=11")),
            (2, ["#RRGGBB", "red"], (*render, *CAMERA, "-s", "Border=red")),
            (2, ["NAME=VALUE"], (*render, *CAMERA, "-s", "X Jitter")),
            (2, ["--effect"], render),
            (2, ["did you mean \"Film Look\"?"], (*render, "-e", "Film Lok")),
            (2, ["did you mean \"Train Ride\"?"], (*render, *CAMERA, "-p", "Train")),
            (2, ["did you mean \"X Jitter\"?"], (*render, *CAMERA, "-s", "X Gitter=3")),
            (2, ["did you mean \"--effect\"? See"], (*render, "--efect", "Film Look")),
            (2, ["\"x\", \"y\""], ("info", small, "x", "y")),
            (2, ["ascend", "3@5 4@3"], (*render, *CAMERA, "-s", "X Jitter=3@5 4@3")),
            (2, ["0 to 100", "101"], (*render, *CAMERA, "--mix", "101")),
            (2, ["--effect", "twice", "--then"], (*render, *CAMERA, *CAMERA)),
            (2, ["--effect is missing"], (*render, *CAMERA, "--then", "--mix", "3")),
            (2, ["--random-state", "--then"], (*render, *CAMERA, "--random-state", "1f", "--then", *CAMERA)),
            (2, ["Film Camera", ".fxprela"], ("preset", "save", self.out / "p.fxprelb", *CAMERA)),
            (2, ["A:B"], (*render, *CAMERA, "--frames", "9223372036854775807:")),
            (2, ["change over time"], ("preset", "save", self.out / "p", *CAMERA, "-s", "X Jitter=3@5 4@9")),
            (2, ["is the input"], ("render", small, small.parent / "." / ".." / small.parent.name / small.name, *CAMERA, "-y")),
            (2, ["is the input"], ("render", f"file:{small}", links[0], *CAMERA, "-y")),
            (2, ["is the input"], ("render", small, f"file:{links[1]}", *CAMERA, "-y")),
            (2, ["is the input"], ("frame", picture, self.out / ".." / self.id() / picture.name, *CAMERA, "-y")),
            (2, ["is the input"], ("render", self.out / "p-%d.png", f"{self.out}/./p-%d.png", *CAMERA, "-y")),
            (2, ["frame, counted from 0", "\"-1\""], ("frame", small, self.out / "out.png", *CAMERA, "-n", "-1")),
            (2, ["no option \"--preset\""], ("sheet", small, self.out / "out.png", *CAMERA, "--preset", "Oldie")),
            (2, ["no command \"frobnicate\"", "render"], ("frobnicate", small)),
            (2, ["no command \"dance\"", "show"], ("preset", "dance")),
            (2, ["no option \"--verson\""], ("--verson",)),
            (2, ["command is missing"], ()),
            (2, ["--wrong"], (*render, *CAMERA, "--wrong")),
            (2, ["--seed"], (*render, *CAMERA, "--seed", "x")),
            (2, ["A:B"], (*render, *CAMERA, "--frames", "9:3")),
            (2, ["codec", "h265x"], (*render, *CAMERA, "--codec", "h265x")),
            (2, ["yuv9", "pixel format"], (*render, *CAMERA, "--pix-fmt", "yuv9")),
            (2, ["--format"], ("render", small, self.out / "out.unknown", *CAMERA)),
            (2, ["--progress", "often"], (*render, *CAMERA, "--progress", "often")),
            (2, ["libx264", "transparency"], (*render, "-e", "Film Damage", "--matte")),
            (2, ["yuv420p", "transparency"], ("render", small, self.out / "out.mkv", "-e", "Film Damage", "--matte",
                                                 "--pix-fmt", "yuv420p")),
            (2, ["Blue Channel Only=off"], (*render, "-e", "Film Damage", "-p", "Water Damage", "--matte")),
            (2, ["damage", "Film Camera"], (*render, *CAMERA, "--matte")),
            (2, ["Film Foo"], ("presets", "Film Foo")),
            (3, ["missing.mp4"], ("info", clips.root / "missing.mp4")),
            (2, ["one picture"], ("render", small, self.out / "out.png", *CAMERA)),
            (2, [".png or .jpg"], ("frame", small, self.out / "out.bmp", *CAMERA)),
            (3, ["missing.mp4"], ("render", clips.root / "missing.mp4", out, *CAMERA)),
            (3, ["text.mp4"], ("render", text, out, *CAMERA)),
            (3, ["truncated.mp4"], ("render", truncated, out, *CAMERA)),
            (3, ["no video"], ("render", silent, out, *CAMERA)),
            (3, ["folder"], ("render", clips.root, out, *CAMERA)),
            (3, ["no frame", "41"], (*render, *CAMERA, "--frames", "99:")),
            (3, ["no frame"], ("render", small, self.out / "i-%d.png", *CAMERA, "--no-sound", "--frames",
                 "9223372036854775806:")),
            (3, ["no frame 99"], ("frame", small, self.out / "out.png", *CAMERA, "--frame", "99")),
            (2, ["--all", "folder"], ("sheet", small, self.out / "out.png", "--all")),
            (2, ["--all", "--effect"], ("sheet", small, self.out / "new", "--all", *CAMERA)),
            (3, ["no frame 99"], ("sheet", small, self.out / "new", "--all", "--frame", "99")),
            (2, ["900x10 ", "320x180"], ("strip", small, self.out / "out.png", *CAMERA, "--crop", "900x10")),
            (2, ["pixels"], ("sheet", small, self.out / "out.png", *CAMERA, "--width", "8192", "--columns", "9")),
            (2, ["--crop", "9x9+1"], ("strip", small, self.out / "out.png", *CAMERA, "--crop", "9x9+1")),
            (3, ["not a preset"], (*render, "--preset-file", text)),
            (4, ["No such file"], ("render", small, self.out / "no" / "out.mp4", *CAMERA)),
            (4, ["already exists"], ("render", small, text, *CAMERA)),
            (4, ["folder"], ("render", small, self.out, *CAMERA, "--format", "mp4")),
        ]
        for code, words, args in rows:
            with self.subTest(args=args[1:]):
                self.check(code, words, *args)
                if args[:1] == ("render",):
                    self.check(code, words, *args, "--dry-run")
        self.assertEqual(self.left_over(), ["p-1.png", "text.mp4"])
        self.assertEqual(text.read_text(), "no film")

    def test_empty_pipe(self):
        self.check(3, ["standard input"], "render", "-", self.out / "out.mp4", *CAMERA, input=b"")
        header = b"YUV4MPEG2 W16 H16 F25:1 C420jpeg\n"
        self.check(3, ["no frame"], "render", "-", self.out / "out.mp4", *CAMERA, input=header)
        self.assertEqual(self.left_over(), [])

    def test_overwriting_replaces_when_done(self):
        out = self.render(clips.small, "out.mp4", *CAMERA, "--frames", "0:3")
        self.check(4, ["--overwrite"], "render", clips.small, out, *CAMERA)
        self.render(clips.small, "out.mp4", *CAMERA, "--frames", "0:5", "--overwrite")
        self.assertEqual(len(frame_times(out)), 5)
        self.assertEqual(self.left_over(), ["out.mp4"])


if __name__ == "__main__":
    unittest.main()
