#!/usr/bin/env python3
"""Checks that the sources of a build compile without a warning with the headers of another libxml2.

usage: compile_with_headers.py BUILD_FOLDER LIBXML2_INCLUDE_FOLDER [SOURCE_FOLDER...]

Repeats the commands of the build, of all sources or of those in the given folders, and produces no object files. A
source that several targets compile is compiled once; sources that are compiled as one, so are here.
"""
import concurrent.futures
import json
import os
import pathlib
import shlex
import subprocess
import sys


def arguments_without_output(command):
    arguments = shlex.split(command)
    at = arguments.index("-o")
    return arguments[:at] + arguments[at + 2:]


def with_headers(arguments, headers):
    """Replaces the folder of the build's own headers, which end in libxml2."""
    return [headers if previous == "-isystem" and pathlib.Path(argument).name == "libxml2" else argument
            for previous, argument in zip([""] + arguments, arguments)]


def compiles(entry, headers):
    arguments = with_headers(arguments_without_output(entry["command"]), headers)
    result = subprocess.run(arguments + ["-fsyntax-only"], cwd=entry["directory"], check=False,
                            stderr=subprocess.PIPE, text=True)
    if result.returncode != 0 or result.stderr:
        print(f"{entry['file']} with {headers}:\n{result.stderr}", file=sys.stderr)
    return result.returncode == 0 and not result.stderr


def selected(entry, folders):
    source = pathlib.Path(entry["file"])
    return source.suffix in (".cpp", ".cxx") and (
        not folders or any(source.is_relative_to(folder) for folder in folders))


def main(build, headers, *folders):
    if not pathlib.Path(headers, "libxml", "tree.h").exists():
        sys.exit(f"{headers} has no libxml/tree.h")
    folders = [pathlib.Path(folder).resolve() for folder in folders]
    commands = json.loads(pathlib.Path(build, "compile_commands.json").read_text())
    sources = {entry["file"]: entry for entry in commands if selected(entry, folders)}
    with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as workers:
        results = list(workers.map(lambda entry: compiles(entry, headers), sources.values()))
    print(f"{results.count(True)} of {len(results)} sources compile with {headers}")
    return 0 if results and all(results) else 1


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
