# 32-bit ARM as the device has it: Debian's cross compiler, the libraries of build/arm-sysroot (see
# scripts/arm-sysroot), and qemu-arm to run what comes out.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR arm)
set(CMAKE_CXX_COMPILER arm-linux-gnueabihf-g++)
set(CMAKE_LIBRARY_ARCHITECTURE arm-linux-gnueabihf)

set(SYSROOT ${CMAKE_CURRENT_LIST_DIR}/../build/arm-sysroot)
cmake_path(NORMAL_PATH SYSROOT)
if(NOT EXISTS ${SYSROOT}/.stamp)
  message(FATAL_ERROR "There is no ${SYSROOT}: run scripts/arm-sysroot")
endif()
set(CMAKE_FIND_ROOT_PATH ${SYSROOT})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)
set(ENV{PKG_CONFIG_SYSROOT_DIR} ${SYSROOT})
set(ENV{PKG_CONFIG_LIBDIR}
  ${SYSROOT}/usr/lib/${CMAKE_LIBRARY_ARCHITECTURE}/pkgconfig:${SYSROOT}/usr/share/pkgconfig)

# What the libraries need themselves is found when they are loaded.
set(CMAKE_CXX_FLAGS_INIT "-Wno-psabi -DSIMDJSON_NO_PORTABILITY_WARNING")
set(CMAKE_EXE_LINKER_FLAGS_INIT -Wl,--unresolved-symbols=ignore-in-shared-libs)
set(CMAKE_SHARED_LINKER_FLAGS_INIT -Wl,--unresolved-symbols=ignore-in-shared-libs)

# qemu's -L is not enough: it does not show the loader the sysroot's folders, only the files.
set(LIBRARIES ${SYSROOT}/usr/lib/${CMAKE_LIBRARY_ARCHITECTURE})
set(CMAKE_CROSSCOMPILING_EMULATOR qemu-arm -L ${SYSROOT} -E LD_LIBRARY_PATH=${LIBRARIES}:${LIBRARIES}/android:${SYSROOT}/lib/${CMAKE_LIBRARY_ARCHITECTURE}:${SYSROOT}/usr/lib/p7zip)
