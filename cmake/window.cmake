# The window's install rules.
if(NOT TARGET movieconv_gui)
  return()
endif()

set(app_id org.movieconv.MovieConv)
set(window_data ${PROJECT_SOURCE_DIR}/host/window/data)
set(MOVIECONV_HOMEPAGE "" CACHE STRING "Address of the project's page, which has docs/pictures in its folder pictures")
file(READ ${window_data}/${app_id}.metainfo.xml.in metainfo)
if(NOT MOVIECONV_HOMEPAGE)
  string(REGEX REPLACE " *<url .*</screenshots>\n" "" metainfo "${metainfo}")
endif()
file(CONFIGURE OUTPUT ${CMAKE_BINARY_DIR}/${app_id}.metainfo.xml CONTENT "${metainfo}" @ONLY)
set_property(DIRECTORY ${PROJECT_SOURCE_DIR} APPEND PROPERTY
  CMAKE_CONFIGURE_DEPENDS ${window_data}/${app_id}.metainfo.xml.in)

install(TARGETS movieconv_gui RUNTIME DESTINATION ${home_dir})
install(FILES ${window_data}/${app_id}.desktop DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/applications)
install(FILES ${CMAKE_BINARY_DIR}/${app_id}.metainfo.xml DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/metainfo)
install(FILES ${window_data}/${app_id}.svg
  DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/icons/hicolor/scalable/apps)
install(FILES ${window_data}/movieconv-gui.1 DESTINATION ${CMAKE_INSTALL_MANDIR}/man1)
file(RELATIVE_PATH window_path ${CMAKE_INSTALL_PREFIX}/${CMAKE_INSTALL_BINDIR}
  ${CMAKE_INSTALL_PREFIX}/${home_dir}/movieconv-gui)
file(CREATE_LINK ${window_path} ${CMAKE_BINARY_DIR}/install-links/movieconv-gui SYMBOLIC)
install(FILES ${CMAKE_BINARY_DIR}/install-links/movieconv-gui DESTINATION ${CMAKE_INSTALL_BINDIR})
