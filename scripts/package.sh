#!/bin/sh
# Makes the Debian packages, in build/package/packages. Usage: package.sh
set -eu
cd "$(dirname "$0")/.."
build=${KORVEX_BUILD_DIR:-$PWD/build}/package
# As Debian builds: hardened, and no path of this machine in any file.
DEB_BUILD_MAINT_OPTIONS="hardening=+all"
DEB_CXXFLAGS_STRIP=-g
export DEB_BUILD_MAINT_OPTIONS DEB_CXXFLAGS_STRIP
cmake --preset package -B "$build" \
    -DCMAKE_CXX_FLAGS="$(dpkg-buildflags --get CXXFLAGS) $(dpkg-buildflags --get CPPFLAGS)" \
    -DCMAKE_SHARED_LINKER_FLAGS="$(dpkg-buildflags --get LDFLAGS)" \
    -DCMAKE_EXE_LINKER_FLAGS="$(dpkg-buildflags --get LDFLAGS)" > /dev/null
cmake --build "$build" -j "$(nproc)"
rm -rf "$build/packages" "$build/_CPack_Packages"
cpack --config "$build/CPackConfig.cmake" -B "$build" > "$build/cpack.log" 2>&1 ||
    { cat "$build/cpack.log"; exit 1; }
ls -l "$build/packages"
