#!/usr/bin/env bash
# Compares the symbols that a shared library exports with a checked-in list.
# usage: check_symbols.sh LIBRARY LIST [--accept]
set -euo pipefail

library=$1
list=$2

# Demangled, with the string type under its short name, so that one list serves every ABI.
exported() {
    "${NM:-nm}" -D --defined-only --demangle "$library" |
        sed -E -e 's/^[0-9a-f]+ . //' \
            -e 's/std::(__cxx11::)?basic_string<char, std::char_traits<char>, std::allocator<char> ?>/std::string/g' \
            -e 's/std::__cxx11::list</std::list</g' -e 's/\[abi:cxx11\]//g' |
        sort -u
}

if [ "${3:-}" = --accept ]; then
    exported >"$list"
    echo "wrote $list"
    exit 0
fi

if ! difference=$(diff -u --label "$(basename "$list")" --label "$(basename "$library")" "$list" <(exported)); then
    cat <<TEXT
The exported symbols have changed: "-" is missing from the library, "+" is new in it.

$difference

Clients in the field link against these names. A change that is not meant: look at src/exports.map and
at the visibility of what was added. A change that is meant:

    $0 LIBRARY $list --accept

and say in CHANGELOG.md what it means for clients (a name that went needs a new SOVERSION).
TEXT
    exit 1
fi
