# 64-bit ARM by Clang on an x86 machine. GCC's cross compiler would do as well, but Debian does not install it beside
# g++-multilib, which the 32-bit build needs. The tests run under the emulator.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR aarch64)
foreach(language IN ITEMS C CXX)
  set(CMAKE_${language}_COMPILER_TARGET aarch64-linux-gnu)
endforeach()
set(CMAKE_C_COMPILER clang)
set(CMAKE_CXX_COMPILER clang++)

# Without FFmpeg's libraries for this architecture there is nothing of it outside /usr/aarch64-linux-gnu.
set(MOVIECONV_ARM64_PKGCONFIG /usr/lib/aarch64-linux-gnu/pkgconfig)
set(ENV{PKG_CONFIG_LIBDIR} ${MOVIECONV_ARM64_PKGCONFIG})

find_program(QEMU_AARCH64 NAMES qemu-aarch64 qemu-aarch64-static REQUIRED)
set(CMAKE_CROSSCOMPILING_EMULATOR "${QEMU_AARCH64}")
if(NOT EXISTS /lib/ld-linux-aarch64.so.1)
  list(APPEND CMAKE_CROSSCOMPILING_EMULATOR -L /usr/aarch64-linux-gnu)
endif()
