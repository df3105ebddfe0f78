# shellcheck shell=sh
# Sourced, at the top of the tree.

# source_files [PATTERN...]: the files of the sources with such names, each ending in a NUL. Where there
# is no git, as in an unpacked tarball, all but what is built.
source_files() {
    if [ -e .git ] && command -v git > /dev/null; then
        git ls-files -zco --exclude-standard -- "$@"
        return
    fi
    [ $# -gt 0 ] || set -- '*'
    for pattern in "$@"; do
        find . \( -name build -o -name .git \) -prune -o \( -type f -o -type l \) -name "$pattern" -print0
    done | sed -z 's|^\./||'
}
