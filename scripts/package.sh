#!/bin/bash
# Makes the source tarball and the Debian packages, in package/packages below the build folder. They are
# built in two folders and must be the same, and lintian must find nothing. Usage: package.sh
set -euo pipefail
cd "$(dirname "$0")/.."
build=${KORVEX_BUILD_DIR:-$PWD/build}/package
rm -rf "$build"
mkdir -p "$build/packages" "$build/first" "$build/second folder"
scripts/debian-symbols.sh --check
version=$(sed -n '1s/.*(\(.*\)).*/\1/p' debian/changelog)
grep -qx "## $version\(,.*\)\?" CHANGELOG.md || { echo "CHANGELOG.md has no $version"; exit 1; }

scripts/tarball.sh "$build/packages/korvex-$version.tar.gz"
for folder in first "second folder"; do
    echo "package: building in '$folder' (a minute or more; the log is $build/$folder/log)" >&2
    tar -xzf "$build/packages/korvex-$version.tar.gz" -C "$build/$folder"
    (cd "$build/$folder/korvex-$version" && DEB_BUILD_OPTIONS="nocheck parallel=$(nproc)" DEB_BUILD_PROFILES=nocheck \
        dpkg-buildpackage -us -uc > ../log 2>&1) || { tail -n 40 "$build/$folder/log"; exit 1; }
done
for package in "$build"/first/*.deb "$build"/first/*.dsc; do
    cmp "$package" "$build/second folder/${package##*/}"
done
echo "package: the same from both folders, byte for byte" >&2
lintian --allow-root --pedantic --fail-on error,warning,info,pedantic --display-info "$build"/first/*.changes
echo "package: lintian finds nothing" >&2
cp "$build"/first/*.deb "$build"/first/*.dsc "$build"/first/*.tar.* "$build/packages"
ls -l "$build/packages"
