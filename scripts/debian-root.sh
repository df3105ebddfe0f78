# shellcheck shell=bash
# Clean Debian roots, for scripts to source. Needs root and debootstrap.

debian_bases=${KORVEX_BUILD_DIR:-$PWD/build}/portability

# inside ROOT COMMAND...: in that root, with mounts that vanish with the command.
inside() {
    local root=$1
    shift
    unshare --mount --fork sh -c '
        mount --make-rprivate / && mount -t proc proc "$0/proc" && mount -t tmpfs tmpfs "$0/tmp" &&
        mkdir -p "$0/dev/pts" && mount -t devpts -o newinstance,ptmxmode=0666 devpts "$0/dev/pts" &&
        exec chroot "$0" env DEBIAN_FRONTEND=noninteractive HOME=/root LC_ALL=C "$@"' "$root" "$@"
}

# new_root ROOT [SUITE]: a fresh copy of a minimal Debian, of bookworm unless another is named.
new_root() {
    local suite=${2:-bookworm}
    local debian_base=$debian_bases/base-$suite
    if [ ! -e "$debian_base/ready" ]; then
        rm -rf --one-file-system "$debian_base"
        mkdir -p "$debian_bases"
        debootstrap --variant=minbase "$suite" "$debian_base" > "$debian_base.log"
        cp /etc/resolv.conf "$debian_base/etc/"
        cp /etc/apt/apt.conf.d/99* "$debian_base/etc/apt/apt.conf.d/" 2> /dev/null || true
        touch "$debian_base/ready"
    fi
    rm -rf --one-file-system "$1"
    mkdir -p "${1%/*}"
    cp -a "$debian_base" "$1"
    rm "$1/ready"
}
