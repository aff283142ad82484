#!/usr/bin/env bash
# Compiles the library's sources, all as one, and each public header on its own with GCC and Clang, as every
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

# A platform of its own layout: the mask word is found by its offset, whatever the object's members are called.
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
platform=$work/platform
mkdir "$platform"
sed 's/unsigned int xmlConfigParserMask;/unsigned int words[1];/' "$root/platform/include/KxLog.h" >"$platform/KxLog.h"
! cmp -s "$root/platform/include/KxLog.h" "$platform/KxLog.h" ||
    { echo "KxLog.h has no xmlConfigParserMask" >&2; exit 1; }

# That each compiles alone, the build has shown.
printf '#include "%s"\n' "$root"/src/*/*.cpp "$root"/platform/host/*.cpp >"$work/all.cpp"

commands() {
    for compiler in "${compilers[@]}"; do
        for standard in "${standards[@]}"; do
            # A header alone and first, with no engine in sight.
            for header in "$root"/include/*.h "$root"/platform/include/*.h; do
                echo "$compiler -std=c++$standard $warnings $headers -include $header -x c++ /dev/null"
            done
            echo "$compiler -std=c++$standard $warnings $sources $work/all.cpp"
            echo "$compiler -std=c++$standard $warnings -I$platform -I$root/src $root/src/diag/Log.cpp"
        done
    done
}

commands | xargs -d '\n' -P "$(nproc)" -I{} sh -c '{} || { echo "failed: {}" >&2; exit 255; }'
echo "$(commands | wc -l) compilations without a warning"
