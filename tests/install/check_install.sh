#!/usr/bin/env bash
# Installs a build into a prefix and, staged, into DESTDIR; looks at what is there; moves a copy of the prefix.
# usage: check_install.sh SOURCE_FOLDER BUILD_FOLDER STAGE_FOLDER LIBDIR VERSION
set -euo pipefail

source=$1
build=$2
stage=$3
libdir=$4
version=$5

rm -rf "$stage"
mkdir -p "$stage"
cmake --install "$build" --prefix "$stage/prefix" >"$stage/log"
DESTDIR=$stage/destdir cmake --install "$build" >"$stage/log"
cp -a "$stage/prefix" "$stage/moved"
# A file that pointed back would find nothing.
cp -a "$stage/prefix" "$stage/kept" && rm -rf "$stage/prefix"

prefix_of_build=$(sed -n 's/^CMAKE_INSTALL_PREFIX:PATH=//p' "$build/CMakeCache.txt")
zsh_folder=site-functions
if [ "$prefix_of_build" = /usr ]; then zsh_folder=vendor-completions; fi

expected() {
    echo bin/kxconfig
    local header
    for header in "$source"/include/*.h; do echo "include/KX_XMLConfigParser/$(basename "$header")"; done
    for header in "$source"/platform/include/*.h; do echo "include/KX_Platform/$(basename "$header")"; done
    printf "$libdir/cmake/KX_XMLConfigParser/KX_XMLConfigParser%s.cmake\n" \
        Config ConfigVersion Targets "Targets-CONFIGURATION"
    printf "$libdir/lib%s\n" KX_Platform.so{,.1,.1.0.0} KX_XMLConfigParser.so{,."${version%%.*}",."$version"}
    echo "$libdir/pkgconfig/KX_XMLConfigParser.pc"
    echo share/bash-completion/completions/kxconfig
    echo share/fish/vendor_completions.d/kxconfig.fish
    echo "share/zsh/$zsh_folder/_kxconfig"
    echo share/doc/KX_XMLConfigParser/CHANGELOG.md
    echo share/man/man1/kxconfig.1
}

found() {
    find "$1" ! -type d -printf '%P\n' | sed -E 's/(Targets-)[a-z]+\.cmake$/\1CONFIGURATION.cmake/' | sort
}

diff <(expected | sort) <(found "$stage/kept")
diff <(expected | sort) <(found "$stage/destdir$prefix_of_build")

# Nothing that clients or the loader read may point into the folders of the build or of the installation.
if grep -rlIF -e "$source" -e "$build" -e "$stage" "$stage/kept"; then
    echo "the files above name a folder of the build"
    exit 1
fi
for binary in "$stage/kept/bin/kxconfig" "$stage/kept/$libdir"/lib*.so; do
    paths=$(readelf -d "$binary" | sed -nE 's/.*(RPATH|RUNPATH).*\[(.*)\]/\2/p')
    for path in ${paths//:/ }; do
        case $path in
        '$ORIGIN' | '$ORIGIN'/*) ;;
        *) echo "$binary looks for libraries in $path"; exit 1 ;;
        esac
    done
done
mv "$stage/kept" "$stage/prefix"

# A prefix that the caller overrides reaches every folder.
flags=$(PKG_CONFIG_PATH=$stage/prefix/$libdir/pkgconfig \
    pkg-config --define-variable=prefix=/opt/kx --cflags --libs-only-L KX_XMLConfigParser)
[ "$(xargs -n 1 <<<"$flags")" = "$(printf -- '-I/opt/kx/include/%s\n' KX_XMLConfigParser KX_Platform
    echo "-L/opt/kx/$libdir")" ] ||
    { echo "with another prefix, pkg-config says $flags"; exit 1; }
echo "$(expected | wc -l) files"
