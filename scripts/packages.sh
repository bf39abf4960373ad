# Debian packages, for the scripts beside this one to source.

# To build the library and sensor-replay. For ARM, scripts/arm-sysroot takes the libraries among them.
BUILD_PACKAGES='g++ cmake ninja-build pkg-config android-libutils-dev android-liblog-dev
    android-libcutils-dev libjsoncpp-dev libsqlite3-dev libsimdjson-dev libcli11-dev libpng-dev
    libunistring-dev libarchive-dev zlib1g-dev'

# To test them as well. llvm-14 has the symbolizer, by which sanitizers know what is suppressed.
TEST_PACKAGES='clang-14 libclang-rt-14-dev clang-format-14 clang-tidy-14 libgtest-dev
    llvm-14 g++-arm-linux-gnueabihf qemu-user chromium dpkg-dev file lintian sqlite3'

# To measure them.
BENCH_PACKAGES='libbenchmark-dev jq'
