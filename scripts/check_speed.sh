#!/usr/bin/env bash
# Detects regressions of speed: counts the instructions of some key operations, and of some runs of the client, and
# compares them with the counts in bench/instructions.txt and bench/client_instructions.txt, which are valid for
# Debian 12 on x86-64; and the stack that a level of a lookup takes.
# usage: check_speed.sh [--accept]
#   --accept  writes the present counts to the files, for an intended change
. "$(dirname "$0")/common.sh"

margin=3        # percent
stack_limit=240 # bytes
file=bench/instructions.txt
client_file=bench/client_instructions.txt

need "${build_packages[@]}" valgrind

build_preset bench --target kx_bench_guard kx_as_it_is kxconfig

# Versions outside this project that affect the counts.
versions() {
    dpkg-query -W -f '${Package} ${Version}\n' g++-12 libc6 libstdc++6 libxml2 valgrind 2>/dev/null |
        sort -u | paste -sd, | sed 's/,/, /g'
}

mapfile -t operations < <(grep -v '^#' $file | cut -f2)

# count VARIANT — prints the instructions of the operations with that build of the library.
count() {
    LD_LIBRARY_PATH=build/bench/bench/variants/$1 \
        scripts/count_instructions.sh build/bench/bench/kx_bench_guard "${operations[@]}"
}

counted=$(count as_it_is)
client_counted=$(scripts/count_client.sh build/bench/tools/kxconfig)

# accept FILE COUNTS
accept() {
    { grep '^#' "$1" | grep -v '^# with '; echo "# with $(versions)"; echo "$2"; } >"$1.new"
    mv "$1.new" "$1"
}

if [ "${1:-}" = --accept ]; then
    [ "$(wc -l <<<"$counted")" -eq ${#operations[@]} ] ||
        { echo "not all operations of $file were counted; is one of them called otherwise now?" >&2; exit 1; }
    accept $file "$counted"
    accept $client_file "$client_counted"
    echo "$file and $client_file are written; commit them with the change that they are about"
    exit 0
fi

# compare MARGIN BEFORE AFTER — prints the differences, and fails if a count is higher by more than the margin.
compare() {
    awk -F'\t' -v margin="$1" '
        /^#/ { next }
        NR == FNR { before[$2] = $1; next }
        {
            change = ($1 / before[$2] - 1) * 100
            verdict = change > margin ? "SLOWER" : change < -margin ? "faster" : ""
            printf "%10d  %+6.1f %%  %-7s %s\n", $1, change, verdict, $2
            slower = slower || change > margin
            seen[$2] = 1
        }
        END {
            for (name in before)
                if (!(name in seen)) { print "not counted: " name; slower = 1 }
            exit slower
        }' "$2" "$3"
}

echo "== instructions, against $file and $client_file"
failed=0
compare $margin $file <(echo "$counted") || failed=1
compare $margin $client_file <(echo "$client_counted") || failed=1
if [ $failed = 1 ]; then
    cat >&2 <<MESSAGE

An operation takes more than $margin % more instructions than $file or $client_file states.
If the change is not intended: callgrind_annotate shows where the instructions are spent, see docs/performance.md.
If it is meant: scripts/check_speed.sh --accept writes the new counts; commit them, and say why in the message.
MESSAGE
    accepted_versions=$(sed -n 's/^# with //p' $file)
    if [ "$accepted_versions" != "$(versions)" ]; then
        printf 'These counts may differ for another reason:\n  accepted with %s\n  counted with  %s\n' \
            "$accepted_versions" "$(versions)" >&2
    fi
    exit 1
fi

echo "== stack for a level of a lookup"
awk -F'\t' -v limit=$stack_limit '
    /(Append|Collect)Values\(/ {
        print $2, $1
        seen++
        failed = failed || $2 > limit
    }
    END { exit failed || seen != 2 }' build/bench/bench/CMakeFiles/kx_as_it_is.dir/__/src/config/KeyPathLookup.cpp.su ||
    { echo "a level of a lookup has to take at most $stack_limit bytes of stack" >&2; exit 1; }
