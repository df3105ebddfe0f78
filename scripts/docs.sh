#!/bin/sh
# Checks the pages and makes the documentation site of them and the public headers; any warning of
# Doxygen's fails. Usage: docs.sh
set -eu
cd "$(dirname "$0")/.."
tests/docs/pages.sh .
tests/docs/messages.sh .
build=${KORVEX_BUILD_DIR:-$PWD/build}
rm -rf "$build/docs"
mkdir -p "$build/docs"
{ cat docs/Doxyfile && echo "OUTPUT_DIRECTORY = \"$build/docs\""; } | doxygen -

# Doxygen does not say so when a link of a page leads nowhere.
cd "$build/docs/html"
for page in index.html md_*.html; do
    grep -o 'href="[^":]*"' "$page" | sed 's/^href="//; s/"$//' | sort -u | while IFS= read -r target; do
        file=${target%%#*}
        [ -e "${file:-$page}" ] || echo "$page: no $file"
    done
done > ../dead-links
[ ! -s ../dead-links ] || { cat ../dead-links; exit 1; }
echo "$PWD/index.html"
