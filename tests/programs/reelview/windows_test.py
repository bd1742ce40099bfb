"""Drives reelview through its windows, then compares the frames that it saved with those of reelhost.

Environment: WINE32 is the script that runs Windows programs; WINDOW_TEST, REELVIEW, RECORDER and REELHOST are build
results. FILTER limits the window tests; MONKEY_SECONDS and MONKEY_SEED are for the monkey test.
"""

import os
import shlex
import struct
import subprocess
import sys
import tempfile
from pathlib import Path

WINE32 = os.environ["WINE32"]
TEST, REELVIEW, RECORDER, REELHOST = (os.environ[name] for name in ("WINDOW_TEST", "REELVIEW", "RECORDER", "REELHOST"))


def ffmpeg(*arguments, **options):
    return subprocess.run(["ffmpeg", "-v", "error", "-y", *map(str, arguments)], check=True, **options)


def windows(path):
    return "Z:" + str(path).replace("/", "\\")


def make_media(folder):
    source = ("-f", "lavfi", "-i")
    ffmpeg(*source, "testsrc2=s=64x48:r=25:d=0.48", "-pix_fmt", "yuv420p", folder / "small.y4m")
    ffmpeg(*source, "testsrc2=s=320x180:r=25:d=0.48", "-pix_fmt", "yuv420p", folder / "wide.y4m")
    ffmpeg(*source, "testsrc2=s=640x360:r=25:d=8", "-pix_fmt", "yuv420p", folder / "long.y4m")
    ffmpeg(*source, "testsrc2=s=64x48:r=25:d=0.48", "-c:v", "rawvideo", "-pix_fmt", "bgr24", folder / "plain.avi")
    ffmpeg(*source, "testsrc2=s=64x48:r=25:d=0.48", folder / "seq%02d.png")
    ffmpeg(*source, "color=white:s=320x200", "-frames:v", 1, folder / "white.png")
    for kind in ("png", "jpg", "bmp", "tif"):
        ffmpeg(*source, "testsrc2=s=64x48", "-frames:v", 1, "-update", 1, *(("-pix_fmt", "rgb24") if kind == "tif" else ()),
               folder / f"picture.{kind}")
    # The head of an Exif block: one entry, tag 274, a 16-bit 6: a quarter turn to the right.
    exif = b"MM\0*" + struct.pack(">IHHHIHHI", 8, 1, 274, 3, 1, 6, 0, 0)
    jpeg = (folder / "picture.jpg").read_bytes()
    (folder / "turned.jpg").write_bytes(jpeg[:2] + b"\xff\xe1" + struct.pack(">H", len(exif) + 8) + b"Exif\0\0" + exif + jpeg[2:])
    write_turned_tiff(folder / "turned.tif")
    (folder / "empty.png").touch()
    (folder / "text.mp4").write_text("This is no film.\n" * 100)
    (folder / "cut.png").write_bytes((folder / "picture.png").read_bytes()[:300])
    (folder / "cut.avi").write_bytes((folder / "plain.avi").read_bytes()[:200])
    (folder / "header.y4m").write_bytes(b"YUV4MPEG2 W64 H48 F25:1 C420jpeg\nFRAME\nshort")
    (folder / "huge.y4m").write_bytes(b"YUV4MPEG2 W32000 H32000 F25:1 C444\nFRAME\n")


def write_turned_tiff(path):
    """64 x 48 pixels, grey, dark on the left: a quarter turn to the right brings the dark side to the top."""
    pixels = bytes(4 * x for x in range(64)) * 48
    entries = [(256, 64), (257, 48), (258, 8), (259, 1), (262, 1), (273, 8), (274, 6), (277, 1), (278, 48),
               (279, len(pixels))]
    table = b"".join(struct.pack("<HHII", tag, 4 if tag in (273, 279) else 3, 1, value) for tag, value in entries)
    path.write_bytes(b"II*\0" + struct.pack("<I", 8 + len(pixels)) + pixels + struct.pack("<H", len(entries)) + table +
                     b"\0\0\0\0")


def run_tests(folder, filter_, **more):
    environment = {**os.environ, **more, "REELVIEW": windows(REELVIEW), "REELVIEW_RECORDER": windows(RECORDER),
                   "REELVIEW_MEDIA": windows(folder)}
    return subprocess.run([WINE32, TEST, f"--gtest_filter={filter_}"], env=environment).returncode


def pixels(path, *options):
    return ffmpeg("-i", path, *options, "-f", "rawvideo", "-pix_fmt", "bgr24", "-", stdout=subprocess.PIPE).stdout


def check_saved(folder):
    """Film Look's first preset draws no random numbers, so both programs give the same bytes."""
    saved = (folder / "saved.y4m").read_bytes()
    command = shlex.split((folder / "command.txt").read_text())  # what follows the file names
    assert command[:2] == ["--effect", "Film Look"] and "--set" in command, command
    for options in (["--effect", "Film Look", "--preset", "Black N White"], command):
        with open(folder / "small.y4m", "rb") as clip:
            rendered = subprocess.run([WINE32, REELHOST, *options], stdin=clip, stdout=subprocess.PIPE,
                                      stderr=subprocess.DEVNULL, check=True).stdout
        assert rendered.count(b"FRAME\n") == 12
        assert saved.split(b"FRAME\n")[1:] == rendered.split(b"FRAME\n")[1:], f"the saved film is not that of {options}"
    film = pixels(folder / "saved.avi")
    assert len(film) == 12 * 64 * 48 * 3 and film == pixels(folder / "saved%04d.png"), "AVI and PNG differ"
    assert pixels(folder / "frame.png") == film[:64 * 48 * 3], "the saved frame is another"
    assert len(pixels(folder / "codec.avi")) == len(film), "saved through the codec dialog"
    assert pixels(folder / "copied.bmp") == pixels(folder / "frame.png"), "the copied frame is another"
    assert not [path for path in folder.iterdir() if "unfinished" in path.name]


def main():
    filter_ = os.environ.get("FILTER", "*")
    # A folder whose name has no 8-bit form, as users have them.
    with tempfile.TemporaryDirectory(prefix="reelview-\u6620\u753b-") as name:
        folder = Path(name)
        make_media(folder)
        failed = run_tests(folder, filter_, REELVIEW_PRESETS_WORD="Presets")
        if filter_ == "*":
            failed |= run_tests(folder, "*Language*:*Controls*", REELVIEW_PRESETS_WORD="プリセット",
                                VELMORA_LOCALE="ja_JP.UTF-8")
            if not failed:
                check_saved(folder)
    sys.exit(1 if failed else 0)


main()
