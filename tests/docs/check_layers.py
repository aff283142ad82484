#!/usr/bin/env python3
"""Checks that the client's directories include each other only as the table of its layers states.

usage: check_layers.py RECORD CLIENT_FOLDER
"""

import pathlib
import re
import sys

ROW = re.compile(r"^\| `(\w+)/` \|[^|]*\| (.*?) \|$", re.M)
INCLUDE = re.compile(r'^#include "(\w+)/', re.M)


def stated(record):
    """By directory, the directories that it may include. The table has them from the top down."""
    rows = ROW.findall(record.read_text())
    names = [name for name, _ in rows]
    allowed = {}
    for row, (name, cell) in enumerate(rows):
        below = names[row + 1:]
        allowed[name] = below if cell == "all below" else re.findall(r"`(\w+)`", cell)
        for other in set(allowed[name]) - set(below):
            yield f"{record}: {name} is stated to include {other}, which is not below it"
    yield allowed


def arrows(client, names):
    """The includes of one directory by another."""
    for source in sorted(client.glob("*/*.*")):
        for other in INCLUDE.findall(source.read_text()):
            if other in names and other != source.parent.name:
                yield source, other


def complaints(record, client):
    *broken, allowed = stated(record)
    yield from broken
    folders = {folder.name for folder in client.iterdir() if folder.is_dir()}
    for name in sorted(folders ^ set(allowed)):
        yield f"{record}: {name} is not both a directory and a row of the table"
    used = set()
    for source, other in arrows(client, folders):
        used.add((source.parent.name, other))
        if other not in allowed.get(source.parent.name, []):
            yield f"{source}: includes {other}"
    for name, others in allowed.items():
        for other in others:
            if (name, other) not in used:
                yield f"{record}: {name} does not include {other}"


found = list(complaints(pathlib.Path(sys.argv[1]), pathlib.Path(sys.argv[2])))
print("\n".join(found) or "the layers are as stated")
sys.exit(1 if found else 0)
