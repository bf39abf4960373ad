#!/bin/sh
# Debian packages, for the scripts beside this one to source.
# shellcheck disable=SC2034  # who sources it uses them

# To build the library and sensor-replay. For ARM, scripts/arm-sysroot takes the libraries among them.
BUILD_PACKAGES='g++ cmake ninja-build pkg-config android-libutils-dev android-liblog-dev
    android-libcutils-dev libjsoncpp-dev libsqlite3-dev libsimdjson-dev libcli11-dev libpng-dev
    libunistring-dev libexpected-dev libarchive-dev zlib1g-dev'

# To test them as well.
TEST_PACKAGES='libgtest-dev libgmock-dev sqlite3'

# Clang with its sanitizers. llvm-14 has the symbolizer, by which they know what is suppressed, and
# what counts coverage.
CLANG_PACKAGES='clang-14 libclang-rt-14-dev llvm-14'

# To build for 32-bit ARM, and to run that.
ARM_PACKAGES='g++-arm-linux-gnueabihf qemu-user dpkg-dev'

# For one step of ./test each.
FORMAT_PACKAGES='clang-format-14'
TIDY_PACKAGES='clang-tidy-14'
SHELL_PACKAGES='shellcheck'
PACKAGE_PACKAGES='dpkg-dev file lintian'
PAGE_PACKAGES='chromium chromium-driver'
# A Node.js that is not Debian's brings its own npm, and conflicts with Debian's.
command -v node >/dev/null && command -v npm >/dev/null || PAGE_PACKAGES="$PAGE_PACKAGES nodejs npm"

# To measure.
BENCH_PACKAGES='libbenchmark-dev jq'
