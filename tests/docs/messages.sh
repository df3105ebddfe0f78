#!/bin/sh
# Checks that docs/errors.md tells every message and assertion that the library's sources can print.
# Usage: messages.sh SOURCE-DIR
set -eu
cd "$1"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

# The first string, its pieces joined, of each call that prints, throws or names a message.
# shellcheck disable=SC2016  # awk's own dollars
find src -name '*.cc' -o -name '*.h' | sort | while IFS= read -r file; do
    sed 's|//.*||' "$file" | tr '\n' ' ' | awk '{
        rest = $0
        call = "(error|crit|warn|info|debug|internal|setStackSize|format|fprintf|std::printf|puts|" \
               "throw [A-Za-z:]+|allocate|KORVEX_ASSERT_AS)\\(|return \""
        while (match(rest, call)) {
            start = substr(rest, RSTART, RLENGTH) ~ /"$/ ? RSTART + RLENGTH - 1 : RSTART + RLENGTH
            rest = substr(rest, start)
            if (!match(rest, /"([^"\\]|\\.)*"/)) continue
            if (substr(rest, 1, RSTART - 1) ~ /[;{}]/) continue
            text = ""
            tail = substr(rest, RSTART)
            while (match(tail, /^ *"([^"\\]|\\.)*"/)) {
                piece = substr(tail, 1, RLENGTH)
                gsub(/^ *"|"$/, "", piece)
                text = text piece
                tail = substr(tail, RLENGTH + 1)
            }
            print text
        }
    }'
    sed -n 's/.*KORVEX_ASSERT(\(.*\));$/\1/p' "$file"
done | sed 's/\\n$//; s/\\"/"/g' | sort -u > "$work/texts"

# Pieces that are no messages of their own: names, layouts, numbers.
grep -E '.{7}|==|<' "$work/texts" |
    grep -vE '^(%|0x|KORVEX_HOME$|DATE$|ISO8601$|ABSOLUTE$|BasicLayout$|SimpleLayout$|PatternLayout$)' \
        > "$work/messages" || true
printf '%s\n' '%s:%u: Parse error at "%s"' '%s:%u: Unterminated XML comment started' \
    '%s: about to throw a PthreadException: %s: %m' '%s:%u: failed assertion' >> "$work/messages"

bad=0
while IFS= read -r message; do
    pattern=$(printf '%s\n' "$message" | sed 's/[][\.*^$+?(){}|]/\\&/g; s/%[a-z]/.+/g')
    grep -qE -- "$pattern" docs/errors.md || { echo "not told: $message"; bad=1; }
done < "$work/messages"
count=$(wc -l < "$work/messages")
[ "$count" -ge 55 ] || { echo "only $count messages found"; bad=1; }
exit $bad
