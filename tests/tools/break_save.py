#!/usr/bin/env python3
"""Breaks `kxconfig set` at every system call of a save, by strace.

usage: break_save.py STRACE KXCONFIG

The process is killed before each call, and then each call fails. Afterwards the file must be the old or the new one,
whole, with its permissions; the exit status must fit; a killed save may leave one file of a known name, a failed
one none; and the next `set` must succeed and clean up. A backup, where one is asked for, is the old file if the file is
the new one.
"""

import collections
import os
import re
import subprocess
import sys
import tempfile

OLD = "<cfg><name>old</name></cfg>"
NEW = '<?xml version="1.0" encoding="UTF-8"?>\n<cfg><name>new</name></cfg>\n'
MODE = 0o640
DEBRIS = re.compile(r"\.kxconfig-[0-9a-f]{16}\.tmp")
CALL = re.compile(r"(\w+)\(")
ERRORS = {"flock": "ENOLCK", "fsync": "EIO", "write": "ENOSPC", "mmap": "ENOMEM", "brk": "ENOMEM", "openat": "EACCES"}
SAVED = (0, 5)
# Neither fails, and what does not return cannot be made to.
NEVER_FAIL = {"exit_group", "rt_sigreturn", "munmap"}


def read(path):
    try:
        with open(path, encoding="utf-8") as file:
            return file.read()
    except FileNotFoundError:
        return None


class Save:
    def __init__(self, strace, kxconfig, folder, options):
        self.strace = strace
        self.kxconfig = kxconfig
        self.folder = folder
        self.options = options
        self.file = os.path.join(folder, "cfg.xml")
        self.backup = self.file + "~"
        self.log = os.path.join(os.path.dirname(folder), "log")

    def reset(self):
        for name in os.listdir(self.folder):
            os.unlink(os.path.join(self.folder, name))
        with open(self.file, "w", encoding="utf-8") as file:
            file.write(OLD)
        os.chmod(self.file, MODE)

    def run(self, injections):
        """Returns the exit status, or minus the signal."""
        self.reset()
        command = [self.strace, "-o", self.log]
        for injection in injections:
            command += ["-e", "inject=" + injection]
        command += [self.kxconfig, "set", self.file, "cfg.name", "new"] + self.options
        return subprocess.run(command, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL, check=False).returncode

    def calls(self, injections):
        """Returns (name, number among those of that name) of each call from the first that names the file."""
        if self.run(injections) != 0:
            sys.exit("the save fails although nothing breaks it")
        numbers = collections.Counter()
        calls = []
        with open(self.log, encoding="utf-8", errors="replace") as log:
            for line in log:
                match = CALL.match(line)
                if match:
                    numbers[match[1]] += 1
                    if calls or '"' + self.file + '"' in line and not line.startswith("execve"):
                        calls.append((match[1], numbers[match[1]]))
        return calls

    def faults(self, status, debris_allowed):
        """Yields what is wrong after a run."""
        content = read(self.file)
        if content not in (OLD, NEW):
            yield f"the file is neither old nor new: {content!r}"
        if os.stat(self.file).st_mode & 0o7777 != MODE:
            yield "the permissions changed"
        if status >= 0 and (content == NEW) != (status in SAVED):
            yield f"status {status}, but the file is {'new' if content == NEW else 'old'}"
        if "--backup" in self.options and content == NEW and read(self.backup) != OLD:
            yield "the backup is not the old file"
        rest = [name for name in os.listdir(self.folder) if name not in ("cfg.xml", "cfg.xml~")]
        if len(rest) > debris_allowed or not all(DEBRIS.fullmatch(name) for name in rest):
            yield f"left behind: {rest}"
        if subprocess.run([self.kxconfig, "set", self.file, "cfg.name", "next"], check=False,
                          stdout=subprocess.DEVNULL).returncode != 0:
            yield "the next update fails"
        if not set(os.listdir(self.folder)) <= {"cfg.xml", "cfg.xml~"}:
            yield f"the next update leaves {os.listdir(self.folder)}"


def breaks(call, number):
    """Yields a name, an injection and how many files may be left."""
    yield "killed before", f"{call}:signal=KILL:when={number}", 1
    if call not in NEVER_FAIL:
        error = ERRORS.get(call, "EPERM")
        # What cannot be removed stays.
        yield "failed", f"{call}:error={error}:when={number}", 1 if call == "unlinkat" else 0


def check(save, way, always):
    """Returns the number of broken runs and of faults."""
    runs = faults = 0
    occupied = {injection.split(":")[0] for injection in always}
    for call, number in save.calls(always):
        if call in occupied:
            continue
        for what, injection, debris_allowed in breaks(call, number):
            status = save.run(always + [injection])
            runs += 1
            for fault in save.faults(status, debris_allowed):
                faults += 1
                print(f"{way}, {what} {call} {number}: {fault}")
    return runs, faults


def number_of_unnamed(save):
    """Returns which openat() makes the file without a name."""
    save.calls([])
    with open(save.log, encoding="utf-8", errors="replace") as log:
        opened = [line for line in log if line.startswith("openat(")]
    return next(i for i, line in enumerate(opened, 1) if "O_TMPFILE" in line)


def can_trace(strace):
    try:
        trial = subprocess.run([strace, "-o", "/dev/null", "true"], check=False, stderr=subprocess.DEVNULL)
    except OSError:
        return False
    return trial.returncode == 0


def main():
    strace, kxconfig = sys.argv[1:]
    if not can_trace(strace):
        print("SKIPPED: processes cannot be traced here")
        return 0
    # Nothing here depends on a disk, which takes long to sync.
    with tempfile.TemporaryDirectory(dir="/dev/shm" if os.access("/dev/shm", os.W_OK) else None) as parent:
        folder = os.path.join(parent, "folder")
        os.mkdir(folder)
        save = Save(strace, kxconfig, folder, [])
        backup = Save(strace, kxconfig, folder, ["--backup"])
        named = [f"openat:error=EOPNOTSUPP:when={number_of_unnamed(save)}"]
        ways = {"unnamed": (save, []), "named": (save, named), "with a backup": (backup, [])}
        failed = 0
        for way, (attempt, always) in ways.items():
            runs, faults = check(attempt, way, always)
            print(f"{way}: {runs} broken saves, {faults} faults")
            failed += faults
            if runs == 0:
                sys.exit(f"{way}: no system call was broken")
    return 1 if failed else 0


if __name__ == "__main__":
    sys.exit(main())
