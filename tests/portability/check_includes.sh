#!/usr/bin/env bash
# Checks that the library includes nothing that the target's standard libraries lack or hide: headers of C++98
# only; C's headers as <string.h>, since of two libraries one puts the names of <cstring> into std alone; no
# <iostream>, which brings a static constructor into each source that includes it.
# usage: check_includes.sh SOURCE_FOLDER
set -euo pipefail
cd "$1"

c='assert ctype errno float limits locale math setjmp signal stdarg stddef stdio stdlib string time'
posix='fcntl pthread strings sys/stat sys/time sys/types unistd'
cxx='algorithm bitset complex deque exception fstream functional iomanip ios iosfwd istream iterator limits list
    locale map memory new numeric ostream queue set sstream stack stdexcept streambuf string typeinfo utility
    valarray vector'
# shellcheck disable=SC2086  # words
allowed=$(printf '%s.h\n' $c $posix && printf '%s\n' $cxx)

# FILE:LINE:HEADER of every header of the system.
included=$(grep -rnE '^[[:space:]]*#[[:space:]]*include[[:space:]]*<' include platform src |
    sed -E 's/#[[:space:]]*include[[:space:]]*<([^>]*)>.*/\1/')

trouble=$(while IFS=: read -r file line header; do
    case $header in libxml/*.h) continue ;; esac
    grep -qxF -- "$header" <<<"$allowed" || echo "$file:$line: <$header>"
done <<<"$included")
if [ -n "$trouble" ]; then
    echo "$trouble"
    echo "is not for the library: it is newer than C++98, or has its names in std alone, or see the head of $0"
    exit 1
fi
echo "$(wc -l <<<"$included") includes"
