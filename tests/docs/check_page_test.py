#!/usr/bin/env python3
"""Gives check_page.py pages that are wrong in one place, and one that is right.

usage: check_page_test.py OPTIONS_OF_CHECK_PAGE...
"""

import pathlib
import subprocess
import sys
import tempfile

FILE = "<!-- file: device.xml -->\n```xml\n<cfg><name>box</name></cfg>\n```\n"


def console(*lines):
    return FILE + "```console\n" + "".join(line + "\n" for line in lines) + "```\n"


def cpp(code, output=None):
    return FILE + f"```cpp\n{code}\n```\n" + ("" if output is None else f"```output\n{output}\n```\n")


PROGRAM = '#include <iostream>\nint main(int, char**) { std::cout << "box"; return 0; }'

RIGHT = {
    "a command": console("$ kxconfig get device.xml cfg.name", "box"),
    "a status": console("$ kxconfig get device.xml cfg 2>/dev/null", "$ echo $?", "2"),
    "a variable": console("$ export A=1", "$ echo $A", "1"),
    "lines left out": console("$ seq 4", "1", "...", "4"),
    "the rest of a line left out": console("$ echo a b c", "a b..."),
    "a continued command": console("$ echo a \\", "> b", "a b"),
    "a record": console("$ kxconfig --log-mask value get device.xml cfg.name",
                        "2001-01-01T00:00:00.000 value GetValue:1 Key is cfg.name", "...", "box"),
    "a snippet": cpp('std::cout << CXMLReader("device.xml").GetValue("cfg.name");', "box"),
    "a program": cpp(PROGRAM, "box"),
    "a marked block": "<!-- untested: cannot be -->\n```sh\nfalse\n```\n",
}
WRONG = {
    "another value": console("$ kxconfig get device.xml cfg.name", "crate"),
    "a line too many": console("$ kxconfig get device.xml cfg.name", "box", "box"),
    "a line too few": console("$ seq 2", "1"),
    "another beginning of a line": console("$ echo a b c", "a c..."),
    "another record": console("$ kxconfig --log-mask value get device.xml cfg.name",
                              "2001-01-01T00:00:00.000 error GetValue:1 Key is cfg.name", "...", "box"),
    "a snippet that does not compile": cpp("CXMLReader reader = 1;"),
    "a warning": cpp("#include <iostream>\nint main(int n, char**) { return 0; }"),
    "C++11": cpp("auto x = nullptr;"),
    "another output": cpp(PROGRAM, "crate"),
    "a program that fails": cpp("return 1;", ""),
    "a file that is not well-formed": "```xml\n<cfg>\n```\n",
    "a script that fails": "```sh\nfalse\ntrue\n```\n",
    "an unknown language": "```fortran\n```\n",
    "a comment about nothing": "<!-- file: a.xml -->\nText.\n",
}


def passes(page_text):
    with tempfile.NamedTemporaryFile("w", suffix=".md") as page:
        page.write(page_text)
        page.flush()
        check = pathlib.Path(__file__).with_name("check_page.py")
        done = subprocess.run([sys.executable, check, *sys.argv[1:], page.name],
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
    return done.returncode == 0


failures = [f"found wrong, but is right: {name}" for name, page in RIGHT.items() if not passes(page)]
failures += [f"wrong, but not found: {name}" for name, page in WRONG.items() if passes(page)]
print("\n".join(failures) or f"{len(RIGHT)} right pages, {len(WRONG)} wrong ones")
sys.exit(1 if failures else 0)
