#!/usr/bin/env bash
# Installs the Debian packages that packages.txt lists and that are missing; quick when nothing is.
#
#   tools/dev/setup.sh [LIST...]     lists other than packages.txt, for example packages-bench.txt
#
# Uses apt, through sudo where the caller is not root. Where there is no apt it names what is missing and ends with 1.
set -euo pipefail

root=$(cd "$(dirname "${BASH_SOURCE[0]}")/../.." && pwd)
lists=("$@")
[ ${#lists[@]} -gt 0 ] || lists=("$root/packages.txt")
mapfile -t wanted < <(sed -e 's/#.*//' -e 's/[[:space:]]//g' -e '/^$/d' "${lists[@]}")

has() { command -v "$1" >/dev/null 2>&1; }
hasHeader() { has c++ && echo "#include <$1>" | c++ -E -x c++ - >/dev/null 2>&1; }

# Whether what the Debian package gives is there, on a system that has no dpkg to ask.
isThere() {
    case $1 in
    g++) has c++ ;;
    ninja-build) has ninja ;;
    cmake | git | python3 | pkg-config | file | chromium | gdb | doxygen | valgrind) has "$1" ;;
    chromium-driver) has chromedriver ;;
    clang) has clang++ ;;
    llvm) has llvm-profdata && has llvm-cov ;;
    dpkg-dev) has dpkg-shlibdeps ;;
    python3-*) python3 -c "import ${1#python3-}" 2>/dev/null ;;
    libboost*-dev) hasHeader boost/version.hpp ;;
    libgtest-dev) hasHeader gtest/gtest.h ;;
    libgmock-dev) hasHeader gmock/gmock.h ;;
    libfmt-dev) hasHeader fmt/format.h ;;
    libcli11-dev) hasHeader CLI/CLI.hpp ;;
    nlohmann-json3-dev) hasHeader nlohmann/json.hpp ;;
    libflint-dev) hasHeader flint/flint.h ;;
    libmd-dev) hasHeader md5.h ;;
    ros-*-msgs) name=${1#ros-} && [ -d "/usr/share/${name//-/_}/msg" ] ;;
    *) false ;;
    esac
}

missing=()
if has dpkg-query; then
    installed=$(dpkg-query -W -f '${db:Status-Status} ${Package}\n' 2>/dev/null | sed -n 's/^installed //p')
    for package in "${wanted[@]}"; do
        grep -qxF -- "$package" <<<"$installed" || missing+=("$package")
    done
else
    for package in "${wanted[@]}"; do
        isThere "$package" || missing+=("$package")
    done
fi
[ ${#missing[@]} -gt 0 ] || exit 0

if ! has apt-get; then
    echo "setup: there is no apt here; please install what these Debian 12 packages give: ${missing[*]}" >&2
    exit 1
fi

asRoot=()
if [ "$(id -u)" != 0 ]; then
    if ! has sudo; then
        echo "setup: neither root nor sudo; please have these packages installed: ${missing[*]}" >&2
        exit 1
    fi
    asRoot=(sudo)
fi
echo "setup: installing ${missing[*]}"
"${asRoot[@]}" apt-get update -qq
"${asRoot[@]}" env DEBIAN_FRONTEND=noninteractive apt-get install -y -qq --no-install-recommends "${missing[@]}"
