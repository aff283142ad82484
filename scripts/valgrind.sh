#!/usr/bin/env bash
# Runs the suites, the fuzz corpora and kxconfig under Valgrind. Fails on errors, and on leaks that are not in
# tests/valgrind.supp.
. "$(dirname "$0")/common.sh"

need "${build_packages[@]}" "${test_packages[@]}" valgrind libc6-dbg

build=build/dev
logs=build/valgrind
mkdir -p $logs
build_preset dev

# check STATUS COMMAND... — runs the command under Valgrind, and fails unless it ends with STATUS. The tests count
# calls of their own operator new, so Valgrind must not replace it. The slowest program takes about a minute.
check() {
    local expected=$1 log status=0
    shift
    log=$(mktemp -p $logs)
    timeout 900 valgrind --quiet --error-exitcode=99 --leak-check=full --num-callers=30 \
        --errors-for-leak-kinds=definite,indirect,possible --show-leak-kinds=definite,indirect,possible \
        --soname-synonyms=somalloc=nouserintercepts --suppressions=tests/valgrind.supp \
        "$@" >"$log" 2>&1 || status=$?
    if [ $status -ne "$expected" ]; then
        tail -n 60 "$log" >&2
        echo "valgrind: $* ended with $status" >&2
        return 1
    fi
    rm "$log"
    echo "valgrind: ${1##*/}${2:+ $2} clean"
}

# start STATUS COMMAND... — runs check in parallel, as soon as a processor is free.
start() {
    [ $running -lt "$(nproc)" ] || await_one
    check "$@" &
    running=$((running + 1))
}

await_one() {
    wait -n || failed=1
    running=$((running - 1))
}

running=0
failed=0
export KX_EVALUATIONS=4000
for module in config dom faults model threads trust platform diag; do # the slow ones first
    start 0 $build/tests/$module/${module}_tests
done
for target in keypath document loader; do
    start 0 $build/fuzz/replay_$target fuzz/corpus/$target
done

# The client as in a shell. Its output is tested elsewhere.
sample=examples/data/gateway.xml
for arguments in "get $sample gateway.name" "keys $sample" "find $sample //@*" "explain $sample gateway.log.level" \
    "explain --set $sample gateway.name" "set --dry-run $sample gateway.name crate" \
    "set --output $logs/written.xml $sample gateway.name crate" "--json keys $sample"; do
    # shellcheck disable=SC2086  # words without blanks in them
    start 0 $build/tools/kxconfig $arguments
done
start 0 $build/tools/kxconfig check --notes $sample
start 1 $build/tools/kxconfig check $sample gateway.name other.name

while [ $running -gt 0 ]; do
    await_one
done
exit $failed
