# 32-bit x86 on a 64-bit machine's own compiler. No x87 arithmetic: results must not depend on 80-bit registers.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR i686)
set(CMAKE_C_FLAGS_INIT "-m32 -msse2 -mfpmath=sse")
set(CMAKE_CXX_FLAGS_INIT "-m32 -msse2 -mfpmath=sse")

# Some kernels refuse 32-bit programs; there the tests run under the emulator.
execute_process(
  COMMAND /lib/ld-linux.so.2 --version
  RESULT_VARIABLE i386_loader_result
  OUTPUT_QUIET ERROR_QUIET)
if(NOT i386_loader_result EQUAL 0)
  find_program(QEMU_I386 NAMES qemu-i386 qemu-i386-static REQUIRED)
  set(CMAKE_CROSSCOMPILING_EMULATOR "${QEMU_I386};-cpu;max")
endif()
