# shellcheck shell=bash disable=SC2034
# Sourced by the scripts beside it, from the top of the tree: gets what they need from a Debian
# machine when it is missing, and says so.

build_packages=(cmake ninja-build g++ binutils pkgconf python3 googletest libcli11-dev libstb-dev
    libssl-dev)
server_packages=(nginx-light vsftpd python3-aiosmtpd openssl)
test_packages=("${build_packages[@]}" "${server_packages[@]}" attr valgrind locales)
windows_packages=(g++-mingw-w64-x86-64-posix wine64 llvm)
cross_packages=(g++-aarch64-linux-gnu g++-s390x-linux-gnu g++-riscv64-linux-gnu qemu-user-static)
lint_packages=(clang clang-format clang-tidy libclang-rt-14-dev cppcheck shellcheck)
bench_packages=(libbenchmark-dev libapr1-dev libaprutil1-dev libglib2.0-dev libcurl4-openssl-dev)
docs_packages=(doxygen python3)
msvc_packages=(clang lld libwine-dev)
package_packages=(dpkg-dev file gzip man-db util-linux abigail-tools)

fail() {
    printf '%s: %s\n' "${0##*/}" "$*" >&2
    exit 1
}

as_root() {
    if [ "$(id -u)" -eq 0 ]; then
        "$@"
    elif command -v sudo >/dev/null; then
        sudo "$@"
    else
        fail "this needs root or sudo: $*"
    fi
}

# A name may end with an architecture, as in libssl-dev:arm64.
missing_packages() {
    local own
    own=$(dpkg --print-architecture)
    dpkg-query -W -f '${db:Status-Status} ${Package} ${Architecture}\n' "$@" 2>/dev/null |
        awk -v own="$own" '$1 == "installed" { print $2 ":" $3
            if ($3 == own || $3 == "all") print $2 }' |
        sort -u | comm -13 - <(printf '%s\n' "$@" | sort -u)
}

# A server's package must start no service: the tests start their own servers, on loopback.
install_without_services() (
    policy=/usr/sbin/policy-rc.d
    if [ ! -e "$policy" ]; then
        trap 'as_root rm -f "$policy"' EXIT
        printf '#!/bin/sh\nexit 101\n' | as_root tee "$policy" >/dev/null
        as_root chmod 755 "$policy"
    fi
    as_root env DEBIAN_FRONTEND=noninteractive apt-get -q -y -o DPkg::Lock::Timeout=300 \
        install --no-install-recommends "$@"
)

# Lets packages of another architecture be installed.
need_architecture() {
    dpkg --print-foreign-architectures | grep -qx "$1" || as_root dpkg --add-architecture "$1"
}

need_packages() {
    command -v apt-get >/dev/null || return 0 # another system: its user has brought the tools
    local missing
    mapfile -t missing < <(missing_packages "$@")
    [ "${#missing[@]}" -gt 0 ] || return 0
    mkdir -p build
    echo "Installing with apt-get: ${missing[*]}"
    {
        as_root apt-get -q -y -o DPkg::Lock::Timeout=300 update &&
            install_without_services "${missing[@]}"
    } </dev/null >build/setup.log 2>&1 ||
        fail "could not install them: $(tail -n 3 build/setup.log) (all of it: build/setup.log)"
}

# Wine without a screen, in a prefix of this tree. Its links into the home folder lead to an empty
# one, so that no test can reach the user's files through them.
need_wine() {
    export WINEDEBUG=-all WINEPREFIX=$PWD/build/wine WINEDLLOVERRIDES='mscoree,mshtml,winemenubuilder.exe='
    [ ! -e "$WINEPREFIX/made" ] || return 0
    echo "Making a Wine prefix in build/wine"
    rm -rf "$WINEPREFIX"
    mkdir -p "$WINEPREFIX/home"
    HOME=$WINEPREFIX/home /usr/lib/wine/wine64 wineboot --init </dev/null >build/wine.log 2>&1 ||
        fail "Wine did not start: $(tail -n 3 build/wine.log)"
    touch "$WINEPREFIX/made"
}

use_ccache() {
    command -v ccache >/dev/null || return 0
    export CMAKE_C_COMPILER_LAUNCHER=ccache CMAKE_CXX_COMPILER_LAUNCHER=ccache
}
