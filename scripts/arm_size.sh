#!/usr/bin/env bash
# Prints how large the library is for ARM, as the presets armhf and armel build it (-Os), and fails if its text has
# outgrown what it has reached, or if the test of a log gate has become a call.
# usage: arm_size.sh
set -euo pipefail
cd "$(dirname "$0")/.."

# print_size PRESET TRIPLET LIMIT
print_size() {
    local library=build/$1/src/libKX_XMLConfigParser.so text data bss rest
    [ -e "$library" ] || { echo "$library is not there: build the preset $1 first" >&2; exit 1; }
    read -r text data bss rest < <("$2-size" "$library" | tail -n 1)
    echo "$1: text $text, data $data, bss $bss"
    [ "$text" -lt "$3" ] || { echo "text is $3 or more" >&2; exit 1; }
    ! "$2-nm" --demangle "$library" | grep -E 'kx::Log(Mask|Enabled)\(' >&2 ||
        { echo "the test of a log gate is a function, and each gate calls it" >&2; exit 1; }
}

# With the target's kind of standard library the aim is 24 KiB. The newer one has longer names in each signature:
# just above what it is, so that growth is seen.
print_size armel arm-linux-gnueabi $((24 * 1024))
print_size armhf arm-linux-gnueabihf $((25 * 1024 + 512))
