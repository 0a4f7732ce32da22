option(MOVIECONV_BUILD_TESTS "Build the tests" ON)
option(MOVIECONV_BUILD_BENCH "Build the benchmarks (64-bit builds only)" ON)
option(MOVIECONV_BUILD_FUZZ "Build the fuzz targets (Clang only)" OFF)
option(MOVIECONV_WERROR "Treat warnings as errors" OFF)

if(CMAKE_SIZEOF_VOID_P EQUAL 4)
  set(MOVIECONV_BUILD_BENCH OFF)
endif()

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_C_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)

# Everything that belongs together lies in one directory, in the build tree as in an installed one.
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/bin)
set(CMAKE_LIBRARY_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/bin)
set(CMAKE_BUILD_WITH_INSTALL_RPATH ON)
set(CMAKE_INSTALL_RPATH "$ORIGIN")

find_package(Threads REQUIRED)

add_library(movieconv_options INTERFACE)
target_include_directories(movieconv_options INTERFACE ${PROJECT_SOURCE_DIR})
target_link_libraries(movieconv_options INTERFACE Threads::Threads)
target_compile_options(movieconv_options INTERFACE -Wall -Wextra -Wpedantic $<$<BOOL:${MOVIECONV_WERROR}>:-Werror>)
# Not those of GCC's warnings that follow the flow of values: they go astray in strings built from parts and in what a
# sanitizer has put in between, and come and go with the length of the folder's name.
target_compile_options(movieconv_options INTERFACE
  $<$<CXX_COMPILER_ID:GNU>:-Wno-array-bounds;-Wno-maybe-uninitialized;-Wno-restrict;-Wno-stringop-overflow>)
target_link_options(movieconv_options INTERFACE -Wl,--as-needed)
if(NOT CMAKE_CXX_FLAGS MATCHES "-fsanitize")
  target_link_options(movieconv_options INTERFACE -Wl,--no-undefined)
else()
  target_compile_definitions(movieconv_options INTERFACE MOVIECONV_SANITIZED)
endif()

# FFmpeg's development files may be installed for another architecture than the one being built.
find_package(PkgConfig)
if(PKG_CONFIG_FOUND)
  pkg_check_modules(FFMPEG IMPORTED_TARGET libavformat libavcodec libavutil libswscale libswresample)
  pkg_check_modules(FILTERS libavfilter)
endif()
if(FFMPEG_FOUND AND FILTERS_FOUND)
  include(CheckLibraryExists)
  check_library_exists(avcodec avcodec_version "" MOVIECONV_FFMPEG_LINKS)
endif()
if(MOVIECONV_FFMPEG_LINKS)
  set(MOVIECONV_HAVE_FFMPEG ON)
else()
  set(MOVIECONV_HAVE_FFMPEG OFF)
  message(STATUS "No FFmpeg libraries for this architecture: building without the media writer and the host")
endif()
