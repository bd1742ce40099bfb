"""Writes the man pages and the shells' completion of reelfx below a share folder.

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



def written(name):
    """The writer of a page that is written by hand."""
    page = Path(__file__).parent / name
    return lambda program: page.read_text().replace("@VERSION@", program.version).replace("@DATE@", man_page.DATE)


WRITERS = {
    "man/man1/reelfx.1": man_page.text,
    "man/man1/reelfx-farm-join.1": written("reelfx-farm-join.1"),
    "man/man1/reelfx-farm-slurm.1": written("reelfx-farm-slurm.1"),
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
