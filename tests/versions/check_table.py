#!/usr/bin/env python3
"""Compares the table of engine versions with what the running engine does.

usage: check_table.py [--write] PAGE PROBE

The first line of the table names the versions. The probe prints its version and, for each behavior, the answer that
belongs in the column of that version. With --write the answers replace the cells. Exit status 77: no such column.
"""
import pathlib
import subprocess
import sys


def cells_of(line):
    return [cell.strip() for cell in line.strip().strip("|").split("|")]


def is_row(line):
    return line.startswith("| ")


def answers_of(probe):
    lines = subprocess.run([probe], check=True, stdout=subprocess.PIPE, text=True).stdout.splitlines()
    return lines[0], dict(line.split("\t") for line in lines[1:])


def table_of(lines):
    """Returns the numbers of the first and of the last line of the table whose first cell is "behavior"."""
    first = next(number for number, line in enumerate(lines) if is_row(line) and cells_of(line)[0] == "behavior")
    last = first
    while last + 1 < len(lines) and is_row(lines[last + 1]):
        last += 1
    return first, last


def formatted(rows):
    widths = [max(len(row[column]) for row in rows) for column in range(len(rows[0]))]
    rows = [rows[0], ["-" * width for width in widths]] + rows[1:]
    return ["| " + " | ".join(cell.ljust(width) for cell, width in zip(row, widths)) + " |" for row in rows]


def compare(rows, column, version, answers):
    names = [row[0] for row in rows]
    differences = [f"{name}: not in the table" for name in answers if name not in names]
    differences += [f"{name}: not probed" for name in names if name not in answers]
    for row in rows:
        answer = answers.get(row[0], row[column])
        if row[column] != answer:
            differences.append(f"{row[0]}, {version}: {answer}, and not {row[column]}")
            row[column] = answer
    return differences


def main(arguments):
    page, probe = pathlib.Path(arguments[-2]), arguments[-1]
    lines = page.read_text().splitlines()
    first, last = table_of(lines)
    rows = [cells_of(line) for number, line in enumerate(lines[first:last + 1]) if number != 1]
    version, answers = answers_of(probe)
    if version not in rows[0]:
        print(f"{page.name} has no column for libxml2 {version}")
        return 77
    differences = compare(rows[1:], rows[0].index(version), version, answers)
    if "--write" in arguments:
        lines[first:last + 1] = formatted(rows)
        page.write_text("\n".join(lines) + "\n")
        return 0
    for difference in differences:
        print(f"{page.name}: {difference}", file=sys.stderr)
    return 1 if differences else 0


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
