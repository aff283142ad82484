#!/usr/bin/env bash
# Installs what is missing and builds the reference, build/reference/html/index.html. Fails on any warning.
. "$(dirname "$0")/common.sh"

need "${build_packages[@]}" doxygen python3

build_preset release --target reference
echo "build/reference/html/index.html"
