#!/usr/bin/env bash
# Checks that the man page is well-formed and describes each option, command and argument that --help lists.
# usage: check_man_page.sh MAN_PAGE KXCONFIG
set -euo pipefail

export COLUMNS=1000 # a row of help is a line

page=$1
tool=$2

warnings=$(LC_ALL=C groff -man -Tascii -ww -z "$page" 2>&1)
[ -z "$warnings" ] || { echo "$warnings"; exit 1; }

text=$(groff -man -Tascii -P -cbou "$page")
help=$("$tool" --help)
# "  -h, --help   ..." and, below "Commands:", "  get   ...".
options=$(grep -oE '^ +(-[a-z], )?--[a-z-]+' <<<"$help" | grep -oE -- '--[a-z-]+')
commands=$(sed -nE '/^Commands:/,/^$/s/^  ([a-z]+) .*/\1/p' <<<"$help")
[ -n "$options" ] && [ -n "$commands" ]
for word in $options $commands; do
    grep -qwF -e "$word" <<<"$text" || { echo "the man page does not describe $word"; exit 1; }
done

# "NAME meaning" of each argument, from lines such as "  FILE      an XML file".
positionals()
{
    "$tool" "$1" --help |
        sed -nE '/^Arguments:/,/^$/s/^  ([A-Z]+) +(.*)/\1 \2/p'
}

# What the page says of a command: up to the next one's heading.
section()
{
    sed -nE "/^   $1 /,/^(   [a-z]|[A-Z])/p" <<<"$text" | sed '1d' | tr -s '[:space:]' ' '
}

for command in $commands; do
    arguments=$(positionals "$command")
    [ -n "$arguments" ] || { echo "$command --help describes no arguments"; exit 1; }
    while read -r argument; do
        grep -qF -e " $argument " <<<"$(section "$command")" ||
            { echo "the man page does not describe $command: $argument"; exit 1; }
    done <<<"$arguments"
done
# shellcheck disable=SC2086  # words
echo "describes" $options $commands
