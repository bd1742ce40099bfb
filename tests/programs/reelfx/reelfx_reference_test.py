"""The man page and the shell completion of reelfx, checked by the programs that read them."""

import itertools
import os
import pty
import re
import select
import shutil
import subprocess
import tempfile
import time
import unittest
from pathlib import Path

SHARE = Path(os.environ["REELFX_SHARE"])
MAN_PAGE = SHARE / "man/man1/reelfx.1"
MAN_PAGES = sorted(MAN_PAGE.parent.glob("*.1"))

# What is typed, where "\t" is the Tab key, and the arguments that reelfx then receives.
TYPED = (
    ("ren\tin.mp4 out.mp4 --overw\t-e Film\\ C\t--preset Tr\t",
     "render in.mp4 out.mp4 --overwrite -e 'Film Camera' --preset 'Train Ride'"),
    ("render a b -e 'Film Damage' --set Pat\tGr\t", "render a b -e 'Film Damage' --set Pattern=Grainy"),
    ("render a b -e 'Film Pro' -s Y\\ Jit\t4", "render a b -e 'Film Pro' -s 'Y Jitter=4'"),
    ("render a b -e 'Film Look' -p Sep\t--then -e 'Film Damage' -p Shr\t",
     "render a b -e 'Film Look' -p Sepia --then -e 'Film Damage' -p Shredded"),
    ("preset sh\tmi\t", "preset show 'mine one.fxp'"),
    ("list film\\ e\t--js\t", "list 'Film Express' --json"),
    ("render a b --format matr\t--pix-fmt yuv420p1\t", "render a b --format matroska --pix-fmt yuv420p10le"),
    ("render mi\tout.mov --codec pror\t", "render 'mine one.fxp' out.mov --codec prores_ks"),
)


class Terminal:
    """A shell on its own terminal, in which reelfx is a function that shows its arguments."""

    def __init__(self, command, start, folder):
        environment = {"PATH": os.environ["PATH"], "TERM": "dumb", "HOME": str(folder), "LC_ALL": "C.UTF-8"}
        self.process, self.terminal = pty.fork()
        if self.process == 0:
            os.chdir(folder)
            os.execvpe(command[0], command, environment)
        self.send(start + "\necho re''ady\n")
        self.read_to("ready\r?\n")

    def send(self, text):
        os.write(self.terminal, text.encode())

    def read_to(self, pattern):
        text, end = "", time.monotonic() + 30
        while not re.search(pattern, text):
            ready, _, _ = select.select([self.terminal], [], [], max(0.0, end - time.monotonic()))
            if not ready:
                raise AssertionError(f"{pattern} did not come; the terminal shows {text!r}")
            text += os.read(self.terminal, 65536).decode(errors="replace")
        return text

    def arguments(self, typed):
        self.send("reelfx ")
        for part in re.split("(\t)", typed):
            self.send(part)
            if part == "\t":
                time.sleep(0.7)  # like a user; further typing would cancel a completion
        self.send("\n")
        return re.search(r"<<(.*)>>", self.read_to(r"<<.*>>")).group(1)

    def close(self):
        os.close(self.terminal)
        os.waitpid(self.process, 0)


SHELLS = {
    "bash": (["bash", "--norc", "--noprofile", "-i"],
             "bind 'set enable-bracketed-paste off'; source /usr/share/bash-completion/bash_completion; "
             "source {share}/bash-completion/completions/reelfx"),
    "zsh": (["zsh", "-f", "-i"],
            "unsetopt zle_bracketed_paste; PS1='> '; fpath=({share}/zsh/site-functions $fpath); "
            "autoload -U compinit; compinit -u -D"),
}


class Completion(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory(prefix="velmora-reference-")
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
        (self.folder / "mine one.fxp").touch()

    def check(self, shell):
        if not shutil.which(shell):
            self.skipTest(f"{shell} is missing")
        command, start = SHELLS[shell]
        shown = r"""; reelfx() { printf '<%s>\n' "<$(printf '|%s' "$@")>"; }"""
        terminal = Terminal(command, start.format(share=SHARE) + shown, self.folder)
        self.addCleanup(terminal.close)
        for typed, expected in TYPED:
            with self.subTest(typed=typed):
                wanted = subprocess.run(["sh", "-c", f"printf '|%s' {expected}"], capture_output=True, check=True)
                self.assertEqual(terminal.arguments(typed), wanted.stdout.decode())

    def test_bash(self):
        self.check("bash")

    def test_zsh(self):
        self.check("zsh")

    def test_fish(self):
        if not shutil.which("fish"):
            self.skipTest("fish is missing")
        for typed, wanted in (
                ("reelfx ren", ["render"]),
                ("reelfx preset s", ["save", "show"]),
                ("reelfx render in.mp4 --overw", ["--overwrite"]),
                ("reelfx render a b --effect Film\\ C", ["Film Camera"]),
                ("reelfx render a b -e 'Film Camera' -p Tr", ["Train Ride"]),
                ("reelfx render a b -e 'Film Damage' -s Pattern=G", ["Pattern=Grainy"]),
                ("reelfx list 'Film E", ["Film Express"]),
                ("reelfx render a b --format mat", ["matroska"]),
                ("reelfx preset show mi", ["mine one.fxp"])):
            with self.subTest(typed=typed):
                script = f"source {SHARE}/fish/vendor_completions.d/reelfx.fish; complete -C \"{typed}\""
                environment = dict(os.environ, HOME=str(self.folder), LC_ALL="C.UTF-8")
                done = subprocess.run(["fish", "--no-config", "-c", script], capture_output=True, cwd=self.folder,
                                      env=environment, timeout=60)
                found = sorted(line.split("\t")[0] for line in done.stdout.decode().splitlines())
                self.assertEqual((found, done.stderr), (wanted, b""))


class ManPage(unittest.TestCase):
    def test_formatters_have_nothing_to_say(self):
        self.assertEqual(len(MAN_PAGES), 3)
        commands = (["man", "--warnings", "-E", "UTF-8", "-Tutf8", "-Z", "-l"], ["mandoc", "-Tlint"])
        for command, page in itertools.product(commands, MAN_PAGES):
            if not shutil.which(command[0]):
                continue
            with self.subTest(command=command, page=page.name):
                done = subprocess.run([*command, page], capture_output=True,
                                      env=dict(os.environ, MANROFFSEQ="", MANWIDTH="80"))
                self.assertEqual(done.stderr, b"")
                if command[0] == "mandoc":
                    self.assertEqual(done.stdout, b"")

    def test_the_index_of_pages_takes_its_name(self):
        if not shutil.which("lexgrog"):
            self.skipTest("lexgrog is missing")
        done = subprocess.run(["lexgrog", MAN_PAGE], capture_output=True)
        self.assertIn(b'"reelfx - the look of old film', done.stdout)


if __name__ == "__main__":
    unittest.main()
