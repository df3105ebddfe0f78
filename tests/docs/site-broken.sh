#!/bin/sh
# Checks that site.py finds the mistakes of broken.md, a page that is not in the navigation either.
# Usage: site-broken.sh
set -eu
cd "$(dirname "$0")"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
mkdir "$work/pages"
cp -r ../../docs/site/mkdocs.yml ../../docs/site/theme "$work"
cp broken.md "$work/pages"
echo '# Start' > "$work/pages/README.md"
printf '\nnav:\n  - README.md\n' >> "$work/mkdocs.yml"
mkdocs build --quiet -f "$work/mkdocs.yml" 2> /dev/null
rm "$work/html/404.html"
if ./site.py "$work/pages" "$work/html" umask > "$work/found"; then
    echo "site.py does not fail"
    exit 1
fi
diff broken.out "$work/found"
