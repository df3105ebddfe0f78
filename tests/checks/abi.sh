#!/bin/sh
# Compares the shared library's interface, classes' layouts included, with its description in
# abi.xml.gz. What may come within a major version: names, enumerators, and members in bytes that a class
# left unused. For g++ on x86-64, and a library with debug information. With --update, writes the
# description. Usage: abi.sh SOURCE-DIR LIBRARY [--update]
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

# Classes that a public header only names, and the standard library's, which are the compiler's business.
hidden=$(sed -nE 's/^ +(class|struct) (KORVEX_HIDDEN )?([A-Za-z:]+);$/\3/p' $(find include -name '*.h') | sort -u | paste -sd '|' -)
cat > "$work/ignored" << END
[suppress_type]
  name_regexp = ^korvex::.*($hidden)$
[suppress_type]
  name_regexp = ^(std|__gnu_cxx)::
END
abidiff --no-added-syms --suppressions "$work/ignored" "$work/abi.xml" "$2" > "$work/changes" && exit

# A member in unused bytes is reported by these lines, and any other change by one of its own besides.
if grep -vE "^\$|changes summary: 0 Removed|^[0-9]+ functions? with some indirect sub-type changes?:\$|\
 has some indirect sub-type changes:\$| of type '[^']*' has sub-type changes:\$|in (pointed|referenced) to type '[^']*'|\
type size hasn't changed\$|[0-9]+ data member insertions?:\$|^ +'[^']*', at offset [0-9]+ \(in bits\)" "$work/changes"; then
    cat "$work/changes"
    echo "The interface differs. While 1.0 is not out: $0 SOURCE-DIR LIBRARY --update"
    exit 1
fi
