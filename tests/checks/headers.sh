#!/bin/sh
# Checks that every public header compiles alone, without a warning, also with the namespace as an
# ordinary one and in a program whose macros have the levels' names, and that none brings along a header that costs its includer much.
# Usage: headers.sh SOURCE-DIR CXX
set -eu
cd "$1"
flags="-std=c++17 -fsyntax-only -Wall -Wextra -Wpedantic -Wconversion -Wshadow -Werror
    -Iinclude -Icompat/xmlwrapp/include $(pkg-config --cflags xmlwrapp 2> /dev/null || true)"
count=0
for header in $(find include -name '*.h' | sort); do
    for macros in "" -DKORVEX_QUALIFIED_NAMES "-DDEBUG -DINFO=1 -DNOTICE -DWARN -DERROR=2 -DCRIT -DALERT -DFATAL -DEMERG"; do
        # shellcheck disable=SC2086  # lists of flags
        printf '#include <%s>\n#include <%s>\nint main() {}\n' "${header#include/}" "${header#include/}" |
            "$2" $flags $macros -x c++ -
    done
    count=$((count + 1))
done
[ "$count" -ge 15 ]

# Logger.h is included nearly everywhere, so what it brings must cost less still.
costly='algorithm|chrono|filesystem|fstream|functional|iomanip|ios|iostream|istream|mutex|ostream|regex|sstream|thread|unordered_map'
if grep -rnE "#include <($costly)>" include/korvex; then exit 1; fi
logging=$("$2" -std=c++17 -Iinclude -MM -x c++ include/korvex/util/Logger.h | tr ' ' '\n' | grep '^include/')
[ "$(echo "$logging" | wc -l)" -ge 10 ]
# shellcheck disable=SC2086  # a list of files
if grep -nE '#include <memory>' $logging; then exit 1; fi
