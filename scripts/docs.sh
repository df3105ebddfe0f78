#!/bin/sh
# Checks the pages and makes the documentation site of them and the public headers; any warning of
# Doxygen's fails. Usage: docs.sh
set -eu
cd "$(dirname "$0")/.."
tests/docs/pages.sh .
tests/docs/messages.sh .
rm -rf build/docs
mkdir -p build/docs
doxygen docs/Doxyfile
echo "$PWD/build/docs/html/index.html"
