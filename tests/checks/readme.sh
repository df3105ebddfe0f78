#!/bin/sh
# Runs the README's program twice, as it says, and looks whether the README shows just that source.
# Usage: readme.sh SOURCE-DIR PROGRAM
set -eu
source=$1 program=$2
# shellcheck disable=SC2016  # the README's own backquotes
sed -n '/^```cpp$/,/^```$/p' "$source/README.md" | sed '1d;$d' | diff - "$source/docs/samples/hello.cc"

root=$(mktemp -d)
trap 'rm -rf "$root"' EXIT
export KORVEX_HOME="$root/home" KORVEX_DB="$root/db"
mkdir -p "$KORVEX_HOME/etc" "$KORVEX_DB/hashDb"
echo 'log4cpp.rootCategory=INFO' > "$KORVEX_HOME/etc/log-cmdline.cfg"
for expected in 'ran 0 times before' 'ran 1 times before'; do
    [ "$("$program" 2>&1 > /dev/null)" = "$expected" ]
done
