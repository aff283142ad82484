#!/usr/bin/env bash
# Installs the packages into a scratch root, runs kxconfig from there, builds clients against it, and removes the
# packages again.
# usage: check_packages.sh SOURCE_FOLDER PACKAGES_FOLDER LIBDIR
# From the environment: what tests/consumer/build.sh takes.
set -euo pipefail

[ "$(id -u)" -eq 0 ] || exec fakeroot "$0" "$@"

source=$1
packages=$2
libdir=$3
root=$packages/root

# The scratch root starts with this machine's list of packages, so that dependencies are checked for real.
rm -rf "$root"
mkdir -p "$root"/var/lib/dpkg/{info,updates,triggers}
cp /var/lib/dpkg/status "$root/var/lib/dpkg/status"

# The packages trigger a renewal of the loader's cache, which libc-bin does. The cache of this machine stays as it is.
cp /var/lib/dpkg/triggers/* "$root/var/lib/dpkg/triggers/"
cp /var/lib/dpkg/info/libc-bin.{postinst,triggers} "$root/var/lib/dpkg/info/"
mkdir -p "$packages/bin"
printf '#!/bin/sh\necho called >>"%s"\n' "$packages/ldconfig.calls" >"$packages/bin/ldconfig"
chmod +x "$packages/bin/ldconfig"
rm -f "$packages/ldconfig.calls"

# The packages of this machine have no files in the scratch root, which dpkg points out one by one.
run_dpkg() {
    PATH=$packages/bin:$PATH dpkg --root="$root" --log="$packages/dpkg.history" --force-script-chrootless \
        "$@" >"$packages/dpkg.log" 2>&1 ||
        { grep -v 'files list file for package' "$packages/dpkg.log"; exit 1; }
}

run_dpkg --install "$packages"/*.deb
[ -e "$packages/ldconfig.calls" ] || { echo "the loader's cache would not know the libraries"; exit 1; }

for binary in "$root/usr/bin/kxconfig" "$root/usr/$libdir"/lib*.so.1; do
    if readelf -d "$binary" | grep -E 'RPATH|RUNPATH' || readelf -S "$binary" | grep -F .debug_info; then
        echo "$binary carries a library path or debug information of its build"
        exit 1
    fi
done
MANPATH=$root/usr/share/man man --where kxconfig >/dev/null || { echo "man finds no page of kxconfig"; exit 1; }
for completion in bash-completion/completions/kxconfig zsh/vendor-completions/_kxconfig \
    fish/vendor_completions.d/kxconfig.fish; do
    [ -f "$root/usr/share/$completion" ] || { echo "no shell finds $completion"; exit 1; }
done
cmp "$source/CHANGELOG.md" "$root/usr/share/doc/KX_XMLConfigParser/CHANGELOG.md"
for package in "$packages"/*.deb; do
    dpkg-deb --field "$package" Package Version Depends
done
dpkg-deb --field "$packages"/libkx-xmlconfigparser1_*.deb Depends | grep -q libxml2

# On a machine that has them installed the loader would know this folder.
export LD_LIBRARY_PATH=$root/usr/$libdir${LD_LIBRARY_PATH:+:$LD_LIBRARY_PATH}
value=$("$root/usr/bin/kxconfig" get "$source/examples/data/gateway.xml" gateway.name)
[ "$value" = line-3-gateway ] || { echo "kxconfig says $value"; exit 1; }
for road in cmake pkg-config; do
    "$source/tests/consumer/build.sh" $road "$root/usr" "$libdir" "$packages/$road" \
        "$source/examples/data/gateway.xml"
done

run_dpkg --purge kxconfig libkx-xmlconfigparser-dev libkx-xmlconfigparser1
if find "$root" -path "$root/var/lib/dpkg" -prune -o ! -type d -print | grep .; then
    echo "the files above are left behind"
    exit 1
fi
