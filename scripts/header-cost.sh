#!/bin/sh
# Prints what a public header costs its includer, and what a small program linked with the static library
# weighs. Times are the least of five runs, in user CPU. Usage: header-cost.sh BUILD-DIR CXX
set -eu
cd "$(dirname "$0")/.."
build=$1 cxx=$2
flags="-std=c++17 -Iinclude -Icompat/xmlwrapp/include"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

# least SOURCE: milliseconds to compile it, without code.
least() {
    for _ in 1 2 3 4 5; do
        # shellcheck disable=SC2086  # flags
        bash -c 'TIMEFORMAT=%U; time "$@"' sh "$cxx" $flags -fsyntax-only -x c++ "$1" 2>&1
    done | tr -d .s | sort -n | sed 's/^0*//' | head -n 1
}

echo 'int main() {}' > "$work/empty.cc"
empty=$(least "$work/empty.cc")
printf '%-50s %8s %8s\n' header 'ms' 'lines'
for header in "<string>" "<korvex/util/Logger.h>" $(find include/korvex -name '*.h' | sort |
    sed 's|include/\(.*\)|<\1>|' | grep -v '<korvex/util/Logger.h>'); do
    printf '#include %s\nint main() {}\n' "$header" > "$work/header.cc"
    # shellcheck disable=SC2086  # flags
    lines=$("$cxx" $flags -E -P "$work/header.cc" | wc -l)
    printf '%-50s %8s %8s\n' "$header" $(($(least "$work/header.cc") - ${empty:-0})) "$lines"
done

cat > "$work/hello.cc" << 'END'
#include <korvex/util/Logger.h>

static Logger logger("hello");

int main() {
    logger.info("hello");
}
END
# shellcheck disable=SC2046,SC2086  # lists of flags
"$cxx" $flags -O2 "$work/hello.cc" -o "$work/hello" -Wl,--as-needed "$build/src/libkorvex.a" \
    $(pkg-config --libs popt libxml-2.0)
"$work/hello" 2>&1 | grep -qx hello
strip "$work/hello"

# bytes CALL: the code of a function that makes that call.
bytes() {
    printf '#include <korvex/util/Logger.h>\nvoid f(Logger& logger, int n) { %s; }\n' "$1" > "$work/call.cc"
    # shellcheck disable=SC2086  # flags
    "$cxx" $flags -O2 -c "$work/call.cc" -o "$work/call.o"
    nm -S --size-sort "$work/call.o" | awk '/_Z1f/ { print $2 }' | tail -n 1
}
printf 'a call site, with its function: %d bytes as a method, %d as a macro\n' \
    "0x$(bytes 'logger.debug("%%d", n)')" "0x$(bytes 'KORVEX_DEBUG(logger, "%%d", n)')"
echo "static hello, stripped: $(stat -c %s "$work/hello") bytes; of text: $(size "$work/hello" | awk 'NR == 2 { print $1 }')"
echo "libkorvex.a: $(stat -c %s "$build/src/libkorvex.a") bytes"
