#!/bin/sh
# Explores each scenario up to 3 preemptions, but at most N schedules of each number of them, and N by
# random priorities; tells how many there were. Usage: schedules.sh PROGRAM N JOBS
set -eu
logs=$(mktemp -d)
trap 'rm -rf "$logs"' EXIT
part=1
while [ "$part" -le "$3" ]; do
    { "$1" --bound 3 --limit "$2" --random "$2" --part "$part/$3" || echo failed > "$logs/failed"; } \
        > "$logs/$part" 2>&1 &
    part=$((part + 1))
done
wait
cat "$logs"/[0-9]* | { if [ -e "$logs/failed" ]; then cat; else sort; fi; }
# A line is "NAME: 0:1 1:14 2:230+ random:1000".
cat "$logs"/[0-9]* | awk '/^[a-z-]*: 0:/ {
        scenarios++
        for (i = 2; i <= NF && $i ~ /^(random|[0-9]):[0-9]+[+]?$/; i++) { sub(/.*:/, "", $i); schedules += $i }
    }
    END { print schedules " schedules of " scenarios " scenarios" }'
[ ! -e "$logs/failed" ]
