#!/usr/bin/env bash
# Checks that a page names the Debian packages which the scripts install: for a build, for the tests and for making
# packages, each list in an "apt-get install" of its own.
# usage: check_requirements.sh SOURCE_FOLDER PAGE
set -euo pipefail
. "$1/scripts/packages.sh"

for list in "${build_packages[*]}" "${test_packages[*]}" "${packaging_packages[*]}"; do
    echo "apt-get install $list"
done >expected_requirements

# Lines that end in a backslash go on.
sed -e ':more' -e '/\\$/ { N; s/ *\\\n */ /; b more' -e '}' "$2" | grep '^apt-get install ' >documented_requirements
diff expected_requirements documented_requirements
