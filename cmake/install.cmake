# What `cmake --install` puts where: the header, both libraries, and what pkg-config and
# find_package(zarvo) read. Everything finds its prefix by its own place, so it may be moved.
include(CMakePackageConfigHelpers)

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/zarvo)
set(pkgconfig_dir ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

install(FILES include/zarvo.h DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(TARGETS zarvo zarvo_static EXPORT zarvoTargets
  RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})
install(EXPORT zarvoTargets NAMESPACE zarvo:: DESTINATION ${package_dir})

configure_file(cmake/zarvoConfig.cmake.in zarvoConfig.cmake @ONLY)
write_basic_package_version_file(zarvoConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES
  ${PROJECT_BINARY_DIR}/zarvoConfig.cmake
  ${PROJECT_BINARY_DIR}/zarvoConfigVersion.cmake
  DESTINATION ${package_dir})
install(FILES cmake/zarvo_add_plugin.cmake DESTINATION ${package_dir} OPTIONAL)

file(RELATIVE_PATH prefix_from_pc /prefix/${pkgconfig_dir} /prefix)
get_target_property(private_libraries zarvo_static INTERFACE_LINK_LIBRARIES)
list(TRANSFORM private_libraries PREPEND -l)
list(JOIN private_libraries " " private_libraries)
string(REGEX REPLACE "/$" "" prefix_from_pc "${prefix_from_pc}")
configure_file(cmake/zarvo.pc.in zarvo.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/zarvo.pc DESTINATION ${pkgconfig_dir})

if(TARGET zv)
  install(TARGETS zv RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})
endif()
