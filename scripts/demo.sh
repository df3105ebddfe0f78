#!/bin/sh
# The main job for all to see: records that survive the process, a log that rotates.
# Usage: demo.sh PATH-OF-korvex-records
set -eu

tool=$1
root=$(mktemp -d)
trap 'rm -rf "$root"' EXIT
export KORVEX_HOME="$root/home" KORVEX_DB="$root/db"
mkdir -p "$KORVEX_HOME/etc" "$KORVEX_HOME/log" "$KORVEX_DB"

cat > "$KORVEX_HOME/etc/log-cmdline.cfg" <<'CFG'
log4cpp.rootCategory=DEBUG, MAIN
log4cpp.appender.MAIN=RollingFileAppender
log4cpp.appender.MAIN.fileName=${KORVEX_HOME}/log/tools.log
log4cpp.appender.MAIN.maxFileSize=100
log4cpp.appender.MAIN.maxBackupIndex=2
log4cpp.appender.MAIN.layout=PatternLayout
log4cpp.appender.MAIN.layout.ConversionPattern=%d{ISO8601} [%t] %-5p %c: %m%n
CFG

show() {
    printf '\n$ %s\n' "$*"
    "$@"
}
records() {
    printf '\n$ korvex-records %s\n' "$*"
    "$tool" "$@" 2>> "$root/stderr" || { cat "$root/stderr" >&2; exit 1; }
}

echo "The logging configuration, $KORVEX_HOME/etc/log-cmdline.cfg:"
cat "$KORVEX_HOME/etc/log-cmdline.cfg"
printf '\nEach command below is a process of its own.\n'
records --create put fruit/apple red
records put fruit/banana yellow
records put vegetable/leek 'white and green'
records list --long
records get fruit/banana
echo
records remove fruit/apple
records list
records check
show ls -l "$KORVEX_HOME/log"
for log in "$KORVEX_HOME"/log/*; do show cat "$log"; done
show od -A d -t x1z -v "$KORVEX_DB/hashDb/data"
