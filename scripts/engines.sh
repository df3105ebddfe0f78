#!/bin/sh
# Runs the tests with real log engines and servers, and says what it skipped, and why.
# Usage: engines.sh BUILD-DIR ENGINES-DIR
# KORVEX_MESSAGES says how many messages are logged for each layout (100000).
set -eu
build=$(realpath "$1")
cd "$(dirname "$0")/.."
scripts/engines-root.sh "$2"
# Expressions as Go and Ruby have them, and YAML.
if command -v npm > /dev/null; then
    [ -d "$2/npm/node_modules/yaml" ] || npm install --silent --no-fund --no-audit \
        --prefix "$2/npm" re2-wasm vscode-oniguruma yaml || echo "no packages of npm"
fi
export KORVEX_BUILD="$build" KORVEX_ENGINES="$2/root"
cd tests/engines
exec python3 -B -m unittest -v
