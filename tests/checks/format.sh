#!/bin/sh
# Checks that every source is as clang-format would have it. Usage: format.sh SOURCE-DIR
set -eu
cd "$1"
find include src compat tools examples tests docs \( -name '*.cc' -o -name '*.h' \) -print0 |
    xargs -0 clang-format --dry-run -Werror
