"""A clip rendered in four parts, with GNU parallel and with a real scheduler, equals the clip rendered whole."""

import os
import shutil
import socket
import subprocess
import sys
import tempfile
import time
import unittest
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "common"))
from clip import CLIP, Clips, REELFX, ffmpeg, frame_digests, frame_times, reelfx, run  # noqa: E402

SCRIPTS = Path(__file__).resolve().parents[3] / "scripts"
OPTIONS = ("-e", "Film Pro", "-p", "Super 8", "--seed", "7")
LOSSLESS = (*OPTIONS, "--codec", "ffv1")


def setUpModule():
    global clips, whole
    if not CLIP.exists():
        raise unittest.SkipTest("no clip: the package forensics-samples-files is missing")
    clips = Clips()
    whole = clips.root / "whole.mkv"
    assert reelfx("render", clips.small, whole, *LOSSLESS).returncode == 0


def tearDownModule():
    clips.folder.cleanup()


def sound_digest(path):
    return ffmpeg("-i", path, "-map", "0:a", "-c", "copy", "-f", "md5", "-")


class FarmTest(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory(prefix="velmora-farm-")
        self.addCleanup(folder.cleanup)
        self.root = Path(folder.name)

    def assert_whole(self, joined):
        self.assertEqual(frame_digests(joined), frame_digests(whole))
        self.assertEqual(sound_digest(joined), sound_digest(whole))
        pairs = zip(frame_times(joined), frame_times(whole), strict=True)
        # Matroska timestamps are in milliseconds.
        self.assertLess(max(abs(one - other) for one, other in pairs), 0.0015)


class Parts(FarmTest):
    def test_parts_lie_side_by_side(self):
        wanted = reelfx("render", clips.small, "--hash", *OPTIONS).stdout
        for parts in (1, 4, 41):
            with self.subTest(parts=parts):
                done = [reelfx("render", clips.small, "--hash", *OPTIONS, "--farm", f"{n}/{parts}").stdout
                        for n in range(1, parts + 1)]
                self.assertTrue(all(done))
                self.assertEqual(b"".join(done), wanted)

    def test_parts_begin_inside_groups_of_pictures(self):
        # Frames that depend on later ones, groups that depend on each other, containers with and without an index.
        source = self.root / "source.mp4"
        ffmpeg("-f", "lavfi", "-i", "testsrc2=size=160x90:rate=25:duration=8", "-c:v", "libx264", "-x264-params",
               "keyint=9:min-keyint=3:bframes=4:open-gop=1:b-pyramid=normal", source)
        for ending in (".mp4", ".mkv", ".ts", ".nut"):
            with self.subTest(ending=ending):
                clip = self.root / ("clip" + ending)
                ffmpeg("-i", source, "-c", "copy", clip)
                wanted = reelfx("render", clip, "--hash", *OPTIONS).stdout
                done = [reelfx("render", clip, "--hash", *OPTIONS, "--farm", f"{n}/7").stdout for n in range(1, 8)]
                self.assertEqual(b"".join(done), wanted)
                self.assertTrue(all(done))

    def test_parts_of_image_sequences(self):
        pattern = self.root / "s-%03d.png"
        ffmpeg("-i", clips.small, "-frames:v", "10", "-start_number", "3", pattern)
        wanted = reelfx("render", pattern, "--hash", *OPTIONS).stdout
        self.assertEqual(wanted.count(b"\n"), 10)
        done = [reelfx("render", pattern, "--hash", *OPTIONS, "--farm", f"{n}/3").stdout for n in (1, 2, 3)]
        self.assertEqual(b"".join(done), wanted)

    def test_images_of_all_parts_share_a_folder(self):
        for part in (2, 1, 3):
            done = reelfx("render", clips.small, self.root / "f-%03d.png", "-e", "Film Camera", "--farm", f"{part}/3")
            self.assertEqual(done.returncode, 0, done.stderr)
        # The first frame stands still for six places.
        self.assertEqual(sorted(os.listdir(self.root)), [f"f-{n:03}.png" for n in range(1, 47)])
        whole = self.root / "whole"
        whole.mkdir()
        reelfx("render", clips.small, whole / "f-%03d.png", "-e", "Film Camera")
        for image in whole.iterdir():
            self.assertEqual(image.read_bytes(), (self.root / image.name).read_bytes(), image.name)

    def test_images_of_a_stream_without_times(self):
        raw = self.root / "raw.h264"
        ffmpeg("-i", clips.small, "-frames:v", "12", "-c:v", "libx264", raw)
        for part in (1, 2, 3):
            reelfx("render", raw, self.root / "r-%03d.png", "-e", "Film Camera", "--farm", f"{part}/3")
        self.assertEqual(sorted(os.listdir(self.root)), [f"r-{n:03}.png" for n in range(1, 13)] + ["raw.h264"])

    def test_wrong_wishes(self):
        for code, word, options in (
                (2, "N/M", ("--farm", "5/4")), (2, "N/M", ("--farm", "4")), (2, "41 frames", ("--farm", "1/42")),
                (2, "--frames", ("--farm", "1/2", "--frames", "0:9")),
                (2, "--random-state", ("--farm", "1/2", "--random-state", "1"))):
            with self.subTest(options=options):
                done = reelfx("render", clips.small, "--hash", *OPTIONS, *options)
                self.assertEqual((done.returncode, done.stderr.count(b"\n"), done.stdout), (code, 1, b""))
                self.assertIn(word, done.stderr.decode())


class Joining(FarmTest):
    def test_gnu_parallel(self):
        if not shutil.which("parallel"):
            self.skipTest("parallel is missing")
        part = self.root / "it's part {}.mkv"
        done = run("parallel", "-q", "-j", 2, REELFX, "render", clips.small, part, *LOSSLESS, "--farm", "{}/4", ":::",
                   *"1234")
        self.assertEqual(done.returncode, 0, done.stderr.decode())
        parts = [str(part).replace("{}", n) for n in "1234"]
        done = run(SCRIPTS / "reelfx-farm-join", clips.small, self.root / "joined.mkv", *parts)
        self.assertEqual((done.returncode, done.stderr), (0, b""))
        self.assert_whole(self.root / "joined.mkv")
        for number, (some, word) in enumerate(((parts[:3], b"missing"), (parts[1::-1] + parts[2:], b"order"))):
            done = run(SCRIPTS / "reelfx-farm-join", clips.small, self.root / f"{number}.mkv", *some)
            self.assertEqual((done.returncode, word in done.stderr), (0, True), done.stderr)

    def test_times_and_sound_in_other_containers(self):
        for ending, codec in ((".mp4", "libx264"), (".mov", "prores_ks")):
            with self.subTest(ending=ending):
                parts = [self.root / (n + ending) for n in "123"]
                for n, part in zip("123", parts):
                    self.assertEqual(reelfx("render", clips.small, part, *OPTIONS, "--codec", codec, "--farm",
                                            n + "/3").returncode, 0)
                joined = self.root / ("joined" + ending)
                done = run(SCRIPTS / "reelfx-farm-join", clips.small, joined, *parts)
                self.assertEqual((done.returncode, done.stderr), (0, b""))
                self.assertEqual(frame_times(joined), frame_times(clips.small))
                self.assertEqual(sound_digest(joined), sound_digest(clips.small))

    def test_a_failing_join_leaves_nothing(self):
        out, broken = self.root / "out.mkv", self.root / "broken.mkv"
        broken.write_text("no film")
        for code, arguments in ((2, (clips.small, out)), (3, (clips.small, out, self.root / "missing.mkv")),
                                (3, (clips.small, out, broken)), (4, (clips.small, broken, whole)),
                                (4, (clips.small, self.root / "no" / "out.mkv", whole))):
            with self.subTest(arguments=arguments):
                done = run(SCRIPTS / "reelfx-farm-join", *arguments)
                self.assertEqual((done.returncode, done.stderr.count(b"\n")), (code, 1), done.stderr)
        self.assertEqual(os.listdir(self.root), ["broken.mkv"])


def free_port():
    with socket.socket() as probe:
        probe.bind(("127.0.0.1", 0))
        return probe.getsockname()[1]


class Cluster:
    """A Slurm cluster of this one machine, with all its files in its own folder."""

    def __init__(self, root):
        self.root, self.programs = root, []
        self.environment = dict(os.environ, SLURM_CONF=str(root / "slurm.conf"), REELFX=REELFX)
        name, user = socket.gethostname().split(".")[0], subprocess.check_output(["id", "-un"], text=True).strip()
        for folder in ("state", "spool"):
            (root / folder).mkdir()
        (root / "munge.key").write_bytes(os.urandom(128))
        (root / "munge.key").chmod(0o400)
        (root / "slurm.conf").write_text(f"""\
ClusterName=film
SlurmctldHost={name}(127.0.0.1)
SlurmUser={user}
SlurmdUser={user}
SlurmctldPort={free_port()}
SlurmdPort={free_port()}
AuthType=auth/munge
AuthInfo=socket={root}/munge.sock
CredType=cred/munge
StateSaveLocation={root}/state
SlurmdSpoolDir={root}/spool
SlurmctldPidFile={root}/slurmctld.pid
SlurmdPidFile={root}/slurmd.pid
ProctrackType=proctrack/pgid
TaskPlugin=task/none
JobAcctGatherType=jobacct_gather/none
AccountingStorageType=accounting_storage/none
SelectType=select/cons_res
SelectTypeParameters=CR_CPU
SwitchType=switch/none
MpiDefault=none
SlurmdParameters=config_overrides
NodeName={name} NodeAddr=127.0.0.1 CPUs=2
PartitionName=all Nodes=ALL Default=YES
""")
        self.start("munged", "-F", "-f", *(f"--{what}={root}/munge.{ending}" for what, ending in (
            ("socket", "sock"), ("key-file", "key"), ("pid-file", "pid"), ("log-file", "log"), ("seed-file", "seed"))))
        while not (root / "munge.sock").exists():
            time.sleep(0.1)
        self.start("slurmctld", "-D")
        self.start("slurmd", "-D", "-N", name)
        self.wait_for_the_machine()

    def start(self, *command):
        with open(self.root / (command[0] + ".out"), "w") as log:
            self.programs.append(subprocess.Popen(command, stdout=log, stderr=log, env=self.environment))

    def wait_for_the_machine(self):
        for _ in range(120):
            seen = subprocess.run(["sinfo", "-h", "-o", "%T"], capture_output=True, text=True, env=self.environment)
            if seen.stdout.strip() in ("idle", "mixed"):
                return
            if any(program.poll() is not None for program in self.programs):
                break
            time.sleep(0.5)
        raise AssertionError("the cluster does not start: " + self.logs())

    def logs(self):
        return "\n".join(file.read_text()[-800:] for file in sorted(self.root.glob("*.out")))

    def stop(self):
        for program in reversed(self.programs):
            program.terminate()
            program.wait(30)


class Scheduler(FarmTest):
    def setUp(self):
        super().setUp()
        for program in ("sbatch", "slurmctld", "slurmd", "munged"):
            if not shutil.which(program, path=os.environ["PATH"] + ":/usr/sbin"):
                self.skipTest(f"{program} is missing")
        os.environ["PATH"] += ":/usr/sbin"
        folder = tempfile.TemporaryDirectory(prefix="velmora-slurm-")
        self.addCleanup(folder.cleanup)
        self.cluster = Cluster(Path(folder.name))
        self.addCleanup(self.cluster.stop)

    def farm(self, *arguments):
        return run(SCRIPTS / "reelfx-farm-slurm", "--wait", *arguments, env=self.cluster.environment)

    def test_four_parts_and_their_join(self):
        joined = self.root / "a film.mkv"
        done = self.farm(4, clips.small, joined, *LOSSLESS)
        self.assertEqual((done.returncode, done.stderr), (0, b""), self.cluster.logs())
        self.assert_whole(joined)
        self.assertEqual(os.listdir(self.root), ["a film.mkv"])
        # An invalid request is reported before anything is submitted; a failing part when it has failed.
        done = self.farm(4, clips.small, self.root / "b.mkv", "-e", "Film Foo")
        self.assertEqual((done.returncode, done.stdout), (2, b""))
        self.assertIn(b"Film Foo", done.stderr)
        stub = self.root / "reelfx"
        stub.write_text(f'#!/bin/sh\ncase "$*" in *2/4*) exit 3 ;; esac\nexec {REELFX} "$@"\n')
        stub.chmod(0o755)
        self.cluster.environment["REELFX"] = str(stub)
        done = self.farm(4, clips.small, self.root / "c.mkv", *OPTIONS)
        self.assertEqual(done.returncode, 1)
        self.assertIn(b"c.mkv.parts", done.stderr)
        self.assertFalse((self.root / "c.mkv").exists())


if __name__ == "__main__":
    unittest.main()
