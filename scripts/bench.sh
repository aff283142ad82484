#!/usr/bin/env bash
# Measures this library and others, and writes docs/performance.md from the results. Takes about twenty minutes; other
# load on the machine distorts the figures.
# usage: bench.sh [client]
#   client  measures kxconfig alone, and renews its section of the page; takes about five minutes
. "$(dirname "$0")/common.sh"

client=build/bench/client

measure_client() {
    need "${build_packages[@]}" "${client_bench_packages[@]}"
    build_preset bench --target kxconfig kx_bench_load
    scripts/client_performance.py measure build/bench/tools/kxconfig build/bench/bench/kx_bench_load $client
}

if [ "${1:-}" = client ]; then
    measure_client
    scripts/client_performance.py page $client docs/performance.md
    echo "the client's section of docs/performance.md is written"
    exit
fi

need "${build_packages[@]}" "${bench_packages[@]}"

results=build/bench/results
programs=build/bench/bench
rm -rf $results
mkdir -p $results
build_preset bench

echo "== allocations"
$programs/kx_bench_allocations >$results/allocations.json

# The placement of code and documents in memory affects the times and is fixed for a process. So each workload runs in
# several processes, one in each round, and the median of the rounds counts.
mapfile -t workloads < <($programs/kx_bench --benchmark_list_tests | sed 's,/[^/]*$,,' | awk '!seen[$0]++')
rm -f $results/time-*.json
rounds=${KX_BENCH_ROUNDS:-9}
for round in $(seq "$rounds"); do
    echo "== time, round $round of $rounds"
    # shellcheck disable=SC2001  # a regular expression
    for i in "${!workloads[@]}"; do
        $programs/kx_bench --benchmark_filter="^$(sed 's/[(|)]/\\&/g' <<<"${workloads[i]}")/" \
            --benchmark_repetitions=3 --benchmark_min_time=0.05 --benchmark_enable_random_interleaving=true \
            --benchmark_out="$(printf '%s/time-%d-%03d.json' $results "$round" "$i")" --benchmark_out_format=json \
            >$results/time.txt 2>&1 || { cat $results/time.txt >&2; exit 1; }
    done
done

echo "== instructions"
scripts/count_instructions.sh $programs/kx_bench_instructions >$results/instructions.txt

echo "== cost of the log gates"
mapfile -t names < <(cut -f2 $results/instructions.txt | grep '/this library' | grep -vE '^load|0000/')
for variant in as_it_is no_gates; do
    LD_LIBRARY_PATH=$programs/variants/$variant scripts/count_instructions.sh $programs/kx_bench_guard "${names[@]}" \
        >$results/$variant.txt
done

measure_client

scripts/performance_report.py $results $client docs
echo "docs/performance.md is written"
