#!/usr/bin/env bash
# Installs what is missing on a bare Debian 12, builds the library and its command-line client, and demonstrates both
# on a sample configuration. Prints each command that it runs.
. "$(dirname "$0")/common.sh"

need "${build_packages[@]}"

# show COMMAND... — prints the command as typed in a shell, then runs it.
show() {
    printf '\n$'
    local word
    for word in "$@"; do
        case $word in
            *[!A-Za-z0-9_./=:-]*) printf " '%s'" "$word" ;;
            *) printf ' %s' "$word" ;;
        esac
    done
    printf '\n'
    "$@"
}

# show_quietly COMMAND... — the same, but prints the output of the command only if it fails.
show_quietly() {
    printf '\n$ %s\n' "$*"
    quietly build/quickstart.log "$@"
}

kxconfig=build/release/tools/kxconfig
file=examples/data/gateway.xml

show_quietly cmake --preset release
show_quietly cmake --build --preset release

show "$kxconfig" get "$file" gateway.name
show "$kxconfig" get "$file" gateway.network.interface.address
show "$kxconfig" get "$file" gateway.network.interface@name=eth1.address
show "$kxconfig" get "$file" 'gateway.channels.channel@id=1|id=2.limit@level=alarm'

# Changes go to a copy of the sample.
copy=build/gateway.xml
show cp "$file" "$copy"
show "$kxconfig" set "$copy" gateway.log.level debug
show "$kxconfig" get "$copy" gateway.log.level
show "$kxconfig" --log-mask value get "$file" gateway.time.zone

# A key that finds nothing, and the reason.
show "$kxconfig" get "$file" gateway.log.target || true
show "$kxconfig" explain "$file" gateway.log.target || true

printf '\nThe file is %s; try other keys, or %s --help.\n' "$file" "$kxconfig"
printf 'For kxconfig in any folder: export PATH=%q:$PATH\n' "$PWD/${kxconfig%/*}"
