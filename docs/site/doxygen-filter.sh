#!/bin/sh
# Gives Doxygen what it can read: a public header's plain comments become Doxygen's, and one that
# stands above several declarations is repeated for each. Usage: doxygen-filter.sh HEADER
set -eu

# shellcheck disable=SC2016  # awk's own dollars
awk '
# Marks that are no commands in the comment; code, which is indented, stays as it is.
function quoted(text) {
    if (text ~ /^   */) return "    " text
    gsub(/[\\@<>%#&]/, "\\\\&", text)
    return text
}
function repeat_comment(    i) {
    if (used && /^ *virtual ~|^ *~/) {
        print indent "/// Ends the object."
        return
    }
    if (used && /= delete;$/) {
        print indent "/// Not possible."
        return
    }
    for (i = 1; i <= lines; i++) print indent "///" comment[i]
    used = 1
}
# A comment is kept until the declaration below it is seen.
/^ *\/\/( |$)/ {
    if (!in_comment) { lines = 0; in_comment = 1; used = 0 }
    match($0, /^ */)
    indent = substr($0, 1, RLENGTH)
    text = substr($0, RLENGTH + 4)
    comment[++lines] = text == "" ? "" : " " quoted(text)
    next
}
# Nothing is declared below it: a remark on the file or on a section, and no more.
/^ *$/ || /^ *(private|protected|public):/ || /^[ \t]*[}#]/ {
    in_comment = lines = open = 0
    print
    next
}
{
    in_comment = 0
    # Inline, each class would appear twice; told once, it lists the functions and levels.
    if (sub(/^KORVEX_NAMESPACE\(korvex\)/, "namespace korvex") && FILENAME ~ /LoaderInfo/) {
        print "/// All of Korvex. The namespace is inline: names work with and without it."
    }
    sub(/ +\/\/ NOLINT.*/, "")
    trailing = ""
    if (match($0, / +\/\/ /)) {  # a comment of its own
        trailing = " ///< " quoted(substr($0, RSTART + RLENGTH))
        $0 = substr($0, 1, RSTART - 1)
    }
    if (!open && lines > 0 && trailing == "") repeat_comment()
    print $0 trailing
    open = $0 !~ /[;{}]$/  # the declaration goes on in the next line
    if ($0 ~ /[{]$/) lines = 0
}
' "$1"
