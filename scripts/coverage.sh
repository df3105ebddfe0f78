#!/bin/sh
# Runs the whole suite with clang's counters and prints the library's line, branch and MC/DC coverage.
# Usage: coverage.sh [JOBS]
set -eu
cd "$(dirname "$0")/.."
jobs=${1:-2}
build=${KORVEX_BUILD_DIR:-$PWD/build}/coverage

flags="-O0 -g0 -fprofile-instr-generate -fcoverage-mapping -fprofile-update=atomic"
suffix=-19
if command -v clang++-19 > /dev/null; then
    flags="$flags -fcoverage-mcdc"
else
    echo "coverage: there is no clang-19, so there is no MC/DC" >&2
    suffix=
fi

# The programs are linked anew each time, because no rule says that they hold profile.o.
tests=$build/tests/korvex-tests
records=$build/tools/korvex-records/korvex-records
logcheck=$build/tools/korvex-logcheck/korvex-logcheck
rm -f "$tests" "$records" "$logcheck"
mkdir -p "$build"
"clang++$suffix" -c -O1 scripts/coverage-profile.cc -o "$build/profile.o"
cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=None -DCMAKE_CXX_COMPILER="clang++$suffix" \
    -DCMAKE_CXX_FLAGS="$flags" -DCMAKE_EXE_LINKER_FLAGS="$build/profile.o" > /dev/null
cmake --build "$build" -j "$jobs"

# One file of counters for each process that was not forked: its forked children add to it (%m),
# those that have become another user too. The checks of sources and package run nothing of this
# build.
profiles=$(mktemp -d)
trap 'rm -rf "$profiles"' EXIT
chmod a+rwx "$profiles"
export LLVM_PROFILE_FILE="$profiles/%m-%p.profraw"
ctest --test-dir "$build" -j "$jobs" --output-on-failure --progress \
    --exclude-regex '^(Check|Stranger)\.'

# A tool that was killed while it wrote its counters leaves a file that cannot be read.
"llvm-profdata$suffix" merge -failure-mode=all -o "$build/all.profdata" "$profiles" \
    2> "$build/unreadable.log"
# A function that only one of the programs uses has no counters in the other, of which llvm-cov
# warns.
"llvm-cov$suffix" export -instr-profile "$build/all.profdata" "$tests" -object "$records" \
    -object "$logcheck" > "$build/coverage.json" 2> "$build/llvm-cov.log" || { cat "$build/llvm-cov.log" >&2; exit 1; }
python3 scripts/coverage-report.py . tests/coverage-exempt.txt "$build/coverage.json"
