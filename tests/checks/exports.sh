#!/bin/sh
# Checks that a shared library shows the names in exports.txt and no other; the list holds for g++
# and clang++ on x86-64. With --update, writes the list. Usage: exports.sh LIBRARY [--update]
set -eu
list=$(dirname "$0")/exports.txt
shown() { nm -D -C --defined-only "$1" | sed 's/^[0-9a-f]* . //' | LC_ALL=C sort -u; }
if [ "${2:-}" = --update ]; then
    shown "$1" > "$list"
    exit
fi
[ "$(wc -l < "$list")" -gt 200 ]
shown "$1" | diff "$list" - || { echo "exports.txt differs; if it should, $0 LIBRARY --update"; exit 1; }
