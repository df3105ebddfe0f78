#!/bin/sh
# Builds the stranger in BUILD-DIR against the Korvex that CMake or pkg-config finds, or from its
# sources, and runs it. Usage: use.sh SOURCE-DIR static|shared WAY BUILD-DIR CXX
# WAY is find_package, pkg-config or add_subdirectory. With STRANGER_STATIC=ON in the environment it
# asks for the static library by its own name.
set -eu

source=$1 kind=$2 way=$3 build=$4 cxx=$5
shared=OFF module=korvex
[ "$kind" = static ] || shared=ON
[ -z "${STRANGER_STATIC:-}" ] || module=korvex-static

case $way in
    pkg-config)
        mkdir -p "$build"
        # shellcheck disable=SC2046  # lists of flags
        "$cxx" -std=c++17 $(pkg-config --cflags $module) "$source/tests/stranger/project/Main.cc" \
            -o "$build/stranger" $(pkg-config --libs $module)
        ;;
    *)
        korvex=
        [ "$way" = find_package ] || korvex=$source
        cmake -S "$source/tests/stranger/project" -B "$build" -G Ninja -DCMAKE_CXX_COMPILER="$cxx" \
            -DCMAKE_CXX_FLAGS=-O0 -DSTRANGER_STATIC="${STRANGER_STATIC:-}" -DSTRANGER_KORVEX="$korvex" \
            -DBUILD_SHARED_LIBS=$shared > /dev/null
        cmake --build "$build"
        ;;
esac

"$build/stranger" > "$build/out" 2>&1
printf '%s\n' 'hello from Main Thread' 'hello from worker' 'Main Thread created twice!' stranger | diff - "$build/out"
linked=$(ldd "$build/stranger" | grep -c 'libkorvex\.so\.1 ' || true)
[ "$linked" = "$([ "$kind" = shared ] && echo 1 || echo 0)" ] ||
    { echo "linked with libkorvex.so.1: $linked times"; exit 1; }
