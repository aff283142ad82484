#!/usr/bin/env python3
"""Checks that what the pages link to is there: files, and headings in them.

usage: check_links.py PAGE...
"""

import pathlib
import re
import sys

LINK = re.compile(r"\]\(([^)\s]+)\)")


def without_blocks(text):
    return re.sub(r"^\s*```.*?^\s*```\s*$", "", text, flags=re.M | re.S)


def anchors_of(page):
    """The names that a forge gives to the headings of a page."""
    headings = re.findall(r"^#+ (.*)$", without_blocks(page.read_text()), flags=re.M)
    return {re.sub(r"[^\w\- ]", "", heading.lower()).replace(" ", "-") for heading in headings}


def broken_links(page):
    for link in LINK.findall(without_blocks(page.read_text())):
        if link.startswith(("https://", "http://")):
            continue
        name, _, anchor = link.partition("#")
        target = page.parent / name if name else page
        if not target.exists():
            yield f"{page}: {link}: no such file"
        elif anchor and anchor not in anchors_of(target):
            yield f"{page}: {link}: no such heading"


broken = [complaint for page in sys.argv[1:] for complaint in broken_links(pathlib.Path(page))]
print("\n".join(broken) or "every link leads somewhere")
sys.exit(1 if broken else 0)
