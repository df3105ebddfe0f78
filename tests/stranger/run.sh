#!/bin/sh
# Installs the library into a temporary prefix, then builds and runs a small stranger against it.
# Usage: run.sh SOURCE-DIR static|shared|system WAY BUILD-DIR CXX [RECORDS]
# WAY is find_package, pkg-config, add_subdirectory; examples: those are built instead, and run with the
# record tool RECORDS; folders: as pkg-config, installed into folders of unusual names; or the name of a
# script beside this one, which is run with the installed library.
# BUILD-DIR holds the library's build, which the ways of one kind share. The kind "system" is static,
# on a system that has xmlwrapp (a stand-in for it, fake-xmlwrapp). add_subdirectory installs nothing.
set -eu

source=$1 kind=$2 way=$3 build=$4 cxx=$5
prefix=$(mktemp -d)
trap 'rm -rf "$prefix"' EXIT

shared=OFF xmlwrapp=compat linkage=static
includedir=include libdir=lib
if [ "$way" = folders ]; then
    way=pkg-config includedir=$prefix/absolute/include libdir=lib/of/mine
fi
if pkg-config --exists xmlwrapp; then xmlwrapp=system; fi
if [ "$kind" = static ]; then
    export STRANGER_STATIC=ON
elif [ "$kind" = shared ]; then
    shared=ON linkage=shared
elif [ "$kind" = system ]; then
    xmlwrapp=system
    PKG_CONFIG_PATH="$source/tests/stranger/fake-xmlwrapp"
    export PKG_CONFIG_PATH
fi
if [ "$way" = add_subdirectory ]; then
    exec "$source/tests/stranger/use.sh" "$source" $linkage "$way" "$build-along" "$cxx"
fi
cmake -S "$source" -B "$build" -G Ninja -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_BUILD_TYPE=Debug \
    -DCMAKE_CXX_FLAGS=-O0 -DBUILD_SHARED_LIBS=$shared -DKORVEX_BUILD_TESTS=OFF \
    -DKORVEX_BUILD_TOOLS=OFF -DCMAKE_INSTALL_PREFIX="$prefix/first" \
    -DCMAKE_INSTALL_INCLUDEDIR="$includedir" -DCMAKE_INSTALL_LIBDIR=$libdir > /dev/null
cmake --build "$build"
cmake --install "$build" > /dev/null
# The packages must work wherever they lie.
mv "$prefix/first" "$prefix/moved"
pc_dir=$(dirname "$(find "$prefix/moved" -name korvex.pc)")
PKG_CONFIG_PATH="$pc_dir:${PKG_CONFIG_PATH:-}" CMAKE_PREFIX_PATH="$prefix/moved"
export PKG_CONFIG_PATH CMAKE_PREFIX_PATH

case $way in
    examples)
        CXX="$cxx" PATH="$(dirname "$6"):$PATH" "$source/tests/examples/walk.sh" "$source/examples"
        exit
        ;;
    find_package | pkg-config) ;;
    *)
        "$source/tests/stranger/$way.sh" "$source/tests/stranger" "$prefix/build" "$cxx"
        exit
        ;;
esac
"$source/tests/stranger/use.sh" "$source" $linkage "$way" "$prefix/build" "$cxx"
if [ "$libdir" != lib ]; then
    # CMake finds it there as well, and neither knows a folder "include".
    Korvex_DIR=$(dirname "$pc_dir")/cmake/Korvex \
        "$source/tests/stranger/use.sh" "$source" $linkage find_package "$prefix/build-cmake" "$cxx"
    [ ! -e "$prefix/moved/include" ]
    [ -e "$includedir/korvex/util/Logger.h" ]
fi
[ "$(pkg-config --variable=xmlwrapp korvex)" = $xmlwrapp ]
grep -q "set(Korvex_XMLWRAPP \"$xmlwrapp\")" "$(dirname "$pc_dir")/cmake/Korvex/KorvexConfig.cmake"
# The two kinds have names that no program mistakes.
name=libkorvex
[ $xmlwrapp = compat ] || name=libkorvex-xmlwrapp
[ "$(cd "$(dirname "$pc_dir")" && ls libkorvex*.* | sed 's/\..*//' | sort -u)" = $name ]
# Our own class is installed only where there is no other.
[ "$(find "$prefix" -path '*korvex-compat*' -name node.h | wc -l)" = "$([ $xmlwrapp = compat ] && echo 1 || echo 0)" ]
