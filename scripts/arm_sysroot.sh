#!/usr/bin/env bash
# Unpacks the engine for an ARM architecture of Debian into build/sysroot/ARCHITECTURE, where the toolchain files of
# cmake/toolchains expect it. Downloads once; remove the directory to repeat it.
# usage: arm_sysroot.sh armhf|armel
. "$(dirname "$0")/common.sh"
. scripts/private_apt.sh

architecture=${1:-}
case $architecture in
armhf | armel) ;;
*) echo "usage: $0 armhf|armel" >&2; exit 2 ;;
esac
sysroot=$PWD/build/sysroot/$architecture
packages=(libxml2 libxml2-dev libicu72 zlib1g liblzma5)

[ ! -e "$sysroot/complete" ] || exit 0
rm -rf "$sysroot"
mkdir -p "$sysroot/packages"
codename=$(. /etc/os-release && echo "$VERSION_CODENAME")
private_apt "$sysroot/apt" "$architecture" "deb $codename main"
(cd "$sysroot/packages" && APT_CONFIG=$sysroot/apt/apt.conf apt-get download -qq "${packages[@]}")
for package in "$sysroot"/packages/*.deb; do
    dpkg-deb --extract "$package" "$sysroot"
done
rm -rf "$sysroot/packages" "$sysroot/apt"
touch "$sysroot/complete"
