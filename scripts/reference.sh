#!/usr/bin/env bash
# Installs what is missing and builds the reference, build/reference/html/index.html. Fails on any warning.
set -euo pipefail
cd "$(dirname "$0")/.."
. scripts/packages.sh

need "${build_packages[@]}" doxygen python3

log=build/reference.log
mkdir -p build
{ cmake --preset release && cmake --build --preset release --target reference; } >"$log" 2>&1 ||
    { cat "$log" >&2; exit 1; }
echo "build/reference/html/index.html"
