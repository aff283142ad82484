#!/usr/bin/env python3
"""Compiles the examples in the comments of headers, as C++98 and without a warning.

usage: check_headers.py COMPILER ENGINE_HEADERS HEADER_FOLDER...

An example is a run of lines that are indented by five blanks after "///". One without a statement is not code.
"""

import pathlib
import re
import subprocess
import sys

EXAMPLE = re.compile(r"(?:^ *///     .*\n)+", re.M)
FRAME = """#include "CXMLReader.h"
#include "CXMLWriter.h"
#include "CXmlParser.h"
#include <iostream>
#include <libxml/xpath.h>
void Example(CXMLReader* reader, CXMLWriter* writer, CXmlParser& parser);
void Example(CXMLReader* reader, CXMLWriter* writer, CXmlParser& parser)
{
    (void)reader; (void)writer; (void)parser;
    {
%s
    }
}
"""


def examples_of(header):
    for found in EXAMPLE.findall(header.read_text()):
        code = re.sub(r"^ *///     ", "", found, flags=re.M)
        if ";" in code:
            yield code


def main():
    compiler, engine, *folders = sys.argv[1:]
    command = [compiler, "-std=c++98", "-Wall", "-Wextra", "-Werror", "-Wno-unused-variable", "-fsyntax-only",
               "-isystem", engine, "-DU_SHOW_CPLUSPLUS_API=0", *["-I" + folder for folder in folders], "-x", "c++", "-"]
    checked = failed = 0
    for header in [header for folder in folders for header in sorted(pathlib.Path(folder).glob("*.h"))]:
        for code in examples_of(header):
            checked += 1
            done = subprocess.run(command, input=FRAME % code, text=True, stderr=subprocess.PIPE)
            if done.returncode != 0:
                failed += 1
                print(f"{header}:\n{code}\n{done.stderr}")
    print(f"{checked} examples")
    return 1 if failed or not checked else 0


sys.exit(main())
