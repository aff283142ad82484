#!/usr/bin/env bash
# Runs the suites of the library with each libxml2-VERSION.tar.xz of a folder. They are compiled once, with the headers
# of the installed engine, as clients on a machine with an older or newer engine are. A version whose library has
# another file name, as from 2.14 on, cannot take its place and is left out. Also checks that the library compiles with
# the headers of each version, and everything with those of the oldest.
# usage: test_engines.sh FOLDER
versions=$("$(dirname "$0")/engines.sh" "${1:?usage: test_engines.sh FOLDER}")
. "$(dirname "$0")/common.sh"

need "${build_packages[@]}" "${test_packages[@]}"

suites=(config dom faults model seams trust threads)
build_preset dev --target "${suites[@]/%/_tests}"
name=$(readelf --dynamic build/dev/src/libKX_XMLConfigParser.so | sed -n 's/.*NEEDED.*\[\(libxml2[^]]*\)\].*/\1/p')

# The headers differ too: the oldest declare less const than all that follow.
first=${versions%%$'\n'*}
for version in $versions; do
    folders=(src platform)
    [ "$version" != "$first" ] || folders=()
    tests/portability/compile_with_headers.py build/dev "$PWD/build/libxml2/$version/include/libxml2" "${folders[@]}"
done

# run_suite VERSION SUITE — prints details only of failures.
run_suite() {
    local log=build/libxml2/$1.$2.log
    LD_LIBRARY_PATH=$PWD/build/libxml2/$1/lib timeout 600 "build/dev/tests/$2/$2_tests" --gtest_brief=1 >"$log" 2>&1 ||
        { echo "== $2 with libxml2 $1, status $?"; cat "$log"; return 1; } >&2
}
export -f run_suite

failed=()
for version in $versions; do
    if [ ! -e "build/libxml2/$version/lib/$name" ]; then
        echo "== libxml2 $version: not run, its library is not $name"
        continue
    fi
    echo "== libxml2 $version"
    printf '%s\0' "${suites[@]}" | xargs -0 -P "$(nproc)" -n 1 bash -c 'run_suite "$0" "$1"' "$version" ||
        failed+=("$version")
done
[ ${#failed[@]} -eq 0 ] || { echo "suites failed with libxml2 ${failed[*]}" >&2; exit 1; }
