"""Shared by the tests of the command-line hosts: programs, and small versions of the phone clip."""

import os
import re
import subprocess
import tempfile
from pathlib import Path

CLIP = Path("/usr/share/forensics-samples/original-files/movie1/VID_20191220_170832.mp4")
REELFX = os.environ.get("REELFX", "")


def run(*args, **options):
    options.setdefault("timeout", 300)
    return subprocess.run([str(a) for a in args], capture_output=True, **options)


def run_host(*args, **options):
    """Runs a program that loads our plug-ins, up to three times if it hangs.

    The preloaded sanitizer and the start-up of libraries that melt loads (translations, TLS) can deadlock. Our code is
    not involved and holds no locks.
    """
    for tries in range(3):
        try:
            return run(*args, **dict(options, timeout=60))
        except subprocess.TimeoutExpired:
            if tries == 2:
                raise


def ffmpeg(*args):
    done = run("ffmpeg", "-nostdin", "-v", "error", "-y", *args)
    assert done.returncode == 0, done.stderr.decode()
    return done.stdout


def reelfx(*args, **options):
    return run(REELFX, *args, **options)


def probe(path, *entries):
    """The values that ffprobe prints for the entries, one list of fields per line."""
    done = run("ffprobe", "-v", "error", *entries, "-of", "csv=p=0", path)
    assert done.returncode == 0, done.stderr.decode()
    return [line.rstrip(",").split(",") for line in done.stdout.decode().split()]


def frame_times(path):
    lines = probe(path, "-select_streams", "v", "-show_entries", "packet=pts_time")
    return sorted(float(line[0]) for line in lines)


def frame_digests(path, *options):
    """MD5 of each decoded frame, without its timestamp."""
    text = ffmpeg("-i", path, "-map", "0:v", "-fps_mode", "passthrough", *options, "-f", "framemd5", "-").decode()
    return [line.split(",")[-1].strip() for line in text.splitlines() if not line.startswith("#")]


def luma_psnr(one, other):
    graph = "[0:v]settb=1/25,setpts=N[a];[1:v]settb=1/25,setpts=N[b];[a][b]psnr"
    done = run("ffmpeg", "-nostdin", "-i", one, "-i", other, "-lavfi", graph, "-f", "null", "-")
    return float(re.search(r"PSNR y:(\S+)", done.stderr.decode()).group(1))


class Clips:
    """Small versions of the clip in a folder of their own: the same 41 frames, times, sound and colours."""

    def __init__(self):
        self.folder = tempfile.TemporaryDirectory(prefix="velmora-hosts-")
        self.root = Path(self.folder.name)
        self.small = self.root / "small.mp4"
        ffmpeg("-i", CLIP, "-fps_mode", "passthrough", "-vf", "scale=320:180", "-c:v", "libx264", "-preset",
               "ultrafast", "-enc_time_base", "1/90000", "-c:a", "copy", self.small)
        self.odd = self.root / "odd.mkv"
        ffmpeg("-i", self.small, "-fps_mode", "passthrough", "-vf", "scale=161:91", "-pix_fmt", "yuv444p",
               "-c:v", "ffv1", "-c:a", "copy", self.odd)
