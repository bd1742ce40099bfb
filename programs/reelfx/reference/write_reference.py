"""Writes the man page and the shells' completion of reelfx below a share folder.

write_reference.py OPTIONS.json EFFECTS.json SHARE
"""

import json
import sys
from pathlib import Path

import bash_completion
import fish_completion
import man_page
import zsh_completion
from commands import Program

WRITERS = {
    "man/man1/reelfx.1": man_page.text,
    "bash-completion/completions/reelfx": bash_completion.text,
    "zsh/site-functions/_reelfx": zsh_completion.text,
    "fish/vendor_completions.d/reelfx.fish": fish_completion.text,
}


def main(options, effects, share):
    program = Program(json.loads(Path(options).read_text()), json.loads(Path(effects).read_text()))
    for name, text in WRITERS.items():
        file = Path(share) / name
        file.parent.mkdir(parents=True, exist_ok=True)
        file.write_text(text(program), encoding="utf-8")


if __name__ == "__main__":
    main(*sys.argv[1:])
