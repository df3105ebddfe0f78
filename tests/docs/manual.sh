#!/bin/sh
# Runs the examples of a manual page, as on a terminal, and compares what they print with what the
# page shows. Usage: manual.sh PAGE PROGRAM
# An example is a block of unfilled lines: "$ COMMAND", then what that prints. What the set-up of
# every tool says first is left out.
set -eu
page=$(realpath "$1") program=$(realpath "$2")

root=$(mktemp -d)
trap 'rm -rf "$root"' EXIT
mkdir -p "$root/bin" "$root/home/etc" "$root/db"
ln -s "$program" "$root/bin/"

awk '/^\.SH/ { examples = $2 == "EXAMPLES" }
    /^\.fi/ { block = 0 }
    examples && block { gsub(/\\-/, "-"); gsub(/\\&/, ""); gsub(/\\e/, "\\"); print }
    /^\.nf/ { block = 1 }' "$page" > "$root/shown"
grep -q '^\$ ' "$root/shown" || { echo "$page: no examples"; exit 1; }

cat > "$root/home/etc/log-cmdline.cfg" << 'CFG'
log4cpp.rootCategory=WARN, MAIN
log4cpp.category.net=DEBUG
log4cpp.appender.MAIN.fileName=${KORVEX_HOME}/log/tools.log
log4cpp.appender.NET.fileName=${KORVEX_HOME}/log/net.log
CFG
mkdir "$root/home/log"

cd "$root/home"
export PATH="$root/bin:$PATH" LC_ALL=C KORVEX_HOME="$root/home" KORVEX_DB="$root/db"
while IFS= read -r line; do
    case $line in
        '$ '*)
            printf '%s\n' "$line"
            eval "${line#??}" < /dev/null || true # what it prints, or echo $?, tells
            ;;
    esac
done < "$root/shown" > "$root/raw" 2>&1
sed "/^Using logging configuration at /d; s|$root/home|/opt/product|g" "$root/raw" |
    diff "$root/shown" -
