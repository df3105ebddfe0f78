#!/bin/sh
# Links the static library into a plugin: it works, and shows nothing of Korvex.
# Usage: plugin.sh FOLDER BUILD-DIR CXX
set -eu
folder=$1 build=$2 cxx=$3
mkdir -p "$build"
# shellcheck disable=SC2046  # lists of flags
"$cxx" -std=c++17 -shared -fPIC -fvisibility=hidden -fvisibility-inlines-hidden "$folder/plugin/Plugin.cc" \
    -o "$build/plugin.so" -Wl,-z,defs -Wl,-z,text $(pkg-config --cflags --libs korvex-static)
"$cxx" -std=c++17 "$folder/plugin/Host.cc" -o "$build/host" -ldl
"$build/host" "$build/plugin.so" > "$build/out" 2>&1
printf '%s\n' 'hello from worker' 'caught' | diff - "$build/out"
nm -DC --defined-only "$build/plugin.so" | sed 's/^[0-9a-f]* . //' > "$build/shown"
grep -qx run "$build/shown"
if grep korvex "$build/shown"; then exit 1; fi
