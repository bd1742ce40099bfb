"""Shared by the package tests: packs as two different users would, and looks into the results."""

import hashlib
import os
import subprocess
import sys
from pathlib import Path

ROOT = Path(__file__).resolve().parents[2]
DIST = Path(os.environ["VELMORA_DIST"])
CLIP = Path("/usr/share/forensics-samples/original-files/movie1/VID_20191220_170832.mp4")

# Packages must not depend on who builds them: another time zone, language and umask.
USERS = [
    {"TZ": "UTC", "LC_ALL": "C.UTF-8", "umask": "022"},
    {"TZ": "Asia/Tokyo", "LC_ALL": "de_DE.UTF-8", "umask": "077"},
]


def run(*words, **options):
    """Runs a program and returns its output as text. On failure, shows the output and ends the test."""
    done = subprocess.run([str(word) for word in words], capture_output=True, text=True, errors="replace", **options)
    if done.returncode != 0:
        sys.exit(f"{' '.join(map(str, words))}: exit code {done.returncode}\n{done.stdout}{done.stderr}")
    return done.stdout


def pack_twice(work, *packers):
    """Packs as two users into work/0 and work/1, checks that the bytes are equal, returns {file name: path}."""
    packed = []
    for number, user in enumerate(USERS):
        folder = Path(work) / str(number)
        environment = {**os.environ, "TZ": user["TZ"], "LC_ALL": user["LC_ALL"]}
        environment.pop("SOURCE_DATE_EPOCH", None)
        for packer in packers:
            run("sh", "-c", f'umask {user["umask"]}; exec "$@"', "sh", ROOT / "packaging" / packer, DIST, folder,
                env=environment)
        packed.append({path.name: path for path in folder.iterdir()})
    first, second = packed
    assert first.keys() == second.keys(), (first, second)
    for name in first:
        assert first[name].read_bytes() == second[name].read_bytes(), f"{name} differs when another user packs it"
    return first


def files_below(folder):
    """{path within the folder, with slashes: digest} of all files."""
    return {path.relative_to(folder).as_posix(): hashlib.sha256(path.read_bytes()).hexdigest()
            for path in Path(folder).rglob("*") if path.is_file()}


def check_digest_list(folder):
    """SHA256SUMS must list exactly the files beside it, with their digests."""
    files = files_below(folder)
    del files["SHA256SUMS"]
    lines = (Path(folder) / "SHA256SUMS").read_text().splitlines()
    listed = dict(reversed(line.split("  ", 1)) for line in lines)
    assert listed == files, set(listed.items()) ^ set(files.items())


def check_no_build_paths(folder):
    """No file may contain the path of its build folder: builds elsewhere would differ, and it reveals the builder."""
    # A folder right below the root may have a name that occurs in other paths, which runtime libraries mention.
    roots = [f"{root}/".encode() for root in (ROOT, DIST, Path.home()) if len(root.parts) > 2]
    for path in Path(folder).rglob("*"):
        if path.is_file():
            data = path.read_bytes()
            for root in roots:
                assert root not in data, f"{path.name} contains {root.decode()}"
