#!/usr/bin/env python3
"""Writes a C++ file with an entry for each function of some shared libraries that a program calls.

  write_entries.py OUT NM READELF --libraries FILE... --archives FILE...

The archives are what the program is made of. An entry jumps to the function's address, which library_loader.cpp finds
when the first entry is called. A program that is linked with these entries instead of the libraries starts without
loading them.
"""

import argparse
import pathlib
import re
import subprocess
import sys


def output(*command):
    return subprocess.run(command, check=True, text=True, stdout=subprocess.PIPE).stdout


def parse_arguments():
    parser = argparse.ArgumentParser()
    parser.add_argument("out", type=pathlib.Path)
    parser.add_argument("nm")
    parser.add_argument("readelf")
    parser.add_argument("--libraries", nargs="+", required=True)
    parser.add_argument("--archives", nargs="+", required=True)
    return parser.parse_args()


def used_names(nm, archives):
    lines = output(nm, "--undefined-only", *archives).splitlines()
    return {words[1] for words in map(str.split, lines) if len(words) == 2}


def library_name(readelf, library):
    return re.search(r"\(SONAME\).*\[(.*)\]", output(readelf, "--dynamic", library)).group(1)


def functions(nm, library, used):
    """The functions of the library that are used. Data has no address to jump to, so it cannot be reached this way."""
    names = []
    for line in output(nm, "--dynamic", "--defined-only", library).splitlines():
        kind, name = line.split()[-2:]
        name = name.partition("@")[0]
        if name not in used:
            continue
        if kind != "T":
            sys.exit(f"{library}: {name} is not a function")
        names.append(name)
    return sorted(names)


ENTRY = """    ".globl {name}\\n"
    ".type {name}, @function\\n"
    "{name}: cmpq $0, velmora_addresses+{offset}(%rip)\\n"
    "je {name}_first\\n"
    "jmp *velmora_addresses+{offset}(%rip)\\n"
    "{name}_first: call velmora_load_libraries\\n"
    "jmp *velmora_addresses+{offset}(%rip)\\n"
"""


def main():
    arguments = parse_arguments()
    used = used_names(arguments.nm, arguments.archives)
    rows, entries = [], []
    for library in arguments.libraries:
        soname = library_name(arguments.readelf, library)
        for name in functions(arguments.nm, library, used):
            entries.append(ENTRY.format(name=name, offset=8 * len(rows)))
            rows.append(f'    {{"{soname}", "{name}"}},\n')
    if not rows:
        sys.exit("none of these libraries is used")
    arguments.out.write_text(
        "// Written by write_entries.py.\n"
        '#include "programs/reelfx/loading/library_loader.h"\n\n'
        'extern "C" {\n'
        f"void* velmora_addresses[{len(rows)}] = {{}};\n"
        f"const velmora::hosts::LibraryFunction velmora_functions[{len(rows)}] = {{\n{''.join(rows)}}};\n"
        f"const unsigned velmora_function_count = {len(rows)};\n"
        "}\n\n"
        f'asm(".text\\n"\n{"".join(entries)});\n')


main()
