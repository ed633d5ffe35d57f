# Functions that the scripts share. Scripts source this file; it changes to the tree's root.
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."

fail() {
    printf '%s: %s\n' "$(basename "$0")" "$*" >&2
    exit 1
}

# Debian's packages ask /usr/sbin/policy-rc.d whether their services may start. One that is there already stays.
install_without_services='
policy=/usr/sbin/policy-rc.d
if [ ! -e $policy ]; then
    trap "rm -f $policy" EXIT
    printf "#!/bin/sh\nexit 101\n" >$policy
    chmod 755 $policy
fi
apt-get install -y -qq --no-install-recommends "$@"'

# install_packages NAME...: installs those of the Debian packages that are missing, and starts no service that is among
# them. Needs to be root, or a sudo that asks for no password; otherwise names the missing packages and ends the script.
install_packages() {
    local missing=() package
    for package in "$@"; do
        dpkg-query -W -f='${Status}' "$package" 2>/dev/null | grep -q 'ok installed' || missing+=("$package")
    done
    [ ${#missing[@]} -eq 0 ] && return
    command -v apt-get >/dev/null || fail "these Debian packages are needed: ${missing[*]}"
    local as_root=()
    if [ "$(id -u)" -ne 0 ]; then
        sudo -n true 2>/dev/null || fail "install these packages first: apt-get install ${missing[*]}"
        as_root=(sudo -n)
    fi
    printf 'Installing %s ...\n' "${missing[*]}"
    local log
    log=$(mktemp)
    if ! { "${as_root[@]}" apt-get update -qq &&
           "${as_root[@]}" env DEBIAN_FRONTEND=noninteractive sh -c "$install_without_services" install \
               "${missing[@]}"; } >"$log" 2>&1; then
        tail -n 20 "$log" >&2
        fail "could not install: ${missing[*]}"
    fi
    rm -f "$log"
}

BUILD_PACKAGES=(cmake g++ ninja-build libcli11-dev libjs-chart.js libnats-dev libncurses-dev libpcap-dev libpqxx-dev libssl-dev
                libtomlplusplus-dev nlohmann-json3-dev pkg-config)
CHECK_PACKAGES=(clang-format clang-tidy cppcheck)
TEST_PACKAGES=(bash-completion chromium-headless-shell groff-base libgtest-dev libgmock-dev libbenchmark-dev man-db mandoc
               nats-server openssl postgresql prometheus prometheus-alertmanager python3 python3-jsonschema tmux tshark
               zsh)
FLEET_PACKAGES=(curl jq nats-server openssl postgresql prometheus python3 util-linux)
PACKAGE_PACKAGES=(dpkg-dev gzip lintian)

# build_preset PRESET [OPTION...] [--target NAME]: configures a preset, and builds it or the target. Shows the compiler's
# output only if that fails.
build_preset() {
    local preset=$1 log
    shift
    local options=() targets=()
    while [ $# -gt 0 ]; do
        if [ "$1" = --target ]; then targets=("$1" "$2"); shift; else options+=("$1"); fi
        shift
    done
    log=$(mktemp)
    local first=
    [ -e "build/$preset" ] || first=' (the first time takes some minutes)'
    printf 'Building %s%s ...\n' "$preset" "$first"
    if ! { cmake --preset "$preset" "${options[@]}" && cmake --build --preset "$preset" "${targets[@]}"; } >"$log" 2>&1; then
        tail -n 60 "$log" >&2
        fail "the $preset build failed"
    fi
    rm -f "$log"
}
