#!/bin/sh
# Compiles the branches for other systems, with headers that stand in for theirs; they are not linked.
# What differs between systems is said in src/platform only. Usage: platforms.sh SOURCE-DIR CXX
set -eu
cd "$1"
if grep -rnE '__(APPLE|GLIBC|linux|FreeBSD|NetBSD|OpenBSD)__|stdio_ext|__xpg_' src include tools compat |
    grep -v '^src/platform/'; then
    exit 1
fi
flags="-std=c++17 -fsyntax-only -Wall -Wextra -Werror -Iinclude -Isrc -Icompat/xmlwrapp/include"
for source in src/platform/*.cc; do
    # shellcheck disable=SC2086  # lists of flags
    "$2" $flags -D__APPLE__ -isystem tests/checks/platforms/macos "$source"
    # (g++ defines _GNU_SOURCE, by which glibc declares functions that no other system has.)
    # shellcheck disable=SC2086  # lists of flags
    "$2" $flags -U_GNU_SOURCE -D_XOPEN_SOURCE=700 -D_DEFAULT_SOURCE -isystem tests/checks/platforms/bsd "$source"
done
# The stand-ins are what is compiled against.
macros="$("$2" -std=c++17 -U_GNU_SOURCE -D_XOPEN_SOURCE=700 -isystem tests/checks/platforms/bsd -dM -E -include ctime -x c++ /dev/null)"
if echo "$macros" | grep -q 'define __GLIBC__ '; then exit 1; fi
