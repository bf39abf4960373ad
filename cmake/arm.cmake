# 32-bit ARM, as the device has it: Debian's cross compiler, the libraries of build/arm-sysroot (see
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
set(LIBRARIES ${SYSROOT}/usr/lib/${CMAKE_LIBRARY_ARCHITECTURE})

# The C library and its headers are the cross compiler's own: this is no sysroot for the compiler.
set(CMAKE_FIND_ROOT_PATH ${SYSROOT})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)
set(ENV{PKG_CONFIG_SYSROOT_DIR} ${SYSROOT})
set(ENV{PKG_CONFIG_LIBDIR} ${LIBRARIES}/pkgconfig:${SYSROOT}/usr/share/pkgconfig)
set(CMAKE_CXX_FLAGS_INIT
  "-Wno-psabi -DSIMDJSON_NO_PORTABILITY_WARNING -isystem ${SYSROOT}/usr/include")

# What a library needs itself is looked for when it is loaded.
set(CMAKE_EXE_LINKER_FLAGS_INIT "-Wl,--unresolved-symbols=ignore-in-shared-libs -L${LIBRARIES}")
set(CMAKE_SHARED_LINKER_FLAGS_INIT ${CMAKE_EXE_LINKER_FLAGS_INIT})
set(CMAKE_MODULE_LINKER_FLAGS_INIT ${CMAKE_EXE_LINKER_FLAGS_INIT})

# Through -L the loader sees the sysroot's files but not its folders, so that it skips them.
set(CMAKE_CROSSCOMPILING_EMULATOR qemu-arm -L ${SYSROOT} -E
  LD_LIBRARY_PATH=${LIBRARIES}:${LIBRARIES}/android:${SYSROOT}/usr/lib/p7zip:${SYSROOT}/lib/${CMAKE_LIBRARY_ARCHITECTURE})
