#!/bin/sh
# Gets the Debian packages of the engines that the tests run, and unpacks them below DIR without
# installing them: a machine keeps its own system logger, and no server is started on it. What is
# installed already is used as it is. Usage: engines-root.sh DIR
# Prints a line "no PACKAGE" for each that cannot be had.
set -eu
mkdir -p "$1/debs" "$1/root"
cd "$1"

packages="lnav rsyslog rsyslog-relp syslog-ng-core grok redis-server redis-tools
    etcd-server etcd-client postgresql"

# missing PACKAGE: the package and what it needs of what is not installed. Asked for one at a time:
# system loggers exclude each other.
missing() { apt-get install -s -qq --no-install-recommends "$1" 2> /dev/null | sed -n 's/^Inst \([^ ]*\) .*/\1/p'; }

for package in $packages; do
    if ! names=$(missing "$package") || ! apt-cache show "$package" > /dev/null 2>&1; then
        echo "no $package"
        continue
    fi
    for name in $names; do
        [ -e "debs/$name" ] && continue
        if (cd debs && apt-get download -qq "$name" > /dev/null 2>&1); then
            dpkg-deb -x debs/"$name"_*.deb root
            rm debs/"$name"_*.deb
            : > "debs/$name"
        else
            echo "no $name, for $package"
        fi
    done
done
