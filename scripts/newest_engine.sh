#!/usr/bin/env bash
# Builds the newest libxml2 that Debian has as a source package, into build/libxml2/newest. Queries the newest version
# each time, and builds it if it is missing.
. "$(dirname "$0")/common.sh"
. scripts/private_apt.sh

folder=$PWD/build/libxml2
mkdir -p "$folder"
private_apt "$folder/apt" "$(dpkg --print-architecture)" "deb-src sid main"
export APT_CONFIG=$folder/apt/apt.conf

version=$(apt-cache showsrc --only-source libxml2 | sed -n 's/^Version: //p' | sort -V | tail -n 1)
[ -n "$version" ] || { echo "no source package of libxml2" >&2; exit 1; }
echo "libxml2 $version"
[ ! -e "$folder/$version/complete" ] || exit 0

rm -rf "$folder/source" "$folder/build" "${folder:?}/$version"
mkdir -p "$folder/source"
cd "$folder/source"
# As clients use it: no programs, no bindings, gzip as in Debian's package.
build_engine() {
    apt-get source -qq "libxml2=$version" &&
        cmake -G Ninja -S libxml2-*/ -B "$folder/build" -DCMAKE_BUILD_TYPE=RelWithDebInfo \
            -DCMAKE_INSTALL_PREFIX="$folder/$version" -DCMAKE_INSTALL_LIBDIR=lib \
            -DLIBXML2_WITH_PROGRAMS=OFF -DLIBXML2_WITH_TESTS=OFF -DLIBXML2_WITH_PYTHON=OFF \
            -DLIBXML2_WITH_ZLIB=ON &&
        cmake --build "$folder/build" && cmake --install "$folder/build"
}
quietly "$folder/log" build_engine
rm -rf "$folder/source" "$folder/build"
touch "$folder/$version/complete"
ln -sfn "$version" "$folder/newest"
