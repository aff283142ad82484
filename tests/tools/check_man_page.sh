#!/usr/bin/env bash
# Checks that the man page is well-formed and tells of each option and command that --help lists.
# usage: check_man_page.sh MAN_PAGE KXCONFIG
set -euo pipefail

page=$1
tool=$2

warnings=$(LC_ALL=C groff -man -Tascii -ww -z "$page" 2>&1)
[ -z "$warnings" ] || { echo "$warnings"; exit 1; }

text=$(groff -man -Tascii -P -cbou "$page")
help=$("$tool" --help)
# "  -h,--help   ..." and, below "Subcommands:", "  get   ...".
options=$(grep -oE '^ +(-[a-z],)?--[a-z-]+' <<<"$help" | grep -oE -- '--[a-z-]+')
commands=$(sed -nE '/^Subcommands:/,/^$/s/^  ([a-z]+) .*/\1/p' <<<"$help")
[ -n "$options" ] && [ -n "$commands" ]
for word in $options $commands; do
    grep -qwF -e "$word" <<<"$text" || { echo "the man page does not tell of $word"; exit 1; }
done
echo "tells of" $options $commands
