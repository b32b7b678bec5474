# What `cmake --install` puts where: the header, both libraries, and what pkg-config and
# find_package(zarvo) read. Everything finds its prefix by its own place, so it may be moved.
# A component is what one package holds: library, development or tool.
include(CMakePackageConfigHelpers)

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/zarvo)
set(pkgconfig_dir ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

install(TARGETS ${zarvo_libraries} EXPORT zarvoTargets
  RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT library
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT library NAMELINK_COMPONENT development
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT development)
install(EXPORT zarvoTargets NAMESPACE zarvo:: DESTINATION ${package_dir} COMPONENT development)

configure_file(cmake/zarvoConfig.cmake.in zarvoConfig.cmake @ONLY)
write_basic_package_version_file(zarvoConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES
  ${PROJECT_BINARY_DIR}/zarvoConfig.cmake
  ${PROJECT_BINARY_DIR}/zarvoConfigVersion.cmake
  DESTINATION ${package_dir} COMPONENT development)
install(FILES cmake/zarvo_add_plugin.cmake DESTINATION ${package_dir} COMPONENT development)

# What the static library needs is private to the shared one, and of concern to all where there is
# no shared one.
file(RELATIVE_PATH pc_prefix /prefix/${pkgconfig_dir} /prefix)
string(REGEX REPLACE "/$" "" pc_prefix "\${pcfiledir}/${pc_prefix}")
if(ZARVO_PACKAGES AND NOT WIN32)
  set(pc_prefix /usr)  # by that name pkg-config knows what every compiler searches anyway
endif()
get_target_property(private_libraries zarvo_static INTERFACE_LINK_LIBRARIES)
list(TRANSFORM private_libraries PREPEND -l REGEX "^[^-]")
list(JOIN private_libraries " " private_libraries)
if(NOT TARGET zarvo)
  set(public_libraries " ${private_libraries}")
endif()
configure_file(cmake/zarvo.pc.in zarvo.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/zarvo.pc DESTINATION ${pkgconfig_dir} COMPONENT development)
install(FILES include/zarvo.h include/zarvo.hpp DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT development)

if(TARGET zv)
  install(TARGETS zv RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT tool)
  if(NOT WIN32)
    install(FILES tools/zv/completion.bash RENAME zv
      DESTINATION ${CMAKE_INSTALL_DATADIR}/bash-completion/completions COMPONENT tool)
  endif()
endif()
