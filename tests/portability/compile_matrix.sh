#!/usr/bin/env bash
# Compiles the library's sources and each public header on its own with GCC and Clang, as every
# language version from C++98 to C++20, and fails on any warning.
# usage: compile_matrix.sh SOURCE_FOLDER LIBXML2_INCLUDE_FOLDER [STANDARD...]
set -euo pipefail

root=$1
engine=$2
shift 2
standards=("$@")
[ ${#standards[@]} -gt 0 ] || standards=(98 11 17 20)
compilers=(g++ clang++)

for compiler in "${compilers[@]}"; do
    command -v "$compiler" >/dev/null || { echo "$compiler is not installed" >&2; exit 1; }
done

warnings="-Wall -Wextra -Wpedantic -Wshadow -Wconversion -Werror -fsyntax-only"
headers="-I$root/include -I$root/platform/include"
sources="$headers -I$root/src -I$root/platform/host -isystem $engine -DU_SHOW_CPLUSPLUS_API=0"

commands() {
    for compiler in "${compilers[@]}"; do
        for standard in "${standards[@]}"; do
            # A header alone and first, with no engine in sight.
            for header in "$root"/include/*.h "$root"/platform/include/*.h; do
                echo "$compiler -std=c++$standard $warnings $headers -include $header -x c++ /dev/null"
            done
            for source in "$root"/src/*/*.cpp "$root"/platform/host/*.cpp; do
                echo "$compiler -std=c++$standard $warnings $sources $source"
            done
        done
    done
}

commands | xargs -d '\n' -P "$(nproc)" -I{} sh -c '{} || { echo "failed: {}" >&2; exit 255; }'
echo "$(commands | wc -l) compilations without a warning"
