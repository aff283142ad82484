#!/usr/bin/env bash
# Counts the instructions of each operation of a benchmark program with Valgrind's callgrind. The counts are
# reproducible across runs and machines. Prints a line for each operation: the count, a tab, the name.
# usage: count_instructions.sh PROGRAM [NAME...]
set -euo pipefail

dumps=$(mktemp -d)
trap 'rm -rf "$dumps"' EXIT

. "$(dirname "$0")/plain_processor.sh"

# With LD_BIND_NOW the loader does not resolve a function at its first call.
if ! LD_BIND_NOW=1 valgrind --tool=callgrind --instr-atstart=no --callgrind-out-file="$dumps/out" "$@" \
    2>"$dumps/log" >&2; then
    cat "$dumps/log" >&2
    exit 1
fi

# Each dump states the number of its operations and their name; the dumps of an operation are consecutive.
find "$dumps" -name 'out.*' | sort -V | xargs awk '
    function flush() { if (name != "") printf "%d\t%s\n", (2 in count) ? count[2] - count[1] : count[1], name }
    /^desc: Trigger: Client Request: / {
        operation = $0
        sub(/^desc: Trigger: Client Request: /, "", operation)
        times = substr(operation, 1, 1) + 0
        operation = substr(operation, 3)
        if (operation != name) { flush(); delete count; name = operation }
    }
    /^totals: / { if (operation != "") count[times] = $2; operation = "" }
    END { flush() }'
