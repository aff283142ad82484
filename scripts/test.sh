#!/usr/bin/env bash
# Installs what is missing, builds and tests.
# usage: test.sh [STAGE...]
#
#   fast     all tests but the longest; an outside project builds against the installed library
#   long     the longest tests: a million random lookups and updates, all language versions, the build for QNX, a kill
#            at every system call of a save
#   style    layout and common mistakes: .editorconfig, clang-format, clang-tidy, missing includes, shellcheck, pyflakes
#   sanitize all tests under AddressSanitizer and UndefinedBehaviorSanitizer
#   package  the Debian packages: installs them into a scratch root, uses and removes them
#   abi98    all tests with the target's kind of standard library (shared strings, a linear list::size)
#   engine   all tests with the newest libxml2 that Debian has as a source package
#   engines  the suites with each libxml2-VERSION.tar.xz in the folder KX_ENGINE_ARCHIVES
#   arm      all tests for ARMv7-A under qemu-arm, those of the library in both calling conventions; the library's size
#   target   the library's suites as on the target: ARMv7-A, soft-float convention, shared strings, libxml2 2.7.8 from
#            the folder KX_ENGINE_ARCHIVES
#   proof    full coverage of lines and branches; Valgrind; ThreadSanitizer; a short run of each fuzz target
#   speed    the instructions of key operations, compared with the accepted counts
#   docs     the reference, without a warning of Doxygen; the recording of a new user's first steps
#   host     fast and package; the default: about three minutes
#   all      all stages, engines and target only if KX_ENGINE_ARCHIVES is set; CI runs this
. "$(dirname "$0")/common.sh"

# run_preset NAME [OPTION...] — configures, builds and tests with the preset, with options of ctest. Prints details of
# failures only.
run_preset() {
    local log=build/$1.log
    build_preset "$1"
    echo "== $*"
    if ! ctest --preset "$@" >"$log" 2>&1; then
        grep -vE ' Passed |^ +Start ' "$log"
        exit 1
    fi
    tail -n 3 "$log"
}

stage_fast() {
    need "${build_packages[@]}" "${test_packages[@]}"
    run_preset dev --label-exclude 'full|long'
}

stage_long() {
    need "${build_packages[@]}" "${test_packages[@]}"
    run_preset dev --label-regex 'full|long'
}

stage_style() {
    if git rev-parse --verify --quiet HEAD >/dev/null; then
        scripts/style.sh
    else
        echo "not a clone: the style is not checked"
    fi
}

stage_sanitize() {
    need "${build_packages[@]}" "${test_packages[@]}"
    run_preset asan
}

stage_package() {
    need "${build_packages[@]}" "${packaging_packages[@]}"
    run_preset package
}

stage_abi98() {
    need "${build_packages[@]}" "${test_packages[@]}" googletest
    run_preset abi98
}

stage_engine() {
    need "${build_packages[@]}" "${test_packages[@]}" dpkg-dev zlib1g-dev
    scripts/newest_engine.sh
    run_preset engine
}

stage_engines() {
    scripts/test_engines.sh "${KX_ENGINE_ARCHIVES:?names a folder of libxml2-VERSION.tar.xz}"
}

stage_arm() {
    need "${build_packages[@]}" "${test_packages[@]}" googletest \
        g++-arm-linux-gnueabihf g++-arm-linux-gnueabi qemu-user
    local architecture
    for architecture in armhf armel; do
        scripts/arm_sysroot.sh $architecture
        run_preset $architecture
    done
    scripts/arm_size.sh
}

stage_target() {
    need "${build_packages[@]}" "${test_packages[@]}" googletest g++-arm-linux-gnueabi qemu-user
    scripts/arm_sysroot.sh armel
    scripts/target_engine.sh "${KX_ENGINE_ARCHIVES:?names a folder of libxml2-VERSION.tar.xz}"
    run_preset target
}

stage_proof() {
    scripts/coverage.sh
    scripts/valgrind.sh
    run_preset tsan
    scripts/fuzz.sh
}

stage_speed() {
    scripts/check_speed.sh
}

stage_docs() {
    scripts/reference.sh
    if git rev-parse --verify --quiet HEAD >/dev/null; then
        scripts/record_first_steps.sh --check
    else
        echo "not a clone: the recording of the first steps is not compared"
    fi
}

stage_host() {
    stage_fast
    stage_package
}

stage_all() {
    stage_host
    stage_long
    stage_style
    stage_sanitize
    stage_docs
    stage_speed
    stage_proof
    stage_abi98
    stage_engine
    stage_arm
    if [ -n "${KX_ENGINE_ARCHIVES:-}" ]; then
        stage_engines
        stage_target
    fi
}

[ $# -gt 0 ] || set -- host
for stage in "$@"; do
    declare -F "stage_$stage" >/dev/null ||
        {
            echo "$0: no stage \"$stage\"; there are fast, long, style, sanitize, package, abi98, engine, engines," \
                "arm, target, proof, speed, docs, host, all" >&2
            exit 2
        }
done
for stage in "$@"; do
    "stage_$stage"
done
