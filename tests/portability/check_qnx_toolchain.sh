#!/usr/bin/env bash
# Shows what the QNX toolchain file makes of an SDK: there is none here, so that a stand-in for qcc takes its place,
# which notes how it was called and lets this machine's compiler do the work. For what the SDK's own compiler
# says to the code, see docs/development/building-for-qnx.md.
# usage: check_qnx_toolchain.sh SOURCE_FOLDER WORK_FOLDER LIBXML2_INCLUDE_FOLDER LIBXML2_LIBRARY
set -euo pipefail

source=$1
work=$2
engine_headers=$3
engine_library=$4

rm -rf "$work"
mkdir -p "$work"/{host/usr/bin,target/armle-v7/usr/lib,target/usr/include,platform}
ln -s "$engine_headers" "$work/target/usr/include/libxml2"
ln -s "$engine_library" "$work/target/armle-v7/usr/lib/libxml2.so"
ln -s "$(dirname "$engine_headers")/unicode" "$work/target/usr/include/unicode"
cat >"$work/host/usr/bin/QCC" <<'QCC'
#!/usr/bin/env bash
# Without a target the driver lists those that it knows; CMake recognises it by that.
[ "$*" != -V ] || { echo "cc: targets available in nowhere: 4.4.2,gcc_ntoarmv7le"; exit 0; }
echo "$*" >>"$(dirname "$0")/calls"
arguments=()
for argument in "$@"; do
    case $argument in
    -V4.4.2,gcc_ntoarmv7le | -Y_cpp | -Y_gpp | -lang-c++) ;;
    -V* | -Y* | -Wpedantic) echo "unknown option $argument" >&2; exit 1 ;;
    *) arguments+=("$argument") ;;
    esac
done
# GCC 4.4 has no newer language than C++98.
for argument in "${arguments[@]}"; do
    case $argument in -std=c++98 | -std=gnu++98) ;; -std=*) echo "unknown $argument" >&2; exit 1 ;; esac
done
exec g++ -D__QNXNTO__ "${arguments[@]}"
QCC
chmod +x "$work/host/usr/bin/QCC"
ln -s QCC "$work/host/usr/bin/qcc"

# A platform: headers, and a library with what they declare.
cp "$source"/platform/include/*.h "$work/platform"
g++ -shared -fPIC -I"$work/platform" -I"$source/platform/host" "$source"/platform/host/*.cpp \
    -o "$work/platform/libplatform.so"

configure() {
    cmake --preset qnx -S "$source" -B "$work/build" -DKX_PLATFORM_INCLUDE_DIR="$work/platform" \
        -DKX_PLATFORM_LIBRARIES="$work/platform/libplatform.so" "$@" >"$work/log" 2>&1
}

expect_refusal() {
    local message=$1
    shift
    if configure "$@"; then echo "configured with $* in spite of: $message"; exit 1; fi
    tr -s ' \n' ' ' <"$work/log" | grep -qF "$message" || { cat "$work/log"; exit 1; }
    rm -rf "$work/build"
}

export QNX_HOST=$work/host
unset QNX_TARGET
expect_refusal 'QNX_TARGET names no folder'
export QNX_TARGET=$work/target
expect_refusal 'it is cpp (Dinkum) or gpp (GNU)' -DKX_QNX_CXX_RUNTIME=stl

for runtime in cpp gpp; do
    rm -rf "$work/build" "$work/host/usr/bin/calls"
    { configure -DKX_QNX_CXX_RUNTIME=$runtime && cmake --build "$work/build"; } >>"$work/log" 2>&1 ||
        { cat "$work/log"; exit 1; }
    grep -q 'CMAKE_CXX_COMPILER_ID "QCC"' "$work"/build/CMakeFiles/*/CMakeCXXCompiler.cmake
    grep -qF "$work/target/armle-v7/usr/lib/libxml2.so" "$work/build/CMakeCache.txt"
    # The library's sources and its link: the right compiler, run-time library, language and no path of the build.
    for call in 'CXMLReader.cpp.o -c' 'libKX_XMLConfigParser.so.1'; do
        grep -F -- "$call" "$work/host/usr/bin/calls" | grep -F -- -V4.4.2,gcc_ntoarmv7le |
            grep -qF -- "-Y_$runtime" || { cat "$work/host/usr/bin/calls"; exit 1; }
    done
    grep -F 'CXMLReader.cpp' "$work/host/usr/bin/calls" | grep -F -- -fvisibility=hidden |
        grep -qF -- -std=c++98 || { cat "$work/host/usr/bin/calls"; exit 1; }
    "$source"/tests/abi/check_symbols.sh "$work/build/src/libKX_XMLConfigParser.so" \
        "$source/tests/abi/KX_XMLConfigParser.symbols"
done
