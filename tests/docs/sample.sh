#!/bin/sh
# Runs a sample program of the documentation, by the script beside it where there is one, as on a
# terminal and in a new directory, and compares what it prints. Usage: sample.sh SAMPLE PROGRAM
# SAMPLE is the expected output's file; with UPDATE=1 in the environment it is written instead.
set -eu
expected=$(realpath "$1") program=$(realpath "$2")
script=${expected%.out}.sh
name=$(basename "$program")
name=${name#sample-}

root=$(mktemp -d)
trap 'rm -rf "$root"' EXIT
mkdir "$root/bin" "$root/work"
ln -s "$program" "$root/bin/$name"
cd "$root/work"
export PATH="$root/bin:$PATH" TZ=UTC LC_ALL=C KORVEX_HOME="$root/home" KORVEX_DB="$root/db"
mkdir "$KORVEX_HOME" "$KORVEX_DB"
umask 022

# Line by line, as on a terminal, so that standard output and standard error come in order. (What
# stdbuf(1) preloads comes before the address sanitizer's runtime, which does no harm.)
export ASAN_OPTIONS="verify_asan_link_order=0:${ASAN_OPTIONS:-}"
if [ -f "$script" ]; then set -- sh -e "$script"; else set -- "$name"; fi
status=0
stdbuf -oL "$@" < /dev/null > "$root/raw" 2>&1 || status=$?
sed "s|$root|/tmp/try|g" "$root/raw" > "$root/out"
[ $status -eq 0 ] || { cat "$root/out"; exit $status; }

if [ "${UPDATE:-}" = 1 ]; then
    cp "$root/out" "$expected"
else
    diff "$expected" "$root/out"
fi
