# shellcheck shell=sh disable=SC2154  # dev's own variables
# What ./dev needs installed; sourced by it. Debian's names of packages, which are Ubuntu's too.

# there PACKAGE: whether it is installed, by dpkg or because its contents are found.
there() {
    dpkg-query -W -f '${Status}\n' "$1" 2> /dev/null | grep -q 'ok installed' && return
    case $1 in
        abigail-tools) command -v abidw ;;
        acl) command -v setfacl ;;
        locales) command -v locale-gen ;;
        ninja-build) command -v ninja ;;
        libpcre2-dev) pkg-config --exists libpcre2-8 ;;
        libpopt-dev) pkg-config --exists popt ;;
        libxml2-dev) pkg-config --exists libxml-2.0 ;;
        libgtest-dev) pkg-config --exists gtest ;;
        libgmock-dev) pkg-config --exists gmock ;;
        liblog4cplus-dev) pkg-config --exists log4cplus ;;
        *) PATH=$PATH:/usr/sbin:/sbin command -v "$1" ;;
    esac > /dev/null 2>&1
}

# Runs a command as root.
as_root() {
    if [ "$(id -u)" -eq 0 ]; then "$@"; else sudo "$@"; fi
}

# apt COMMAND...: as apt-get, into the log. Waits ten minutes for another apt to end.
apt() {
    apt_try=0
    while ! as_root env DEBIAN_FRONTEND=noninteractive apt-get "$@" < /dev/null > "$log.apt" 2>&1; do
        if [ $apt_try -eq 120 ] || ! grep -qE 'Could not get lock|Unable to (acquire|lock)' "$log.apt"; then
            cat "$log.apt" >> "$log"
            return 1
        fi
        [ $apt_try -gt 0 ] || say "another apt is at work; waiting for it to end"
        apt_try=$((apt_try + 1))
        sleep 5
    done
    cat "$log.apt" >> "$log"
}

# need PACKAGE...: installs those that are not there. If it cannot, says why and what is missing.
need() {
    missing=
    for package in "$@"; do
        there "$package" || missing="$missing $package"
    done
    [ -n "$missing" ] || return 0
    if ! command -v apt-get > /dev/null; then
        say "missing:$missing"
        say "These are Debian's names. There is no apt-get here; install what they hold in another way."
        return 1
    fi
    if [ "$(id -u)" -ne 0 ] && ! command -v sudo > /dev/null; then
        say "missing:$missing"
        say "Only root may install them, and there is no sudo. As root: apt-get install$missing"
        return 1
    fi
    say "installing$missing (up to a minute)"
    # Lists that cannot be renewed may still do.
    apt update -qq || say "the lists of packages could not be renewed; trying with those that are here"
    # shellcheck disable=SC2086  # a list of packages
    apt install -y -qq --no-install-recommends $missing || {
        cat "$log.apt" >&2
        say "could not install$missing"
        return 1
    }
}
