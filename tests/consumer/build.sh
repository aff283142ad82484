#!/usr/bin/env bash
# Builds and runs the clients, by one of the roads that clients take: against an installed package, or together
# with the library's sources.
# usage: build.sh cmake|pkg-config PREFIX LIBDIR BUILD_FOLDER CONFIGURATION_FILE
#        build.sh add_subdirectory|FetchContent SOURCE_FOLDER LIBDIR BUILD_FOLDER CONFIGURATION_FILE
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

# by_cmake OPTION...
by_cmake() {
    cmake -G Ninja -S "$source" -B "$build" -DCMAKE_BUILD_TYPE=Debug \
        -DCMAKE_TOOLCHAIN_FILE="${TOOLCHAIN:-}" -DKX_CONSUMER_FILE="$file" "$@" &&
        cmake --build "$build" -j 2
}

by_package() {
    by_cmake -DCMAKE_PREFIX_PATH="$prefix" -DCMAKE_FIND_ROOT_PATH="$prefix"
}

# by_sources FOLDER_OR_URL
by_sources() {
    by_cmake -DKX_CONSUMER_ROAD="$road" -DKX_CONSUMER_SOURCE="$1"
}

# repository_of FOLDER — makes a repository of the folder as it is now, which may be no clone or have changes.
repository_of() {
    local git=(git --git-dir "$build/repository/.git" -c user.name=test -c user.email=test@localhost)
    git init --quiet --initial-branch main "$build/repository" &&
        "${git[@]}" --work-tree "$1" add --all &&
        "${git[@]}" --work-tree "$1" commit --quiet --message "The sources"
}

by_fetched_sources() {
    repository_of "$prefix" && by_sources "file://$build/repository"
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
cmake) quietly by_package && quietly run_by_cmake ;;
add_subdirectory) quietly by_sources "$prefix" && quietly run_by_cmake ;;
FetchContent) quietly by_fetched_sources && quietly run_by_cmake ;;
pkg-config) quietly by_pkg_config && run_by_pkg_config ;;
*) echo "unknown road: $road" >&2; exit 2 ;;
esac
clients=("$source"/clients/*.cpp)
echo "${#clients[@]} clients by $road"
