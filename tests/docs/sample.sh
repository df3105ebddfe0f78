#!/bin/sh
# Runs a sample program of the documentation, by the script beside it where there is one, as on a
# terminal and in a new directory, and compares what it prints. Usage: sample.sh SAMPLE PROGRAM
# SAMPLE is the expected output's file; with UPDATE=1 in the environment it is written instead.
set -eu
expected=$1 program=$2
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

# script(1) gives it a terminal, so that standard output and standard error come in order.
[ -f "$script" ] && run="sh -e '$script'" || run=$name
script -qefc "$run" /dev/null < /dev/null | tr -d '\r' | sed "s|$root|/tmp/try|g" > "$root/out"

if [ "${UPDATE:-}" = 1 ]; then
    cp "$root/out" "$expected"
else
    diff "$expected" "$root/out"
fi
