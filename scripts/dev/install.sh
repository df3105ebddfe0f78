# shellcheck shell=sh disable=SC2154  # dev's own variables
# ./dev install; sourced by dev.

# Sets prefix and shared from the arguments of the command.
install_arguments() {
    prefix=/usr/local shared=OFF
    while [ $# -gt 0 ]; do
        case $1 in
            --prefix=?*) prefix=${1#*=} ;;
            --prefix)
                [ -n "${2:-}" ] || stop "--prefix takes a folder"
                prefix=$2
                shift
                ;;
            --shared) shared=ON ;;
            *) stop "install takes --prefix DIR and --shared, not '$1'" ;;
        esac
        shift
    done
    case $prefix in /*) ;; *) prefix=$caller/$prefix ;; esac
}

# may_write FOLDER: whether it can be written in, or be made.
may_write() {
    folder=$1
    while [ ! -e "$folder" ]; do
        folder=$(dirname "$folder")
    done
    [ -d "$folder" ] && [ -w "$folder" ]
}

install_korvex() {
    install_arguments "$@"
    root=
    if ! may_write "$prefix"; then
        if [ "$(id -u)" -eq 0 ] || ! command -v sudo > /dev/null; then
            stop "cannot write below $prefix; become root, or choose a folder of yours by --prefix"
        fi
        root=as_root
    fi
    need_build
    build install -DCMAKE_INSTALL_PREFIX="$prefix" -DBUILD_SHARED_LIBS=$shared
    step "installing below $prefix" $root cmake --install "$KORVEX_BUILD_DIR/install"
    say "installed. Next: docs/getting-started.md"
    case $prefix in
        /usr | /usr/local) ;;
        *)
            libdir=$(sed -n 's/^CMAKE_INSTALL_LIBDIR:[A-Z]*=//p' "$KORVEX_BUILD_DIR/install/CMakeCache.txt")
            say "so that a shell finds it:"
            echo "export PATH=\"$prefix/bin:\$PATH\" CMAKE_PREFIX_PATH=\"$prefix\"" \
                "PKG_CONFIG_PATH=\"$prefix/$libdir/pkgconfig\""
            ;;
    esac
}
