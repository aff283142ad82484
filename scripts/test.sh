#!/usr/bin/env bash
# Installs what is missing, builds everything and runs all tests.
set -euo pipefail
cd "$(dirname "$0")/.."
. scripts/packages.sh

# The last line: packages whose files the tests read.
need "${build_packages[@]}" \
    clang libgtest-dev libgmock-dev groff-base bsdutils \
    fontconfig-config shared-mime-info xkb-data

# run_preset NAME — configures, builds and tests by the preset; quiet until something fails.
run_preset() {
    local log=build/$1.log
    mkdir -p build
    { cmake --preset "$1" && cmake --build --preset "$1"; } >"$log" 2>&1 || { cat "$log" >&2; exit 1; }
    echo "== $1"
    if ! ctest --preset "$1" >"$log" 2>&1; then
        grep -vE ' Passed |^ +Start ' "$log"
        exit 1
    fi
    tail -n 3 "$log"
}

run_preset dev
run_preset asan
