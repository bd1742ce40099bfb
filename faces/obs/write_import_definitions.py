"""Writes the definition file of an import library for libobs:   write_import_definitions.py HEADERS FILE

OBS for Windows comes without import libraries. The public headers declare what its obs.dll exports; the linker takes from
the library only what the plug-in uses.
"""

import re
import sys
from pathlib import Path

# EXPORT, a type, the name, an argument list; also over several lines.
DECLARATION = re.compile(r"^EXPORT\s[^;{(]*?\b(\w+)\s*\(", re.M)


def main():
    names = set()
    for header in sorted(Path(sys.argv[1]).rglob("*.h")):
        names |= set(DECLARATION.findall(header.read_text(encoding="utf-8", errors="replace")))
    if "obs_register_source_s" not in names or "gs_texture_create" not in names:
        sys.exit(f"{sys.argv[1]} does not have the headers of libobs")
    Path(sys.argv[2]).write_text("LIBRARY obs.dll\nEXPORTS\n" + "".join(f"    {name}\n" for name in sorted(names)),
                                 encoding="ascii")


main()
