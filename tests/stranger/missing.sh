#!/bin/sh
# Asks CMake for the installed library where popt is not there: it is not found, and the reason is told.
# Usage: missing.sh FOLDER BUILD-DIR CXX
set -eu
build=$2 cxx=$3
mkdir -p "$build/empty"
printf '%s\n' 'cmake_minimum_required(VERSION 3.20)' 'project(Missing LANGUAGES CXX)' \
    'find_package(Korvex 1.0 ${how})' 'message(STATUS "found: ${Korvex_FOUND}: ${Korvex_NOT_FOUND_MESSAGE}")' \
    > "$build/CMakeLists.txt"
ask() {
    rm -rf "$build/out"
    PKG_CONFIG_LIBDIR=$build/empty PKG_CONFIG_PATH='' cmake -S "$build" -B "$build/out" -G Ninja \
        -DCMAKE_CXX_COMPILER="$cxx" -Dhow="$1" > "$build/log" 2>&1
}
reason='This Korvex needs popt, which pkg-config does not find'
ask QUIET
grep -qx -- "-- found: 0: $reason" "$build/log"
if grep -qi 'warning\|error' "$build/log"; then exit 1; fi
if ask REQUIRED; then exit 1; fi
tr -s ' \n' ' ' < "$build/log" | grep -qF "$reason"
