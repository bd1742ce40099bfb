"""The tarball and the Debian package: their bytes, their contents, and what a user does with them on this machine.

Environment: VELMORA_DIST has the results of the native build, WORK is a folder for this test alone.
"""

import gzip
import hashlib
import os
import re
import subprocess
import tempfile
from pathlib import Path

from packing import CLIP, DIST, check_digest_list, check_no_build_paths, files_below, pack_twice, run

PRODUCT = "velmora-reel-effects-1.0-linux-x86_64"
PLUGINS = [f"velmora_film_{name}" for name in ("camera", "damage", "express", "look", "pro")]
NAMES = ("reelfx", "reelfx-farm-slurm", "reelfx-farm-join")
DEB_FILES = [*(f"usr/bin/{name}" for name in NAMES), *(f"usr/share/man/man1/{name}.1.gz" for name in NAMES),
             "usr/share/bash-completion/completions/reelfx",
             "usr/share/zsh/vendor-completions/_reelfx", "usr/share/fish/vendor_completions.d/reelfx.fish",
             "usr/share/velmora-reel-effects/reel.html",
             *(f"usr/lib/frei0r-1/{name}.so" for name in PLUGINS),
             *(f"usr/OFX/Plugins/VelmoraReelEffects.ofx.bundle/Contents/{name}" for name in
               ("Info.plist", "Linux-x86-64/VelmoraReelEffects.ofx")),
             *(f"usr/share/mlt-7/frei0r/filter_frei0r.{name}.yml" for name in PLUGINS),
             *(f"usr/share/kdenlive/effects/{name}.xml" for name in PLUGINS),
             *(f"usr/share/velmora-reel-effects/kdenlive/presets/frei0r.{name}.json" for name in PLUGINS),
             "usr/bin/velmora-kdenlive-setup", "usr/share/man/man1/velmora-kdenlive-setup.1.gz",
             *(f"usr/share/doc/velmora-reel-effects/{name}" for name in
               ("copyright", "changelog.gz", "changelog.Debian.gz", "help/start.html"))]


OBS = "velmora-reel-effects-obs"
OBS_FILES = {f"usr/lib/x86_64-linux-gnu/obs-plugins/{OBS}.so", f"usr/share/obs/obs-plugins/{OBS}/locale/de-DE.ini",
             f"usr/share/doc/{OBS}/obs.md", f"usr/share/doc/{OBS}/copyright"}


def digests(reelfx, *environment):
    return run("env", *environment, reelfx, "render", CLIP, "--effect", "Film Pro", "--preset", "Super 8", "--seed", "7",
               "--duration", "0.3", "--hash")


def check_tarball(path, work, expected):
    folder = work / "a folder with spaces"
    folder.mkdir()
    run("tar", "-C", folder, "-xf", path)
    unpacked = folder / PRODUCT
    check_digest_list(unpacked)
    check_no_build_paths(unpacked)
    check_page(unpacked / "docs/hosts.md")
    assert digests(unpacked / "reelfx") == expected

    home = work / "home"
    home.mkdir()
    kept = home / ".local" / "share" / "kdenlive" / "effects" / "mine.xml"
    kept.parent.mkdir(parents=True)
    kept.write_text("a user's own")
    (home / ".frei0r-1").mkdir()  # the user's own folders, with nothing in them
    (home / ".local" / "bin").mkdir()
    before = sorted(home.rglob("*"))
    environment = {"HOME": str(home), "PATH": os.environ["PATH"]}
    for words, code in ((["--help"], 0), (["--frobnicate"], 2), (["--remove", "all"], 2), (["--remove"], 0)):
        done = subprocess.run([unpacked / "install.sh", *words], env=environment, capture_output=True, text=True)
        assert (done.returncode, sorted(home.rglob("*"))) == (code, before), (words, done)
        assert words == ["--remove"] or "Usage: install.sh" in done.stdout + done.stderr, done
    said = run(unpacked / "install.sh", env=environment)
    installed = {str(home / name) for name in files_below(home)} - {str(kept)}
    listing = str(home / ".local/share/velmora-reel-effects/installed-files")
    assert set(re.findall(r"^  (.*)$", said, re.M)) == installed - {listing}, said
    assert digests(home / ".local/bin/reelfx") == expected
    page = run(home / ".local/bin/reelfx", "studio", "--path").strip()
    assert page == str(home / ".local/share/velmora-reel-effects/reel.html"), page
    module = home / ".config/obs-studio/plugins" / OBS
    assert (module / "bin/64bit" / f"{OBS}.so").is_file() and (module / "data/locale/ko-KR.ini").is_file()
    # FFmpeg finds the plug-in by itself, and its frames are those of reelfx.
    run("ffmpeg", "-nostdin", "-v", "error", "-i", CLIP, "-vf", "frei0r=velmora_film_pro:super8|7", "-frames:v", "2",
        "-f", "null", "-", env=environment)
    assert "Usage: " in run(home / ".local/bin/reelfx-farm-join", "--help")
    # A new version over this one, which had a plug-in more.
    outdated = home / ".frei0r-1/lib/velmora_film_gone.so"
    outdated.write_text("of this version")
    with open(listing, "a") as lines:
        lines.write(f"{hashlib.sha256(outdated.read_bytes()).hexdigest()}  {outdated}\n")
    run(unpacked / "install.sh", env=environment)
    assert not outdated.exists()
    changed = home / ".local/share/man/man1/reelfx.1"
    changed.write_text("the user's own now")
    run(unpacked / "install.sh", "--remove", env=environment)
    assert changed.read_text() == "the user's own now"
    for path in (changed, *list(changed.parents)[:2]):
        path.unlink() if path.is_file() else path.rmdir()
    assert sorted(home.rglob("*")) == before, set(home.rglob("*")) ^ set(before)
    theirs = home / ".local/bin/reelfx"
    theirs.write_text("another program")
    done = subprocess.run([unpacked / "install.sh"], env=environment, capture_output=True, text=True)
    assert done.returncode == 1 and str(theirs) in done.stderr, done
    assert sorted(home.rglob("*")) == sorted([*before, theirs]) and theirs.read_text() == "another program"


def check_page(page):
    """The page for users of the plug-ins names nothing that only the source tree has."""
    for word in ("make ", "build/", "scripts/", "frei0r_hosts", "<!--", ".dll"):
        assert word not in page.read_text(), f"{page}: {word}"
    assert "melt" in page.read_text()


def check_deb(path, unpacked, must_have, libraries):
    run("dpkg-deb", "-R", path, unpacked)
    files = files_below(unpacked)
    assert not set(must_have) - set(files), set(must_have) - set(files)
    sums = dict(reversed(line.split("  ", 1)) for line in (unpacked / "DEBIAN/md5sums").read_text().splitlines())
    assert sums == {name: hashlib.md5((unpacked / name).read_bytes()).hexdigest()
                    for name in files if not name.startswith("DEBIAN/")}
    control = (unpacked / "DEBIAN" / "control").read_text()
    for library in (*libraries, "libtinyxml", "libc6"):
        assert re.search(rf"^Depends: .*\b{library}", control, re.M), f"{library} is not among the dependencies"
    owners = {line.split()[1] for line in run("dpkg-deb", "-c", path).splitlines()}
    assert owners == {"root/root"}, owners
    for name in files:
        if name.endswith(".gz"):  # the timestamp in a compressed file's header
            assert (unpacked / name).read_bytes()[4:8] == bytes(4), name
            gzip.decompress((unpacked / name).read_bytes())
    check_no_build_paths(unpacked)


def check_lintian(path):
    """No errors and no warnings."""
    words = ["lintian", "--fail-on", "error,warning", "--allow-root", path]
    done = subprocess.run(words, capture_output=True, text=True)
    assert done.returncode == 0 and not done.stdout.strip(), done.stdout + done.stderr


def main():
    with tempfile.TemporaryDirectory(prefix="linux-", dir=os.environ["WORK"]) as folder:
        work = Path(folder)
        packages = pack_twice(work, "pack-linux", "pack-debian")
        tarball, deb, obs = (f"{PRODUCT}.tar.xz", "velmora-reel-effects_1.0-1_amd64.deb", f"{OBS}_1.0-1_amd64.deb")
        assert set(packages) == {tarball, deb, obs}, packages
        expected = digests(DIST / "reelfx")
        assert len(set(expected.splitlines())) > 3, expected
        check_tarball(packages[tarball], work, expected)
        check_deb(packages[deb], work / "deb", DEB_FILES, ("libavcodec", "libavformat", "libcairo2"))
        check_page(work / "deb/usr/share/doc/velmora-reel-effects/hosts.md")
        assert digests(work / "deb/usr/bin/reelfx") == expected
        check_deb(packages[obs], work / "obs", OBS_FILES, ("libobs0",))
        check_lintian(packages[deb])
        check_lintian(packages[obs])
        for name, path in sorted(packages.items()):
            print(f"{name}: {path.stat().st_size} bytes, sha256 {hashlib.sha256(path.read_bytes()).hexdigest()}")


main()
