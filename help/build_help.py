#!/usr/bin/env python3
"""Compiles the help pages into VMReelEffects.chm.

    build_help.py PAGES TOPICS_H WORK OUTPUT

PAGES is the folder of the pages (docs/help), of which the edition for users of the library is compiled. TOPICS_H is the
list of numbered topics, WORK a folder that may be emptied, OUTPUT the file to write. The table of contents is the nested
list on the start page and the index comes from the pages' keywords, so pages, contents and index always agree. Needs
chmcmd.
"""

import re
import shutil
import subprocess
import sys
from html import escape
from html.parser import HTMLParser
from pathlib import Path

from chm_file import ChmFile
from edition import write_edition

START = "start.html"
TITLE = "Velmora Reel Effects"
COMPILED = "VMReelEffects.chm"

# Contents, index and search tabs beside the page; buttons to hide them, go back, go home, print and set options.
PANES = 0x63520
BUTTONS = 0x304E


class PageReader(HTMLParser):
    """Collects a page's title, its keywords and the nested list of class "contents"."""

    def __init__(self):
        super().__init__()
        self.title, self.keywords, self.contents = "", [], []
        self._in_title, self._depth, self._in_list = False, 0, False
        self._entry = None

    def handle_starttag(self, tag, attrs):
        attrs = dict(attrs)
        if tag == "title":
            self._in_title = True
        elif tag == "meta" and attrs.get("name") == "keywords":
            self.keywords = [word.strip() for word in attrs["content"].split(",")]
        elif tag == "ul" and (self._in_list or attrs.get("class") == "contents"):
            self._in_list, self._depth = True, self._depth + 1
        elif tag == "li" and self._in_list:
            self._entry = {"depth": self._depth, "name": "", "page": None}
            self.contents.append(self._entry)
        elif tag == "a" and self._in_list and self._entry:
            self._entry["page"] = attrs["href"]

    def handle_endtag(self, tag):
        if tag == "title":
            self._in_title = False
        elif tag == "ul" and self._in_list:
            self._depth -= 1
            self._in_list = self._depth > 0

    def handle_data(self, data):
        if self._in_title:
            self.title += data
        elif self._in_list and self._entry:
            self._entry["name"] += data


def read_page(path):
    reader = PageReader()
    reader.feed(path.read_text(encoding="ascii"))  # entities for the rest: no viewer has to guess an encoding
    reader.title = reader.title.strip()
    for entry in reader.contents:
        entry["name"] = " ".join(entry["name"].split())
    return reader


def read_topics(header):
    """[(constant, number, page)] of the header's constants; kFilmLook belongs to film-look.html."""
    topics = []
    for name, number in re.findall(r"^inline constexpr int k(\w+) = (\d+);", header.read_text(), re.M):
        page = re.sub(r"(?<!^)([A-Z])", r"-\1", name).lower() + ".html"
        topics.append(("k" + name, int(number), page))
    return topics


def site_object(name, page):
    local = f'<param name="Local" value="{page}">' if page else ""
    return f'<LI><OBJECT type="text/sitemap"><param name="Name" value="{escape(name)}">{local}</OBJECT>'


def site_map(lines):
    head = '<!DOCTYPE HTML PUBLIC "-//IETF//DTD HTML//EN">\n<HTML>\n<HEAD></HEAD>\n<BODY>\n'
    return head + "\n".join(lines) + "\n</BODY>\n</HTML>\n"


def contents_file(start):
    lines, depth = [], 0
    for entry in [{"depth": 1, "name": TITLE, "page": START}] + start.contents:
        lines += ["<UL>"] * (entry["depth"] - depth) + ["</UL>"] * (depth - entry["depth"])
        depth = entry["depth"]
        lines.append(site_object(entry["name"], entry["page"]))
    return site_map(lines + ["</UL>"] * depth)


def index_file(pages):
    words = sorted({(word, page) for page, reader in pages.items() for word in reader.keywords},
                   key=lambda pair: (pair[0].lower(), pair[1]))
    return site_map(["<UL>"] + [site_object(word, page) for word, page in words] + ["</UL>"])


def project_file(files, topics):
    # A text index: the compiler leaves uninitialised bytes in a binary one.
    return f"""[OPTIONS]
Compatibility=1.1 or later
Compiled file={COMPILED}
Contents file=contents.hhc
Index file=index.hhk
Default topic={START}
Default Window=main
Title={TITLE}
Language=0x409
Full-text search=Yes
Binary TOC=No
Binary Index=No

[WINDOWS]
main="{TITLE}","contents.hhc","index.hhk","{START}","{START}",,,,,{PANES:#x},220,{BUTTONS:#x},,,,,,,,0

[FILES]
""" + "\n".join(files) + "\n\n[ALIAS]\n" + "\n".join(f"{name}={page}" for name, _, page in topics) \
        + "\n\n[MAP]\n" + "\n".join(f"#define {name} {number}" for name, number, _ in topics) + "\n"


def run_tool(work, *command):
    run = subprocess.run(command, cwd=work, text=True, stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
    if run.returncode or re.search(r"^(Error|Warning)", run.stdout, re.M):
        sys.exit(f"{command[0]} failed:\n{run.stdout}")


def compile_project(work):
    # In the map of topics the compiler puts the project's folder before each page's name, and then no viewer finds the
    # page. Under this name the folder has the same length wherever the build is; it is removed from the strings
    # afterwards, which keep their positions.
    folder = "/proc/self/cwd/"
    run_tool(work, "chmcmd", "--no-html-scan", folder + "project.hhp")
    run_tool(work, "chmls", "extract", COMPILED, "/#STRINGS", "strings")
    strings = (work / "strings").read_bytes()
    mapped = re.compile(re.escape(folder.encode()) + rb"([^\0]*)")
    strings = mapped.sub(lambda match: match[1].ljust(len(match[0]), b"\0"), strings)

    chm = ChmFile((work / COMPILED).read_bytes())
    chm.replace(b"/#STRINGS", strings)
    chm.clear_times()
    return chm.data


def main():
    pages_dir, header, work, output = map(Path, sys.argv[1:5])
    shutil.rmtree(work, ignore_errors=True)
    work.mkdir(parents=True)
    write_edition(pages_dir, work, ["library"])

    pages = {path.name: read_page(path) for path in sorted(work.glob("*.html"))}
    topics = read_topics(header)
    missing = [page for _, _, page in topics if page not in pages]
    if missing or not topics:
        sys.exit(f"{header}: no page for a topic: {missing}")
    topics.sort(key=lambda topic: topic[1])  # the compiler maps topics in the order of the files
    mapped = [page for _, _, page in topics]
    files = sorted(str(path.relative_to(work)) for path in work.rglob("*") if path.is_file())
    files = mapped + [file for file in files if file not in mapped]
    (work / "contents.hhc").write_text(contents_file(pages[START]), encoding="ascii")
    (work / "index.hhk").write_text(index_file(pages), encoding="ascii")
    (work / "project.hhp").write_text(project_file(files, topics), encoding="ascii")

    output.parent.mkdir(parents=True, exist_ok=True)
    output.write_bytes(compile_project(work))


if __name__ == "__main__":
    main()
