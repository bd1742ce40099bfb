#!/usr/bin/env python3
"""reelfx when disk, memory, input or patience runs out: no broken file under the final name, one line, the exit code.

    reelfx_faults_test.py [--rounds N] [--seed N]

The rounds send signals at random moments. Environment: REELFX.
"""

import argparse
import os
import random
import re
import resource
import signal
import subprocess
import sys
import time
import unittest
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "common"))
from clip import CLIP, Clips, REELFX, ffmpeg, frame_digests, reelfx, run  # noqa: E402

DAMAGE = ("--effect", "Film Pro", "--preset", "Super 8")
OPTIONS = argparse.Namespace(rounds=5, seed=None)
OLDER = {"older.mp4", "older.png", "older.fxp"}
NOBODY = {"user": 65534, "group": 65534} if os.geteuid() == 0 else {}


def setUpModule():
    global clips, y4m
    if not CLIP.exists():
        raise unittest.SkipTest("no clip: the package forensics-samples-files is missing")
    clips = Clips()
    clips.root.chmod(0o755)
    y4m = ffmpeg("-i", clips.small, "-pix_fmt", "yuv420p", "-f", "yuv4mpegpipe", "-")


def tearDownModule():
    clips.folder.cleanup()


def without_notes(text):
    """The lines that do not say what the output cannot hold."""
    notes = re.compile(" is left out| becomes | are repeated")
    return [line for line in text.splitlines() if not notes.search(line)]


class Commands(unittest.TestCase):
    def setUp(self):
        self.out = clips.root / self.id().split(".")[-1]
        self.out.mkdir()
        for name in OLDER:
            (self.out / name).write_text("older")

    def rows(self, folder=None, name="new", extra=()):
        """The commands that write files: (final name or first name of a pattern, arguments)."""
        folder = folder or self.out
        table = [(".mp4", "render", ()), (".mkv", "render", ("--codec", "ffv1")), ("-%03d.png", "render", ()),
                 (".png", "frame", ()), (".png", "sheet", ("--width", 64)), (".fxp", "preset", ())]
        for ending, command, options in table:
            target = folder / (name + ending)
            args = (("preset", "save", target, *DAMAGE, "--name", "x") if command == "preset" else
                    (command, clips.small, target, *(DAMAGE[:2] if command == "sheet" else DAMAGE), *options))
            yield target, (*args, *extra)

    def check_failed(self, done, codes, *words):
        """One line of ours; the codec's library may add its own when it is out of memory."""
        text = done.stderr.decode()
        ours = [line for line in without_notes(text) if not line.startswith("x264 [")]
        self.assertIn(done.returncode, codes, text)
        self.assertEqual(len(ours), 1, text)
        self.assertTrue(ours[0].startswith("reelfx: "), text)
        for word in words:
            self.assertIn(word, ours[0])

    def left_over(self):
        return sorted(set(os.listdir(self.out)) - OLDER)

    def check_older(self):
        for name in OLDER:
            self.assertEqual((self.out / name).read_text(), "older")


class Places(Commands):
    def test_file_size_limit(self):
        # Smaller than any result, and than the older files, which must stay untouched.
        def limit():
            resource.setrlimit(resource.RLIMIT_FSIZE, (600, 600))

        for target, args in self.rows():
            with self.subTest(args=args):
                self.check_failed(reelfx(*args, preexec_fn=limit), [4], "cannot be written")
        for ending, command in ((".mp4", "render"), (".png", "frame"), (".fxp", "preset")):
            for target, args in self.rows(name="older", extra=("--overwrite",)):
                if target.suffix == ending and args[0] == command and "%" not in str(target):
                    self.check_failed(reelfx(*args, preexec_fn=limit), [4])
        self.assertEqual(self.left_over(), [])
        self.check_older()

    def test_full_disk(self):
        # A small file system in a mount namespace of the test's own, which ends with it.
        disk = self.out / "disk"
        disk.mkdir()
        script = ('mount -t tmpfs -o size=64k none "$1" && cd "$1" && shift && head -c 57344 /dev/zero > full; '
                  '"$@"; code=$?; echo $(ls -A); exit $code')
        if run("unshare", "--mount", "true").returncode:
            self.skipTest("no right to mount")
        for target, args in self.rows(folder=disk):
            if args[0] == "preset":
                continue  # fits into the remaining block
            with self.subTest(args=args):
                done = run("unshare", "--mount", "sh", "-c", script, "sh", disk, REELFX, *args)
                self.check_failed(done, [4], "cannot be written")
                self.assertEqual(done.stdout, b"full\n")

    def test_standard_output_is_full(self):
        for args in (("render", clips.small, "-", *DAMAGE), ("render", clips.small, "--hash", *DAMAGE), ("list",),
                     ("render", clips.small, "/dev/full", "--format", "matroska", *DAMAGE)):
            with self.subTest(args=args), open("/dev/full", "wb") as full:
                done = subprocess.run([REELFX, *map(str, args)], stdout=full, stderr=subprocess.PIPE, timeout=300)
                self.check_failed(done, [4], "cannot be written")

    def test_closed_streams(self):
        """Files get no number of a standard stream, and no message is written into them."""
        options = (*DAMAGE, "--codec", "libx265")  # an encoder that warns at this size
        tiny = self.out / "tiny.mkv"
        ffmpeg("-i", clips.small, "-frames:v", "3", "-s", "64x48", "-c:v", "ffv1", tiny)
        for name, redirection in (("open.mkv", "2> /dev/null"), ("closed.mkv", "<&- >&- 2>&-")):
            script = f'exec "$@" {redirection}'
            self.assertEqual(run("sh", "-c", script, "sh", REELFX, "render", tiny, self.out / name, *options).returncode, 0)
        self.assertEqual((self.out / "open.mkv").read_bytes(), (self.out / "closed.mkv").read_bytes())

    def test_link_to_nothing(self):
        link = self.out / "link.mp4"
        link.symlink_to("target.mp4")
        self.assertEqual(reelfx("render", clips.small, link, *DAMAGE).returncode, 0)
        self.assertEqual((link.is_symlink(), (self.out / "target.mp4").is_file()), (True, True))

    def test_places_that_cannot_be_written(self):
        locked = self.out / "locked"
        locked.mkdir(mode=0o555)
        places = [(self.out / "missing", {}), (Path("/proc"), {})]
        try:
            run(REELFX, "--version", **NOBODY)
            places.append((locked, NOBODY))
        except PermissionError:
            pass  # root can open every folder, and no other user can run the programs here
        for folder, who in places:
            for _, args in self.rows(folder=folder):
                with self.subTest(args=args):
                    self.check_failed(reelfx(*args, **who), [4], "cannot be written")
        self.assertEqual(os.listdir(locked), [])

    def test_memory_runs_out(self):
        def limited(megabytes, *args):
            size = megabytes << 20
            return reelfx(*args, preexec_fn=lambda: resource.setrlimit(resource.RLIMIT_AS, (size, size)))

        if limited(4096, "--version").returncode:
            self.skipTest("the program reserves more than it uses")
        # The help of render names codecs, so the media libraries are loaded for it.
        least = next(size for size in range(100, 4096, 10) if limited(size, "render", "--help").returncode == 0)
        rows = list(self.rows())
        for number in range(10 if OPTIONS.rounds < 50 else 40):
            target, args = rows[number % len(rows)]
            with self.subTest(args=args, more=number):
                done = limited(least + 6 * number, *args)
                if done.returncode == 0:
                    self.assertTrue(self.left_over())
                else:
                    self.check_failed(done, [1], "not enough")
                    self.assertEqual(self.left_over(), [])
                for name in self.left_over():
                    (self.out / name).unlink()


class Input(Commands):
    def test_cut_off(self):
        """The readable frames are rendered, and an existing file stays."""
        front, raw = self.out / "front.mp4", self.out / "small.bgra"
        ffmpeg("-i", clips.small, "-c", "copy", "-movflags", "+faststart", front)
        ffmpeg("-i", clips.small, "-pix_fmt", "bgra", "-f", "rawvideo", raw)
        streams = {"mp4": front.read_bytes(), "y4m": y4m, "bgra": raw.read_bytes()}
        for ending, data in streams.items():
            size = ("--size", "320x180") if ending == "bgra" else ()
            cut = self.out / f"cut.{ending}"
            cut.write_bytes(data[:len(data) * 6 // 10])
            with self.subTest(ending=ending):
                target = self.out / f"{ending}.mkv"
                done = reelfx("render", cut, target, *DAMAGE, *size, "--codec", "ffv1")
                frames = len(frame_digests(target))
                self.assertGreater(frames, 10)
                self.check_failed(done, [3], cut.name, f"first {frames} frames")
                done = reelfx("render", cut, self.out / "older.mp4", *DAMAGE, *size, "--overwrite")
                self.check_failed(done, [3], "nothing was written")
                self.check_older()
        done = reelfx("render", "-", self.out / "pipe.mkv", *DAMAGE, input=y4m[:len(y4m) // 2])
        self.check_failed(done, [3], "standard input", "inside a frame")
        for source in ("-", self.out / "cut.y4m"):
            done = reelfx("frame", source, self.out / "x.png", *DAMAGE, "--frame", 40, input=y4m[:len(y4m) // 2])
            self.check_failed(done, [3], "inside a frame")
        # Decoders of pictures fill what is missing with grey or black, and bytes after a picture mean nothing.
        for ending, cut_at in (("jpg", 0.9), ("exr", 0.9), ("qoi", 0.9), ("sun", 0.9), ("gif", 0.9), ("gif", -1)):
            with self.subTest(ending=ending):
                whole, cut = self.out / f"whole.{ending}", self.out / f"part.{ending}"
                words = "cut off" if ending == "gif" else "inside a frame"
                ffmpeg("-i", clips.small, "-frames:v", "5" if ending == "gif" else "1", "-y", whole)
                data = whole.read_bytes()
                cut.write_bytes(data[:int(len(data) * cut_at) if cut_at > 0 else cut_at])
                self.check_failed(reelfx("render", cut, "--hash", *DAMAGE), [3], words)
                if words == "inside a frame":
                    self.check_failed(reelfx("frame", cut, self.out / "x.png", *DAMAGE), [3], words)
                whole.write_bytes(data + b"more")
                self.assertEqual(reelfx("render", whole, "--hash", *DAMAGE).returncode, 0)
        # This container stores its own length, but not where its last frame is.
        film = self.out / "film.mkv"
        ffmpeg("-i", clips.small, "-c", "copy", film)
        (self.out / "cut.mkv").write_bytes(film.read_bytes()[:film.stat().st_size * 4 // 10])
        self.check_failed(reelfx("render", self.out / "cut.mkv", self.out / "x.mp4", *DAMAGE), [3], "cut off", "first")

    def test_index_at_the_end(self):
        """A redirected file is read as a named one; a pipe cannot be."""
        film = self.out / "film.mp4"
        ffmpeg("-i", clips.small, "-c", "copy", film)
        with film.open("rb") as stream:
            done = reelfx("render", "-", "--hash", *DAMAGE, stdin=stream)
        self.assertEqual((done.returncode, done.stdout), (0, reelfx("render", film, "--hash", *DAMAGE).stdout))
        self.check_failed(reelfx("render", "-", "--hash", *DAMAGE, input=film.read_bytes()), [3], "index", "pipe")

    def while_it_runs(self, args, action):
        """Runs a render and lets `action` happen once it has begun to write, while it is paused."""
        program = subprocess.Popen([REELFX, "render", *map(str, args), "-j", "1"], stderr=subprocess.PIPE)
        while program.poll() is None and not any(name.startswith(".reelfx-") for name in os.listdir(self.out)):
            time.sleep(0.001)
        program.send_signal(signal.SIGSTOP)
        action()
        program.send_signal(signal.SIGCONT)
        text = program.communicate(timeout=300)[1]
        return subprocess.CompletedProcess(args, program.returncode, b"", text)

    def test_removed_while_it_is_read(self):
        source, whole, out = self.out / "source.mp4", self.out / "whole.mkv", self.out / "out.mkv"
        lossless = (*DAMAGE, "--codec", "ffv1")
        reelfx("render", clips.small, whole, *lossless)
        source.write_bytes(clips.small.read_bytes())
        done = self.while_it_runs((source, out, *lossless), source.unlink)
        self.assertEqual((done.returncode, done.stderr), (0, b""))  # files that are open stay open
        self.assertEqual(frame_digests(out), frame_digests(whole))
        pictures = clips.root / "pictures"
        pictures.mkdir()
        ffmpeg("-stream_loop", "5", "-i", clips.small, "-fps_mode", "passthrough", pictures / "in-%03d.png")
        last = sorted(pictures.iterdir())[150:]
        done = self.while_it_runs((pictures / "in-%03d.png", self.out / "part.mkv", *lossless),
                                  lambda: [path.unlink() for path in last])
        self.check_failed(done, [3], "in-%03d.png", "contains the first 150 frames")
        self.assertEqual(len(frame_digests(self.out / "part.mkv")), 150)


class Signals(Commands):
    def test_waiting_for_input_ends(self):
        """The finished part stays and can be played, but does not replace an older file."""
        for name, data, left in (("none.mp4", b"", []), ("new.mp4", y4m, ["new.mp4"]), ("older.mp4", y4m, ["new.mp4"])):
            with self.subTest(name=name, frames=bool(data)):
                program = subprocess.Popen([REELFX, "render", "-", str(self.out / name), *DAMAGE, "--overwrite"],
                                           stdin=subprocess.PIPE, stderr=subprocess.PIPE)
                program.stdin.write(data)
                program.stdin.flush()
                time.sleep(2)
                program.send_signal(signal.SIGTERM if data else signal.SIGINT)
                self.assertEqual(program.wait(30), 130)
                text = program.stderr.read()
                program.stdin.close()
                program.stderr.close()
                self.assertEqual((text.count(b"\n"), self.left_over()), (1, left), text)
                self.check_older()
                if name == "new.mp4":
                    frames = len(frame_digests(self.out / name))
                    self.assertGreater(frames, 0)
                    self.assertIn(f"first {frames} frames".encode(), text)

    def references(self):
        """For each command: how long it takes, and its files when complete."""
        for target, args in list(self.rows(name="whole")):
            begin = time.monotonic()
            self.assertEqual(reelfx(*args).returncode, 0)
            yield time.monotonic() - begin, {n.removeprefix("whole"): (self.out / n).read_bytes()
                                             for n in self.left_over() if n.startswith("whole")}
            for name in self.left_over():
                (self.out / name).unlink()

    def check_round(self, target, args, sent, delay, whole):
        older = {name for name in self.left_over() if name.startswith(".reelfx-")}
        program = subprocess.Popen([REELFX, *map(str, args)], stderr=subprocess.PIPE)
        time.sleep(delay)
        program.send_signal(sent)
        text = program.communicate(timeout=300)[1].decode()
        code = program.returncode
        hidden = {name for name in self.left_over() if name.startswith(".reelfx-")} - older
        files = {name: (self.out / name).read_bytes() for name in self.left_over() if name not in hidden | older}
        about = f"{args} {sent} after {delay:.3f} s: {code} {text} {list(files)} {hidden}"
        lines = len(without_notes(text))
        if code == 130:
            self.assertEqual(lines, 1, about)
            if files and target.suffix in (".mp4", ".mkv"):
                self.assertIn(f"first {len(frame_digests(target))} frames", text, about)
                files = {}
        else:
            # A signal may arrive before the program handles it.
            self.assertIn(code, (0, -sent), about)
            self.assertEqual(lines, 0, about)
        for name, data in files.items():
            self.assertEqual(data, whole[name.removeprefix("new")], about)
        if code == 0:
            self.assertEqual(len(files), len(whole), about)
        if sent != signal.SIGKILL:
            self.assertEqual(hidden, set(), about)
        return bool(hidden)

    def test_random_moments(self):
        seed = OPTIONS.seed if OPTIONS.seed is not None else random.SystemRandom().randrange(1 << 32)
        print(f"reelfx_faults: seed {seed}, {OPTIONS.rounds} rounds", file=sys.stderr)
        numbers = random.Random(seed)
        references = list(self.references())
        rows = list(self.rows())
        left = 0
        for _ in range(OPTIONS.rounds):
            which = numbers.choice([0, 0, 0, 1, 2, 2, 3, 4, 5])
            sent = numbers.choice([signal.SIGINT, signal.SIGTERM, signal.SIGHUP, signal.SIGKILL])
            seconds, whole = references[which]
            left += self.check_round(*rows[which], sent, numbers.uniform(0, 1.1 * seconds), whole)
            for name in self.left_over():
                if not name.startswith("."):
                    (self.out / name).unlink()
        # The next command removes whatever the killed ones left behind.
        self.assertEqual(reelfx("preset", "save", self.out / "next.fxp", *DAMAGE).returncode, 0)
        self.assertEqual(self.left_over(), ["next.fxp"])
        print(f"figure: reelfx under faults = {OPTIONS.rounds} signals at random moments, {left} folders left and "
              f"cleaned, seed {seed}", file=sys.stderr)


if __name__ == "__main__":
    parser = argparse.ArgumentParser()
    parser.add_argument("--rounds", type=int, default=OPTIONS.rounds)
    parser.add_argument("--seed", type=int)
    OPTIONS, rest = parser.parse_known_args()
    unittest.main(argv=[sys.argv[0], *rest])
