#!/bin/sh
# Gives a public header to Doxygen: its plain comments become Doxygen's, and one that stands above
# several declarations is repeated for each. A page gets the marks that Doxygen needs for links to
# headings. Usage: doxygen-filter.sh FILE
set -eu
case $1 in
    *.md)
        # A link to a heading finds it by a label: lower case, blanks as hyphens, other marks left out.
        awk '
        /^<!-- .* -->$/ { next }
        /^```/ { code = !code }
        !code && /^##+ / {
            label = tolower($0)
            sub(/^#+ /, "", label)
            gsub(/ /, "-", label)
            gsub(/[^a-z0-9_-]/, "", label)
            $0 = $0 " {#" label "}"
        }
        { print }
        ' "$1"
        exit
        ;;
esac
# shellcheck disable=SC2016  # awk's own dollars
awk '
# Markup and commands that the comment does not mean; code, which is indented, stays as it is.
function quoted(text) {
    if (text ~ /^   */) return "    " text
    gsub(/[\\@<>%#&]/, "\\\\&", text)
    return text
}
function flush_comment(    i) {
    for (i = 1; i <= lines; i++) print indent "///" comment[i]
}
# A comment line: kept until the declaration is seen.
/^ *\/\/( |$)/ {
    if (!in_comment) { lines = 0; in_comment = 1 }
    match($0, /^ */)
    indent = substr($0, 1, RLENGTH)
    text = substr($0, RLENGTH + 4)
    comment[++lines] = text == "" ? "" : " " quoted(text)
    next
}
# Nothing declared below it: a remark on the file or on a section, and no more.
/^ *$/ || /^ *(private|protected|public):/ || /^[ \t]*[}#]/ {
    in_comment = 0; lines = 0; open = 0
    print
    next
}
{
    in_comment = 0
    trailing = ""
    # Where the comment behind a declaration is its own.
    if (match($0, / +\/\/ /) && $0 !~ /NOLINT/) {
        trailing = " ///< " quoted(substr($0, RSTART + RLENGTH))
        $0 = substr($0, 1, RSTART - 1)
    }
    sub(/ +\/\/ NOLINT.*/, "")
    if (!open && lines > 0 && trailing == "") flush_comment()
    print $0 trailing
    # A declaration ends with its line, or goes on.
    open = $0 !~ /[;}]$/
    if ($0 ~ /[{]$/) { lines = 0; open = 0 }
}
' "$1"
