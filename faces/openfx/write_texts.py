"""Writes what the plug-ins say about their parameters: write_texts.py HELP LANGUAGE-FILE OUTPUT

Each effect's help page has a table with a row for each control; the last cell says what the control does. Controls that
share a name are told apart as the plug-ins do it: the colour first, then its amount. The labels are those that the language
file has for parameters and menu items.
"""

import html
import re
import sys
import xml.etree.ElementTree as xml
from collections import Counter
from pathlib import Path

EFFECTS = ["Film Camera", "Film Look", "Film Damage", "Film Express", "Film Pro"]
ROW = re.compile(r"<tr><td>(.*?)</td><td>(.*?)</td><td>.*?</td><td>(.*?)</td></tr>")


def text(cell):
    return html.unescape(re.sub(r"<[^>]*>", "", cell)).replace("\N{MINUS SIGN}", "-").strip()


def hints(page):
    rows = [tuple(map(text, row)) for row in ROW.findall(page)]
    count = Counter(name for name, _, _ in rows)
    for name, values, what in rows:
        if count[name] > 1:
            name += " Colour" if values == "any colour" else " Amount"
        yield name, what


# Categories of the language file; of some only the named texts.
CATEGORIES = {9: ["Camera", "New seed", "Seed"], 10: None, 12: ["Preset"], 13: None}


def labels(language):
    for category in language.iter("category"):
        wanted = CATEGORIES.get(int(category.get("id")), [])
        for entry in category.iter("text"):
            words = " ".join(entry.text.split())
            if words != entry.get("key") and (wanted is None or entry.get("key") in wanted):
                yield entry.get("key"), words


def quoted(words):
    return '"' + words.replace("\\", "\\\\").replace('"', '\\"') + '"'


def main(folder, languages, output):
    lines = ['#include "faces/openfx/plugin_params.h"', "", "namespace velmora::hosts::openfx {", "namespace {", "",
             "struct Hint {", "    std::string_view effect, title, text;", "};", "constexpr Hint kHints[] = {"]
    for effect in EFFECTS:
        page = Path(folder, effect.lower().replace(" ", "-") + ".html").read_text(encoding="utf-8")
        found = list(hints(page))
        if not found:
            sys.exit(f"write_texts.py: the help page of {effect} has no table of controls")
        lines += [f"    {{{quoted(effect)}, {quoted(name)}, {quoted(what)}}}," for name, what in found]
    lines += ["};", "struct Label {", "    std::string_view language, english, text;", "};",
              "constexpr Label kLabels[] = {"]
    for language in xml.parse(languages).getroot().iter("language"):
        code = quoted(language.get("code"))
        lines += [f"    {{{code}, {quoted(english)}, {quoted(words)}}}," for english, words in labels(language)]
    lines += ["};", "", "}  // namespace", "", "std::string LabelOf(std::string_view language, std::string_view english) {",
              "    for (const Label& label : kLabels) {",
              "        if (label.language == language && label.english == english) return std::string(label.text);",
              "    }", "    return std::string(english);", "}", "",
              "std::string HintOf(std::string_view effect, std::string_view title) {",
              "    for (const Hint& hint : kHints) {",
              "        if (hint.effect == effect && hint.title == title) return std::string(hint.text);", "    }",
              "    return {};", "}", "", "}  // namespace velmora::hosts::openfx", ""]
    Path(output).write_text("\n".join(lines), encoding="utf-8")


main(*sys.argv[1:])
