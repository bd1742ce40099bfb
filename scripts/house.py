"""The floors of the house: which folders may include which, and what the #include lines say."""

import re
from dataclasses import dataclass
from fnmatch import fnmatch
from pathlib import Path

ROOT = Path(__file__).resolve().parent.parent

# From the ground up, each folder with its contents. A folder includes from itself and from the floors below, never
# from another folder of its own floor. An entry includes subfolders that are not listed; `*` stands for every folder
# there, each a part of its own.
FLOORS = [
    [("render", "pixels: the stages of a frame"),
     ("platform", "the system, the processor"),
     ("text", "strings, conversions, numbers")],
    [("api", "host_api.h, COM helpers")],
    [("effects", "tables, settings, sessions"),
     ("language", "texts in the user's language"),
     ("help", "topics, the compiled help")],
    [("user_presets", "presets that users save"),
     ("desktop", "dialogs, options, registry")],
    [("library", "what makes the DLL"),
     ("resources", "bitmaps of the dialogs")],
    [("faces/*", "the effects in other programs")],
    [("programs/common", "what the programs share")],
    [("programs/reelfx/common", "choices, output, progress"),
     ("programs/reelfx/conversion", "frames to pictures and back")],
    [("programs/reelfx/media", "readers, writers, sound"),
     ("programs/reelfx/loading", "FFmpeg at first use")],
    [("programs/reelfx/pictures", "sheets, grids, mattes")],
    [("programs/reelfx/pipeline", "workers")],
    [("programs/reelfx/commands", "one file per command")],
    [("programs/reelfx/reference", "man page, completion"),
     ("programs/reelfx", "the command line program"),
     ("programs/reelhost", "plays clips through the DLL"),
     ("programs/reelcheck", "checks the library's contract"),
     ("programs/*", "one of our programs")],
    [("bench", "measurements")],
]
# Sources outside the house: they may include anything, and nothing in the house includes them.
OUTSIDE = ["tests", "docs", "cmake", "build"]

SOURCES = {".c", ".cc", ".cpp", ".h", ".hpp", ".inc", ".in", ".rc"}
INCLUDE = re.compile(r'^\s*#\s*include\s*[<"]([^>"]+)[>"]')


@dataclass(frozen=True)
class Include:
    file: str  # that includes; from the root, as are all paths here
    line: int
    target: str


def folder_of(path):
    return str(Path(path).parent)


def place(folder, floors=FLOORS):
    """(floor counted from 0, name of the part of the house) of a folder; None when it has no floor."""
    words = folder.split("/")
    for length in range(len(words), 0, -1):
        part = "/".join(words[:length])
        for level, row in enumerate(floors):
            for pattern, _ in row:
                if pattern.count("/") == part.count("/") and fnmatch(part, pattern):
                    return level, part
    return None


def sources(root):
    for path in sorted(root.rglob("*")):
        inside = path.relative_to(root)
        if path.suffix in SOURCES and len(inside.parts) > 1 and inside.parts[0] not in OUTSIDE \
                and not inside.parts[0].startswith(".") and path.is_file() and not path.is_symlink():
            yield inside


def target_of(root, file, written):
    """The path that an include line means; None for headers outside the house (system, libraries, generated)."""
    if place(folder_of(written)) or written.split("/")[0] in OUTSIDE or (root / written).is_file():
        return written
    beside = root / folder_of(file) / written
    return str(beside.resolve().relative_to(root.resolve())) if beside.is_file() else None


def includes(root=ROOT):
    for inside in sources(root):
        text = (root / inside).read_text(encoding="utf-8", errors="replace")
        for number, line in enumerate(text.splitlines(), 1):
            found = INCLUDE.match(line)
            target = found and target_of(root, str(inside), found.group(1))
            if target:
                yield Include(str(inside), number, target)


def faults(root=ROOT):
    """What is wrong with the house, one line per fault: FILE:LINE: what."""
    found, seen = [], {}
    for inside in sources(root):
        if place(folder_of(inside)) is None:
            found.append(f"{inside}:1: {folder_of(inside)}/ has no floor; give it one in scripts/house.py")
    for include in includes(root):
        here, there = folder_of(include.file), folder_of(include.target)
        own, other = place(here), place(there)
        if own is None:
            continue
        where = f"{include.file}:{include.line}: includes {include.target}"
        if other is None:
            found.append(f"{where}, which is no part of the house")
        elif own[1] == other[1] and here != there:
            seen.setdefault((here, there), where)
        elif own[1] != other[1] and other[0] >= own[0]:
            beside = "on the same floor" if other[0] == own[0] else "on a floor above"
            found.append(f"{where}, but {other[1]}/ lies {beside}")
    for (here, there), where in seen.items():
        if (there, here) in seen and here < there:
            found.append(f"{where}, and {seen[there, here]}: two folders must not include each other")
    return found
