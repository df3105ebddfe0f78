#!/bin/sh
# Writes debian/libkorvex1.symbols from the names that the shared library shows, tests/checks/exports.txt.
# A name keeps the version that stands there already; a new one gets the current version.
# Usage: debian-symbols.sh [--check]: with it, says whether the file is as it should be
set -eu
cd "$(dirname "$0")/.."
file=debian/libkorvex1.symbols
version=$(sed -n '1s/.*(\(.*\)).*/\1/p' debian/changelog)
write() {
    printf '%s\n' 'libkorvex.so.1 libkorvex1 #MINVER#' '* Build-Depends-Package: libkorvex-dev'
    # Types that differ between machines are left open.
    sed -E '/unsigned long|long long|unsigned int|va_list|ssize_t|stat\*|timeval| long/ {
            s/[][*^$()+?{}|\\.]/\\&/g; s/\\\(.*\\\)/\\(.*\\)/; s/.*/ (c++|regex)"^&@Base$"/; b
        }
        s/.*/ (c++)"&@Base"/' tests/checks/exports.txt | LC_ALL=C sort -u |
        while IFS= read -r line; do
            known=$(grep -F -- "$line " "$file" 2> /dev/null | sed 's/.* //' | head -n 1) || true
            printf '%s %s\n' "$line" "${known:-$version}"
        done
}
if [ "${1:-}" = --check ]; then
    write | diff "$file" - || { echo "$file differs; $0 writes it"; exit 1; }
else
    write > "$file.new"
    mv "$file.new" "$file"
fi
