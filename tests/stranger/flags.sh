#!/bin/sh
# Builds the stranger with flags that Korvex is not built with, and without a warning.
# Usage: flags.sh FOLDER BUILD-DIR CXX
set -eu
folder=$1 build=$2 cxx=$3
mkdir -p "$build"
strict="-Wall -Wextra -Wpedantic -Wshadow -Wconversion -Werror"
printf '%s\n' 'hello from Main Thread' 'hello from worker' 'Main Thread created twice!' stranger > "$build/expected"
for flags in -fno-rtti "-O2 -flto" "-fsanitize=address,undefined -fno-sanitize-recover=all" -std=c++20 -std=c++2b \
    "-fvisibility=hidden -fno-plt" "-DNDEBUG -D_GLIBCXX_ASSERTIONS -D_FORTIFY_SOURCE=2 -O1"; do
    echo "with $flags"
    # shellcheck disable=SC2046,SC2086  # lists of flags
    "$cxx" -std=c++17 $strict $flags "$folder/project/Main.cc" -o "$build/program" $(pkg-config --cflags --libs korvex)
    "$build/program" > "$build/out" 2>&1
    diff "$build/expected" "$build/out"
done
