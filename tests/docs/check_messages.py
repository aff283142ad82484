#!/usr/bin/env python3
"""Compares the records that the library's sources log with those that a page lists.

usage: check_messages.py SOURCE_FOLDER HEADER_FOLDER PAGE

A row of the page lists a record as | `"text"` | level | `Class::Operation`, ... | meaning |. It must be in the sources
with this text, at this level and from exactly these operations, and every record of the sources must have its row.
Only of "+" and "-", which nearly every operation logs, the operations are not compared.
"""

import collections
import pathlib
import re
import sys

Macro = collections.namedtuple("Macro", "level tag text")  # each is what it always is, or the position of a parameter

STRING = re.compile(r'"((?:[^"\\]|\\.)*)"')
DEFINITION = re.compile(r"^#define (KX_\w+)\(([^)]*)\)((?:.*\\\n)*.*)", re.M)
LEVEL = re.compile(r"\b(LogLevel\w+) = (\d+)")
LEVEL_NAME = re.compile(r"LogLevel\w+")
FUNCTION = re.compile(r"^(?!using|namespace|class|struct|enum|extern \"C\"\s*\{)"
                      r"[A-Za-z][^;{}(]*?([\w:]*~?\w+)\((?:[^;{}]*)\n\{", re.M)
ROW = re.compile(r'^\| `"(.*)"` \| (\d+) \| (.*?) \|', re.M)
TRACE = {"+", "-"}  # logged by nearly every operation


class Unclear(Exception):
    """A record of which text, tag or operation cannot be seen in the source."""


def levels_of(log_header):
    return {name: int(number) for name, number in LEVEL.findall(log_header)}


def macros_of(log_header):
    """The log macros that take a text, whatever they are called: given away by their parameters."""
    for name, parameters, body in DEFINITION.findall(log_header):
        parameters = [parameter.strip() for parameter in parameters.split(",")]
        positions = {parameter: position for position, parameter in enumerate(parameters)}
        text = positions.get("text", positions.get("format"))
        if text is not None:
            level = LEVEL_NAME.search(body)
            yield name, Macro(level[0] if level else positions["level"], positions.get("tag", "__FUNCTION__"), text)


def without_comments(text):
    return re.sub(r"//[^\n]*|/\*.*?\*/", lambda comment: re.sub(r"[^\n]", " ", comment[0]), text, flags=re.S)


def arguments_at(text, start):
    """The arguments of the call whose parenthesis opens before start."""
    found, depth, at = [""], 0, start
    while depth >= 0:
        string = STRING.match(text, at)
        piece = string[0] if string else text[at]
        depth += (piece == "(") - (piece == ")")
        if piece == "," and depth == 0:
            found.append("")
        elif depth >= 0:
            found[-1] += piece
        at += len(piece)
    return [argument.strip() for argument in found]


def calls_of(name, text):
    """Where a function or macro is called, and with which arguments."""
    for call in re.finditer(rf"(?<![\w:~]){name}\(", text):
        yield call.start(), arguments_at(text, call.end())


class Sources:
    def __init__(self, folder, headers):
        self.texts = {path: without_comments(path.read_text()) for path in sorted(folder.rglob("*.*"))
                      if path.suffix in (".h", ".cpp") and path.name != "Log.h"}
        log_header = (folder / "diag/Log.h").read_text()
        self.levels = levels_of(log_header)
        self.macros = dict(macros_of(log_header))
        self.classes = {path.stem: without_comments(path.read_text()) for path in headers.glob("C*.h")}

    def function_around(self, text, at):
        """The definition that a place lies in, or None for one inside a class."""
        found = [function for function in FUNCTION.finditer(text, 0, at) if text.find("\n}", function.end()) > at]
        return found[-1] if found else None

    def tags_of(self, argument, path, at):
        """The tags that an argument can be: a literal, the function's name, or what callers pass for a parameter."""
        if STRING.fullmatch(argument):
            return [argument[1:-1]]
        text = self.texts[path]
        function = self.function_around(text, at)
        if function is None:
            raise Unclear(f"the tag {argument} is used inside a class")
        if argument == "__FUNCTION__":
            return [function[1].split("::")[-1]]
        constant = re.search(rf'\b{argument} = "(\w+)"', text[function.end():at])
        return [constant[1]] if constant else self.tags_passed(argument, path, function)

    def tags_passed(self, parameter, path, function):
        _, parameters = next(calls_of(function[1], function[0]))
        position = next(i for i, declared in enumerate(parameters) if declared.endswith(parameter))
        for caller, text in self.texts.items():
            for at, arguments in calls_of(function[1], text):
                if caller != path or not function.start() <= at < function.end():
                    yield from self.tags_of(arguments[position], caller, at)

    def operation(self, tag, path, at):
        """The operation of a public class that a tag names, by its class."""
        function = self.function_around(self.texts[path], at)
        name = function[1].split("::")[0] if function else ""
        owners = [name] if name in self.classes else [
            owner for owner, text in self.classes.items() if re.search(rf"(?<![\w~:>]){tag}\(", text)]
        if len(owners) != 1:
            raise Unclear(f"{tag} is an operation of {owners or 'no public class'}")
        return owners[0] + "::" + tag

    def records(self):
        for path, text in self.texts.items():
            for name, macro in self.macros.items():
                for at, arguments in calls_of(name, text):
                    try:
                        yield from self.records_at(path, at, macro, arguments)
                    except Unclear as reason:
                        raise SystemExit(f"{path}:{text.count(chr(10), 0, at) + 1}: {reason}") from None

    def records_at(self, path, at, macro, arguments):
        level, tag, text = (arguments[part] if isinstance(part, int) else part for part in macro)
        record = "".join(STRING.findall(text))
        if not record:
            raise Unclear("the text is not a literal")
        number = self.levels[LEVEL_NAME.search(level)[0]]
        if record in TRACE:
            yield record, number, None
            return
        for name in self.tags_of(tag, path, at):
            yield record, number, self.operation(name, path, at)


def listed(page):
    for text, level, operations in ROW.findall(page.read_text()):
        for operation in [None] if text in TRACE else re.findall(r"`([\w:~]+)`", operations):
            yield text, int(level), operation


def main():
    source, headers, page = map(pathlib.Path, sys.argv[1:])
    logged, documented = set(Sources(source, headers).records()), set(listed(page))
    logged |= {(text, 11, None) for text in TRACE}
    for text, level, operation in sorted(logged - documented, key=str):
        print(f'{page}: missing: "{text}" at level {level} from {operation}')
    for text, level, operation in sorted(documented - logged, key=str):
        print(f'{page}: not in the sources: "{text}" at level {level} from {operation}')
    print(f"{len(logged)} records, by text, level and operation")
    return 0 if logged == documented else 1


sys.exit(main())
