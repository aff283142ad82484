#!/usr/bin/env bash
# Counts the instructions of whole runs of the client with Valgrind's callgrind, as count_instructions.sh counts those
# of operations. Prints a line for each command: the count, a tab, the name.
# usage: count_client.sh KXCONFIG
set -euo pipefail

program=$(realpath "$1")
. "$(dirname "$0")/plain_processor.sh"
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
cd "$folder"

awk 'BEGIN {
    print "<cfg>"
    for (i = 0; i < 1000; ++i) {
        printf "  <section name=\"section-%d\">\n", i
        for (j = 0; j < 10; ++j)
            printf "    <item id=\"%d\">\n      <name>item %d</name>\n      <on/>\n    </item>\n", j, i * 10 + j
        print "  </section>"
    }
    print "</cfg>"
}' >cfg.xml
key='cfg.section@name=section-500.item@id=7.name'

# count NAME ARGUMENT...
count() {
    local name=$1
    shift
    if ! LD_BIND_NOW=1 valgrind --tool=callgrind --callgrind-out-file=out "$program" "$@" >output 2>log; then
        cat log >&2
        exit 1
    fi
    printf '%d\tkxconfig %s\n' "$(sed -n 's/^summary: //p' out)" "$name"
}

count get get cfg.xml "$key"
count keys keys cfg.xml
count "set --output" set --output out.xml cfg.xml "$key" new
