#!/bin/sh
# Checks the pages, and makes the documentation site of them and the public headers: the pages by
# MkDocs in the order of docs/README.md, the headers by Doxygen, any warning of which fails.
# Usage: docs.sh
set -eu
cd "$(dirname "$0")/.."
tests/docs/pages.sh .
tests/docs/messages.sh .
tests/docs/site-broken.sh
build=${KORVEX_BUILD_DIR:-$PWD/build}/docs
rm -rf "$build"
mkdir -p "$build/pages/benchmarks"
cp -r docs/site/theme "$build"

# CONTRIBUTING.md and CHANGELOG.md move beside the other pages. Links to sources become text.
cp docs/*.md docs/*.svg CONTRIBUTING.md CHANGELOG.md "$build/pages"
cp docs/benchmarks/*.md docs/benchmarks/*.svg "$build/pages/benchmarks"
find "$build/pages" -name '*.md' -exec sed -i -E 's#\]\(\.\./(CONTRIBUTING|CHANGELOG)\.md#](\1.md#g
    s#\]\(docs/#](#g
    s#\[([^]]*)\]\([^):]*\.(txt|h|cc|sh|cfg)\)#\1#g' {} +

{ cat docs/site/Doxyfile && echo "OUTPUT_DIRECTORY = \"$build/pages\""; } | doxygen -
# shellcheck disable=SC2016  # Markdown's code marks
sed -i 's#`include/korvex/`#[&](reference/index.html)#' "$build/pages/README.md"

cd "$build"
# shellcheck disable=SC2016  # awk's own dollars
{
    cat "$OLDPWD/docs/site/mkdocs.yml"
    printf '\nnav:\n  - Overview: README.md\n'
    awk '/^## / { section = substr($0, 4) }
        /^\| \[/ {
            if (section != shown) printf "  - \"%s\":\n", (shown = section)
            split($0, part, /[][()]+/)
            printf "      - \"%s\": %s\n", part[2], part[3]
        }' pages/README.md
    echo '  - Reference of the headers: reference/index.html'
} > mkdocs.yml
mkdocs build --strict --quiet
rm html/404.html html/sitemap.xml*  # they fit the top of a server only

# Where the site is opened as a file, the search needs its index as a script.
{ printf 'var __index = ' && cat html/search/search_index.json; } > html/search/search_index.js
"$OLDPWD/tests/docs/site.py" pages html rotation umask KORVEX_HOME fork
echo "$build/html/index.html"
