# Cross build for 32-bit ARM Linux (armv7-a, hard-float, NEON) with Debian's
# g++-arm-linux-gnueabihf; binaries run on this machine through qemu-arm.
#
#   scripts/armhf-sysroot.sh build-armhf/sysroot
#   cmake -S . -B build-armhf -G Ninja -DCMAKE_TOOLCHAIN_FILE=cmake/toolchains/armhf.cmake
#
# The sysroot holds the armhf libjpeg-turbo and the nlohmann-json headers; the C and C++ runtime
# come with the cross compiler under /usr/arm-linux-gnueabihf. Its place is ORZAVS_ARMHF_SYSROOT
# (cache variable or environment variable), by default <build dir>/sysroot.
# scripts/test-armhf.sh does all of this and runs the tests.

set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR armv7l)
set(CMAKE_LIBRARY_ARCHITECTURE arm-linux-gnueabihf)

set(ORZAVS_ARMHF_TRIPLE arm-linux-gnueabihf)
# -DORZAVS_ARMHF_CLANG=ON compiles with the host's clang for the same target instead (the
# compiler family of the Android NDK); it links with the cross binutils and runtime of GCC.
option(ORZAVS_ARMHF_CLANG "Cross-compile for armhf with clang instead of GCC" OFF)
list(APPEND CMAKE_TRY_COMPILE_PLATFORM_VARIABLES ORZAVS_ARMHF_CLANG)
if(ORZAVS_ARMHF_CLANG)
  set(CMAKE_C_COMPILER clang)
  set(CMAKE_CXX_COMPILER clang++)
  set(CMAKE_C_COMPILER_TARGET ${ORZAVS_ARMHF_TRIPLE})
  set(CMAKE_CXX_COMPILER_TARGET ${ORZAVS_ARMHF_TRIPLE})
else()
  set(CMAKE_C_COMPILER ${ORZAVS_ARMHF_TRIPLE}-gcc)
  set(CMAKE_CXX_COMPILER ${ORZAVS_ARMHF_TRIPLE}-g++)
endif()

# The ABI of Android's armeabi-v7a with NEON, on a hard-float Linux userland. -mfpu=neon turns
# on __ARM_NEON, which selects the SIMD paths of the detector.
set(ORZAVS_ARMHF_FLAGS "-march=armv7-a -mfpu=neon -mfloat-abi=hard")
# -Wno-psabi: GCC notes that the passing of some aggregates changed in GCC 7.1; every object of
# this build comes from the same compiler, so the note is noise.
if(NOT ORZAVS_ARMHF_CLANG)
  string(APPEND ORZAVS_ARMHF_FLAGS " -Wno-psabi")
endif()
set(CMAKE_C_FLAGS_INIT "${ORZAVS_ARMHF_FLAGS}")
set(CMAKE_CXX_FLAGS_INIT "${ORZAVS_ARMHF_FLAGS}")

if(NOT ORZAVS_ARMHF_SYSROOT)
  if(DEFINED ENV{ORZAVS_ARMHF_SYSROOT})
    set(ORZAVS_ARMHF_SYSROOT "$ENV{ORZAVS_ARMHF_SYSROOT}")
  else()
    set(ORZAVS_ARMHF_SYSROOT "${CMAKE_BINARY_DIR}/sysroot")
  endif()
  set(ORZAVS_ARMHF_SYSROOT "${ORZAVS_ARMHF_SYSROOT}" CACHE PATH "armhf libraries (scripts/armhf-sysroot.sh)")
endif()
# try_compile projects read this file again from their own build folder: hand them the sysroot.
list(APPEND CMAKE_TRY_COMPILE_PLATFORM_VARIABLES ORZAVS_ARMHF_SYSROOT)
if(NOT EXISTS "${ORZAVS_ARMHF_SYSROOT}/usr/include/jpeglib.h")
  message(FATAL_ERROR "No armhf sysroot at ${ORZAVS_ARMHF_SYSROOT}: "
                      "run scripts/armhf-sysroot.sh ${ORZAVS_ARMHF_SYSROOT} first")
endif()

# Headers, libraries and CMake packages come only from the sysroot and the cross runtime;
# programs (code generators, java, nm) from the host.
set(CMAKE_FIND_ROOT_PATH "${ORZAVS_ARMHF_SYSROOT}" /usr/${ORZAVS_ARMHF_TRIPLE})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# pkg-config answers for the target too, never with the host's x86-64 libraries.
set(ENV{PKG_CONFIG_SYSROOT_DIR} "${ORZAVS_ARMHF_SYSROOT}")
set(ENV{PKG_CONFIG_LIBDIR}
    "${ORZAVS_ARMHF_SYSROOT}/usr/lib/${ORZAVS_ARMHF_TRIPLE}/pkgconfig:${ORZAVS_ARMHF_SYSROOT}/usr/share/pkgconfig")
unset(ENV{PKG_CONFIG_PATH})

# GoogleTest is built from /usr/src/googletest with the cross compiler: the host's libraries are
# x86-64.
set(ORZAVS_GTEST_FROM_SOURCE ON CACHE BOOL "Build GoogleTest from /usr/src/googletest (cross builds)")

# Debian's armhf JVM, unpacked by scripts/armhf-sysroot.sh with its launcher <sysroot>/java (the
# JVM under qemu-arm): the Java tests, the tools and the soak run on it, against the ARM library.
if(EXISTS "${ORZAVS_ARMHF_SYSROOT}/java")
  set(ORZAVS_TARGET_JAVA "${ORZAVS_ARMHF_SYSROOT}/java")
endif()

# CTest runs the ARM test programs through qemu-arm, with the cross runtime as the dynamic
# loader's root and the sysroot's libjpeg on the library path.
find_program(ORZAVS_QEMU_ARM qemu-arm)
if(ORZAVS_QEMU_ARM)
  set(CMAKE_CROSSCOMPILING_EMULATOR
      "${ORZAVS_QEMU_ARM};-L;/usr/${ORZAVS_ARMHF_TRIPLE};-E;LD_LIBRARY_PATH=${ORZAVS_ARMHF_SYSROOT}/usr/lib/${ORZAVS_ARMHF_TRIPLE}")
endif()
