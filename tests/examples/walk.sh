#!/bin/bash
# Takes the examples out of the tree and does with them, line by line, what their READMEs say, as
# somebody does who has the library installed and korvex-records in the PATH.
# Usage: walk.sh EXAMPLES-DIR
set -euo pipefail

root=$(mktemp -d)
cleanUp() {
    pid=$(cat "$root"/home/*/tallyd.pid 2> /dev/null || true)
    [ -z "$pid" ] || kill "$pid"
    rm -rf "$root"
}
trap cleanUp EXIT
cp -R "$1" "$root/examples"
export HOME="$root/home"
mkdir "$HOME"

# A port that nobody has, instead of the README's.
port=$((20000 + $$ % 12000))
while grep -q ":$(printf %04X $port) " /proc/net/udp; do port=$((port + 1)); done

# walk EXAMPLE: the commands are those after "$ ", the lines below are what they print.
walk() {
    cd "$root/examples/$1"
    # shellcheck disable=SC2016  # the README's own backquotes
    sed -n '/^```console$/,/^```$/p' README.md | sed "/^\`\`\`/d; s/8090/$port/g" > "$root/said"
    [ -s "$root/said" ]
    while IFS= read -r line; do
        case $line in
            '$ '*)
                echo "$line" >> "$root/printed"
                # stdout only; a build's output is not shown.
                eval "${line#??}" > "$root/out" < /dev/null
                case $line in *cmake*) ;; *) cat "$root/out" >> "$root/printed" ;; esac
                ;;
        esac
    done < "$root/said"
    # The times and the home directory are the READMEs' own.
    for file in said printed; do
        sed -E -i "s/[0-9]{4}-[0-9]{2}-[0-9]{2} [0-9:]{8},[0-9]{3}/TIME/; s|$HOME|/home/you|" "$root/$file"
    done
    diff "$root/said" "$root/printed"
    rm "$root/printed"
}
walk hello
walk daemon
