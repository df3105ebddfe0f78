#!/bin/sh
# Installs the library into a temporary prefix, then builds and runs a small stranger against it.
# Usage: run.sh SOURCE-DIR static|shared|system find_package|pkg-config|examples BUILD-DIR CXX [RECORDS]
# "examples" builds the examples instead, and runs them with the record tool RECORDS.
# BUILD-DIR holds the library's build, which the ways of one kind share. The kind "system" is static,
# on a system that has xmlwrapp (a stand-in for it, fake-xmlwrapp).
set -eu

source=$1 kind=$2 way=$3 build=$4 cxx=$5
prefix=$(mktemp -d)
trap 'rm -rf "$prefix"' EXIT

shared=OFF xmlwrapp=compat
if pkg-config --exists xmlwrapp; then xmlwrapp=system; fi
if [ "$kind" = shared ]; then
    shared=ON
elif [ "$kind" = system ]; then
    xmlwrapp=system
    PKG_CONFIG_PATH="$source/tests/stranger/fake-xmlwrapp"
    export PKG_CONFIG_PATH
fi
cmake -S "$source" -B "$build" -G Ninja -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_BUILD_TYPE=Debug \
    -DCMAKE_CXX_FLAGS=-O0 -DBUILD_SHARED_LIBS=$shared -DKORVEX_BUILD_TESTS=OFF \
    -DKORVEX_BUILD_TOOLS=OFF -DCMAKE_INSTALL_PREFIX="$prefix/first" > /dev/null
cmake --build "$build"
cmake --install "$build" > /dev/null
# The packages must work wherever they lie.
mv "$prefix/first" "$prefix/moved"
pc_dir=$(dirname "$(find "$prefix/moved" -name korvex.pc)")
PKG_CONFIG_PATH="$pc_dir:${PKG_CONFIG_PATH:-}"
export PKG_CONFIG_PATH

if [ "$way" = examples ]; then
    CXX="$cxx" CMAKE_PREFIX_PATH="$prefix/moved" PATH="$(dirname "$6"):$PATH" \
        "$source/tests/examples/walk.sh" "$source/examples"
    exit
elif [ "$way" = find_package ]; then
    cmake -S "$source/tests/stranger/project" -B "$prefix/build" -G Ninja \
        -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_PREFIX_PATH="$prefix/moved" > /dev/null
    cmake --build "$prefix/build"
else
    mkdir "$prefix/build"
    # shellcheck disable=SC2046  # lists of flags
    "$cxx" -std=c++17 $(pkg-config --cflags korvex) "$source/tests/stranger/project/Main.cc" \
        -o "$prefix/build/stranger" $(pkg-config --libs korvex)
fi

LD_LIBRARY_PATH=$(dirname "$pc_dir") "$prefix/build/stranger" > "$prefix/out" 2>&1
printf 'hello from Main Thread\nstranger\n' | diff - "$prefix/out"

linked=$(ldd "$prefix/build/stranger" | grep -c libkorvex || true)
[ "$linked" = "$([ "$kind" = shared ] && echo 1 || echo 0)" ]
[ "$(pkg-config --variable=xmlwrapp korvex)" = $xmlwrapp ]
grep -q "set(Korvex_XMLWRAPP \"$xmlwrapp\")" "$(dirname "$pc_dir")/cmake/Korvex/KorvexConfig.cmake"
# Our own class is installed only where there is no other.
[ "$(find "$prefix/moved" -path '*korvex-compat*' -name node.h | wc -l)" = "$([ $xmlwrapp = compat ] && echo 1 || echo 0)" ]
