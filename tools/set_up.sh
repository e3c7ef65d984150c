#!/usr/bin/env bash
# Installs the Debian packages that the given kinds of work need and that are missing.
# Usage: tools/set_up.sh KIND...    kinds: build test bench fuzz coverage format tidy
set -euo pipefail

# "package" is looked up with dpkg, "package:command" is there when the command is.
needs_of() {
    case $1 in
        build) echo g++:g++ cmake:cmake ninja-build:ninja libcli11-dev libgtest-dev zlib1g-dev libcurl4-openssl-dev libutf8proc-dev ;;
        test) echo pkgconf:pkg-config ;;
        bench) echo python3:python3 ;;
        fuzz) echo clang:clang++ libclang-rt-dev ;;
        coverage) echo llvm:llvm-cov ;;
        format) echo clang-format:clang-format ;;
        tidy) echo clang-tidy:clang-tidy clang:clang++ ;;
        *) echo "set_up: no kind is called '$1'" >&2; exit 2 ;;
    esac
}

needs=()
for kind in "$@"; do
    # shellcheck disable=SC2207  # package names hold no blanks
    needs+=($(needs_of "$kind"))
done

missing=()
libraries=()
for need in "${needs[@]}"; do
    package=${need%%:*}
    if [[ $need != *:* ]]; then
        libraries+=("$package")
    elif ! command -v "${need#*:}" >/dev/null; then
        missing+=("$package")
    fi
done

if ! command -v dpkg-query >/dev/null; then
    if ((${#missing[@]})); then
        echo "This is no Debian system: please install what Debian calls: ${missing[*]} ${libraries[*]}" >&2
        exit 1
    fi
    exit 0  # libraries are left for cmake to find
fi

if ((${#libraries[@]})); then
    installed=" $(dpkg-query -W -f '${Package}:${db:Status-Status} ' "${libraries[@]}" 2>/dev/null || true)"
    for package in "${libraries[@]}"; do
        [[ $installed == *" $package:installed "* ]] || missing+=("$package")
    done
fi
((${#missing[@]})) || exit 0

as_root=()
if [[ $(id -u) != 0 ]]; then
    as_root=(sudo)
    if ! command -v sudo >/dev/null || { ! sudo -n true 2>/dev/null && [[ ! -t 0 ]]; }; then
        echo "These packages are missing, and installing them needs root:" >&2
        echo "    apt-get install --no-install-recommends ${missing[*]}" >&2
        exit 1
    fi
fi
echo "Installing: ${missing[*]}"
# env stands behind sudo, which would drop the variable.
"${as_root[@]}" apt-get -qq update
"${as_root[@]}" env DEBIAN_FRONTEND=noninteractive \
    apt-get -qq install -y --no-install-recommends "${missing[@]}" </dev/null
