#!/bin/bash
# Packs the sources, and nothing that was built, into FILE.tar.gz: the same bytes for the same sources.
# Usage: tarball.sh FILE.tar.gz
set -euo pipefail
cd "$(dirname "$0")/.."
. scripts/dev/source-files.sh
version=$(sed -n '1s/.*(\(.*\)).*/\1/p' debian/changelog)
source_files | LC_ALL=C sort -z |
    tar -c --null --no-recursion --transform "s,^,korvex-$version/,S" --owner=0 --group=0 --numeric-owner \
        --mode=go=rX,u+rw --mtime="$(sed -n 's/^ -- .*>  //p' debian/changelog | head -n 1)" --format=gnu -T - |
    gzip -9n > "$1"
