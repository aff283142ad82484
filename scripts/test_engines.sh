#!/usr/bin/env bash
# Runs the suites of the library and of the client with each libxml2-VERSION.tar.xz of a folder. They are compiled with
# the headers of another engine, as clients on a machine with an older or newer engine are: the installed one up to
# 2.13; from 2.14 on, where the library has another file name, the newest (scripts/newest_engine.sh). Also checks that
# the library compiles with the headers of each version, and everything with those of the oldest; and that the page of
# versions has the answers of each.
# usage: test_engines.sh FOLDER
versions=$("$(dirname "$0")/engines.sh" "${1:?usage: test_engines.sh FOLDER}")
. "$(dirname "$0")/common.sh"

need "${build_packages[@]}" "${test_packages[@]}" binutils

# The longest first.
suites=(tools dom config faults model diag platform seams threads trust tool_files)

# prepare PRESET — builds the suites, of which each can run beside the others.
prepare() {
    [ "$1" != engine ] || scripts/newest_engine.sh
    build_preset "$1" --target "${suites[@]/%/_tests}" versions_probe
}

# file_of PRESET — prints the file name of the engine that the preset's programs load.
file_of() {
    readelf --dynamic "build/$1/src/libKX_XMLConfigParser.so" | sed -n 's/.*NEEDED.*\[\(libxml2[^]]*\)\].*/\1/p'
}

# run_suite VERSION PRESET SUITE — prints details only of failures.
run_suite() {
    local log=$PWD/build/libxml2/$1.$3.log program
    program=$(find "build/$2/tests" -name "$3_tests" -type f)
    # What a shell makes of the client's completions does not depend on the engine.
    LD_LIBRARY_PATH=$PWD/build/libxml2/$1/lib timeout 600 "$program" --gtest_brief=1 \
        --gtest_filter='-KxconfigTyped.*:KxconfigOtherShells.*' >"$log" 2>&1 ||
        { echo "== $3 with libxml2 $1, status $?"; cat "$log"; return 1; } >&2
}
export -f run_suite

# run_suites VERSION PRESET
run_suites() {
    echo "== libxml2 $1"
    printf '%s\0' "${suites[@]}" | xargs -0 -P "$(nproc)" -n 1 bash -c 'run_suite "$0" "$1" "$2"' "$1" "$2"
}

# check_page VERSION PRESET — a version without a column passes.
check_page() {
    local status=0
    LD_LIBRARY_PATH=$PWD/build/libxml2/$1/lib tests/versions/check_table.py docs/handbook/engine-versions.md \
        "build/$2/tests/versions/versions_probe" || status=$?
    [ $status -eq 0 ] || [ $status -eq 77 ]
}

# The headers differ, too: the oldest declare less const than all that follow.
compile_with() {
    local folders=(src platform)
    [ "$1" != "${versions%%$'\n'*}" ] || folders=()
    tests/portability/compile_with_headers.py build/dev "$PWD/build/libxml2/$1/include/libxml2" "${folders[@]}"
}

prepare dev
failed=()
for version in $versions; do
    compile_with "$version" || failed+=("$version")
    preset=dev
    if [ ! -e "build/libxml2/$version/lib/$(file_of dev)" ]; then
        preset=engine
        prepare engine
    fi
    run_suites "$version" $preset || failed+=("$version")
    check_page "$version" $preset || failed+=("$version")
done
[ ${#failed[@]} -eq 0 ] || { echo "suites failed with libxml2 ${failed[*]}" >&2; exit 1; }
