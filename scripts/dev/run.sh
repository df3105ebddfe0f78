# shellcheck shell=sh disable=SC2154  # dev's own variables
# How ./dev runs what takes long; sourced by it. What is run writes to the log; the terminal shows what
# goes on, and everybody sees what went wrong.

say() { echo "dev: $*" >&2; }

stop() {
    say "$*"
    exit 1
}

# follow SHOWN: reads lines, adds them to the log, and shows the last one on a terminal while they come.
# SHOWN "tests" are passed on to standard output except what passes; of "steps" nothing is.
follow() {
    while IFS= read -r line || [ -n "$line" ]; do
        printf '%s\n' "$line" >> "$log"
        case $1:$line in
            steps:* | tests:*' Start '*[0-9]:* | tests:*' Test '*'#'*' Passed '*)
                if [ -t 2 ]; then printf '\r\033[K%.78s' "$line" >&2; fi
                ;;
            *)
                if [ -t 2 ]; then printf '\r\033[K' >&2; fi
                printf '%s\n' "$line"
                ;;
        esac
    done
    if [ -t 2 ]; then printf '\r\033[K' >&2; fi
}

# run SHOWN COMMAND...: follows the command, and returns its status.
run() {
    shown=$1
    shift
    rm -f "$log.status"
    { "$@" 2>&1 || echo $? > "$log.status"; } | follow "$shown"
    [ ! -e "$log.status" ] || return "$(cat "$log.status")"
}

# step WHAT COMMAND...: says what is being done. Shows the command's output only if it fails.
step() {
    say "$1"
    shift
    before=$(wc -l < "$log")
    run steps "$@" && return
    status=$?
    tail -n "+$((before + 1))" "$log" | grep -vE '^\[[0-9]+/[0-9]+\] (Building|Linking) ' >&2
    say "failed; all of it is in $log"
    return $status
}

# build PRESET [CMAKE-ARGUMENT...]
build() {
    preset=$1
    shift
    step "configuring $preset" cmake --preset "$preset" -B "$KORVEX_BUILD_DIR/$preset" "$@" &&
        step "building $preset (the first time some minutes; the log is $log)" \
            cmake --build "$KORVEX_BUILD_DIR/$preset" -j "$jobs"
}

# run_tests PRESET [CTEST-ARGUMENT...]: shows the tests that fail, and how it ended.
run_tests() {
    preset=$1
    shift
    say "running the tests of $preset (some minutes)"
    run tests ctest --test-dir "$KORVEX_BUILD_DIR/$preset" -j "$jobs" --output-on-failure "$@"
}
