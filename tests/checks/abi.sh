#!/bin/sh
# Compares the shared library's interface, classes' layouts included, with its description in
# abi.xml.gz: names may come, all else stays within a major version. For g++ on x86-64, whose library has
# debug information. With --update, writes the description. Usage: abi.sh SOURCE-DIR LIBRARY [--update]
set -eu
cd "$1"
description=tests/checks/abi.xml.gz
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
if [ "${3:-}" = --update ]; then
    abidw --headers-dir include --drop-private-types --no-corpus-path --no-comp-dir-path --no-show-locs \
        --exported-interfaces-only --type-id-style hash "$2" | sed "s|$PWD/||" | gzip -9n > $description
    exit
fi
gzip -dc $description > "$work/abi.xml"
[ "$(grep -c '<class-decl' "$work/abi.xml")" -gt 100 ]
abidiff --headers-dir2 include --drop-private-types --no-added-syms --suppressions tests/checks/abi.supp \
    "$work/abi.xml" "$2" || {
    echo "The interface differs. While 1.0 is not out: $0 SOURCE-DIR LIBRARY --update"
    exit 1
}
