#!/usr/bin/env python3
"""Types the beginning of a command into an interactive bash, and the tab key, as a user would.

usage: type_in_bash.py COMPLETION KXCONFIG line|arguments BEGINNING

Prints the line as it stands then, or enters it and prints the arguments that kxconfig would have got, one on a line.
The shell works in the current folder.
"""

import os
import pty
import select
import shlex
import signal
import sys
import tempfile
import time
from pathlib import Path

SECONDS = 60

# What the shell does is reported by files, so that neither prompt nor echo has to be understood: the key ^T writes the
# line, and kxconfig its arguments. Only the completion calls it from a subshell, and gets the program.
SETUP = """
bind 'set bell-style none'
bind 'set enable-bracketed-paste off'
bind 'set completion-query-items 0'
bind 'set page-completions off'
show() {{ printf '%s\\n' "$@" >{answer}.new; mv {answer}.new {answer}; }}
bind -x '"\\C-t": show "$READLINE_LINE"'
kxconfig() {{ if ((BASH_SUBSHELL)); then {tool} "$@"; else show "$@"; fi; }}
. {completion}
show ready
"""


def shell():
    """Starts one on a terminal of its own. @return its process and the terminal."""
    process, terminal = pty.fork()
    if process == 0:
        os.environ.update(PS1="$ ", TERM="dumb", HISTFILE="", INPUTRC="/dev/null")
        os.execvp("bash", ["bash", "--norc", "--noprofile", "-i"])
    return process, terminal


def ask(terminal, answer, keys):
    """@return what the shell answers to the keys."""
    os.write(terminal, keys)
    end = time.monotonic() + SECONDS
    while not answer.exists():
        if time.monotonic() > end:
            sys.exit("bash does not answer")
        if select.select([terminal], [], [], 0.01)[0]:
            os.read(terminal, 65536)  # or the shell would wait for a reader
    text = answer.read_bytes()
    answer.unlink()
    return text


def main():
    completion, tool, wanted, beginning = sys.argv[1:]
    process, terminal = shell()
    with tempfile.TemporaryDirectory() as folder:
        answer = Path(folder) / "answer"
        paths = {"answer": str(answer), "tool": tool, "completion": completion}
        setup = SETUP.format(**{name: shlex.quote(path) for name, path in paths.items()})
        ask(terminal, answer, os.fsencode(setup))
        last = b"\x14" if wanted == "line" else b"\n"
        sys.stdout.buffer.write(ask(terminal, answer, os.fsencode(beginning) + b"\t" + last))
    os.close(terminal)
    os.kill(process, signal.SIGKILL)
    os.waitpid(process, 0)


if __name__ == "__main__":
    main()
