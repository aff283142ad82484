#!/usr/bin/env bash
# Checks layout and common mistakes: .editorconfig, clang-format, clang-tidy, shellcheck and pyflakes, each without a
# finding. clang-tidy reads the library, the platform's stand-in and the client, a dozen sources at a time, as they are
# compiled; that each source of the client includes what it needs is checked too.
. "$(dirname "$0")/common.sh"

need "${build_packages[@]}" "${test_packages[@]}" "${style_packages[@]}"

# files [PATTERN...] — the files of the project whose names match.
files() {
    git ls-files --cached --others --exclude-standard -- "$@" | while read -r file; do
        [ ! -e "$file" ] || echo "$file"
    done
}

failed=0

# check NAME COMMAND... — reports what the command reports, and goes on.
check() {
    local name=$1
    shift
    if quietly "build/style/$name.log" "$@"; then
        echo "style: $name clean"
    else
        echo "style: $name has findings" >&2
        failed=1
    fi
}

mapfile -t all < <(files)
mapfile -t cpp < <(files '*.cpp' '*.h')
mapfile -t shell < <(files '*.sh' '*.bash' .ci/run)
mapfile -t python < <(files '*.py')

check editorconfig scripts/check_editorconfig.py "${all[@]}"
check clang-format clang-format --dry-run --Werror "${cpp[@]}"
check shellcheck shellcheck "${shell[@]}"
check pyflakes pyflakes3 "${python[@]}"
# By Clang, without precompiled headers: clang-tidy reads neither GCC's nor its options.
quietly build/style/configure.log \
    cmake --preset clang -B build/style -D CMAKE_DISABLE_PRECOMPILE_HEADERS=ON \
    -D CMAKE_UNITY_BUILD=ON -D CMAKE_UNITY_BUILD_BATCH_SIZE=12
check clang-tidy run-clang-tidy -quiet -p build/style "^$PWD/build/style/(src|platform|tools)/"
quietly build/style/alone.log cmake --preset dev -B build/style/alone -D KX_COMPILE_IN_BATCHES=OFF
check includes tests/portability/compile_with_headers.py build/style/alone \
    "$(pkg-config --variable=includedir libxml-2.0)/libxml2" tools
exit $failed
