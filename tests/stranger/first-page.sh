#!/bin/sh
# Types the first program of the page "Getting started" as it stands there, files and commands.
# Usage: first-page.sh FOLDER BUILD-DIR CXX
set -eu
page=$1/../../docs/getting-started.md build=$2
mkdir -p "$build/bin"
ln -s "$(command -v "$3")" "$build/bin/g++"
export PATH="$build/bin:$PATH" CXX="$3"

# Blocks become files: first.cc, CMakeLists.txt, and each one of commands a script.
awk -v build="$build" '
    /^## A program that remembers/ { exit }
    /^```cpp$/ { file = build "/first.cc"; next }
    /^```cmake$/ { file = build "/CMakeLists.txt"; next }
    /^```sh$/ { file = build "/commands" ++count; next }
    /^```$/ { file = ""; next }
    file != "" { print > file }' "$page"
cd "$build"
grep -q 'dev install' commands1
[ ! -e commands4 ]
for commands in commands2 commands3; do
    sh -e $commands > out 2> errors
    tail -n 1 errors | grep -qx 'hello, world'
done
