#!/usr/bin/env python3
"""Prints a page or a header as Doxygen wants it; used by docs/Doxyfile.in.

In a header, the path of a page of the handbook becomes a link to it. In a page:

Headings get the names that links call them by. What is quoted as `CXMLReader::GetValue()` or `CXmlNode` becomes plain,
so that it is linked to the reference. Other quotations are written so that Doxygen reads nothing into them.
"""

import html
import pathlib
import re
import sys

CLASSES = "CXMLReader|CXMLWriter|CXmlParser|CXmlNode|CXmlAttr|IConfigReader|IConfigWriter"
FACTORIES = "GetCXMLReaderObject|GetCXMLWriterObject|GetCXMLWriterObjectNoParam"


def name_of(page, heading):
    plain = re.sub(r"[^\w\- ]", "", heading.lower()).replace(" ", "-")
    return f"{pathlib.Path(page).stem.lower()}-{plain}"


def quotation(text):
    if re.fullmatch(rf"(?:{CLASSES})(?:::\w+(?:\(\))?)?|{FACTORIES}", text):
        return text
    if re.search("[&@<>%]", text):
        escaped = re.sub(r"([\\@*_#%])", r"\\\1", html.escape(text)).replace("--", r"\--")
        return f"<code>{escaped}</code>"
    return f"``{text}``" if "'" in text else f"`{text}`"


def filtered(page):
    in_block = False
    stem = pathlib.Path(page).stem.lower()
    for line in pathlib.Path(page).read_text().splitlines():
        if line.lstrip().startswith("```"):
            in_block = not in_block
        elif not in_block:
            heading = re.match(r"(##+) (.*)", line)
            if heading:
                line += f" {{#{name_of(page, heading.group(2))}}}"
            line = re.sub(r"\]\(#([\w-]+)\)", lambda link: f"](#{stem}-{link.group(1)})", line)
            line = re.sub(r"\]\(([\w-]+)\.md#([\w-]+)\)", r"](#\1-\2)", line)
            line = line.replace("](README.md)", "](index.html)").replace("](../../include)", "](files.html)")
            line = re.sub(r"`([^`]+)`", lambda quoted: quotation(quoted.group(1)), line)
        yield line


def linked(header):
    return re.sub(r"docs/handbook/([\w-]+)\.md",
                  lambda page: f"[{page[0]}](@ref md_docs_handbook_{page[1].replace('-', '_')})",
                  pathlib.Path(header).read_text())


print(linked(sys.argv[1]) if sys.argv[1].endswith(".h") else "\n".join(filtered(sys.argv[1])))
