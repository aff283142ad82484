#!/usr/bin/env bash
# Runs the tests with coverage of lines and branches, writes build/coverage/report/index.html, and fails unless all of
# the library are covered, and all of kxconfig but those that tests/tools/uncovered.txt lists. Clang counts branches of
# the source, not those that the compiler adds for exceptions.
. "$(dirname "$0")/common.sh"

need "${build_packages[@]}" "${test_packages[@]}" llvm libclang-rt-dev

build=build/coverage
log=build/coverage.log
build_preset coverage

rm -rf $build/raw
# A thousand processes in turn execute nothing that one does not.
export GTEST_FILTER=-KxconfigSave.LosesNoUpdateOfManyWriters
if ! LLVM_PROFILE_FILE=$PWD/$build/raw/%4m.profraw ctest --preset coverage >$log 2>&1; then
    grep -vE ' Passed |^ +Start ' $log >&2
    exit 1
fi
llvm-profdata merge -o $build/all.profdata $build/raw/*.profraw

# llvm-cov warns of functions that differ between programs, as headers do by what they are compiled with.
# The tests first: they step through the walks like kxconfig, and have parts of the headers that the library leaves out.
library=$build/src/libKX_XMLConfigParser.so
objects=("$build/tests/config/config_tests" -object "$library")
llvm-cov show "${objects[@]}" -instr-profile $build/all.profdata -format=html -output-dir=$build/report \
    -show-branches=count -ignore-filename-regex=/tests/ src include 2>/dev/null
llvm-cov report "${objects[@]}" -instr-profile $build/all.profdata \
    -show-branch-summary -show-region-summary=0 -ignore-filename-regex=/tests/ src include \
    >$build/report.txt 2>/dev/null
if ! awk '$1 == "TOTAL" {
        printf "coverage: %d of %d lines, %d of %d branches\n", $5 - $6, $5, $8 - $9, $8
        complete = $6 == 0 && $9 == 0
    }
    END { exit !complete }' $build/report.txt; then
    cat $build/report.txt >&2
    echo "see $build/report/index.html" >&2
    exit 1
fi

# lacks PROGRAM — whether a Python program, which tries something in a new directory, fails on this machine.
lacks() {
    local folder status=0
    folder=$(mktemp -d)
    (cd "$folder" && python3 -c "import os, struct; $1") 2>/dev/null || status=$?
    rm -rf "$folder"
    [ $status -ne 0 ]
}

# The suites leave out what the machine cannot do.
acl='struct.pack("<I" + "HHI" * 5, 2, 1, 6, 0, 2, 6, 65534, 4, 4, 0, 16, 6, 0, 32, 0, 0)'
if [ "$(id -u)" -ne 0 ] || lacks 'os.open(".", os.O_TMPFILE | os.O_RDWR)' || lacks 'os.openpty()' ||
    lacks "open('f', 'w'); os.setxattr('f', 'user.kx', b'1'); os.setxattr('f', 'system.posix_acl_access', $acl)"; then
    echo "coverage of tools/kxconfig: not measured without superuser, unnamed files, terminals, ACLs or attributes"
    exit
fi

client=("$build/tests/tools/tools_tests" -object "$build/tests/tools/tool_files_tests"
    -object "$build/tests/tools/tool_faults_tests" -object "$build/tools/kxconfig")
llvm-cov show "${client[@]}" -instr-profile $build/all.profdata -format=html -output-dir=$build/report/client \
    -show-branches=count tools 2>/dev/null
llvm-cov export "${client[@]}" -instr-profile $build/all.profdata -format=lcov >$build/client.lcov 2>/dev/null
if ! scripts/compare_uncovered.py $build/client.lcov tests/tools/uncovered.txt tools/kxconfig; then
    echo "see $build/report/client/index.html" >&2
    exit 1
fi
