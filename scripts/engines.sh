#!/usr/bin/env bash
# Builds each libxml2-VERSION.tar.xz of a folder into build/libxml2/VERSION, and prints the versions, oldest first. A
# version is built once; remove its directory to repeat it. Archives before 2.12 must contain a configure script.
# usage: engines.sh FOLDER
archives=$(cd "${1:?usage: engines.sh FOLDER}" && pwd)
. "$(dirname "$0")/common.sh"

need "${build_packages[@]}" make xz-utils zlib1g-dev

folder=$PWD/build/libxml2
mkdir -p "$folder"

# As clients use it: no programs, no bindings, gzip as in Debian's package. The symbols have versions also where the
# configure script leaves them out, as that of 2.7 does: else the loader prints a warning for each program.
by_configure() {
    local versions=LIBXML2_VERSION_SCRIPT=-Wl,--version-script=$1/libxml2.syms
    cd "$1" &&
        ./configure --prefix="$2" --without-python --without-lzma --disable-static CFLAGS='-O1 -w -fcommon' &&
        make -j "$(nproc)" "$versions" libxml2.la && make "$versions" install-libLTLIBRARIES && make -C include install
}

by_cmake() {
    cmake -G Ninja -S "$1" -B "$1/build" -DCMAKE_C_FLAGS='-O1 -w' \
        -DCMAKE_INSTALL_PREFIX="$2" -DCMAKE_INSTALL_LIBDIR=lib \
        -DLIBXML2_WITH_PROGRAMS=OFF -DLIBXML2_WITH_TESTS=OFF -DLIBXML2_WITH_PYTHON=OFF \
        -DLIBXML2_WITH_LZMA=OFF -DLIBXML2_WITH_ZLIB=ON &&
        cmake --build "$1/build" && cmake --install "$1/build"
}

# build_engine VERSION
build_engine() {
    local prefix=$folder/$1 source=$folder/source-$1 way=by_configure
    rm -rf "$prefix" "$source"
    mkdir -p "$source"
    tar --extract --xz --file "$archives/libxml2-$1.tar.xz" --directory "$source" --strip-components 1
    [ ! -e "$source/CMakeLists.txt" ] || way=by_cmake
    (quietly "$folder/$1.log" $way "$source" "$prefix")
    rm -rf "$source"
    touch "$prefix/complete"
}

versions=$(find "$archives" -name 'libxml2-*.tar.xz' -printf '%f\n' | sed 's/^libxml2-//; s/\.tar\.xz$//' | sort -V)
[ -n "$versions" ] || { echo "$archives has no libxml2-VERSION.tar.xz" >&2; exit 1; }
for version in $versions; do
    [ -e "$folder/$version/complete" ] || build_engine "$version"
    echo "$version"
done
