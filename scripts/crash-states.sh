#!/bin/sh
# Looks at every state that a power failure may leave of what the record tool, a save and a log write,
# with all that the tests in tests/crash-states/ can do, and prints a table.
# Usage: crash-states.sh TESTS-PROGRAM
set -eu
export KORVEX_CRASH_STATES=all
log=$(mktemp)
trap 'rm -f "$log"' EXIT
status=0
"$1" --gtest_brief=1 \
    --gtest_filter='Choices.*:CrashStates.*:RecorderTest.*:SaveStates.*:*LogStates.*:*RecordToolStates.*' \
    > "$log" 2>&1 || status=$?
awk -F ' *[|] *' '
    BEGIN { format = "%-48s %6s %8s  %s\n"; printf format, "subject", "events", "states", "result" }
    sub(/^\[ *states *\] /, "") { printf format, $1, $2, $3, $4; rows++; states += $3 }
    END { printf format, "all", "", states, rows " subjects"; exit rows == 0 }' "$log" || status=1
grep -E '^\[ *(PASSED|SKIPPED|FAILED) *\]' "$log" || true
[ "$status" -eq 0 ] || grep -vE '^\[ *states *\]' "$log"
exit "$status"
