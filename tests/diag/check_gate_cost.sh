#!/usr/bin/env bash
# Shows that a gate whose bit is clear costs a load, a test and a branch that is not taken: looks at the
# x86-64 code of a function that holds a gate and nothing else.
# usage: check_gate_cost.sh SOURCE_FOLDER COMPILER...
set -euo pipefail

root=$1
shift
for compiler in "$@"; do
    code=$("$compiler" -O2 -fPIC -S -o - -x c++ -I"$root/src" -I"$root/platform/include" - <<'CODE'
#include "diag/Log.h"
const char* Text();
extern "C" void Probe()
{
    KX_VALUE("%s", Text());
}
CODE
    )
    # From the function's label to its first return, without labels and directives.
    path=$(sed -n '/^Probe:/,/[[:space:]]ret/p' <<<"$code" | grep -E '^[[:space:]]+[a-z]' |
        grep -vE 'endbr64|[[:space:]]ret|pushq|popq')
    loads=$(grep -c 'GOTPCREL' <<<"$path" || true)
    tests=$(grep -cE 'test[bl]' <<<"$path" || true)
    branches=$(grep -cE '\bjn?[es]\b|\bjne\b' <<<"$path" || true)
    count=$(wc -l <<<"$path")
    if [ "$count $loads $tests $branches" != "3 1 1 1" ] || grep -q call <<<"$path"; then
        echo "$compiler: a gate with its bit clear is more than a load, a test and a branch:"
        echo "$path"
        exit 1
    fi
    echo "$compiler: $(tr -s '[:space:]' ' ' <<<"$path")"
done
