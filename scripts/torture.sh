#!/bin/sh
# The sweeps, crash, fork, interruption, disk and stress tests at N times their usual size, and how much they did.
# Usage: torture.sh TESTS-PROGRAM N
set -eu
export KORVEX_TEST_SCALE="$2"
log=$(mktemp)
status=0
"$1" --gtest_brief=1 \
    --gtest_filter='*Sweep*:*Crash*:*ForkTest*:*FirstLineTest*:Interrupted*:*InterruptedSave*:EarlyLoggersTest*:FullDiskTest*:LogrotateTest*:*Stress*:*KilledWriting*' \
    > "$log" 2>&1 || status=$?
grep -E '^\[ *(swept|killed|PASSED|FAILED) *\]' "$log" || true
awk '/swept/ { points += $(NF - 1) } /killed/ { kills += $(NF - 1) }
     END { print points " fault points swept, " kills " kills survived" }' "$log"
[ "$status" -eq 0 ] || cat "$log"
rm -f "$log"
exit "$status"
