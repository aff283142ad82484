#!/usr/bin/env bash
# Runs the suites, the fuzz corpora and kxconfig under Valgrind. Any error fails, and any leak that is not in
# tests/valgrind.supp.
set -euo pipefail
cd "$(dirname "$0")/.."
. scripts/packages.sh

need "${build_packages[@]}" "${test_packages[@]}" valgrind libc6-dbg

build=build/dev
log=build/valgrind.log
mkdir -p build
{ cmake --preset dev && cmake --build --preset dev; } >$log 2>&1 || { tail -n 40 $log >&2; exit 1; }

# check COMMAND... — under Valgrind. The tests count what passes through their own operator new:
# Valgrind must not put its own in its place. A program that hangs fails; the slowest takes about a minute.
# What kxconfig ends with when all went well is not always 0: expected=STATUS check COMMAND...
check() {
    local status=0
    timeout 900 valgrind --quiet --error-exitcode=99 --leak-check=full \
        --errors-for-leak-kinds=definite,indirect,possible --show-leak-kinds=definite,indirect,possible \
        --soname-synonyms=somalloc=nouserintercepts --suppressions=tests/valgrind.supp \
        "$@" >$log 2>&1 || status=$?
    if [ $status -ne "${expected:-0}" ]; then
        tail -n 60 $log >&2
        exit 1
    fi
    echo "valgrind: ${1##*/} clean"
}

for room in config diag dom faults model platform threads trust; do
    KX_EVALUATIONS=4000 check $build/tests/$room/${room}_tests
done
for target in keypath document loader; do
    check $build/fuzz/replay_$target fuzz/corpus/$target
done

# The client as a person runs it. What it answers is tested elsewhere.
sample=examples/data/gateway.xml
for arguments in "get $sample gateway.name" "keys $sample" "find $sample //@*" "explain $sample gateway.log.level" \
    "explain --set $sample gateway.name" "set --dry-run $sample gateway.name crate" \
    "set --output build/valgrind.xml $sample gateway.name crate" "--json keys $sample"; do
    # shellcheck disable=SC2086  # words without blanks in them
    check $build/tools/kxconfig $arguments
done
expected=1 check $build/tools/kxconfig check $sample # there is something to warn of
expected=1 check $build/tools/kxconfig check $sample gateway.name other.name
