#!/usr/bin/env bash
# Builds and runs the clients against an installed package, by one of the roads that clients take.
# usage: build.sh cmake|pkg-config PREFIX LIBDIR BUILD_FOLDER CONFIGURATION_FILE
#
# From the environment: CXX, CXXFLAGS, LDFLAGS; TOOLCHAIN (a CMake toolchain file), EMULATOR (what runs the
# programs, words joined by ";") and ENGINE (the folder of libxml2's headers), all of which may be empty.
set -euo pipefail

road=$1
prefix=$2
libdir=$3
build=$4
file=$5
source=$(cd "$(dirname "$0")" && pwd)

rm -rf "$build"
mkdir -p "$build"

by_cmake() {
    cmake -G Ninja -S "$source" -B "$build" -DCMAKE_BUILD_TYPE=Debug \
        -DCMAKE_TOOLCHAIN_FILE="${TOOLCHAIN:-}" -DCMAKE_PREFIX_PATH="$prefix" \
        -DCMAKE_FIND_ROOT_PATH="$prefix" -DKX_CONSUMER_FILE="$file" &&
        cmake --build "$build" -j 2
}

by_pkg_config() {
    export PKG_CONFIG_PATH=$prefix/$libdir/pkgconfig
    local cflags libs client standard
    cflags=$(pkg-config --cflags KX_XMLConfigParser) || return
    libs="$(pkg-config --libs KX_XMLConfigParser) -Wl,-rpath,$prefix/$libdir" || return
    for client in "$source"/clients/*.cpp; do
        local name more
        name=$(basename "$client" .cpp)
        more=$libs
        case $name in
        *_by_dlopen) more=-ldl ;;
        *_with_engine) more="$libs -lxml2 -DU_SHOW_CPLUSPLUS_API=0 -isystem $ENGINE" ;;
        esac
        for standard in 98 17; do
            # shellcheck disable=SC2086 # flags are words
            $CXX -std=c++$standard ${CXXFLAGS:-} $cflags "$client" -o "$build/${name}_$standard" \
                ${LDFLAGS:-} $more || return
        done
    done
}

run_by_pkg_config() {
    local emulator client standard name
    IFS=';' read -ra emulator <<<"${EMULATOR:-}"
    for client in "$source"/clients/*.cpp; do
        for standard in 98 17; do
            name=$(basename "$client" .cpp)_$standard
            "${emulator[@]}" "$build/$name" "$file" "$prefix/$libdir/libKX_XMLConfigParser.so.1" \
                >"$build/out" 2>&1 ||
                { echo "$name: exit status $?"; cat "$build/out"; return 1; }
        done
    done
}

run_by_cmake() {
    ctest --test-dir "$build" --output-on-failure --no-tests=error
}

quietly() {
    "$@" >"$build/log" 2>&1 || { cat "$build/log"; exit 1; }
}

case $road in
cmake) quietly by_cmake && quietly run_by_cmake ;;
pkg-config) quietly by_pkg_config && run_by_pkg_config ;;
*) echo "unknown road: $road" >&2; exit 2 ;;
esac
echo "$(ls "$source"/clients/*.cpp | wc -l) clients by $road"
