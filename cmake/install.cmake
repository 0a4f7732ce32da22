# Install rules, and the CMake and pkg-config packages. The Debian packages are made of what is installed: debian/.
#
# The engine, its companions and the program lie in one folder of their own, <libdir>/movieconv, where they find each
# other by $ORIGIN; <bindir> and <libdir> hold links to the program and to the engine. The links lead to the real files
# before $ORIGIN is taken, but for the engine's, which is why its run path names the folder as well.
if(NOT TARGET orvex)
  message(STATUS "No media writer: this build cannot be installed")
  return()
endif()

include(CMakePackageConfigHelpers)

set(home_dir ${CMAKE_INSTALL_LIBDIR}/movieconv)
set(doc_dir ${CMAKE_INSTALL_DATAROOTDIR}/doc/movieconv)
set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/MovieConv)

include(cmake/headers.cmake)
install(DIRECTORY ${public_header_dir} DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
target_include_directories(movieconv INTERFACE $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)

install(TARGETS movieconv platform orvex quennet EXPORT MovieConvTargets LIBRARY DESTINATION ${home_dir})
install(TARGETS movieconv_host RUNTIME DESTINATION ${home_dir})

# install_link(FOLDER NAME TARGET): a link NAME in FOLDER to TARGET, both of the installed tree.
function(install_link folder name target)
  file(RELATIVE_PATH path ${CMAKE_INSTALL_PREFIX}/${folder} ${CMAKE_INSTALL_PREFIX}/${target})
  file(MAKE_DIRECTORY ${CMAKE_BINARY_DIR}/install-links/${folder})
  file(CREATE_LINK ${path} ${CMAKE_BINARY_DIR}/install-links/${folder}/${name} SYMBOLIC)
  install(FILES ${CMAKE_BINARY_DIR}/install-links/${folder}/${name} DESTINATION ${folder})
endfunction()
install_link(${CMAKE_INSTALL_BINDIR} movieconv ${home_dir}/movieconv)
install_link(${CMAKE_INSTALL_LIBDIR} libmovieconv.so.${PROJECT_VERSION_MAJOR}
             ${home_dir}/libmovieconv.so.${PROJECT_VERSION_MAJOR})
install_link(${CMAKE_INSTALL_LIBDIR} libmovieconv.so ${home_dir}/libmovieconv.so)

install(FILES host/terminal/movieconv.1 DESTINATION ${CMAKE_INSTALL_MANDIR}/man1)

# What shells need to complete the program's options, written by the program itself.
set(completion_dir ${CMAKE_BINARY_DIR}/completion)
file(MAKE_DIRECTORY ${completion_dir})
add_custom_command(OUTPUT ${completion_dir}/movieconv ${completion_dir}/_movieconv ${completion_dir}/movieconv.fish
  COMMAND movieconv_host --completion bash > ${completion_dir}/movieconv
  COMMAND movieconv_host --completion zsh > ${completion_dir}/_movieconv
  COMMAND movieconv_host --completion fish > ${completion_dir}/movieconv.fish
  DEPENDS movieconv_host VERBATIM)
add_custom_target(completion ALL DEPENDS ${completion_dir}/movieconv)
set(share_dir ${CMAKE_INSTALL_DATAROOTDIR})
install(FILES ${completion_dir}/movieconv DESTINATION ${share_dir}/bash-completion/completions)
install(FILES ${completion_dir}/_movieconv DESTINATION ${share_dir}/zsh/site-functions)
install(FILES ${completion_dir}/movieconv.fish DESTINATION ${share_dir}/fish/vendor_completions.d)

include(cmake/documents.cmake)
install(DIRECTORY ${document_dir}/ DESTINATION ${doc_dir})
install(FILES LICENSE DESTINATION ${doc_dir} RENAME copyright)
install(DIRECTORY examples/ DESTINATION ${doc_dir}/examples)

# find_package(MovieConv COMPONENTS convert)
foreach(library IN ITEMS convert sentence source text)
  set_target_properties(movieconv_${library} PROPERTIES EXPORT_NAME ${library})
endforeach()
install(TARGETS movieconv_convert movieconv_sentence movieconv_source movieconv_text
  EXPORT MovieConvHostTargets ARCHIVE DESTINATION ${home_dir})
target_include_directories(movieconv_convert INTERFACE $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)
install(EXPORT MovieConvHostTargets NAMESPACE MovieConv:: DESTINATION ${package_dir})

# find_package(MovieConv)
install(EXPORT MovieConvTargets NAMESPACE MovieConv:: DESTINATION ${package_dir})
configure_package_config_file(cmake/MovieConvConfig.cmake.in ${CMAKE_BINARY_DIR}/MovieConvConfig.cmake
  INSTALL_DESTINATION ${package_dir})
write_basic_package_version_file(${CMAKE_BINARY_DIR}/MovieConvConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_BINARY_DIR}/MovieConvConfig.cmake ${CMAKE_BINARY_DIR}/MovieConvConfigVersion.cmake
  DESTINATION ${package_dir})

# pkg-config movieconv, movieconv-companions
set(pkgconfig_dir ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
file(RELATIVE_PATH MOVIECONV_PREFIX_FROM_PC ${CMAKE_INSTALL_PREFIX}/${pkgconfig_dir} ${CMAKE_INSTALL_PREFIX})
string(REGEX REPLACE "/$" "" MOVIECONV_PREFIX_FROM_PC ${MOVIECONV_PREFIX_FROM_PC})
foreach(name IN ITEMS movieconv movieconv-companions)
  configure_file(cmake/${name}.pc.in ${CMAKE_BINARY_DIR}/${name}.pc @ONLY)
  install(FILES ${CMAKE_BINARY_DIR}/${name}.pc DESTINATION ${pkgconfig_dir})
endforeach()

include(cmake/window.cmake)
