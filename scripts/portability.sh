#!/bin/bash
# Builds and tests Korvex for other machines, in Debian roots of its own below build/portability, and
# compares the record files that they write. Needs root. Usage: portability.sh [MACHINE...]
set -euo pipefail
. scripts/debian-root.sh
. scripts/dev/source-files.sh

here=${KORVEX_BUILD_DIR:-$PWD/build}/portability
machines=(i386 libc++ arm64 s390x debian13 debian13-c++20 debian13-c++23 debian13-clang)
[ $# -eq 0 ] || machines=("$@")

common="cmake ninja-build pkg-config googletest logrotate procps"
packages_native="$common g++-multilib clang libc++-dev libc++abi-dev libpopt-dev libxml2-dev
    libpopt-dev:i386 libxml2-dev:i386 libgcc-s1:i386"
packages_cross="$common qemu-user-static g++-aarch64-linux-gnu g++-s390x-linux-gnu
    libpopt-dev:arm64 libxml2-dev:arm64 libpopt-dev:s390x libxml2-dev:s390x"

packages_debian13="$common g++ clang-19 libpopt-dev libxml2-dev"

root_of() {
    case $1 in
        arm64 | s390x) echo cross ;;
        debian13*) echo debian13 ;;
        *) echo native ;;
    esac
}

make_root() {
    local root=$here/$1
    [ ! -e "$root/ready" ] || return 0
    local architectures='' packages suite=bookworm
    [ "$1" != debian13 ] || suite=trixie
    new_root "$root" $suite
    case $1 in
        native) architectures=i386 packages=$packages_native ;;
        cross) architectures="arm64 s390x" packages=$packages_cross ;;
        debian13) packages=$packages_debian13 ;;
    esac
    # shellcheck disable=SC2086  # lists
    inside "$root" sh -c 'for a in $0; do dpkg --add-architecture $a; done; apt-get update -qq &&
        apt-get install -y -qq --no-install-recommends "$@"' "$architectures" $packages \
        > "$here/$1-packages.log" 2>&1
    touch "$root/ready"
}

# What is special about a machine.
describe() {
    triple='' emulator='' cc=g++ flags='' standard=17 archdir=x86_64-linux-gnu
    case $1 in
        i386) flags=-m32 archdir=i386-linux-gnu ;;
        libc++) cc=clang++ flags=-stdlib=libc++ ;;
        debian13) ;;
        debian13-c++20) standard=20 ;;
        debian13-c++23) standard=23 ;;
        debian13-clang) cc=clang++-19 ;;
        arm64) triple=aarch64-linux-gnu emulator=qemu-aarch64-static archdir=$triple ;;
        s390x) triple=s390x-linux-gnu emulator=qemu-s390x-static archdir=$triple ;;
    esac
    [ -z "$triple" ] || cc=$triple-g++
}

build() {
    local machine=$1 root
    root=$(root_of "$machine")
    describe "$machine"
    mkdir -p "$here/$root/korvex"
    source_files | tar -c --null -T - | tar -x -C "$here/$root/korvex"
    inside "$here/$root" sh -euc '
        machine=$1 cc=$2 flags=$3 archdir=$4 standard=$5 emulator=$6
        export PKG_CONFIG_LIBDIR=/usr/lib/$archdir/pkgconfig:/usr/share/pkgconfig
        gtest=/korvex-build/$machine/gtest
        set -- -G Ninja -DCMAKE_CXX_COMPILER="$cc" -DCMAKE_CXX_FLAGS="$flags" \
            -DCMAKE_C_COMPILER="$(echo "$cc" | sed "s/clang++/clang/;s/g++/gcc/")" \
            -DCMAKE_C_FLAGS="$(echo "$flags" | sed "s/-stdlib=[^ ]*//")" \
            -DCMAKE_CXX_STANDARD="$standard" -DCMAKE_PREFIX_PATH="$gtest" -DCMAKE_BUILD_TYPE=Release -DCMAKE_CXX_FLAGS_RELEASE="-O1 -DNDEBUG"
        if [ -n "$emulator" ]; then
            set -- "$@" -DCMAKE_SYSTEM_NAME=Linux -DCMAKE_CROSSCOMPILING_EMULATOR="$emulator"
        fi
        if [ ! -e "$gtest" ]; then
            cmake -S /usr/src/googletest -B "$gtest-build" -DCMAKE_INSTALL_PREFIX="$gtest" "$@"
            cmake --build "$gtest-build" -j "$(nproc)" --target install
        fi
        cmake -S /korvex -B "/korvex-build/$machine/korvex" -DKORVEX_WERROR=ON "$@"
        cmake --build "/korvex-build/$machine/korvex" -j "$(nproc)"' \
        sh "$machine" "$cc" "$flags" "$archdir" "$standard" "$emulator" > "$here/$machine-build.log" 2>&1
}

# Runs the tests in one process: the checks of sources and packages are the host's business.
run_tests() {
    local machine=$1 root
    root=$(root_of "$machine")
    describe "$machine"
    inside "$here/$root" env KORVEX_EMULATOR="${emulator:+/usr/bin/$emulator}" sh -euc '
        cd "/korvex-build/$0/korvex/tests"
        $KORVEX_EMULATOR ./korvex-tests --gtest_brief=1 2>&1
        for fuzzer in ../fuzz/fuzz-*; do
            $KORVEX_EMULATOR "$fuzzer" "/korvex/fuzz/corpus/${fuzzer##*/fuzz-}" | tail -n 1
        done' "$machine" > "$here/$machine-tests.log" 2>&1
}

write_records() {
    local machine=$1 root
    root=$(root_of "$machine")
    describe "$machine"
    inside "$here/$root" env KORVEX_HOME=/tmp KORVEX_DB=/tmp sh -euc '
        tool="$1 /korvex-build/$0/korvex/tools/korvex-records/korvex-records -f /korvex-build/$0/records"
        rm -f "/korvex-build/$0/records"
        mkdir -p /tmp/etc && echo rootCategory=ERROR > /tmp/etc/log-cmdline.cfg
        $tool --create put a 1 && $tool put "" empty && $tool put long "$(head -c 2500 /dev/zero | tr "\0" l)"' \
        "$machine" "$emulator" >> "$here/$machine-tests.log" 2>&1
    cp "$here/$root/korvex-build/$machine/records" "$here/records-$machine"
}

# Each machine reads what each other one wrote.
read_records() {
    local machine=$1 root other
    root=$(root_of "$machine")
    describe "$machine"
    for other in "${machines[@]}"; do
        cp "$here/records-$other" "$here/$root/korvex-build/$machine/other"
        inside "$here/$root" env KORVEX_HOME=/tmp KORVEX_DB=/tmp sh -euc '
            mkdir -p /tmp/etc && echo rootCategory=ERROR > /tmp/etc/log-cmdline.cfg
            tool="$1 /korvex-build/$0/korvex/tools/korvex-records/korvex-records -f /korvex-build/$0/other"
            [ "$($tool get a)" = 1 ] && [ "$($tool get long | wc -c)" -eq 2500 ] && $tool check' \
            "$machine" "$emulator" > /dev/null
        cmp "$here/records-$other" "$here/records-$machine"
    done
}

failed=0
for machine in "${machines[@]}"; do
    make_root "$(root_of "$machine")"
    if ! build "$machine"; then
        echo "$machine: does not build, see $here/$machine-build.log"
        failed=1
        continue
    fi
    status=passed
    run_tests "$machine" && write_records "$machine" || status=FAILED failed=1
    echo "$machine: $status: $(grep -cE '^\[  FAILED  \] .*ms\)' "$here/$machine-tests.log" || true) failed," \
        "$(grep -E '^\[  (PASSED|SKIPPED) *\] [0-9]+ test' "$here/$machine-tests.log" | tr -s ' ' | tr '\n' ' ')"
done
[ $failed -eq 0 ] || exit 1
for machine in "${machines[@]}"; do
    read_records "$machine"
done
echo "record files: the same bytes, read on each machine: ${machines[*]}"
