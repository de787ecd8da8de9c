#!/usr/bin/env bash
# Installs the Debian packages that building and testing tekit need, only those missing.
# A machine that has them all does no network access.
#
#   scripts/install-deps.sh            # everything: the Linux legs and the Windows legs
#   scripts/install-deps.sh --linux    # only what the Linux build, tests and tool need
#
# TEKIT_SKIP_WINDOWS=1 has the same effect as --linux. Installing needs root; otherwise the
# missing packages are listed and the script fails.
set -euo pipefail

linux_packages=(cmake ninja-build g++ pkg-config libgtest-dev googletest libbenchmark-dev
                zlib1g-dev clang locales)
# binutils for both MinGW targets: the i686 leg checks its DLL's export table with objdump.
windows_packages=(g++-mingw-w64-x86-64-posix g++-mingw-w64-i686-posix wine wine64
                  libz-mingw-w64-dev xvfb binutils-mingw-w64-x86-64 binutils-mingw-w64-i686)

packages=("${linux_packages[@]}")
if [[ "${1:-}" != "--linux" && "${TEKIT_SKIP_WINDOWS:-0}" != 1 ]]; then
    packages+=("${windows_packages[@]}")
fi

missing=()
for package in "${packages[@]}"; do
    if ! dpkg-query -W -f='${Status}' "$package" 2>/dev/null | grep -q "install ok installed"; then
        missing+=("$package")
    fi
done

# The decimal-point tests read the separator of a locale that writes a decimal comma.
ensure_comma_locale() {
    if locale -a 2>/dev/null | grep -qi '^de_DE\.utf-\?8$'; then
        return
    fi
    if [[ $(id -u) -eq 0 ]]; then
        echo "install-deps: generating the de_DE.UTF-8 locale"
        localedef -i de_DE -f UTF-8 de_DE.UTF-8
    else
        echo "install-deps: no de_DE.UTF-8 locale; the decimal-comma tests will fail" >&2
    fi
}

if [[ ${#missing[@]} -eq 0 ]]; then
    echo "install-deps: all ${#packages[@]} packages present"
    ensure_comma_locale
    exit 0
fi
if [[ $(id -u) -ne 0 ]]; then
    echo "install-deps: missing packages: ${missing[*]}" >&2
    echo "install-deps: run as root, or: sudo apt-get install ${missing[*]}" >&2
    exit 1
fi
echo "install-deps: installing ${missing[*]}"
export DEBIAN_FRONTEND=noninteractive
apt-get update
apt-get install -y --no-install-recommends "${missing[@]}"
ensure_comma_locale
