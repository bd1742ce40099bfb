#!/usr/bin/env python3
"""Copies the help pages as one of their editions.

    edition.py PAGES OUTPUT READER...

One set of pages serves several readers: "library" uses the Windows library in an editor, "reelfx" the command line
program, "plugin" the frei0r plug-ins. What is meant for some of them only is in an element of class only-library,
only-reelfx or only-plugin; an element may have several of these. OUTPUT gets the pages without the elements for other
readers, and without these classes. A page whose body is for other readers is left out: links to it have to be, too.
"""

import shutil
import sys
from html.parser import HTMLParser
from pathlib import Path

READERS = ("library", "reelfx", "plugin")
MARK = "only-"
VOID = {"br", "hr", "img", "link", "meta"}


class Edition(HTMLParser):
    """Collects in `text` what the chosen readers get of a page; None when they do not get the page."""

    def __init__(self, page, readers):
        super().__init__(convert_charrefs=False)
        self.text = ""
        self._readers = readers
        self._open = []  # the names of the open elements
        self._dropped_at = None  # the depth of the element that is being left out
        self._whole_page_dropped = False
        self.feed(page)
        self.close()
        if self._open:
            raise ValueError(f"<{self._open[-1]}> is never closed")
        if self._whole_page_dropped:
            self.text = None

    def _is_kept(self, classes, tag):
        wanted = [name[len(MARK):] for name in classes if name.startswith(MARK)]
        unknown = set(wanted) - set(READERS)
        if unknown:
            raise ValueError(f"<{tag}>: no reader is called {unknown}")
        return not wanted or not self._readers.isdisjoint(wanted)

    def handle_starttag(self, tag, attrs):
        classes = (dict(attrs).get("class") or "").split()
        text = self.get_starttag_text()
        if self._dropped_at is None:
            if self._is_kept(classes, tag):
                kept = [name for name in classes if not name.startswith(MARK)]
                if kept != classes:
                    given = f' class="{" ".join(classes)}"'
                    text = text.replace(given, f' class="{" ".join(kept)}"' if kept else "")
                self.text += text
            elif tag in VOID:
                return
            else:
                self._dropped_at = len(self._open)
                self._whole_page_dropped |= tag == "body"
        if tag not in VOID:
            self._open.append(tag)

    def handle_endtag(self, tag):
        if not self._open or self._open.pop() != tag:
            raise ValueError(f"</{tag}> at {self.getpos()} closes another element")
        if self._dropped_at is None:
            self.text += f"</{tag}>"
        elif self._dropped_at == len(self._open):
            self._dropped_at = None

    def _keep(self, text):
        if self._dropped_at is None:
            self.text += text

    def handle_data(self, data):
        self._keep(data)

    def handle_entityref(self, name):
        self._keep(f"&{name};")

    def handle_charref(self, name):
        self._keep(f"&#{name};")

    def handle_decl(self, decl):
        self._keep(f"<!{decl}>")


def write_edition(pages, output, readers):
    unknown = set(readers) - set(READERS)
    if unknown or not readers:
        raise ValueError(f"the readers are {READERS}, not {unknown}")
    shutil.copytree(pages, output, dirs_exist_ok=True)
    for path in sorted(output.glob("*.html")):
        try:
            text = Edition(path.read_text(encoding="ascii"), set(readers)).text
        except ValueError as error:
            raise ValueError(f"{path.name}: {error}") from None
        if text is None:
            path.unlink()
        else:
            # A line that held nothing but a dropped element leaves no gap.
            path.write_text("\n".join(line for line in text.split("\n") if line.strip()) + "\n", encoding="ascii")


if __name__ == "__main__":
    if len(sys.argv) < 4:
        sys.exit(__doc__)
    write_edition(Path(sys.argv[1]), Path(sys.argv[2]), sys.argv[3:])
