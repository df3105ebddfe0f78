#!/bin/sh
# Checks units: systemd-analyze(1) has nothing to say of them. Programs that they start need not be
# installed here. Skipped, with status 77, where there is no systemd-analyze. Usage: units.sh UNIT...
set -eu
[ $# -gt 0 ] || { echo "no unit given"; exit 1; }
command -v systemd-analyze > /dev/null || { echo "there is no systemd-analyze"; exit 77; }
root=$(mktemp -d)
trap 'rm -rf "$root"' EXIT
bad=0
for unit in "$@"; do
    copy=$root/${unit##*/}
    sed 's|^ExecStart=/opt/[^ ]*|ExecStart=/bin/true|' "$unit" > "$copy"
    told=$(systemd-analyze verify --man=no "$copy" 2>&1) || bad=1
    [ -z "$told" ] || { printf '%s\n' "$told"; bad=1; }
done
exit $bad
