# shellcheck shell=bash
# Sourced first by the scripts of this directory: stops at the first error, and goes to the root of the project.
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."
. scripts/packages.sh

# quietly LOG COMMAND... — runs the command, and prints its output only if it fails.
quietly() {
    local log=$1
    shift
    mkdir -p "$(dirname "$log")"
    "$@" >"$log" 2>&1 || { cat "$log" >&2; return 1; }
}

configure_and_build() {
    cmake --preset "$1" && cmake --build --preset "$@"
}

# build_preset PRESET [OPTION...] — configures and builds, with options of cmake --build.
build_preset() {
    quietly "build/$1.log" configure_and_build "$@"
}
