# A stand-in for the Android NDK's android.toolchain.cmake (armeabi-v7a, API 21) on a machine
# without the NDK, so that the project's Android configuration can be checked here
# (scripts/check-android.sh). It sets what the NDK's file sets and what the project can see:
# CMAKE_SYSTEM_NAME Android with CMAKE_SYSTEM_VERSION 1 (the NDK's own toolchain file does this
# so that CMake's built-in Android module stays out of the way), ANDROID, ANDROID_ABI,
# ANDROID_PLATFORM, a clang compiler with the NDK's armeabi-v7a flags and macros, find roots
# confined to a sysroot that, like the NDK's, has jni.h and liblog and no libjpeg.
#
# What it cannot be: the compiler targets arm-linux-gnueabihf (glibc, hard-float) instead of
# armv7-none-linux-androideabi21 (bionic, softfp), since bionic is not on this machine.
# Real app builds use the NDK's file; see README.md, "Android".

set(CMAKE_SYSTEM_NAME Android)
set(CMAKE_SYSTEM_VERSION 1)
set(CMAKE_SYSTEM_PROCESSOR armv7-a)
set(ANDROID TRUE)
set(ANDROID_ABI armeabi-v7a)
set(ANDROID_PLATFORM android-21)
set(ANDROID_PLATFORM_LEVEL 21)
set(ANDROID_NATIVE_API_LEVEL 21)
set(ANDROID_ARM_NEON TRUE)
set(ANDROID_STL c++_static)

set(CMAKE_C_COMPILER clang)
set(CMAKE_CXX_COMPILER clang++)
set(CMAKE_C_COMPILER_TARGET arm-linux-gnueabihf)
set(CMAKE_CXX_COMPILER_TARGET arm-linux-gnueabihf)

# The NDK's compile flags for armeabi-v7a with NEON, and the macros its compiler predefines.
set(ORZAVS_NDK_FLAGS "-DANDROID -D__ANDROID__ -D__ANDROID_API__=21 -fdata-sections -ffunction-sections -funwind-tables -fstack-protector-strong -no-canonical-prefixes -march=armv7-a -mthumb -mfpu=neon -Wformat -Werror=format-security")

# The NDK's sysroot: jni.h, the Android log interface and the C library, nothing else; its
# compiler searches it by itself.
# ORZAVS_ANDROID_SYSROOT is made by scripts/check-android.sh.
if(NOT ORZAVS_ANDROID_SYSROOT)
  set(ORZAVS_ANDROID_SYSROOT "${CMAKE_BINARY_DIR}/ndk-sysroot" CACHE PATH "Emulated NDK sysroot")
endif()
list(APPEND CMAKE_TRY_COMPILE_PLATFORM_VARIABLES ORZAVS_ANDROID_SYSROOT)
string(APPEND ORZAVS_NDK_FLAGS " -idirafter ${ORZAVS_ANDROID_SYSROOT}/usr/include")

set(CMAKE_C_FLAGS_INIT "${ORZAVS_NDK_FLAGS}")
set(CMAKE_CXX_FLAGS_INIT "${ORZAVS_NDK_FLAGS}")
set(CMAKE_SHARED_LINKER_FLAGS_INIT "-Wl,--build-id=sha1 -Wl,--no-undefined -Wl,--fatal-warnings -Wl,--gc-sections")
# The NDK's linker finds the platform libraries (liblog) in its sysroot by itself.
string(APPEND CMAKE_SHARED_LINKER_FLAGS_INIT " -L${ORZAVS_ANDROID_SYSROOT}/usr/lib")
set(CMAKE_EXE_LINKER_FLAGS_INIT "-L${ORZAVS_ANDROID_SYSROOT}/usr/lib")
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_FIND_ROOT_PATH "${ORZAVS_ANDROID_SYSROOT}")
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)
