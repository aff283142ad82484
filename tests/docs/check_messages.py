#!/usr/bin/env python3
"""Checks that a page tells every message of the library's sources, with its level, and no other.

usage: check_messages.py SOURCE_FOLDER PAGE

The page's tables tell a message as | "text" | level | ... in their rows.
"""

import pathlib
import re
import sys

LEVELS = {"WARNING": 8, "ERROR": 9, "TRACE": 11, "VALUE": 29, "XPATH": 31}
GATE = re.compile(r'KX_(WARNING|ERROR|TRACE|VALUE|XPATH)(?:_AS|_OF)?\(\s*(?:"?\w+"?,\s*)?((?:"(?:[^"\\]|\\.)*"\s*)+)')
STRING = re.compile(r'"((?:[^"\\]|\\.)*)"')
ROW = re.compile(r'^\| `"(.*)"` \| (\d+) \|', re.M)


def messages_of(sources):
    for source in sorted(sources.rglob("*.cpp")) + sorted(sources.rglob("*.h")):
        for kind, strings in GATE.findall(source.read_text()):
            yield "".join(STRING.findall(strings)), LEVELS[kind]


logged = set(messages_of(pathlib.Path(sys.argv[1])))
told = {(text, int(level)) for text, level in ROW.findall(pathlib.Path(sys.argv[2]).read_text())}
for text, level in sorted(logged - told):
    print(f'not told: "{text}" at level {level}')
for text, level in sorted(told - logged):
    print(f'never logged: "{text}" at level {level}')
print(f"{len(logged)} messages")
sys.exit(0 if logged == told else 1)
