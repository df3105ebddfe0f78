#!/bin/sh
# Runs the tests with real log engines and servers, and says what it skipped, and why.
# Usage: engines.sh BUILD-DIR ENGINES-DIR [MODULE...]
# KORVEX_MESSAGES says how many messages are logged for each layout (100000; 5000 at least).
set -eu
build=$(realpath "$1")
cd "$(dirname "$0")/.."
scripts/engines-root.sh "$2"
# Expressions as Go and Ruby have them, and YAML.
if command -v npm > /dev/null; then
    [ -d "$2/npm/node_modules/yaml" ] || npm install --silent --no-fund --no-audit \
        --prefix "$2/npm" re2-wasm vscode-oniguruma yaml || echo "no packages of npm"
fi
engines=$(realpath "$2")
export KORVEX_BUILD="$build" KORVEX_ENGINES="$engines/root"
shift 2
cd tests/engines
{
    status=0
    python3 -B -m unittest -v "$@" 2>&1 || status=$?
    echo "$status" > "$engines/status"
} | tee "$engines/report"
echo "skipped:"
sed -n "s/^\(.*\) (.*) \.\.\. skipped '\(.*\)'$/  \1: \2/p" "$engines/report" | grep . || echo "  nothing"
exit "$(cat "$engines/status")"
