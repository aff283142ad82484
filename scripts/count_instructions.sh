#!/usr/bin/env bash
# Counts the instructions of each operation of a benchmark program with Valgrind's callgrind, so that a figure
# repeats from run to run and from machine to machine. Prints a line for each: the count, a tab, the name.
# usage: count_instructions.sh PROGRAM [NAME...]
set -euo pipefail

dumps=$(mktemp -d)
trap 'rm -rf "$dumps"' EXIT

# The C library would choose its string functions by the processor, and the loader would resolve a function
# when it is called first.
processor=-AVX512F,-AVX512VL,-AVX512BW,-AVX512DQ,-AVX2,-AVX,-BMI1,-BMI2,-LZCNT,-MOVBE,-SSE4_2,-SSE4_1,-SSSE3
processor+=,-ERMS,-FSRM,-RTM,-AVX_Fast_Unaligned_Load,-Fast_Unaligned_Copy,-Prefer_No_VZEROUPPER
if ! GLIBC_TUNABLES=glibc.cpu.hwcaps=$processor LD_BIND_NOW=1 \
    valgrind --tool=callgrind --instr-atstart=no --callgrind-out-file="$dumps/out" "$@" 2>"$dumps/log" >&2; then
    cat "$dumps/log" >&2
    exit 1
fi

# Each dump says how many operations it holds, and which; the dumps of an operation follow each other.
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
