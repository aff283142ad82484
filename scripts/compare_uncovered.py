#!/usr/bin/env python3
"""Compares the lines and branches of a directory that no test executes with the list of those that may be so.

usage: compare_uncovered.py LCOV LIST DIRECTORY

LCOV is what llvm-cov export writes. LIST has a reason as a comment, and after it the places:

    # why no test gets there
    file/Input.cpp: ThrowSystemError();
    file/Input.cpp: branch of: while (size < 0 && errno == EINTR);

A place is a file of DIRECTORY and the first 80 characters of a line, so that it stays the same when lines move.
Fails if a place is missing from the list, or if the line of a listed place is gone. One that is listed and covered is
only reported: what depends on time or on the machine can be either. After "? " it is expected, and not reported.
"""
import os
import sys

SHOWN = 80


def records(lcov, directory):
    """Yields the file, the line, whether it is about a branch, and whether it was executed."""
    file = None
    with open(lcov, encoding="utf-8") as lines:
        for line in lines:
            kind, _, rest = line.strip().partition(":")
            if kind == "SF":
                file = os.path.relpath(rest)
            elif kind in ("DA", "BRDA") and file.startswith(directory + "/"):
                fields = rest.split(",")
                yield file, int(fields[0]), kind == "BRDA", fields[-1] not in ("0", "-")


class Source:
    """The texts of a file's lines."""

    def __init__(self, file):
        with open(file, encoding="utf-8") as lines:
            self.texts = [line.strip() for line in lines]

    def has_words(self, line):
        return any(c.isalnum() for c in self.texts[line - 1])


def uncovered(lcov, directory):
    """Returns the places, and for lines and branches how many there are and how many are not executed."""
    sources, places, missed_lines, counts = {}, {}, set(), {False: [0, 0], True: [0, 0]}
    for file, line, is_branch, is_executed in records(lcov, directory):
        source = sources[file] = sources.get(file) or Source(file)
        counts[is_branch][0] += 1
        counts[is_branch][1] += not is_executed
        if not is_executed:
            missed_lines.update([] if is_branch else [(file, line)])
            if source.has_words(line):
                name = os.path.relpath(file, directory)
                text = source.texts[line - 1][:SHOWN].rstrip()
                places[file, line, is_branch] = f"{name}: {'branch of: ' if is_branch else ''}{text}"
    # The branches of a line that is not executed need no mention.
    return {place for (file, line, is_branch), place in places.items()
            if not is_branch or (file, line) not in missed_lines}, counts


def listed(path):
    """Returns the places that are not covered, and those that may be."""
    with open(path, encoding="utf-8") as lines:
        places = {line.strip() for line in lines if line.strip() and not line.startswith("#")}
    uncertain = {place for place in places if place.startswith("? ")}
    return places - uncertain, {place[2:] for place in uncertain}


def exists(place, directory):
    """Returns whether the line of a place is still there."""
    name, _, text = place.partition(": ")
    try:
        texts = Source(os.path.join(directory, name)).texts
    except FileNotFoundError:
        return False
    return any(line[:SHOWN].rstrip() == text.removeprefix("branch of: ") for line in texts)


def main():
    lcov, path, directory = sys.argv[1:]
    places, counts = uncovered(lcov, directory)
    allowed, uncertain = listed(path)
    missing = sorted(places - allowed - uncertain)
    gone = sorted(place for place in allowed | uncertain if not exists(place, directory))
    for place in missing:
        print(f"not covered: {place}", file=sys.stderr)
    for place in gone:
        print(f"gone, but listed in {path}: {place}", file=sys.stderr)
    for place in sorted(allowed - places - set(gone)):
        print(f"covered, but listed in {path}: {place}")
    (lines, missed_lines), (branches, missed_branches) = counts[False], counts[True]
    print(f"coverage of {directory}: {lines - missed_lines} of {lines} lines, "
          f"{branches - missed_branches} of {branches} branches; {path} lists the rest")
    return bool(missing or gone)


if __name__ == "__main__":
    sys.exit(main())
