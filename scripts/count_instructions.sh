#!/usr/bin/env bash
# Counts the instructions of each operation of a benchmark program with Valgrind's callgrind. The counts are
# reproducible across runs and machines. Prints a line for each operation: the count, a tab, the name.
# usage: count_instructions.sh PROGRAM [NAME...]
set -euo pipefail

dumps=$(mktemp -d)
trap 'rm -rf "$dumps"' EXIT

# Otherwise the C library selects its string functions by the processor, and the loader resolves a function at its first
# call.
processor=-AVX512F,-AVX512VL,-AVX512BW,-AVX512DQ,-AVX2,-AVX,-BMI1,-BMI2,-LZCNT,-MOVBE,-SSE4_2,-SSE4_1,-SSSE3
processor+=,-ERMS,-FSRM,-RTM,-AVX_Fast_Unaligned_Load,-Fast_Unaligned_Copy,-Prefer_No_VZEROUPPER
if ! GLIBC_TUNABLES=glibc.cpu.hwcaps=$processor LD_BIND_NOW=1 \
    valgrind --tool=callgrind --instr-atstart=no --callgrind-out-file="$dumps/out" "$@" 2>"$dumps/log" >&2; then
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
