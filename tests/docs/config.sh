#!/bin/sh
# Reads each sample configuration with the sample program and compares where its messages went.
# Usage: config.sh SAMPLES-DIR TRY-CONFIG   With UPDATE=1 the expected results are written instead.
set -eu
samples=$(realpath "$1") program=$(realpath "$2")
root=$(mktemp -d)
trap 'rm -rf "$root"' EXIT
export TZ=UTC LC_ALL=C KORVEX_HOME="$root/home"
umask 022

count=0
bad=0
for config in "$samples"/config/*.cfg; do
    rm -rf "$KORVEX_HOME" "$KORVEX_HOME.log"
    mkdir -p "$KORVEX_HOME/log"
    cd "$root"
    cp "$config" log.cfg
    "$program" log.cfg > stdout 2> stderr
    [ ! -s stdout ]
    {
        [ ! -s stderr ] || { echo "standard error:"; sed 's/^/    /' stderr; }
        find home home.log -type f 2> /dev/null | sort | while IFS= read -r file; do
            case $file in *" ") echo "'$file':" ;; *) echo "$file:" ;; esac
            if [ -s "$file" ]; then awk '{ print "    " $0 }' "$file"; else echo "    (empty)"; fi
        done
    } | sed "s|$root|/tmp/try|g" > result
    [ -s result ] || echo "(nothing)" > result
    expected=${config%.cfg}.out
    if [ "${UPDATE:-}" = 1 ]; then
        cp result "$expected"
    elif ! diff "$expected" result; then
        echo "in $config"
        bad=1
    fi
    count=$((count + 1))
done
[ "$count" -ge 20 ]
exit $bad
