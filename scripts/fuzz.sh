#!/usr/bin/env bash
# Fuzzes a target of fuzz/, or all of them in parallel, and fails on a finding. Findings are written to
# build/fuzz/findings; write a test for each before you fix it. A run continues with the corpus of the last one, in
# build/fuzz/corpus.
# usage: fuzz.sh [TARGET [SECONDS]]
. "$(dirname "$0")/common.sh"

targets=(keypath document loader client)
seconds=${2:-10}
if [ "${1:-all}" != all ]; then
    targets=("$1")
fi

need "${build_packages[@]}" "${test_packages[@]}" libclang-rt-dev

build=build/fuzz
mkdir -p $build/findings
build_preset fuzz

# fuzz TARGET
fuzz() {
    local target=$1 corpus=$PWD/$build/corpus/$1 log=$build/$1.log
    mkdir -p "$corpus"
    if ! $build/fuzz/fuzz_"$target" "$corpus" "$PWD/fuzz/corpus/$target" \
        -dict="$PWD/fuzz/xml.dict" -max_len=4096 -timeout=10 -rss_limit_mb=1024 -max_total_time="$seconds" \
        -artifact_prefix="$PWD/$build/findings/$target-" -print_final_stats=1 >"$log" 2>&1; then
        tail -n 60 "$log" >&2
        exit 1
    fi
    echo "fuzz $target: $(awk '/number_of_executed_units/ { runs = $2 }
        / cov: / { for (i = 1; i < NF; ++i) if ($i == "cov:") edges = $(i + 1) }
        END { print runs " runs, " edges " edges of library and target covered" }' "$log")"
}

fuzzing=()
for target in "${targets[@]}"; do
    fuzz "$target" &
    fuzzing+=($!)
done
failed=0
for job in "${fuzzing[@]}"; do
    wait "$job" || failed=1
done
exit $failed
