"""The zip and the installer for Windows: their bytes, their contents, and an installation's life in a fresh Wine prefix.

Environment: VELMORA_DIST has the results of the Windows build, WORK is a folder for this test alone.
"""

import hashlib
import os
import re
import subprocess
import sys
import tempfile
import time
import zipfile
from pathlib import Path

from packing import CLIP, DIST, ROOT, check_digest_list, check_no_build_paths, files_below, pack_twice, run

PRODUCT = "velmora-reel-effects-1.0"
WINE = ROOT / "scripts" / "wine32"
MUST_HAVE = """VMReelEffects.dll VMLang.dll VMReelEffectsLang.xml resources.dll VMReelEffects.chm reelhost.exe reelview.exe reelcheck.exe
    frei0r/velmora_film_camera.dll frei0r/velmora_film_look.dll frei0r/velmora_film_damage.dll
    frei0r/velmora_film_express.dll frei0r/velmora_film_pro.dll sdk/host_api.h sdk/example_host.cpp docs/hosts.html
    64-bit/reelcheck.exe 64-bit/frei0r/velmora_film_pro.dll docs/openfx.html
    64-bit/VelmoraReelEffects.ofx.bundle/Contents/Info.plist
    64-bit/VelmoraReelEffects.ofx.bundle/Contents/Win64/VelmoraReelEffects.ofx
    64-bit/obs/velmora-reel-effects-obs/bin/64bit/velmora-reel-effects-obs.dll docs/obs.html docs/changes.html
    64-bit/obs/velmora-reel-effects-obs/data/locale/ja-JP.ini 64-bit/obs/velmora-reel-effects-obs/data/GPL-2.txt
    docs/help/start.html README.txt reel.html LICENSE.txt third-party.txt SHA256SUMS""".split()
UNINSTALL = r"Software\Microsoft\Windows\CurrentVersion\Uninstall"
OWN_KEY = UNINSTALL + r"\VelmoraReelEffects"
EXIT_IN_USE = 2


def check_texts(folder):
    """Texts have Windows line ends; the pages have no marks of their source, and their links lead to files."""
    for path in Path(folder).rglob("*.txt"):
        lines = path.read_bytes().split(b"\n")
        assert all(line.endswith(b"\r") for line in lines[:-1]) and len(lines) > 3, path
    for path in Path(folder, "docs").glob("*.html"):
        page = path.read_text("utf-8")
        assert "<!--" not in page and not re.search(r"\]\(|^\|", page, re.M), path
        for target in re.findall(r'href="([^"]*)"', page):
            assert "://" in target or (path.parent / target).is_file(), f"{path}: {target}"


class Prefix:
    """A separate Windows with its own Wine server, isolated from those that other tests use."""

    def __init__(self, folder, **variables):
        self.folder = folder
        self.drive = folder / "drive_c"
        self._environment = {**os.environ, "WINEPREFIX": str(folder), **variables}
        run(WINE, "--prepare", env=self._environment)

    def start(self, program, *arguments, **options):
        return subprocess.Popen([WINE, program, *arguments], env=self._environment, **options)

    def run(self, program, *arguments):
        return self.start(program, *arguments).wait(timeout=120)

    def end(self):
        run(WINE, "--stop", env=self._environment)

    def files(self):
        """Files and folders, except the contents of temporary folders, which the system may empty at any time."""
        names = {path.relative_to(self.drive).as_posix() for path in self.drive.rglob("*")}
        return {name for name in names if not re.search(r"(^|/)temp/", name, re.I)}

    def registry(self):
        """{(key, value's line)} where programs write; a key without values has the line ""."""
        lines = set()
        for number, root in enumerate(("HKCU", r"HKLM\Software")):
            file = self.drive / f"export{number}.reg"
            run(WINE, "reg", "export", root, f"C:\\{file.name}", "/y", env=self._environment)
            text = file.read_text("utf-16").replace("\\\n", "")
            file.unlink()
            for block in re.split(r"\n(?=\[)", text)[1:]:
                key, *values = block.splitlines()
                lines |= {(key.strip("[]"), value) for value in ["", *values]}
        # Wine stores its own settings there, such as colours and sizes.
        return {line for line in lines if "\\Software\\Wine\\" not in line[0]}

    def write_registry(self, key, name, value):
        assert self.run("reg", "add", key, *(("/v", name) if name else ("/ve",)), "/d", value, "/f") == 0


class Installation:
    """One installation in a prefix: its folder, and the registry root that holds its entry."""

    def __init__(self, prefix, setup, folder, root, *switches):
        self.prefix, self.setup, self.root, self.switches = prefix, setup, root, switches
        self.folder = prefix.drive.joinpath(*folder.split("\\"))
        self.name = "C:\\" + folder

    def install(self, *place):
        return self.prefix.run(self.setup, "/S", *self.switches, *place)

    def uninstall(self):
        """Returns when all is gone: the uninstaller leaves the work to a copy of itself and removes its folder last."""
        assert self.prefix.run(self.folder / "uninstall.exe", "/S") == 0
        for _ in range(600):
            if not (self.folder / "uninstall.exe").exists() and not self.entry():
                return
            time.sleep(0.1)
        sys.exit(f"{self.folder} is not uninstalled")

    def entry(self):
        """The uninstaller's entry {name: value}, or nothing."""
        query = self.prefix.start("reg", "query", f"{self.root}\\{OWN_KEY}", stdout=subprocess.PIPE, stderr=subprocess.DEVNULL)
        # As the console prints it: characters that its code page lacks are lost.
        text = query.communicate(timeout=120)[0].decode("cp437", "replace")
        return dict(re.findall(r"^ +(\S+) +REG_\w+ +(.*?)\r?$", text, re.M))


def check_zip(path, work):
    with zipfile.ZipFile(path) as archive:
        names = archive.namelist()
        assert archive.testzip() is None and names == sorted(names), names
        assert len({entry.date_time for entry in archive.infolist()}) == 1, "files of several times"
        archive.extractall(work)
    assert [entry.name for entry in Path(work).iterdir()] == [PRODUCT]
    unpacked = work / PRODUCT
    files = files_below(unpacked)
    missing = set(MUST_HAVE) - set(files)
    assert not missing, missing
    assert {name: files.get(name) for name in files_below(DIST)} == files_below(DIST), "not what was built"
    check_texts(unpacked)
    check_digest_list(unpacked)
    check_no_build_paths(unpacked)
    # The OpenFX plug-ins as they lie in the package, by the program beside them.
    run(ROOT / "scripts" / "wine64", unpacked / "64-bit" / "reelcheck.exe", "--level", "1", "--seed", "1")
    for module in [*unpacked.glob("*.dll"), *unpacked.glob("*.exe"), *unpacked.glob("**/frei0r/*.dll"),
                   *unpacked.glob("64-bit/*.exe"), *unpacked.glob("**/*.ofx"), *unpacked.glob("64-bit/obs/**/*.dll")]:
        head = module.read_bytes()[:0x400]
        stamp = head.index(b"PE\0\0") + 8
        assert head[stamp:stamp + 4] == bytes(4), f"{module.name} bears the time of its build"
    return files


def digests(start, host):
    """The clip's frames through the library next to a host. Film Look draws no random numbers: runs can be compared."""
    frames = subprocess.run(["ffmpeg", "-nostdin", "-v", "error", "-i", CLIP, "-frames:v", "3", "-fps_mode",
                             "passthrough", "-pix_fmt", "bgra", "-s", "320x180", "-f", "rawvideo", "-"], capture_output=True, check=True).stdout
    process = start(host, "--effect", "Film Look", "--preset", "Sepia", "--size", "320x180", "--hash",
                    stdin=subprocess.PIPE, stdout=subprocess.PIPE, stderr=subprocess.DEVNULL)
    lines = process.communicate(frames, timeout=120)[0].splitlines()
    assert process.returncode == 0 and len(lines) == 3, lines
    return lines


def check_in_use(installation):
    """Neither setup nor the uninstaller may change anything while a program has the library loaded."""
    before = files_below(installation.folder)
    user = installation.prefix.start(installation.folder / "reelhost.exe", "--effect", "Film Look", "--size", "64x48",
                                     "--hash", stdin=subprocess.PIPE, stdout=subprocess.PIPE, stderr=subprocess.DEVNULL)
    user.stdin.write(bytes(64 * 48 * 4))
    user.stdin.flush()
    user.stdout.read(1)  # the first digest: the library is in use
    assert installation.install() == EXIT_IN_USE
    # "_?=" keeps the uninstaller in its folder, so that its exit code is available.
    place = f"_?={installation.name}".split(" ")
    assert installation.prefix.run(installation.folder / "uninstall.exe", "/S", *place) == EXIT_IN_USE
    user.communicate(timeout=120)
    assert files_below(installation.folder) == before and installation.entry()


def check_installation(installation, packed, expected, place=()):
    """Installs, renders, installs again over it, and finds the package's contents and a matching entry."""
    for _ in range(2):
        assert installation.install(*place) == 0
        place = ()  # its folder is known from its entry
        files = files_below(installation.folder)
        assert files.pop("uninstall.exe", None)
        assert files == packed, set(files.items()) ^ set(packed.items())
    entry = installation.entry()
    assert entry["DisplayName"] == "Velmora Reel Effects" and entry["DisplayVersion"] == "1.0", entry
    assert digests(installation.prefix.start, installation.folder / "reelhost.exe") == expected


def check_obs(prefix, installation, packed):
    """Where OBS is installed, setup copies the filters to its plug-ins, except with /NoObs; the uninstaller removes them."""
    plugins = prefix.drive / "ProgramData/obs-studio/plugins"
    assert not plugins.exists()
    prefix.write_registry("HKLM\\Software\\OBS Studio", "", "C:\\OBS")
    assert installation.install("/NoObs") == 0 and not plugins.exists()
    assert installation.install() == 0
    inside = "64-bit/obs/"
    expected = {name.removeprefix(inside): digest for name, digest in packed.items() if name.startswith(inside)}
    assert files_below(plugins) == expected, set(files_below(plugins)) ^ set(expected)
    assert prefix.run("reg", "delete", "HKLM\\Software\\OBS Studio", "/f") == 0


def check_life(prefix, setup, packed, expected):
    """One installation for the user, in a folder with spaces and letters of two scripts, beside one for all users."""
    user = Installation(prefix, setup, "\u00dcbung mit Film\\\u6620\u753b Effects", "HKCU", "/CurrentUser")
    everyone = Installation(prefix, setup, "Program Files\\Velmora\\Reel Effects", "HKLM", "/AllUsers")
    files, registry = prefix.files(), prefix.registry()

    # One word each: the installer takes the rest of its command line, which must not be quoted, as the folder.
    check_installation(user, packed, expected, place=f"/D={user.name}".split(" "))
    check_in_use(user)
    check_installation(everyone, packed, expected)
    check_obs(prefix, everyone, packed)

    preset = user.folder / "docs" / "My look.fxprelb"
    preset.write_text("a user's own")
    setting = ("HKEY_CURRENT_USER\\Software\\Velmora\\Common", '"Knobs Drag Vertical"="yes"')
    prefix.write_registry(setting[0], "Knobs Drag Vertical", "yes")

    user.uninstall()
    assert everyone.entry() and digests(prefix.start, everyone.folder / "reelhost.exe") == expected
    everyone.uninstall()
    kept = {preset.relative_to(prefix.drive).as_posix()}
    kept |= {parent.as_posix() for parent in Path(*kept).parents} - {"."}
    assert prefix.files() - files == kept, prefix.files() ^ files ^ kept
    assert files <= prefix.files()
    # The keys below which all programs have their entries are the system's: made when first needed, and never removed.
    shared = (UNINSTALL, "\\Software\\Classes")
    left = {line for line in prefix.registry() - registry if line[1] or not line[0].endswith(shared)}
    assert left == {setting, (setting[0], ""), (setting[0].removesuffix("\\Common"), "")}, left
    assert registry <= prefix.registry(), registry - prefix.registry()


def check_openfx(work, setup):
    """The OpenFX plug-ins, in a 64-bit Windows that runs the 32-bit installer: chosen, checked, kept by an update, removed.

    The tree's Wine can do so with the package wine64:amd64 in it, which scripts/setup does not install.
    """
    tree = Path(os.environ.get("VELMORA_CACHE", Path.home() / ".cache/velmora-reel-effects"), "wine32-tree")
    if not (tree / "usr/lib/wine/wine64").exists():
        return print("The OpenFX section is not tried: the tree has no wine64:amd64.")
    prefix = Prefix(work / "wow64", WINEARCH="win64")
    try:
        everyone = Installation(prefix, setup, "Program Files (x86)\\Velmora\\Reel Effects", "HKLM", "/AllUsers")
        folder = prefix.drive / "Program Files/Common Files/OFX"
        bundle = folder / "Plugins/VelmoraReelEffects.ofx.bundle"
        assert everyone.install() == 0 and not folder.exists()
        assert everyone.install("/OpenFX") == 0 and files_below(bundle) == files_below(
            everyone.folder / "64-bit/VelmoraReelEffects.ofx.bundle")
        assert prefix.run(everyone.folder / "64-bit/reelcheck.exe", "--level", "1", "--seed", "1", "--bundle", bundle) == 0
        assert everyone.install() == 0 and files_below(bundle)
        # Its entry is in the 32-bit part of the registry, which the 64-bit tools do not show.
        assert prefix.run(everyone.folder / "uninstall.exe", "/S") == 0
        for _ in range(600):
            if not folder.exists() and not everyone.folder.exists():
                return
            time.sleep(0.1)
        raise AssertionError("the uninstaller leaves something")
    finally:
        prefix.end()


def main():
    with tempfile.TemporaryDirectory(prefix="windows-", dir=os.environ["WORK"]) as folder:
        work = Path(folder)
        packages = pack_twice(work, "pack-windows")
        assert set(packages) == {f"{PRODUCT}-win32.zip", f"{PRODUCT}-setup.exe"}, packages
        packed = check_zip(packages[f"{PRODUCT}-win32.zip"], work / "zip")
        expected = digests(lambda *words, **options: subprocess.Popen([WINE, *words], **options), DIST / "reelhost.exe")
        prefix = Prefix(work / "prefix")
        try:
            check_life(prefix, packages[f"{PRODUCT}-setup.exe"], packed, expected)
        finally:
            prefix.end()
        check_openfx(work, packages[f"{PRODUCT}-setup.exe"])
        for name, path in sorted(packages.items()):
            print(f"{name}: {path.stat().st_size} bytes, sha256 {hashlib.sha256(path.read_bytes()).hexdigest()}")


main()
