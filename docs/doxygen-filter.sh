#!/bin/sh
# Gives Doxygen what it can read. A public header's plain comments become Doxygen's, and one that
# stands above several declarations is repeated for each. A page's headings get labels, and its code
# keeps the percent signs and blanks that Doxygen would take away. Usage: doxygen-filter.sh FILE
set -eu

# shellcheck disable=SC2016  # awk's own dollars, here and below
page() {
    awk '
    # A code span as HTML, where Doxygen leaves out less once each mark is quoted.
    function span(text) {
        if (text !~ /%[A-Za-z]|  |\047/) return "`" text "`"
        gsub(/[\\@<>%#&$*_]/, "\\\\&", text)
        gsub(/--/, "\\--", text)
        gsub(/  /, "\\&nbsp;\\&nbsp;", text)
        return "<code>" text "</code>"
    }
    function spans(line,    out) {
        while (match(line, /`[^`]+`/)) {
            out = out plain(substr(line, 1, RSTART - 1)) span(substr(line, RSTART + 1, RLENGTH - 2))
            line = substr(line, RSTART + RLENGTH)
        }
        return out plain(line)
    }
    # A backslash in text is no command.
    function plain(text) {
        gsub(/\\/, "&&", text)
        return text
    }
    /^<!-- .* -->$/ { next }
    /^```/ { code = !code }
    code { print; next }
    # A link to a heading of another page names its label alone; one to a file that is no page, of
    # the kinds that the sources have, becomes text.
    function links(line) {
        while (match(line, /\]\([a-z-]*\.md#/)) {
            line = substr(line, 1, RSTART + 1) "@ref " substr(line, RSTART + RLENGTH)
        }
        while (match(line, /\[[^]]*\]\([^):#@]*\.(txt|h|cc|sh|cfg)\)/)) {
            text = substr(line, RSTART + 1, RLENGTH - 1)
            sub(/\]\(.*/, "", text)
            line = substr(line, 1, RSTART - 1) text substr(line, RSTART + RLENGTH)
        }
        return line
    }
    # A link finds a heading by its label: lower case, blanks as hyphens, other marks left out.
    /^##+ / {
        label = tolower($0)
        sub(/^#+ /, "", label)
        gsub(/ /, "-", label)
        gsub(/[^a-z0-9_-]/, "", label)
        gsub(/`/, "")  # a heading takes no markup
        hashes = substr($0, 1, index($0, " "))
        text = substr($0, length(hashes) + 1)
        gsub(/[\\@<>%#&$]/, "\\\\&", text)
        gsub(/--/, "\\--", text)
        print hashes text " {#" label "}"
        next
    }
    { print spans(links($0)) }
    ' "$1"
}

header() {
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
}

case $1 in
    *.md) page "$1" ;;
    *) header "$1" ;;
esac
