#!/usr/bin/env python3
"""Makes a page for a browser from a Markdown page:   markdown_page.py MARKDOWN OUTPUT NAME...

NAME...: the pages, without extension, that the package has beside OUTPUT. A link to one of them leads to the page. The package
does not contain the other files of the source tree: links to them become plain text, or nothing if they stand alone in
brackets. The style is that of the help pages, which are in the folder help beside OUTPUT.
"""

import html
import re
import subprocess
import sys
from pathlib import Path

PAGE = """<!DOCTYPE html>
<html lang="en">
<head>
<meta charset="utf-8">
<title>{title}</title>
<link rel="stylesheet" type="text/css" href="help/help.css">
</head>
<body>
{body}</body>
</html>
"""
LINK = re.compile(r'<a href="([^"]*)">(.*?)</a>', re.DOTALL)
LINK_IN_BRACKETS = re.compile(r'\s\(<a href="([^"]*)">[^<]*</a>\)')


def page_of(target, pages):
    """The page in the package; None for a file that only the source tree has. Addresses stay as they are."""
    if re.match(r"[a-z]+:", target):
        return target
    path = Path(target.partition("#")[0])
    return f"{path.stem}.html" if path.suffix == ".md" and path.stem in pages else None


def link_in_package(link, pages):
    target, text = link.groups()
    page = page_of(target, pages)
    if page is None:
        return text
    return f'<a href="{page}">{page if text.endswith(".md") else text}</a>'


def convert(markdown, pages):
    body = subprocess.run(["cmark-gfm", "--extension", "table"], input=markdown, capture_output=True, text=True,
                          encoding="utf-8", check=True).stdout
    if "raw HTML omitted" in body or "<img" in body:
        raise ValueError("pages for packages have neither HTML nor pictures")
    title = html.unescape(re.search(r"<h1>(.*?)</h1>", body)[1])
    body = LINK_IN_BRACKETS.sub(lambda link: link[0] if page_of(link[1], pages) else "", body)
    return PAGE.format(title=html.escape(title), body=LINK.sub(lambda link: link_in_package(link, pages), body))


def main():
    source, output, *pages = sys.argv[1:]
    page = convert(Path(source).read_text(encoding="utf-8"), pages)
    Path(output).parent.mkdir(parents=True, exist_ok=True)
    Path(output).write_text(page, encoding="utf-8", newline="\n")


if __name__ == "__main__":
    main()
