#!/bin/sh
# Checks that the library defines no global name outside its own namespaces.
# Usage: symbols.sh LIBRARY
set -eu
names=$(nm -C --defined-only --extern-only "$1" | sed -n 's/^[0-9a-f]* [TDBRVuW] //p')
[ "$(printf '%s\n' "$names" | grep -c '^korvex::Logger::')" -gt 10 ]
foreign=$(printf '%s\n' "$names" | grep -vE \
    '(^|[ (<*&:])(korvex|xml::korvex_compat)::|^(typeinfo( name)? for |void |bool |char\* |unsigned .*)?(std::|__gnu_cxx::)|^(operator (new|delete)|DW\.ref\.|__)' || true)
[ -z "$foreign" ] || { printf 'foreign names:\n%s\n' "$foreign"; exit 1; }
