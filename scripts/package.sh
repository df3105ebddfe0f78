#!/bin/sh
# Makes the Debian packages, in build/package/packages. Usage: package.sh
set -eu
cd "$(dirname "$0")/.."
# As Debian builds: hardened, and no path of this machine in any file.
DEB_BUILD_MAINT_OPTIONS="hardening=+all"
DEB_CXXFLAGS_STRIP=-g
export DEB_BUILD_MAINT_OPTIONS DEB_CXXFLAGS_STRIP
cmake --preset package \
    -DCMAKE_CXX_FLAGS="$(dpkg-buildflags --get CXXFLAGS) $(dpkg-buildflags --get CPPFLAGS)" \
    -DCMAKE_SHARED_LINKER_FLAGS="$(dpkg-buildflags --get LDFLAGS)" \
    -DCMAKE_EXE_LINKER_FLAGS="$(dpkg-buildflags --get LDFLAGS)" > /dev/null
cmake --build build/package -j "$(nproc)"
rm -rf build/package/packages build/package/_CPack_Packages
cpack --config build/package/CPackConfig.cmake -B build/package > build/package/cpack.log 2>&1 ||
    { cat build/package/cpack.log; exit 1; }
ls -l build/package/packages
