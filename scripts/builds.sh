#!/bin/bash
# Builds the library and the tools in each way that a user may ask for, and runs a tool; a program by
# Meson; then everything, with its tests, as a shared library. Usage: builds.sh [NAME...]
set -euo pipefail
cd "$(dirname "$0")/.."
here=${KORVEX_BUILD_DIR:-$PWD/build}/builds
names=(unity lto c++20 c++23 no-pic multi-config shared)
[ $# -eq 0 ] || names=("$@")
mkdir -p "$here"

# arguments NAME: what CMake is told.
arguments() {
    case $1 in
        unity) echo -DCMAKE_UNITY_BUILD=ON ;;
        lto) echo -DCMAKE_INTERPROCEDURAL_OPTIMIZATION=ON ;;
        c++20) echo -DCMAKE_CXX_STANDARD=20 ;;
        c++23) echo -DCMAKE_CXX_STANDARD=23 ;;
        no-pic) echo -DCMAKE_POSITION_INDEPENDENT_CODE=OFF ;;
        multi-config) ;;
        shared) echo -DBUILD_SHARED_LIBS=ON ;;
        *) echo "builds: no build '$1'" >&2; return 1 ;;
    esac
}

build() {
    local name=$1 tests=OFF flags=-O0 argument
    [ "$name" != shared ] || tests=ON
    [ "$name" != lto ] || flags=-O2
    argument=$(arguments "$name") || return 1
    cmake -S . -B "$here/$name" -G "$([ "$name" = multi-config ] && echo Ninja Multi-Config || echo Ninja)" \
        ${argument:+"$argument"} -DKORVEX_BUILD_TESTS=$tests -DCMAKE_CXX_FLAGS="$flags" \
        -DCMAKE_INSTALL_PREFIX="$here/$name/prefix" &&
        cmake --build "$here/$name" -j "$(nproc)" &&
        cmake --install "$here/$name" &&
        "$here/$name/prefix/bin/korvex-records" --version &&
        { [ $tests = OFF ] || ctest --test-dir "$here/$name" -j "$(nproc)" --output-on-failure -E '^(Check|Stranger)\.'; }
}

meson_program() {
    rm -rf "$here/meson"
    mkdir -p "$here/meson"
    cp docs/samples/meson.build docs/samples/first.cc "$here/meson"
    local libraries
    libraries=$(dirname "$(find "$here/shared/prefix" -name korvex.pc)")
    PKG_CONFIG_PATH=$libraries meson setup "$here/meson/build" "$here/meson" &&
        meson compile -C "$here/meson/build" &&
        [ "$("$here/meson/build/program" 2>&1)" = "hello, world" ]
}

# passes NAME COMMAND...: says whether it does.
failed=0
passes() {
    local name=$1
    shift
    if "$@" > "$here/$name.log" 2>&1; then
        echo "$name: passed"
    else
        failed=1
        tail -n 20 "$here/$name.log"
        echo "$name: FAILED, see $here/$name.log"
    fi
}
for name in "${names[@]}"; do
    passes "$name" build "$name"
    [ "$name" != shared ] || passes meson meson_program
done
exit $failed
