#!/bin/sh
# Checks manual pages: mandoc(1) has nothing to say of them, not even of their style.
# Usage: manpages.sh PAGE...
set -eu
[ $# -gt 0 ] || { echo "no page given"; exit 1; }
command -v mandoc > /dev/null || { echo "there is no mandoc"; exit 1; }
bad=0
for page in "$@"; do
    told=$(mandoc -Tlint "$page" 2>&1) || bad=1
    [ -z "$told" ] || { printf '%s\n' "$told"; bad=1; }
done
exit $bad
