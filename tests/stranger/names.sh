#!/bin/sh
# Builds programs whose names are Korvex's as well. Usage: names.sh FOLDER BUILD-DIR CXX
set -eu
folder=$1 build=$2 cxx=$3

# Both kinds of file in one program, by the property of a CMake target.
cmake -S "$folder/names" -B "$build" -G Ninja -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_CXX_FLAGS=-O0 > /dev/null
cmake --build "$build"
"$build/names" > "$build/out" 2>&1
printf '%s\n' 'by name 4' 'own hello 1' 'own hello 2' | sort | diff - "$build/out"

# compile SOURCE FLAG...: whether it compiles.
compile() {
    source=$1
    shift
    # shellcheck disable=SC2046  # lists of flags
    "$cxx" -std=c++17 -fsyntax-only $(pkg-config --cflags korvex) "$@" -x c++ "$source"
}

# Without the macro the compiler says that the names are mistaken; it chooses neither in silence.
if compile "$folder/names/Own.cc" 2> "$build/errors"; then exit 1; fi
grep -Eq 'ambiguous' "$build/errors"
# With it nothing of Korvex's is found by its short name.
for name in Logger ERROR Mutex; do
    printf '#include <korvex/util/Logger.h>\n#include <korvex/util/Thread.h>\nusing ::%s;\n' $name > "$build/short.cc"
    compile "$build/short.cc"
    if compile "$build/short.cc" -DKORVEX_QUALIFIED_NAMES 2> /dev/null; then exit 1; fi
done

# With another logging library, whose levels are plain numbers: Korvex's ERROR must not be taken for one.
pkg-config --exists log4cplus || exit 77
compile "$folder/names/TwoLibraries.cc" -DKORVEX_QUALIFIED_NAMES
if compile "$folder/names/TwoLibraries.cc" -DKORVEX_QUALIFIED_NAMES -DMISTAKEN 2> "$build/errors"; then exit 1; fi
grep -Eq 'ERROR.* (was not declared|undeclared)|undeclared.*ERROR' "$build/errors"
if compile "$folder/names/TwoLibraries.cc" 2> "$build/errors"; then exit 1; fi
grep -q ambiguous "$build/errors"
# shellcheck disable=SC2046  # lists of flags
"$cxx" -std=c++17 -DKORVEX_QUALIFIED_NAMES "$folder/names/TwoLibraries.cc" -o "$build/two" \
    $(pkg-config --cflags --libs korvex log4cplus)
"$build/two" > "$build/out" 2>&1
grep -qx hello "$build/out"
grep -q 'ERROR.*hello' "$build/out"
[ "$(grep -c . "$build/out")" -eq 2 ]
