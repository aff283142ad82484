#!/usr/bin/python3
"""Measures kxconfig and the programs that it is compared with, and describes the result in Markdown.

usage: client_performance.py measure KXCONFIG LOAD FOLDER   writes FOLDER/client.json
       client_performance.py page FOLDER PAGE               replaces the section of the page
"""

import json
import os
import platform
import re
import statistics
import subprocess
import sys
import time
from collections import namedtuple
from pathlib import Path

ROUNDS = int(os.environ.get("KX_CLIENT_ROUNDS", "7"))

LARGE = "50 MB, 1.9 million elements"
SIBLINGS = "100,000 siblings"

BARE = "load and look up"
XMLLINT = "xmllint --xpath"
XMLSTARLET_EL = "xmlstarlet el -v"
XMLSTARLET_ED = "xmlstarlet ed"

# A file, the key of an element in its middle, and an expression for many. An update by that key would reach most of the
# file, so that another element is updated.
Workload = namedtuple("Workload", "path key many")

LAST = "  <last>\n    <title>old</title>\n  </last>\n</cfg>\n"
LAST_KEY = "cfg.last.title"
LAST_ELEMENT = "/cfg/last/title"


def write_large(path):
    with path.open("w") as file:
        file.write('<?xml version="1.0" encoding="UTF-8"?>\n<cfg>\n')
        for section in range(31148):
            file.write(f'  <section name="section-{section}">\n')
            for item in range(20):
                file.write(f'    <item id="{item}">\n      <name>item {section * 20 + item}</name>\n'
                           '      <on/>\n    </item>\n')
            file.write("  </section>\n")
        file.write(LAST)


def write_siblings(path):
    with path.open("w") as file:
        file.write('<?xml version="1.0" encoding="UTF-8"?>\n<cfg>\n')
        for item in range(100000):
            file.write(f'  <item id="{item}"><v>value {item}</v></item>\n')
        file.write(LAST)


def workloads(folder):
    large = Workload(folder / "large.xml", "cfg.section@name=section-15000.item@id=7.name", "//name")
    siblings = Workload(folder / "siblings.xml", "cfg.item@id=50000.v", "//v")
    write_large(large.path)
    write_siblings(siblings.path)
    return {LARGE: large, SIBLINGS: siblings}


def commands(work, kxconfig, load):
    path, output = str(work.path), str(work.path.with_suffix(".out"))
    return {
        BARE: [load, path, work.key],
        "get": [kxconfig, "get", path, work.key],
        "explain": [kxconfig, "explain", path, work.key],
        "find": [kxconfig, "find", path, work.many],
        XMLLINT: ["xmllint", "--xpath", work.many, path],
        "keys": [kxconfig, "keys", path],
        XMLSTARLET_EL: ["xmlstarlet", "el", "-v", path],
        "set --output": [kxconfig, "set", "--output", output, path, LAST_KEY, "new"],
        XMLSTARLET_ED: ["xmlstarlet", "ed", "-u", LAST_ELEMENT, "-v", "new", path],
        "check": [kxconfig, "check", path],
    }


# --- Measuring

def run(command, output):
    """The processor time in seconds and the most memory in KB that the command takes."""
    with output.open("wb") as stream:
        process = subprocess.Popen(command, stdout=stream, stderr=subprocess.PIPE)
        errors = process.stderr.read()
        _, status, usage = os.wait4(process.pid, 0)
        process.returncode = os.waitstatus_to_exitcode(status)
    is_silent = output.stat().st_size == 0 and "check" not in command  # which finds nothing to warn of
    if process.returncode != 0 or is_silent:
        sys.exit(f"{' '.join(command)}: exit status {process.returncode}\n{errors.decode(errors='replace')}")
    return [usage.ru_utime + usage.ru_stime, usage.ru_maxrss]


def measure(kxconfig, load, folder):
    folder.mkdir(parents=True, exist_ok=True)
    files = workloads(folder)
    rounds = []
    for number in range(1, ROUNDS + 1):
        print(f"== client, round {number} of {ROUNDS}", flush=True)
        rounds.append({f"{name}/{operation}": run(command, folder / "output")
                       for name, work in files.items()
                       for operation, command in commands(work, kxconfig, load).items()})
    results = {"date": time.strftime("%Y-%m-%d"), "machine": machine(), "versions": versions(), "rounds": rounds}
    (folder / "client.json").write_text(json.dumps(results, indent=1) + "\n")
    for path in folder.glob("*"):
        if path.suffix != ".json":
            path.unlink()


def machine():
    names = re.findall(r"^model name\s*:\s*(.*)$", Path("/proc/cpuinfo").read_text(), re.M)
    return f"{names[0] if names else platform.machine()}, {os.cpu_count()} processors"


def versions():
    packages = subprocess.run(["dpkg-query", "-W", "-f", "${Package} ${Version}, ", "libxml2", "libxml2-utils",
                               "xmlstarlet"], stdout=subprocess.PIPE, text=True, check=True)
    return packages.stdout.rstrip(", ")


# --- The section of the page

Target = namedtuple("Target", "operation reference limit of")
SECONDS, MEMORY = 0, 1
TARGETS = [
    Target("get", BARE, 1.1, SECONDS),
    Target("explain", BARE, 1.1, SECONDS),
    Target("find", XMLLINT, 1.3, SECONDS),
    Target("keys", XMLSTARLET_EL, 1.5, SECONDS),
    Target("set --output", XMLSTARLET_ED, 2.0, SECONDS),
    Target("check", "get", 4.0, SECONDS),
    Target("keys", "get", 1.3, MEMORY),
    Target("explain", "get", 1.3, MEMORY),
    Target("find", "get", 1.3, MEMORY),
    Target("check", "get", 1.6, MEMORY),
    Target("set --output", "get", 1.6, MEMORY),
]


def ratios(results, target, name):
    return [one[f"{name}/{target.operation}"][target.of] / one[f"{name}/{target.reference}"][target.of]
            for one in results["rounds"]]


def target_row(results, target):
    cells = [f"`{target.operation}`" + (", memory" if target.of == MEMORY else ""),
             target.reference if target.reference == BARE else f"`{target.reference}`", f"{target.limit:.1f}×"]
    kept = True
    for name in (LARGE, SIBLINGS):
        values = ratios(results, target, name)
        middle = statistics.median(values)
        kept = kept and middle <= target.limit
        between = "" if target.of == MEMORY else f" ({min(values):.2f} to {max(values):.2f})"
        cells.append(f"{middle:.2f}×{between}")
    return cells + ["met" if kept else "**missed**"]


def figures_row(results, operation):
    cells = [f"`kxconfig {operation}`" if operation in {target.operation for target in TARGETS} else operation]
    for name in (LARGE, SIBLINGS):
        measured = [one[f"{name}/{operation}"] for one in results["rounds"]]
        cells.append(f"{statistics.median(value[SECONDS] for value in measured):.2f} s")
        cells.append(f"{statistics.median(value[MEMORY] for value in measured) / 1024:,.0f} MB")
    return cells


def markdown(header, rows):
    lines = ["| " + " | ".join(header) + " |", "| --- |" + " --- |" * (len(header) - 1)]
    return "\n".join(lines + ["| " + " | ".join(row) + " |" for row in rows])


SECTION = """`kxconfig`, compared with programs for similar tasks. Times are processor times of whole processes and
include the load of the file. Ratios are the medians of {rounds} rounds, with the range of the single rounds.
`scripts/bench.sh client` measures only this section and renews it.

{targets}

- "{bare}" is a program that loads the file with the library, calls `GetValue()` once, prints the value and ends. As in
  the client, the system takes its memory back.
- `get` and `explain` use a key with conditions, in the middle of the file.
- `set` and `xmlstarlet ed` change the same element, and no other. An update that reaches many elements takes longer,
  and is not measured.
- `find` and `xmllint` print all elements of one name.
- `xmlstarlet el -v` builds no tree and prints no values.
- `set` verifies that what it saves loads again.
- `check` covers every key of the file.

{figures}

Measured on {date}: {machine}; {versions}."""


def section(results):
    operations = [key.split("/", 1)[1] for key in results["rounds"][0] if key.startswith(LARGE)]
    return SECTION.format(
        rounds=len(results["rounds"]), bare=BARE, date=results["date"], machine=results["machine"],
        versions=results["versions"],
        targets=markdown(["command", "measured against", "at most", LARGE, SIBLINGS, ""],
                         [target_row(results, target) for target in TARGETS]),
        figures=markdown(["program", LARGE, "memory", SIBLINGS, "memory"],
                         [figures_row(results, operation) for operation in operations]))


def section_of(folder):
    """The section, or a note that it was not measured."""
    path = folder / "client.json"
    return section(json.loads(path.read_text())) if path.exists() else "Not measured: run `scripts/bench.sh client`."


HEADING = "## The client\n\n"


def renew(folder, page):
    """Replaces the section, which ends at the next one; a page without it gets it at its end."""
    text = page.read_text()
    start = text.find(HEADING)
    if start < 0:
        start = len(text) + 1
        text += "\n"
    end = text.find("\n## ", start + 1)
    rest = "" if end < 0 else text[end:]
    page.write_text(text[:start] + HEADING + section_of(folder) + "\n" + rest)


def main():
    if sys.argv[1] == "measure":
        measure(sys.argv[2], sys.argv[3], Path(sys.argv[4]))
    else:
        renew(Path(sys.argv[2]), Path(sys.argv[3]))


if __name__ == "__main__":
    main()
