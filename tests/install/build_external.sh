#!/usr/bin/env bash
# Builds and installs the library against a platform that is somewhere else: the installed stand-in.
# usage: build_external.sh SOURCE_FOLDER STAGE_FOLDER LIBDIR LIBXML2_INCLUDE_DIR LIBXML2_LIBRARY
# From the environment: CXX, CXXFLAGS and TOOLCHAIN, the latter two may be empty.
set -euo pipefail

source=$1
stage=$2
libdir=$3
platform=$stage/prefix
build=$stage/external-build

rm -rf "$build" "$stage/external"
{
    cmake -G Ninja -S "$source" -B "$build" -DCMAKE_TOOLCHAIN_FILE="$TOOLCHAIN" -DCMAKE_BUILD_TYPE=Debug \
        -DKX_BUILD_TESTS=OFF -DKX_BUILD_TOOLS=OFF -DLIBXML2_INCLUDE_DIR="$4" -DLIBXML2_LIBRARY="$5" \
        -DKX_PLATFORM=external -DKX_PLATFORM_INCLUDE_DIR="$platform/include/KX_Platform" \
        -DKX_PLATFORM_LIBRARIES="$platform/$libdir/libKX_Platform.so" -DCMAKE_INSTALL_LIBDIR="$libdir" \
        -DCMAKE_INSTALL_RPATH="$platform/$libdir" &&
        cmake --build "$build" -j 2 && cmake --install "$build" --prefix "$stage/external"
} >"$stage/log" 2>&1 || { cat "$stage/log"; exit 1; }

if find "$stage/external" -name '*KX_Platform*' -o -name 'IConfig*' | grep .; then
    echo "the files above are the platform's: they are not for this library to install"
    exit 1
fi
