# 64-bit ARM by Clang on an x86 machine. GCC's cross compiler would do as well, but Debian does not install it beside
# g++-multilib, which the 32-bit build needs. The tests run under the emulator.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR aarch64)
set(CMAKE_C_COMPILER clang)
set(CMAKE_C_COMPILER_TARGET aarch64-linux-gnu)
set(CMAKE_CXX_COMPILER clang++)
set(CMAKE_CXX_COMPILER_TARGET aarch64-linux-gnu)
set(CMAKE_LIBRARY_ARCHITECTURE aarch64-linux-gnu)

# What needs FFmpeg is built where it is asked for: its libraries are those of the other architecture that Debian installs
# beside the machine's own.
list(APPEND CMAKE_TRY_COMPILE_PLATFORM_VARIABLES MOVIECONV_ARM64_FFMPEG)
if(MOVIECONV_ARM64_FFMPEG)
  set(ENV{PKG_CONFIG_LIBDIR} /usr/lib/aarch64-linux-gnu/pkgconfig:/usr/share/pkgconfig)
else()
  set(ENV{PKG_CONFIG_LIBDIR} /usr/aarch64-linux-gnu/lib/pkgconfig)
endif()

find_program(QEMU_AARCH64 NAMES qemu-aarch64 qemu-aarch64-static REQUIRED)
set(CMAKE_CROSSCOMPILING_EMULATOR "${QEMU_AARCH64}")
if(NOT EXISTS /lib/ld-linux-aarch64.so.1)
  list(APPEND CMAKE_CROSSCOMPILING_EMULATOR -L /usr/aarch64-linux-gnu)
endif()
