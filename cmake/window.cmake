# The window's install rules, and a Debian package of its own beside the program's. To be included before CPack.
if(NOT TARGET movieconv_gui)
  return()
endif()

set(app_id org.movieconv.MovieConv)
set(window_data ${PROJECT_SOURCE_DIR}/host/window/data)
set(MOVIECONV_HOMEPAGE https://movieconv.example CACHE STRING "Where the project's pages and pictures are published")
configure_file(${window_data}/${app_id}.metainfo.xml.in ${CMAKE_BINARY_DIR}/${app_id}.metainfo.xml @ONLY)

install(TARGETS movieconv_gui RUNTIME DESTINATION ${home_dir} COMPONENT gui)
install(FILES ${window_data}/${app_id}.desktop DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/applications COMPONENT gui)
install(FILES ${CMAKE_BINARY_DIR}/${app_id}.metainfo.xml DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/metainfo COMPONENT gui)
install(FILES ${window_data}/${app_id}.svg
  DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/icons/hicolor/scalable/apps COMPONENT gui)
install(FILES ${window_data}/movieconv-gui.1 DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT gui)
install(FILES LICENSE DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/doc/movieconv-gui RENAME copyright COMPONENT gui)
file(RELATIVE_PATH window_path ${CMAKE_INSTALL_PREFIX}/${CMAKE_INSTALL_BINDIR}
  ${CMAKE_INSTALL_PREFIX}/${home_dir}/movieconv-gui)
file(CREATE_LINK ${window_path} ${CMAKE_BINARY_DIR}/install-links/movieconv-gui SYMBOLIC)
install(FILES ${CMAKE_BINARY_DIR}/install-links/movieconv-gui DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT gui)

set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_COMPONENTS_ALL Unspecified gui)
set(CPACK_DEBIAN_UNSPECIFIED_PACKAGE_NAME movieconv)
set(CPACK_COMPONENT_UNSPECIFIED_DESCRIPTION ${CPACK_PACKAGE_DESCRIPTION})
set(CPACK_DEBIAN_GUI_PACKAGE_NAME movieconv-gui)
set(CPACK_DEBIAN_GUI_PACKAGE_DEPENDS "movieconv (= ${PROJECT_VERSION})")
set(CPACK_DEBIAN_GUI_PACKAGE_RECOMMENDS "libqt6svg6, qt6-translations-l10n")
set(CPACK_COMPONENT_GUI_DESCRIPTION "movie converter with a window
 Drop movies into the window, choose what they shall become, and press Convert. The picture that is being converted
 is shown live, and the queue survives the end of the program.")
