#!/bin/sh
# Proves the explorer of schedules: puts each defect of tests/schedules/mutants into a copy of the
# sources, one at a time, and looks whether it is found. Usage: schedules-prove.sh [PATCH...]
set -eu
cd "$(dirname "$0")/.."
[ $# -gt 0 ] || set -- tests/schedules/mutants/*.patch
work=${KORVEX_BUILD_DIR:-$PWD/build}/schedules-prove
tree=$work/tree
mkdir -p "$tree"

# As of now, so that nothing is left of what the last run built.
git ls-files -z | tar -c --null -T - | tar -x -m -C "$tree"
cmake -G Ninja -S "$tree" -B "$work/build" -DCMAKE_BUILD_TYPE=RelWithDebInfo > /dev/null
build() { cmake --build "$work/build" --target korvex-schedules > "$work/build.log" 2>&1; }
explore() {
    # shellcheck disable=SC2086  # a list of scenarios
    "$work/build/tests/schedules/korvex-schedules" --bound 2 --limit "$1" --random "$1" $2 \
        > "$work/found.log" 2>&1
}

build || { cat "$work/build.log"; exit 1; }
failed=0
for patch in "$@"; do
    name=$(basename "$patch" .patch)
    scenarios=$(sed -n 's/^Found by: //p' "$patch")
    explore 50 "$scenarios" || {
        echo "$name: it takes no defect to make one of these fail: $scenarios"
        cat "$work/found.log"
        failed=1
        continue
    }
    patch -s -d "$tree" -p1 < "$patch" || { echo "$name: does not apply any more"; exit 1; }
    if ! build; then
        cat "$work/build.log"
        failed=1
    elif explore 4000 "$scenarios"; then
        echo "$name: NOT FOUND by $scenarios"
        failed=1
    else
        grep FAILED "$work/found.log" | cut -c 1-160 | sed "s/^/$name: /"
    fi
    patch -s -R -d "$tree" -p1 < "$patch"
done
exit "$failed"
