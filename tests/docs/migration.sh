#!/bin/sh
# Fixes the sample of the page on migration with korvex-logcheck, and compares the result and what is
# left to do with what the page shows. Usage: migration.sh SAMPLES-DIR KORVEX-LOGCHECK
# With UPDATE=1 in the environment both are written instead.
set -eu
samples=$(realpath "$1")/migration logcheck=$(realpath "$2")
root=$(mktemp -d)
trap 'rm -rf "$root"' EXIT
cd "$root"
export LC_ALL=C
unset KORVEX_HOME
cp "$samples/old.cfg" .
status=0
"$logcheck" --fix old.cfg > new.cfg 2> left.out || status=$?
[ $status -eq 2 ] || { echo "the status is $status"; exit 1; }
if [ "${UPDATE:-}" = 1 ]; then
    cp new.cfg left.out "$samples"
else
    diff "$samples/new.cfg" new.cfg
    diff "$samples/left.out" left.out
fi
