# Headers that most files of a target include, parsed once for each set of flags: half of a build's time. Only where a
# preset asks for it: scripts/check looks at a build without, so that every file is known to include what it needs. A
# compiler cache does without as well, as it knows no such headers.
option(MOVIECONV_PRECOMPILE "Precompile headers" OFF)

set(standard_headers <algorithm> <array> <atomic> <cerrno> <cmath> <cstdint> <cstdio> <cstdlib> <cstring> <functional>
  <limits> <memory> <mutex> <optional> <string> <string_view> <thread> <utility> <vector>)

# precompile(TARGET [header...]): the standard headers above and these.
# precompile(TARGET REUSE_FROM target): those of a target with the same flags.
function(precompile target)
  if(NOT MOVIECONV_PRECOMPILE OR CMAKE_CXX_COMPILER_LAUNCHER)
    return()
  endif()
  # The standard headers alone do not pay where few units include them.
  if(CMAKE_UNITY_BUILD AND NOT ARGN)
    return()
  endif()
  if(ARGV1 STREQUAL "REUSE_FROM")
    target_precompile_headers(${target} REUSE_FROM ${ARGV2})
    return()
  endif()
  target_precompile_headers(${target} PRIVATE ${standard_headers} ${ARGN})
endfunction()
