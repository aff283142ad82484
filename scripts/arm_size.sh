#!/usr/bin/env bash
# Prints the size of the library for ARM, as built by the presets armel and armhf (-Os). Fails if its text exceeds the
# limit, or if the test of a log gate is compiled to a call.
# usage: arm_size.sh
. "$(dirname "$0")/common.sh"

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

# The target is 24 KiB in both calling conventions with the target's kind of standard library. The newer one has longer
# mangled names: its limit is just above the present size, to detect growth.
print_size armel arm-linux-gnueabi $((24 * 1024))
build_preset armhf-size
print_size armhf-size arm-linux-gnueabihf $((24 * 1024))
print_size armhf arm-linux-gnueabihf $((26 * 1024))
