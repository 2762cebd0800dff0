#!/usr/bin/env bash
# Cross-builds everything for a receiver target and runs the whole test suite
# under qemu-user:
#
#   scripts/test-cross.sh armhf|aarch64
#
# GoogleTest is built for the target from the sources Debian ships in
# /usr/src/googletest, into build-<target>-gtest; the project goes to
# build-<target>.
set -euo pipefail
cd "$(dirname "$0")/.."
target="${1:-}"
case "$target" in
  armhf | aarch64) ;;
  *)
    echo "usage: $0 armhf|aarch64" >&2
    exit 2
    ;;
esac
RAVEL_WITH_CROSS=1 scripts/setup.sh

jobs="${RAVEL_JOBS:-$(nproc)}"
toolchain="$PWD/cmake/toolchain-$target.cmake"
gtest="$PWD/build-$target-gtest"
if [ ! -f "$gtest/prefix/lib/cmake/GTest/GTestConfig.cmake" ]; then
  cmake -S /usr/src/googletest -B "$gtest/build" -DCMAKE_TOOLCHAIN_FILE="$toolchain" \
    -DCMAKE_BUILD_TYPE=Release -DCMAKE_INSTALL_PREFIX="$gtest/prefix" -DCMAKE_INSTALL_LIBDIR=lib >/dev/null
  cmake --build "$gtest/build" -j"$jobs"
  cmake --install "$gtest/build" >/dev/null
fi

# zlib for the target (ravel-dump inflates carousel modules with it): Debian's
# package of the target architecture, unpacked into build-<target>-zlib and
# linked statically.
case "$target" in
  armhf) debian_arch=armhf triple=arm-linux-gnueabihf ;;
  aarch64) debian_arch=arm64 triple=aarch64-linux-gnu ;;
esac
zlib="$PWD/build-$target-zlib"
if [ ! -f "$zlib/usr/lib/$triple/libz.a" ]; then
  mkdir -p "$zlib"
  (cd "$zlib" && apt-get download -qq "zlib1g-dev:$debian_arch" && dpkg -x zlib1g-dev_*_"$debian_arch".deb .)
fi

cmake -S . -B "build-$target" -DCMAKE_TOOLCHAIN_FILE="$toolchain" -DCMAKE_BUILD_TYPE=RelWithDebInfo \
  -DGTest_DIR="$gtest/prefix/lib/cmake/GTest" \
  -DZLIB_INCLUDE_DIR="$zlib/usr/include" -DZLIB_LIBRARY="$zlib/usr/lib/$triple/libz.a" >/dev/null
cmake --build "build-$target" -j"$jobs"
ctest --test-dir "build-$target" --output-on-failure -j"$jobs"
