#!/bin/sh
# Checks every include line of the library against layers.txt. Usage: layers.sh SOURCE-DIR
set -eu
cd "$1"

# shellcheck disable=SC2016  # awk's own dollars
find src include/korvex -name '*.cc' -o -name '*.h' | sort | xargs awk '
function part_of(path,    i, best) {
    best = 0
    for (i = 1; i <= count; i++)
        if (index(path, name[i]) == 1 && substr(path, length(name[i]) + 1, 1) ~ /^[.\/]?$/) best = i
    return best
}
FILENAME == layers { next }
BEGIN {
    layers = "tests/checks/layers.txt"
    while ((getline line < layers) > 0) {
        if (line ~ /^#/ || line == "") continue
        n = split(line, words, " ")
        name[++count] = words[1]
        for (i = 2; i <= n; i++) also[count, words[i]] = 1
    }
}
FNR == 1 {
    path = FILENAME
    sub(/^src\//, "", path)
    sub(/^include\/korvex\//, "", path)
    here = part_of(path)
    if (here == 0) { print FILENAME ": no layer"; bad = 1 }
}
/^#include [<"](korvex\/|base\/|platform\/|util\/|framework\/)/ {
    target = $2
    gsub(/[<>"]/, "", target)
    sub(/^korvex\//, "", target)
    there = part_of(target)
    checked++
    if (there == 0 || (there > here && !((here, name[there]) in also))) {
        print FILENAME ":" FNR ": " name[here] " must not include " target
        bad = 1
    }
}
END {
    if (checked < 50) { print "only " checked " include lines found"; bad = 1 }
    exit bad
}'
