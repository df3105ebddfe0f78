#!/bin/sh
# Uses xmlwrapp, or what stands in for it, in a program with a Korvex that was built without it.
# Usage: xml-nodes.sh FOLDER BUILD-DIR CXX
set -eu
folder=$1 build=$2 cxx=$3
mkdir -p "$build"
[ "$(pkg-config --variable=xmlwrapp korvex)" = compat ]
# Wherever xmlwrapp stands on the include path, the name of its header leads to it.
for flags in "-I$folder/fake-xmlwrapp/include $(pkg-config --cflags korvex)" \
    "$(pkg-config --cflags korvex) -I$folder/fake-xmlwrapp/include"; do
    # shellcheck disable=SC2046,SC2086  # lists of flags
    "$cxx" -std=c++17 -Wall -Wextra -Wpedantic -Werror -DKORVEX_QUALIFIED_NAMES $flags "$folder"/xml-nodes/*.cc \
        -o "$build/program" $(pkg-config --libs korvex)
    "$build/program" > "$build/out"
    printf '%s\n' theirs short long | diff - "$build/out"
done
