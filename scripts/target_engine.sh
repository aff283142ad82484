#!/usr/bin/env bash
# Builds libxml2 2.7.8, as the target has it, for the preset target: into build/libxml2/target, from the archive
# libxml2-2.7.8.tar.xz of a folder. Builds once; remove the directory to repeat it.
# usage: target_engine.sh FOLDER
archive=$(cd "${1:?usage: target_engine.sh FOLDER}" && pwd)/libxml2-2.7.8.tar.xz
. "$(dirname "$0")/common.sh"

prefix=$PWD/build/libxml2/target
[ ! -e "$prefix/complete" ] || exit 0
need make xz-utils gcc-arm-linux-gnueabi

build_engine() {
    ./configure --host=arm-linux-gnueabi --prefix="$prefix" --without-python --without-lzma --without-zlib \
        --disable-static CFLAGS='-O2 -w -fcommon -march=armv7-a+fp -mfloat-abi=softfp -mthumb' &&
        make -j "$(nproc)" libxml2.la && make install-libLTLIBRARIES && make -C include install
}

source=$prefix/source
rm -rf "$prefix"
mkdir -p "$source"
tar --extract --xz --file "$archive" --directory "$source" --strip-components 1
log=$PWD/build/libxml2/target.log
(cd "$source" && quietly "$log" build_engine)
rm -rf "$source"
touch "$prefix/complete"
