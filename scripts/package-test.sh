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
version=$(sed -n '1s/.*(\(.*\)).*/\1/p' debian/changelog)
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

# An older version, which is this one under another number, is upgraded: the record file stays and is read.
test_upgrade() {
    # shellcheck disable=SC2016  # the inner shell's own dollars
    inside "$here/plain" env ABI="$abi" VERSION="$version" sh -euc '
        cd /packages
        for package in "$ABI" korvex-tools; do
            dpkg-deb -R ${package}_${VERSION}_*.deb /tmp/$package
            sed -i "s/^Version: .*/Version: 0.9.9/; s/(>= $VERSION)/(>= 0.9.9)/" /tmp/$package/DEBIAN/control
            dpkg-deb -b /tmp/$package /tmp/$package.deb
        done
        dpkg -i "/tmp/$ABI.deb" /tmp/korvex-tools.deb
        export KORVEX_HOME=/root/home KORVEX_DB=/root/db
        mkdir -p /root/home/etc /root/db/hashDb
        echo log4cpp.rootCategory=ERROR > /root/home/etc/log-cmdline.cfg
        korvex-records --create put fruit/apple red
        cp -p /root/db/hashDb/data /root/before
        dpkg -i ${ABI}_${VERSION}_*.deb korvex-tools_${VERSION}_*.deb
        dpkg -s korvex-tools | grep -qx "Version: $VERSION"
        cmp /root/db/hashDb/data /root/before
        [ "$(korvex-records get fruit/apple)" = red ]' >> "$log" 2>&1
    say "an upgrade keeps the record file"
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
test_upgrade
root_with development "$abi" libkorvex-dev korvex-doc g++ cmake ninja-build
mkdir "$here/development/korvex"
source_files | tar -c --null -T - | tar -x -C "$here/development/korvex"
use_all "no xmlwrapp"
build_examples
mkdir "$here/development/autopkgtest"
for test in debian/tests/*; do
    case $test in */control) continue ;; esac
    [ "${test##*/}" != tools ] || continue  # run above, where there is nothing else
    # shellcheck disable=SC2016  # the inner shell's own dollars
    inside "$here/development" sh -euc 'cd /korvex && AUTOPKGTEST_TMP=/autopkgtest "$0"' "$test" >> "$log" 2>&1
    say "autopkgtest: ${test##*/}"
done
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
