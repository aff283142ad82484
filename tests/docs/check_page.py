#!/usr/bin/env python3
"""Runs what a page of the documentation shows, and fails where the page is wrong.

usage: check_page.py --root FOLDER --build FOLDER --cxx COMPILER [--cxx-flags FLAGS] --engine FOLDER [--update] PAGE

With --update, what commands and programs print is written into the page where it differs; read it before you
believe it.

Each fenced block of the page is dealt with by its language, in the order of the page, in one scratch folder:

  xml      must be well-formed
  cpp      is compiled as C++98 without a warning; a block without main() becomes the body of one. If an
           "output" block follows, the program is run and must print that.
  output   what the cpp block before it prints
  console  lines after "$ " are commands, the lines below each are what it must print; "> " continues a command,
           a line "..." stands for any number of lines, and "..." at the end of a line for its rest
  sh       must run without a failure
  python   must be a program; commands run it
  json     must be well-formed; after "printed by", what the command printed, laid out for reading
  text     a drawing; nothing is run

Comments before a block say more of it:

  <!-- file: NAME -->      the block is also written to this file
  <!-- given: CODE -->     a cpp block stands in a function in which this comes first
  <!-- untested: REASON --> the block is not run, and why
  <!-- printed by: COMMAND --> a json block is what the command prints

Times and source lines of log records are not compared. In console blocks $KX is the folder of the clone.
"""

import argparse
import difflib
import json
import os
import pathlib
import re
import shlex
import shutil
import subprocess
import sys
import tempfile
import xml.dom.minidom

COMMENT = re.compile(r"^\s*<!-- (file|given|untested|printed by): (.*?) -->\s*$")
FENCE = re.compile(r"^(\s*)```(\S*)\s*$")
RECORD = re.compile(r"^\d{4}-\d\d-\d\dT\d\d:\d\d:\d\d\.\d{3} (\w+) ([~\w]+):\d+ ?", re.M)


class Failure(Exception):
    pass


class Block:
    def __init__(self, line, language, text, notes):
        self.line, self.language, self.text, self.notes = line, language, text, notes


def blocks_of(page):
    """The page's blocks, each with the comments that stand before it."""
    found, notes, lines = [], {}, page.read_text().splitlines()
    at = 0
    while at < len(lines):
        comment, fence = COMMENT.match(lines[at]), FENCE.match(lines[at])
        if fence:
            start, indent = at + 1, len(fence.group(1))
            at = start
            while lines[at].strip() != "```":
                at += 1
            text = "".join(line[indent:] + "\n" for line in lines[start:at])
            found.append(Block(start, fence.group(2), text, notes))
            notes = {}
        elif comment:
            notes[comment.group(1)] = comment.group(2)
        elif lines[at].strip():
            if notes:
                raise Failure(f"{page}:{at}: a comment about a block, but no block follows")
        at += 1
    return found


def comparable(text):
    text = RECORD.sub(r"TIME \1 \2:LINE ", text)
    return [line.rstrip() for line in text.rstrip("\n").split("\n")]


def matches(expected, actual):
    """Whether the lines are the same; "..." among those expected stands for any number."""
    if not expected:
        return not actual
    if expected[0] == "...":
        return any(matches(expected[1:], actual[i:]) for i in range(len(actual) + 1))
    return bool(actual) and line_matches(expected[0], actual[0]) and matches(expected[1:], actual[1:])


def line_matches(expected, actual):
    """Whether the line is the same; "..." at the end of what is expected stands for any rest."""
    return actual.startswith(expected[:-3]) if expected.endswith("...") else expected == actual


class Checker:
    def __init__(self, options, scratch):
        self.options = options
        self.scratch = scratch / "work"
        self.scratch.mkdir()
        self.programs = 0
        self.corrections = {}  # of blocks, by line
        self.status = 0
        root, build = options.root, options.build
        self.includes = [f"-I{root}/include", f"-I{root}/platform/include", "-isystem", options.engine,
                         "-DU_SHOW_CPLUSPLUS_API=0"]
        libraries = [build / "src", build / "platform"]
        self.link = [f"-L{folder}" for folder in libraries] + [f"-Wl,-rpath,{folder}" for folder in libraries]
        self.link += ["-lKX_XMLConfigParser", "-lKX_Platform", "-lxml2"]
        self.make_clone(scratch)

    def make_clone(self, scratch):
        """A folder like a clone that was built by the quickstart, of which the pages speak."""
        clone, tools = scratch / "clone", scratch / "bin"
        (clone / "build").mkdir(parents=True)
        tools.mkdir()
        for name in ("include", "platform", "examples"):
            (clone / name).symlink_to(self.options.root / name)
        (clone / "build/release").symlink_to(self.options.build)
        (tools / "kxconfig").symlink_to(self.options.build / "tools/kxconfig")
        compiler = tools / "g++"
        # By its path: the wrapper is found first under its own name.
        compiler.write_text(f'#!/bin/sh\nexec {shutil.which(self.options.cxx)} {self.options.cxx_flags} "$@"\n')
        compiler.chmod(0o755)
        self.environment = dict(os.environ, KX=str(clone), LC_ALL="C.UTF-8",
                                PATH=f"{tools}:{os.environ['PATH']}")
        self.environment.pop("KX_LOG_MASK", None)

    def run(self, command):
        done = subprocess.run(command, cwd=self.scratch, env=self.environment, stdin=subprocess.DEVNULL,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT, timeout=120)
        return done.returncode, done.stdout.decode("utf-8", "replace")

    def must_run(self, command):
        status, output = self.run(command)
        if status != 0:
            raise Failure(f"status {status} of {' '.join(map(str, command))}\n{output}")
        return output

    def compared(self, what, expected, actual):
        """Returns what the page is to show, which is what it shows unless it is to be updated."""
        wanted, happened = comparable(expected), comparable(actual)
        if matches(wanted, happened):
            return expected
        if self.options.update:
            return actual if actual.endswith("\n") or not actual else actual + "\n"
        difference = difflib.unified_diff(wanted, happened, "the page", "what happens", lineterm="", n=99)
        raise Failure(what + "\n" + "\n".join(difference))

    def corrected(self):
        """The page with the corrections."""
        lines = self.options.page.read_text().splitlines(keepends=True)
        for line, (old, new) in sorted(self.corrections.items(), reverse=True):
            lines[line : line + old.count("\n")] = [new]
        return "".join(lines)

    def correct(self, block, text):
        if text != block.text:
            self.corrections[block.line] = (block.text, text)

    def check_all(self, blocks):
        for block, following in zip(blocks, blocks[1:] + [None]):
            where = f"{self.options.page}:{block.line}: "
            check = getattr(self, "check_" + block.language, None)
            try:
                if "file" in block.notes:
                    (self.scratch / block.notes["file"]).write_text(block.text)
                if "untested" in block.notes:
                    continue
                if check is None:
                    raise Failure(f'nothing is known of blocks in "{block.language}"')
                check(block, following)
            except (Failure, subprocess.TimeoutExpired) as failure:
                raise Failure(where + str(failure)) from None

    def check_xml(self, block, _):
        try:
            xml.dom.minidom.parseString(block.text)
        except Exception as error:
            raise Failure(f"not well-formed: {error}") from None

    def check_cpp(self, block, following):
        whole = "int main(" in block.text
        program = block.text if whole else self.program_around(block)
        self.programs += 1
        source = self.scratch.parent / f"block{self.programs}.cpp"
        binary = source.with_suffix("")
        source.write_text(program)
        lenient = [] if whole else ["-Wno-unused-variable", "-Wno-unused-but-set-variable"]
        self.must_run([self.options.cxx, "-std=c++98", "-Wall", "-Wextra", "-Werror", *lenient,
                       *shlex.split(self.options.cxx_flags), *self.includes, str(source), "-o", str(binary),
                       *self.link])
        if following is not None and following.language == "output":
            printed = self.must_run([str(binary)])
            self.correct(following, self.compared("the program prints something else", following.text, printed))

    @staticmethod
    def program_around(block):
        lines = block.text.splitlines()
        includes = [line for line in lines if line.startswith("#include")]
        body = [line for line in lines if not line.startswith("#include")]
        return "\n".join(["#include <iostream>", "#include <string>", *includes,
                          *[f'#include "{name}.h"' for name in ("CXMLReader", "CXMLWriter", "CXmlParser")],
                          "int main()", "{", block.notes.get("given", ""), *body, "return 0;", "}", ""])

    def check_output(self, block, _):
        """Compared with the block before it."""

    def check_console(self, block, _):
        command, expected, shown = None, "", ""
        for line in block.text.splitlines() + ["$ "]:
            if line.startswith("$ "):
                if command is not None:
                    shown += "$ " + command.replace("\n", "\n> ") + "\n" + self.check_command(command, expected)
                command, expected = line[2:], ""
            elif line.startswith("> ") and not expected:
                command += "\n" + line[2:]
            else:
                expected += line + "\n"
        self.correct(block, shown)

    def check_command(self, command, expected):
        self.status, output = self.run(["bash", "-c", self.in_session(command)])
        return self.compared("$ " + command, expected, output)

    def in_session(self, command):
        """The command with the status, the folder and the exported variables that the one before it left."""
        session = shlex.quote(str(self.scratch.parent / "session"))
        return (f"[ ! -e {session} ] || . {session}\n"
                f"trap '{{ export -p; printf \"cd %q\\n\" \"$PWD\"; }} >{session}' EXIT\n"
                f"(exit {self.status})\n{command}")

    def check_sh(self, block, _):
        self.must_run(["bash", "-euo", "pipefail", "-c", block.text])

    def check_json(self, block, _):
        shown = json.loads(block.text)
        if "printed by" in block.notes:
            command = ["bash", "-c", block.notes["printed by"]]
            printed = json.loads(self.run(command)[1])
            if printed != shown:
                raise Failure("prints " + json.dumps(printed, indent=2))

    def check_python(self, block, _):
        try:
            compile(block.text, "block", "exec")
        except SyntaxError as error:
            raise Failure(str(error)) from None

    def check_text(self, block, _):
        """A drawing."""


def main():
    parser = argparse.ArgumentParser()
    for name in ("root", "build"):
        parser.add_argument("--" + name, type=pathlib.Path, required=True)
    parser.add_argument("--cxx", required=True)
    parser.add_argument("--cxx-flags", default="")
    parser.add_argument("--engine", required=True)
    parser.add_argument("--update", action="store_true")
    parser.add_argument("page", type=pathlib.Path)
    options = parser.parse_args()
    scratch = pathlib.Path(tempfile.mkdtemp(prefix="kx-docs-"))
    try:
        blocks = blocks_of(options.page)
        checker = Checker(options, scratch)
        checker.check_all(blocks)
        if checker.corrections:
            options.page.write_text(checker.corrected())
    except Failure as failure:
        print(failure, file=sys.stderr)
        return 1
    finally:
        shutil.rmtree(scratch)
    untested = sum("untested" in block.notes for block in blocks)
    print(f"{len(blocks)} blocks, {untested} of them marked as not run")
    return 0


if __name__ == "__main__":
    sys.exit(main())
