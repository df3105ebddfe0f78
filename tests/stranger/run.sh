#!/bin/sh
# Installs the library into a temporary prefix, then builds and runs a small stranger against it.
# Usage: run.sh SOURCE-DIR static|shared find_package|pkg-config BUILD-DIR CXX
# BUILD-DIR holds the library's build, which the ways of one kind share.
set -eu

source=$1 kind=$2 way=$3 build=$4 cxx=$5
prefix=$(mktemp -d)
trap 'rm -rf "$prefix"' EXIT

shared=OFF
[ "$kind" = static ] || shared=ON
cmake -S "$source" -B "$build" -G Ninja -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_BUILD_TYPE=Debug \
    -DCMAKE_CXX_FLAGS=-O0 -DBUILD_SHARED_LIBS=$shared -DKORVEX_BUILD_TESTS=OFF \
    -DKORVEX_BUILD_TOOLS=OFF -DCMAKE_INSTALL_PREFIX="$prefix/first" > /dev/null
cmake --build "$build"
cmake --install "$build" > /dev/null
# The packages must work wherever they lie.
mv "$prefix/first" "$prefix/moved"
PKG_CONFIG_PATH=$(dirname "$(find "$prefix/moved" -name korvex.pc)")
export PKG_CONFIG_PATH

if [ "$way" = find_package ]; then
    cmake -S "$source/tests/stranger/project" -B "$prefix/build" -G Ninja \
        -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_PREFIX_PATH="$prefix/moved" > /dev/null
    cmake --build "$prefix/build"
else
    mkdir "$prefix/build"
    # shellcheck disable=SC2046  # lists of flags
    "$cxx" -std=c++17 $(pkg-config --cflags korvex) "$source/tests/stranger/project/Main.cc" \
        -o "$prefix/build/stranger" $(pkg-config --libs korvex)
fi

LD_LIBRARY_PATH=$(dirname "$PKG_CONFIG_PATH") "$prefix/build/stranger" > "$prefix/out" 2>&1
printf 'hello from Main Thread\nstranger\n' | diff - "$prefix/out"

linked=$(ldd "$prefix/build/stranger" | grep -c libkorvex || true)
[ "$kind-$linked" = static-0 ] || [ "$kind-$linked" = shared-1 ]
[ "$(pkg-config --variable=xmlwrapp korvex)" = compat ] || [ "$(pkg-config --variable=xmlwrapp korvex)" = system ]
