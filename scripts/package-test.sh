#!/bin/bash
# Installs the packages of build/package in clean Debian roots, below build/package-test: the tools run
# where nothing else is; a stranger builds by each way there is, with and without a system's xmlwrapp.
# Needs root. Usage: package-test.sh
set -euo pipefail
cd "$(dirname "$0")/.."
. scripts/debian-root.sh
. scripts/dev/source-files.sh
build=${KORVEX_BUILD_DIR:-$PWD/build}
here=$build/package-test
log=$here/log
mkdir -p "$here"
: > "$log"
version=$(sed -n 's/^Version: //p' "$build/package/korvex.pc")
abi=libkorvex${version%%.*}
trap '[ $? -eq 0 ] || { tail -n 30 "$log"; echo "package-test: FAILED; the log is $log"; }' EXIT

say() { echo "package-test: $*"; }

# root_with ROOT PACKAGE...: a new root with these packages, ours or Debian's.
root_with() {
    local root=$here/$1 package
    shift
    new_root "$root"
    mkdir "$root/packages"
    cp "$build"/package/packages/*.deb "$root/packages/"
    local wanted=()
    for package in "$@"; do
        case $package in
            *korvex*) wanted+=("$(cd "$root" && echo ./packages/"$package"_*.deb)") ;;
            *) wanted+=("$package") ;;
        esac
    done
    inside "$root" sh -c 'apt-get update -qq && apt-get install -y -qq --no-install-recommends "$@"' \
        sh "${wanted[@]}" >> "$log" 2>&1
}

# The tools, where there is no compiler and no other file of ours.
test_tools() {
    root_with plain "$abi" korvex-tools
    local completion
    for completion in tools/*/completion/*; do
        case ${completion##*/} in
            '*') ;;
            *.bash) [ -s "$here/plain/usr/share/bash-completion/completions/$(basename "$completion" .bash)" ] ;;
            *) [ -s "$here/plain/usr/share/zsh/vendor-completions/${completion##*/}" ] ;;
        esac
    done
    # shellcheck disable=SC2016  # the inner shell's own dollars
    inside "$here/plain" env ABI="$abi" VERSION="$version" sh -euc '
        ldconfig -p | grep -q "libkorvex.so.${ABI#libkorvex} "
        [ ! -e /usr/include/korvex ]
        [ ! -e /usr/share/doc/korvex-doc ]
        export KORVEX_HOME=/tmp/home KORVEX_DB=/tmp/db
        mkdir -p /tmp/home/etc /tmp/db/hashDb
        echo log4cpp.rootCategory=ERROR > /tmp/home/etc/log-cmdline.cfg
        korvex-records --version | grep -q "$VERSION"
        korvex-records --create put fruit/apple red
        [ "$(korvex-records get fruit/apple)" = red ]
        korvex-records check
        if command -v korvex-logcheck; then
            korvex-logcheck --home /tmp/home /tmp/home/etc/log-cmdline.cfg
        fi
        for tool in /usr/bin/korvex-*; do
            [ -s "/usr/share/man/man1/${tool##*/}.1.gz" ]
        done
        [ -s /usr/share/doc/korvex-tools/examples/korvex.logrotate ]
        [ -s "/usr/share/doc/$ABI/copyright" ]
        dpkg -s korvex-tools | grep -q "^Depends:.*$ABI (>= $VERSION)"
        apt-get purge -y -qq korvex-tools "$ABI"
        ! find /usr /etc /var/lib/korvex* -name "*korvex*" 2> /dev/null | grep .' >> "$log" 2>&1
    say "the tools run, and leave nothing behind"
}

# use KIND WAY: the stranger, with static ones asked for by their own name.
use() {
    local static=
    [ "$1.$2" != static.find_package ] && [ "$1.$2" != static.pkg-config ] || static=ON
    inside "$here/development" env STRANGER_STATIC=$static \
        /korvex/tests/stranger/use.sh /korvex "$1" "$2" "/tmp/$1-$2" g++ >> "$log" 2>&1
    say "stranger: $1, $2${3:+, $3}"
}

use_all() {
    local kind way
    for kind in static shared; do
        for way in find_package pkg-config add_subdirectory; do
            use $kind $way "$1"
        done
    done
}

# Each example is a project of its own, to be copied out of the package.
build_examples() {
    local example name
    for example in examples/*/CMakeLists.txt; do
        [ -e "$example" ] || return 0
        name=$(basename "${example%/*}")
        inside "$here/development" sh -euc 'cp -r "/usr/share/doc/korvex-doc/examples/$0" /tmp/ && cd "/tmp/$0" &&
            cmake -B build -G Ninja && cmake --build build' "$name" >> "$log" 2>&1
        say "example: $name"
    done
}

# wants VERSION: whether find_package is content with it.
wants() {
    inside "$here/development" sh -c '
        mkdir /tmp/wants && cd /tmp/wants && printf "%s\n" "cmake_minimum_required(VERSION 3.20)" \
            "project(Wants CXX)" "find_package(Korvex $0 REQUIRED)" > CMakeLists.txt && cmake -G Ninja .' "$1" >> "$log" 2>&1
}

test_tools
root_with development "$abi" libkorvex-dev korvex-doc g++ cmake ninja-build
mkdir "$here/development/korvex"
source_files | tar -c --null -T - | tar -x -C "$here/development/korvex"
use_all "no xmlwrapp"
build_examples
inside "$here/development" /korvex/tests/checks/exports.sh "/usr/lib/$(uname -m)-linux-gnu/libkorvex.so"
for other in 0.9 1.99 2.0; do
    ! wants $other || { say "$other is content with $version"; exit 1; }
done
wants "${version%.*}"
say "find_package takes the same major version, no newer minor one"

mkdir -p "$here/development/usr/local/lib/pkgconfig"
cp -r tests/stranger/fake-xmlwrapp/. "$here/development/usr/local/lib/pkgconfig/"
use_all "xmlwrapp"
for way in find_package pkg-config; do
    inside "$here/development" /korvex/tests/stranger/run.sh /korvex system $way /system g++ >> "$log" 2>&1
    say "stranger: installed from the sources, $way, xmlwrapp"
done
rm -rf --one-file-system "$here/plain" "$here/development"
