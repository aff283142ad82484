#!/usr/bin/python3
"""Checks files against .editorconfig. usage: check_editorconfig.py FILE...

Debian's interpreter, whose package the module comes from.
"""

import os
import sys

from editorconfig import get_properties


def line_faults(line, rules):
    """Yields what is wrong with a line, given without its end."""
    if rules.get("trim_trailing_whitespace") == "true" and line != line.rstrip():
        yield "blanks at the end"
    if rules.get("indent_style") == "space" and line.startswith("\t"):
        yield "indented by a tab"
    limit = rules.get("max_line_length", "off")
    if limit.isdigit() and len(line) > int(limit):
        yield f"{len(line)} characters, more than {limit}"
    if rules.get("end_of_line") == "lf" and line.endswith("\r"):
        yield "carriage return"


def faults(path):
    """Yields line number and fault of what is wrong with a file."""
    rules = get_properties(os.path.abspath(path))
    with open(path, "rb") as file:
        content = file.read()
    try:
        text = content.decode("utf-8")
    except UnicodeDecodeError:
        if rules.get("charset") == "utf-8":
            yield 1, "not UTF-8"
        return
    lines = text.split("\n")
    if text and rules.get("insert_final_newline") == "true" and lines[-1]:
        yield len(lines), "no newline at the end"
    for number, line in enumerate(lines, 1):
        for fault in line_faults(line, rules):
            yield number, fault


def main(paths):
    found = [f"{path}:{number}: {fault}" for path in paths for number, fault in faults(path)]
    print("\n".join(found), file=sys.stderr, end="\n" if found else "")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
