# shellcheck shell=bash
# Clean Debian roots, for scripts to source. Needs root and debootstrap.

debian_base=${KORVEX_BUILD_DIR:-$PWD/build}/portability/base

# inside ROOT COMMAND...: in that root, with mounts that vanish with the command.
inside() {
    local root=$1
    shift
    unshare --mount --fork sh -c '
        mount --make-rprivate / && mount -t proc proc "$0/proc" && mount -t tmpfs tmpfs "$0/tmp" &&
        mkdir -p "$0/dev/pts" && mount -t devpts -o newinstance,ptmxmode=0666 devpts "$0/dev/pts" &&
        exec chroot "$0" env DEBIAN_FRONTEND=noninteractive HOME=/root LC_ALL=C "$@"' "$root" "$@"
}

# new_root ROOT: a fresh copy of a minimal Debian.
new_root() {
    if [ ! -e "$debian_base/ready" ]; then
        rm -rf --one-file-system "$debian_base"
        mkdir -p "${debian_base%/*}"
        debootstrap --variant=minbase bookworm "$debian_base" > "${debian_base%/*}/debootstrap.log"
        cp /etc/resolv.conf "$debian_base/etc/"
        cp /etc/apt/apt.conf.d/99* "$debian_base/etc/apt/apt.conf.d/" 2> /dev/null || true
        touch "$debian_base/ready"
    fi
    rm -rf --one-file-system "$1"
    mkdir -p "${1%/*}"
    cp -a "$debian_base" "$1"
    rm "$1/ready"
}
