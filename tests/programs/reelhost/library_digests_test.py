"""The DLL under Wine and the native core produce the same bytes: every preset of every effect, 20 frames each.

Environment: REELHOST is the Windows host, next to the DLL; WINE32 the program that runs it; REELFX the native host.
"""

import os
import re
import sys
import tempfile
from concurrent.futures import ThreadPoolExecutor
from pathlib import Path

sys.path.insert(0, str(Path(__file__).resolve().parents[2] / "common"))
from clip import CLIP, REELFX, ffmpeg, reelfx, run  # noqa: E402

FRAMES = 20
SIZE = "160x90"
PRESETS = 81


def main():
    if not Path(REELFX).is_file() or not CLIP.exists():
        print("skipped: no native build of reelfx, or no clip")
        return 77
    with tempfile.TemporaryDirectory(prefix="velmora-hosts-") as folder:
        raw = Path(folder) / "frames.bgra"
        ffmpeg("-i", CLIP, "-vf", "scale=" + SIZE.replace("x", ":"), "-frames:v", FRAMES, "-pix_fmt", "bgra",
               "-f", "rawvideo", raw)
        with open(raw, "rb") as frames:
            done = run(os.environ["WINE32"], os.environ["REELHOST"], "--all-presets", "all", "--size", SIZE,
                       stdin=frames)
        assert done.returncode == 0, done.stderr.decode()
        blocks = re.split(r'effect "(.*)" preset "(.*)" random state (\S+)\n', done.stdout.decode().replace("\r", ""))

        def compare(block):
            effect, preset, state, digests = block
            own = reelfx("render", raw, "--size", SIZE, "--rate", 30, "--effect", effect, "--preset", preset,
                         "--random-state", state, "--hash").stdout.decode()
            equal = own == digests and digests.count("\n") == FRAMES
            return None if equal else f"{effect}: {preset}, state {state}: frames differ"

        jobs = [blocks[i:i + 4] for i in range(1, len(blocks), 4)]
        with ThreadPoolExecutor(2) as pool:
            failures = [text for text in pool.map(compare, jobs) if text]
    print(f"{len(jobs)} presets of {FRAMES} frames compared, {len(failures)} differ", *failures, sep="\n")
    return 1 if failures or len(jobs) != PRESETS else 0


sys.exit(main())
