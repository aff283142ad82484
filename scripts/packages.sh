# shellcheck shell=bash
# shellcheck disable=SC2034  # the scripts that source this use the lists
# Installs missing Debian packages. Sourced by the other scripts.

# need PACKAGE... — installs those that are missing; prints nothing if there are none.
need() {
    local missing=()
    local package
    for package in "$@"; do
        [ "$(dpkg-query -W -f '${db:Status-Status}' "$package" 2>/dev/null)" = installed ] ||
            missing+=("$package")
    done
    [ ${#missing[@]} -gt 0 ] || return 0

    command -v apt-get >/dev/null || {
        echo "missing packages, and no apt-get to install them: ${missing[*]}" >&2
        return 1
    }
    local as_root=()
    if [ "$(id -u)" -ne 0 ]; then
        command -v sudo >/dev/null || {
            echo "missing packages, and neither root nor sudo to install them: ${missing[*]}" >&2
            return 1
        }
        as_root=(sudo)
    fi
    echo "installing: ${missing[*]}" >&2
    local log
    log=$(mktemp)
    if ! { "${as_root[@]}" apt-get update -qq &&
        "${as_root[@]}" env DEBIAN_FRONTEND=noninteractive \
            apt-get install -qq -y --no-install-recommends "${missing[@]}"; } >"$log" 2>&1; then
        cat "$log" >&2
        rm -f "$log"
        return 1
    fi
    rm -f "$log"
}

build_packages=(g++ cmake ninja-build libxml2-dev libcli11-dev nlohmann-json3-dev)

# For the tests of any build. The tests read files of the packages in the last line.
test_packages=(clang git python3 libgtest-dev libgmock-dev pkg-config groff-base bsdutils
    strace zsh fish fontconfig-config shared-mime-info xkb-data)

# For the benchmarks: measuring, the compared libraries, the plots.
bench_packages=(libbenchmark-dev valgrind python3-matplotlib pkg-config
    libpoco-dev libboost-dev libpugixml-dev libtinyxml2-dev libxml++2.6-dev
    fontconfig-config shared-mime-info xkb-data)

# For the benchmark of the client: the compared programs.
client_bench_packages=(python3 libxml2-utils xmlstarlet)

# For building the Debian packages, and for their tests.
packaging_packages=(dpkg-dev file fakeroot lintian man-db pkg-config)

# For scripts/style.sh.
style_packages=(clang-format clang-tidy git pyflakes3 python3-editorconfig shellcheck)
