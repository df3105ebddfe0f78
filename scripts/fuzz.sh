#!/bin/sh
# Runs each fuzzer (or those named) for so many seconds, two at a time, from the checked-in corpus.
# New inputs go to BUILD/found/NAME, where the next run finds them; what ends a fuzzer is kept as
# BUILD/found/NAME-*. Usage: fuzz.sh BUILD-DIR SECONDS [NAME...]
set -u
build=$1
seconds=$2
shift 2
[ $# -gt 0 ] || set -- $(ls fuzz/corpus)
mkdir -p "$build/found"
export ASAN_OPTIONS=allocator_may_return_null=1:max_allocation_size_mb=256:detect_leaks=0:quarantine_size_mb=16

run() {
    mkdir -p "$build/found/$1"
    "$build/fuzz/fuzz-$1" -max_total_time="$seconds" -rss_limit_mb=512 -timeout=25 -max_len=4096 \
        -dict="fuzz/dictionaries/$1.dict" -artifact_prefix="$build/found/$1-" -print_final_stats=1 \
        "$build/found/$1" "fuzz/corpus/$1" > "$build/found/$1.log" 2>&1
    status=$?
    runs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$build/found/$1.log")
    if [ $status -eq 0 ]; then
        echo "$1: $runs executions, nothing found"
    else
        echo "$1: FOUND after ${runs:-?} executions, see $build/found/$1.log"
        tail -n 30 "$build/found/$1.log"
    fi
    return $status
}

failed=0
while [ $# -gt 0 ]; do
    run "$1" &
    first=$!
    shift
    if [ $# -gt 0 ]; then
        run "$1" || failed=1
        shift
    fi
    wait $first || failed=1
done
exit $failed
