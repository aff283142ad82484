#!/usr/bin/env bash
# Records docs/handbook/first-steps.txt, the session of a new user from a clean clone to a key that finds nothing. The
# clone is of the last commit, in an empty directory.
# usage: record_first_steps.sh [--check]   --check writes nothing, and fails if the recording is out of date
# shellcheck disable=SC2016,SC2034  # commands are typed in as they stand
. "$(dirname "$0")/common.sh"

recording=docs/handbook/first-steps.txt
PROJECT=$PWD
empty=$(mktemp -d)
trap 'rm -rf "$empty"' EXIT
new=$empty/recording.txt

say() {
    echo
    printf '# %s\n' "$@"
}

# type_in COMMAND — prints the command as typed, runs it in this shell, and prints its output.
type_in() {
    printf '\n$ %s\n' "${1//$'\n'/$'\n'> }"
    local status=0
    eval "$1" </dev/null || status=$?
    last_status=$status
}

session() {
    cat <<'END'
A recorded first session: from a clone in an empty directory to a key that finds nothing, and the reason.

scripts/record_first_steps.sh writes this file; do not edit it. The times of log records are replaced. If packages are
missing, the first script prints "installing: ..." and asks for the password if necessary.
END
    say 'Clone the project from its address, $PROJECT, and build it.'
    type_in 'git clone --quiet "$PROJECT" kx'
    type_in 'cd kx'
    type_in './scripts/quickstart.sh'

    say 'Install it into a directory of my own, and create a small file.'
    type_in 'cmake --install build/release --prefix ../usr >../install.log'
    type_in 'export PATH=$(realpath ../usr/bin):$PATH'
    type_in 'mkdir ../try && cd ../try'
    type_in 'which kxconfig'
    type_in 'cat >device.xml <<END
<cfg>
    <net id="1"><ip>10.0.0.1</ip></net>
    <net id="2"><ip>10.0.0.2</ip></net>
    <name>box</name>
</cfg>
END'

    say 'Read a first value, and list all keys.'
    type_in 'kxconfig get device.xml cfg.name'
    type_in 'kxconfig keys device.xml'
    type_in 'kxconfig get device.xml cfg.net@id=2.ip'

    say 'Make a first change, with a dry run before.'
    type_in 'kxconfig set --dry-run device.xml cfg.name crate'
    type_in 'kxconfig set device.xml cfg.name crate'
    type_in 'cat device.xml'

    say 'The dry run matters: this key reads one value, but would change two.'
    type_in 'kxconfig get device.xml cfg.net@id=1.ip'
    type_in 'kxconfig set --dry-run device.xml cfg.net@id=1.ip 10.9.9.9'

    say 'A key that finds nothing.'
    type_in 'kxconfig get device.xml cfg.net.address'
    type_in 'echo $last_status'
    say 'Why?'
    type_in 'kxconfig explain device.xml cfg.net.address'
}

# Replaces what changes with each run or each edit of a source: times and source lines of log records, directories.
steady() {
    sed -E -e 's/^[0-9]{4}-[0-9-]{5}T[0-9:.]{12} /2026-01-01T12:00:00.000 /' \
        -e 's/^(2026-01-01T12:00:00.000 [a-z]+ [~A-Za-z]+):[0-9]+ /\1:1 /' \
        -e '/^warning: source repository is shallow/d' -e 's/ +$//' -e 's/\$last_status/$?/' -e "s#$empty#/home/me#g"
}

(cd "$empty" && unset KX_LOG_MASK && session) 2>&1 | steady >"$new"
if [ "${1:-}" = --check ]; then
    diff -u "$recording" "$new" ||
        { echo "$recording is not up to date: run scripts/record_first_steps.sh" >&2; exit 1; }
    echo "$recording is up to date"
else
    cp "$new" "$recording"
fi
