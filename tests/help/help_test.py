"""Checks the compiled help as its viewers see it, unpacked from the finished file.

    help_test.py CHM TOPICS_H PAGES BUILD_SCRIPT [REELFX]

With REELFX the pages are also compared with the effects' tables.
"""

import json
import re
import struct
import subprocess
import sys
import tempfile
import unittest
from html.parser import HTMLParser
from pathlib import Path
from urllib.parse import unquote, urldefrag

CHM, TOPICS_H, PAGES, BUILD_SCRIPT = (Path(argument).resolve() for argument in sys.argv[1:5])
REELFX = sys.argv[5] if len(sys.argv) > 5 else None
MEGABYTE = 1 << 20


class Page(HTMLParser):
    def __init__(self, path):
        super().__init__()
        self.links, self.anchors, self.pictures = [], set(), []
        self.rows = []  # [nearest heading's id or "", [cell texts]]
        self._heading, self._in_cell = "", False
        self.feed(path.read_text(encoding="ascii"))

    def handle_starttag(self, tag, attrs):
        attrs = dict(attrs)
        if "id" in attrs:
            self.anchors.add(attrs["id"])
        for key in ("href", "src"):
            if key in attrs:
                self.links.append(attrs[key])
        if tag == "img":
            self.pictures.append(attrs)
        elif tag == "param" and attrs.get("name") == "Local":
            self.links.append(attrs["value"])
        elif tag == "h2":
            self._heading = attrs.get("id", "")
        elif tag == "tr":
            self.rows.append((self._heading, []))
        elif tag in ("td", "th"):
            self.rows[-1][1].append("")
            self._in_cell = True

    def handle_endtag(self, tag):
        if tag in ("td", "th"):
            self._in_cell = False

    def handle_data(self, data):
        if self._in_cell:
            self.rows[-1][1][-1] += data


def numbered_topics(folder):
    """{number: page} as a viewer reads them: pairs of a number and the name's offset in the string table."""
    pairs = (folder / "#IVB").read_bytes()
    strings = (folder / "#STRINGS").read_bytes()
    size, = struct.unpack_from("<I", pairs)
    assert size == len(pairs) - 4
    return {number: strings[place:strings.index(b"\0", place)].decode("ascii")
            for number, place in struct.iter_unpack("<2I", pairs[4:])}


def header_topics():
    """{number: page} of the shared header: kFilmLook = 102 is film-look.html."""
    topics = {}
    for line in TOPICS_H.read_text().splitlines():
        if "constexpr" in line:
            name, number = re.search(r"\bk(\w+) = (\d+);", line).groups()
            topics[int(number)] = "-".join(re.findall("[A-Z][a-z]*", name)).lower() + ".html"
    return topics


def check_links(test, folder, pages):
    for name, page in pages.items():
        for link in page.links:
            target, anchor = urldefrag(unquote(link))
            target = target or name
            test.assertTrue((folder / target).is_file(), f"{name}: {link}")
            if anchor:
                test.assertIn(anchor, pages[target].anchors, f"{name}: {link}")


class CompiledHelpTest(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls._temporary = tempfile.TemporaryDirectory()
        cls.folder = Path(cls._temporary.name)
        subprocess.run(["extract_chmLib", CHM, cls.folder], check=True, stdout=subprocess.DEVNULL)
        cls.pages = {path.name: Page(path) for path in cls.folder.glob("*.h*")}

    @classmethod
    def tearDownClass(cls):
        cls._temporary.cleanup()

    def test_each_numbered_topic_opens_its_page(self):
        topics = numbered_topics(self.folder)
        self.assertEqual(topics, header_topics())
        self.assertEqual(topics[300], "options.html")
        for number, page in topics.items():
            self.assertIn(page, self.pages, f"topic {number}")

    def test_links_and_pictures_resolve(self):
        check_links(self, self.folder, self.pages)

    def test_contents_lead_to_every_page_and_index_to_all_but_none_twice(self):
        pages = {name for name in self.pages if name.endswith(".html")}
        contents = self.pages["contents.hhc"].links
        self.assertEqual(sorted(contents), sorted(pages))
        self.assertEqual(set(self.pages["index.hhk"].links), pages)

    def test_pictures_are_described_and_small(self):
        used = set()
        for name, page in self.pages.items():
            for picture in page.pictures:
                self.assertGreater(len(picture.get("alt", "")), 10, f"{name}: {picture}")
                used.add(self.folder / picture["src"])
        self.assertEqual(used, set((self.folder / "pictures").glob("*")), "pictures without a page")
        self.assertLess(sum(path.stat().st_size for path in used), 2 * MEGABYTE)

    def test_another_build_elsewhere_gives_the_same_bytes(self):
        with tempfile.TemporaryDirectory(prefix="elsewhere with blanks ") as folder:
            again = Path(folder) / "again.chm"
            subprocess.run([sys.executable, "-B", BUILD_SCRIPT, PAGES, TOPICS_H, Path(folder) / "work", again],
                           check=True)
            self.assertEqual(again.read_bytes(), CHM.read_bytes())


class EditionTest(unittest.TestCase):
    """The pages in each package. Features that only one group of users has must not be explained to the others."""

    EDITIONS = (
        (("library",), ("reelfx", "FFmpeg", "GStreamer", "seed")),
        (("reelfx", "plugin"), ("dll", ".chm", "32-bit", "options.html", "window", "each time the film")),
        (("plugin",), ("dll", ".chm", "--set Saturation", "&quot;Tint&quot;")),
    )

    def test_editions_are_whole_and_for_their_readers(self):
        for readers, foreign in self.EDITIONS:
            with self.subTest(readers), tempfile.TemporaryDirectory() as name:
                folder = Path(name)
                subprocess.run([sys.executable, "-B", BUILD_SCRIPT.parent / "edition.py", PAGES, folder, *readers],
                               check=True)
                pages = {path.name: Page(path) for path in folder.glob("*.html")}
                check_links(self, folder, pages)
                self.assertEqual(set(pages), {"start.html", *pages["start.html"].links} & set(pages))
                for page in pages:
                    text = (folder / page).read_text()
                    self.assertNotIn("only-", text, page)
                    # Reel View copies a command line for reelfx.
                    for word in foreign if page not in ("programs.html", "reel-view.html") else ():
                        self.assertNotIn(word, text.replace("the Windows library", ""), page)


NUMBERS = "no one two three four five six seven eight nine ten".split()


def documented(parameter):
    """(name, range, default) of a parameter as given on an effect's page."""
    ranges = {"slider": lambda: f"{parameter['minimum']:g} to {parameter['maximum']:g}".replace("-", "\u2212"),
              "colour": lambda: "any colour",
              "menu": lambda: f"{NUMBERS[len(parameter['items'])]} patterns",
              "check box": lambda: "on or off"}
    start = {"#000000": "black"}.get(parameter["default"], parameter["default"])
    return parameter["name"], ranges[parameter["kind"]](), start


@unittest.skipUnless(REELFX, "the effects' tables are read from reelfx")
class EffectTablesTest(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        cls.effects = json.loads(subprocess.run([REELFX, "list", "--json"], check=True, capture_output=True).stdout)

    def test_each_effect_s_page_has_its_controls(self):
        for effect in self.effects:
            page = Page(PAGES / (effect["name"].replace(" ", "-").lower() + ".html"))
            rows = [tuple(cells[:3]) for _, cells in page.rows if len(cells) == 4][1:]
            self.assertEqual(rows, [documented(parameter) for parameter in effect["parameters"]], effect["name"])

    def test_preset_page_has_every_preset_in_order(self):
        page = Page(PAGES / "presets.html")
        for effect in self.effects:
            section = effect["name"].replace(" ", "-").lower()
            names = [cells[0] for heading, cells in page.rows if heading == section][1:]
            self.assertEqual(names, effect["presets"], effect["name"])

    def test_pattern_page_has_every_pattern_in_order(self):
        items = next(p["items"] for e in self.effects for p in e["parameters"] if p["kind"] == "menu")
        self.assertEqual([cells[0] for _, cells in Page(PAGES / "pattern.html").rows][1:], items)


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1], verbosity=2)
