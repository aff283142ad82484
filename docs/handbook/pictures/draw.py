#!/usr/bin/env python3
"""Draws what an update reaches, for a page that asks for pictures, as SVG files beside this script.

usage: draw.py [--check] KXCONFIG PAGE

A page asks for one with the comment <!-- picture: NAME FILE KEY VALUE -->, where FILE is an XML block of the page
that is marked with <!-- file: FILE -->. The script computes what each element is compared with; which of them
change is the output of `kxconfig set --dry-run`, and the two must agree. --check writes nothing and fails if a picture
is not up to date.
"""

import pathlib
import re
import subprocess
import sys
import tempfile
import xml.etree.ElementTree as tree
from xml.sax.saxutils import escape

WIDTH, HEIGHT, GAP_X, GAP_Y, MARGIN, CHARACTER = 150, 44, 16, 42, 14, 7.3


class Box:
    def __init__(self, element, path):
        attributes = "".join(f' {name}="{value}"' for name, value in element.attrib.items())
        self.title = f"<{element.tag}{attributes}>"
        self.text = (element.text or "").strip() if len(element) == 0 else ""
        self.path, self.tag, self.attributes = path, element.tag, element.attrib
        self.note, self.state, self.below = "", "seen", []
        for child in element:
            same = [other for other in element if other.tag == child.tag]
            index = f"[{same.index(child) + 1}]" if len(same) > 1 else ""
            self.below.append(Box(child, f"{path}/{child.tag}{index}"))

    def all(self):
        yield self
        for box in self.below:
            yield from box.all()


def holds(condition, box):
    name, _, value = condition.partition("=")
    return box.attributes.get(name) == value


def update(parent, key):
    """The walk of an update; notes at each box what became of it."""
    first, dot, rest = key.partition(".")
    again, onward = (first, rest) if dot else ("", key)
    segment = first
    for box in parent.below:
        name, _, condition = segment.partition("@")
        box.note = f"compared with {segment}" if segment else "compared with an empty name"
        if name == box.tag and condition and not holds(condition, box):
            box.note, box.state = f"not {segment}: skipped", "out"
            for inner in box.all():
                inner.state = "out"
            segment = again
            continue
        if name == box.tag:
            box.note = f"is {segment}"
            box.state = "changed" if box.text else "seen"
        segment = onward
        update(box, onward)


def place(box, depth, left):
    """Sets the box's place, leaves from left to right; returns where the next one begins."""
    box.y = MARGIN + depth * (HEIGHT + GAP_Y)
    box.width = max(WIDTH, CHARACTER * max(len(box.title), len(box.note) * 0.9) + 16)
    right = left
    for inner in box.below:
        right = place(inner, depth + 1, right)
    if box.below:
        box.x = (box.below[0].x + box.below[-1].x + box.below[-1].width - box.width) / 2
    else:
        box.x, right = left, left + box.width + GAP_X
    return max(right, box.x + box.width + GAP_X)


STYLE = """text{font-family:monospace;font-size:12px;fill:#111}
.note{font-size:11px;fill:#444}.line{stroke:#777;fill:none}
.seen{fill:#fff;stroke:#777}.out{fill:#eee;stroke:#999;stroke-dasharray:4 3}
.changed{fill:#fff3c4;stroke:#8a5a00;stroke-width:2.5}"""


def drawn(box, value):
    middle = box.x + box.width / 2
    yield f'<rect class="{box.state}" x="{box.x:.0f}" y="{box.y}" width="{box.width:.0f}" height="{HEIGHT}" rx="5"/>'
    lines = [box.title]
    if box.text:
        lines.append(f'"{box.text}" → "{value}"' if box.state == "changed" else f'"{box.text}"')
    for i, line in enumerate(lines):
        y = box.y + (18 if len(lines) == 2 else 27) + 17 * i
        yield f'<text x="{middle:.0f}" y="{y}" text-anchor="middle">{escape(line)}</text>'
    if box.note:
        y = box.y + HEIGHT + 13
        yield f'<text class="note" x="{middle:.0f}" y="{y}" text-anchor="middle">{escape(box.note)}</text>'
    for inner in box.below:
        top = box.y + HEIGHT + (18 if box.note else 0)
        yield f'<path class="line" d="M{middle:.0f} {top}L{inner.x + inner.width / 2:.0f} {inner.y}"/>'
        yield from drawn(inner, value)


def picture(text, key, value):
    root = tree.fromstring(text)
    top = Box(root, f"/{root.tag}")
    update(top, key.partition(".")[2])
    width = place(top, 0, MARGIN) - GAP_X + MARGIN
    height = max(box.y for box in top.all()) + HEIGHT + 18 + MARGIN
    lines = [f'<svg xmlns="http://www.w3.org/2000/svg" width="{width:.0f}" height="{height}" '
             f'viewBox="0 0 {width:.0f} {height}">', f"<title>{escape(key)}</title>",
             f"<style>{STYLE}</style>", '<rect width="100%" height="100%" fill="#fff"/>', *drawn(top, value), "</svg>"]
    return top, "\n".join(lines) + "\n"


def changed_by(kxconfig, text, key, value):
    with tempfile.NamedTemporaryFile("w", suffix=".xml") as file:
        file.write(text)
        file.flush()
        shown = subprocess.run([kxconfig, "set", "--dry-run", file.name, key, value], text=True,
                               stdout=subprocess.PIPE, stderr=subprocess.DEVNULL)
    return [line.split(": ")[0] for line in shown.stdout.splitlines()]


def main(arguments):
    check = arguments[0] == "--check"
    kxconfig, page = arguments[-2:]
    text = pathlib.Path(page).read_text()
    files, failed = {}, False
    mark = r"<!-- file: (\S+) -->\s*```xml\n(.*?)```|<!-- picture: (\S+) (\S+) (\S+) (\S+) -->"
    for match in re.finditer(mark, text, re.S):
        if match.group(1):
            files[match.group(1)] = match.group(2)
            continue
        name, file, key, value = match.groups()[2:]
        top, svg = picture(files[file], key, value)
        worked_out = [box.path for box in top.all() if box.state == "changed"]
        changed = changed_by(kxconfig, files[file], key, value)
        if worked_out != changed:
            sys.exit(f"{name}: the picture would show {worked_out}, but the library changes {changed}")
        target = pathlib.Path(__file__).parent / f"{name}.svg"
        if not check:
            target.write_text(svg)
        elif not target.exists() or target.read_text() != svg:
            print(f"{target.name} is not up to date: run docs/handbook/pictures/draw.py", file=sys.stderr)
            failed = True
    return 1 if failed else 0


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
