#!/bin/sh
# Checks the pages below docs/ and CONTRIBUTING.md: each block of code says by the comment before it,
# "sample: FILE", which sample it shows, and shows just that; each sample is shown; each link leads to
# a page, a heading or a file that is there; worked changes apply. Usage: pages.sh SOURCE-DIR
set -eu
cd "$1/docs"
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
bad=0

# Commands and diagrams need no sample; a page says "diagram" before a diagram.
for path in *.md ../CONTRIBUTING.md; do
    page=${path##*/}
    awk -v page="$page" -v work="$work" '
    function begin(sample) { file = work "/block" ++count; printf "" > file; print page ":" NR, sample, file }
    /^<!-- sample: .* -->$/ { named = $3; next }
    /^<!-- diagram -->$/ { named = "-"; next }
    fenced && /^```$/ { fenced = 0; next }
    fenced { if (shown) print > file; next }
    /^```/ {
        fenced = 1
        shown = named != "" && named != "-"
        if (shown) begin(named)
        else if (named == "" && $0 !~ /^```(sh|cmake)$/) print page ":" NR, "-", "unnamed"
        named = ""
        next
    }
    /^\|/ && named != "" { begin(named); table = 1; named = "" }
    table && /^\|/ { print > file; next }
    { table = 0 }
    /./ && named != "" { print page ":" NR, named, "nothing"; named = "" }
    END { if (fenced) print page ":" NR, "-", "open" }
    ' "$path"
    mkdir -p "$work/$page"
    mv "$work"/block* "$work/$page/" 2> /dev/null || true
done > "$work/list"

while read -r where sample block; do
    page=${where%%:*}
    case $block in
        unnamed | nothing | open) echo "$where: block without a sample, or sample without a block"; bad=1 ;;
        *)
            # (The last line may lack its newline.)
            awk 1 "samples/$sample" | diff - "$work/$page/${block##*/}" ||
                { echo "$where: is not $sample"; bad=1; }
            ;;
    esac
done < "$work/list"

(cd samples && find . -type f | sed 's|^\./||') | while IFS= read -r sample; do
    grep -q " $sample " "$work/list" || grep -qF "\`docs/samples/$sample\`" ./*.md ||
        echo "no page shows $sample"
done > "$work/unshown"
cat "$work/unshown"
[ ! -s "$work/unshown" ] || bad=1

# Headings as the link to them is spelt: lower case, blanks as hyphens, other marks left out.
grep -on '](\([^)]*\))' ./*.md ../README.md ../CONTRIBUTING.md | sed 's/:[0-9]*:](/ /; s/)$//' |
    while read -r page target; do
        file=${target%%#*} anchor=${target#"${target%%#*}"}
        case $target in *://*) continue ;; esac
        path=$page
        [ -z "$file" ] || path=$(dirname "$page")/$file
        if [ ! -e "$path" ]; then
            echo "$page: no $file"
        elif [ -n "$anchor" ] && ! sed -n 's/^#\+ //p' "$path" | tr 'A-Z ' 'a-z-' |
            sed 's/[^a-z0-9_-]//g' | grep -qx -- "${anchor#\#}"; then
            echo "$page: no heading $anchor in $path"
        fi
    done > "$work/dead"
cat "$work/dead"
[ ! -s "$work/dead" ] || bad=1

# The worked changes fit the sources.
for change in samples/*.diff; do
    (cd .. && patch -sfp1 -F0 --dry-run < "docs/$change") || { echo "$change does not apply"; bad=1; }
done

[ "$(wc -l < "$work/list")" -ge 70 ] || { echo "too few blocks found"; bad=1; }
exit $bad
