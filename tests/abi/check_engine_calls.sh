#!/usr/bin/env bash
# Compares what a shared library imports from libxml2 with a checked-in list, and the list with the engine itself:
# up to 2.13 its symbols carry the version that introduced them.
# usage: check_engine_calls.sh LIBRARY LIST ENGINE_LIBRARY
set -euo pipefail

library=$1
list=$2
engine=$3
oldest=2.7

# The part of a symbol's name behind "@" is the version of the engine that it came with.
export LC_ALL=C # for sort and join to agree
allowed=$(grep -v '^#' "$list" | sort -u)
imported=$("${NM:-nm}" -D --undefined-only "$library" | awk '{ print $NF }' | sed 's/@.*//' |
    grep -E '^(__)?(xml|html)' | sort -u)
provided=$("${NM:-nm}" -D --defined-only --with-symbol-versions "$engine" | awk '{ print $NF }' |
    sed -nE 's/@+LIBXML2_/ /p' | sort -u)

if strangers=$(comm -23 <(echo "$imported") <(echo "$allowed") | grep .); then
    cat <<TEXT
The library imports from libxml2 what is not in $list:

$strangers

Look up the version that introduced each: the library runs with engines from $oldest on. Add what they have.
TEXT
    exit 1
fi

# Of the allowed symbols that have a version, those of a version above the oldest engine's.
newer=$(join <(echo "$allowed") <(echo "$provided") | while read -r symbol version; do
    [[ $version == "$oldest".* ]] || [ "$(printf '%s\n' "$version" $oldest | sort -V | tail -n 1)" = $oldest ] ||
        echo "$symbol came with $version"
done)
if [ -n "$newer" ]; then
    echo "$list allows what engines from $oldest on do not all have:"
    echo "$newer"
    exit 1
fi
echo "$(wc -l <<<"$imported") imports, of $(wc -l <<<"$allowed") allowed;" \
    "$(grep -c . <<<"$provided" || true) symbols of the engine have a version"
