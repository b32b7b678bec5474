# What CPack makes: four Debian packages on Linux, one zip for Windows. `scripts/package` calls it.
set(CPACK_PACKAGE_NAME zarvo)
set(CPACK_PACKAGE_VENDOR "the zarvo authors")
set(CPACK_PACKAGE_CONTACT "the zarvo authors <authors@zarvo.test>")
set(CPACK_PACKAGE_DIRECTORY ${PROJECT_BINARY_DIR}/packages)
set(CPACK_STRIP_FILES ON)
set(CPACK_VERBATIM_VARIABLES ON)

if(WIN32)
  if(NOT ZARVO_DLLTOOL)
    message(FATAL_ERROR "zarvo.lib is made by llvm-dlltool, which is not here")
  endif()
  set(CPACK_GENERATOR ZIP)
  set(CPACK_PACKAGE_FILE_NAME zarvo-${PROJECT_VERSION}-win64)
  install(FILES README.md CHANGELOG.md LICENSE DESTINATION . COMPONENT documents)
  # The sample host with its plugins; make_samples is there where stb is.
  set(host gallery)
  if(TARGET make_samples)
    list(APPEND host make_samples)
  endif()
  install(TARGETS ${host} RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT tool)
  install(DIRECTORY ${PROJECT_BINARY_DIR}/examples/gallery_plugins/ DESTINATION plugins
    COMPONENT tool)
  set(examples .)
  set(examples_component documents)
  # The zip has a folder for each C runtime, made from a build of its own, each with everything.
  set(CPACK_INSTALL_CMAKE_PROJECTS ${PROJECT_BINARY_DIR} zarvo documents /)
  foreach(component library development tool)
    list(APPEND CPACK_INSTALL_CMAKE_PROJECTS ${PROJECT_BINARY_DIR} zarvo ${component} /msvcrt
                                             ${PROJECT_BINARY_DIR}-ucrt zarvo ${component} /ucrt)
  endforeach()
else()
  include(cmake/debian.cmake)
  set(examples ${CMAKE_INSTALL_DATADIR}/doc/${CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME})
  set(examples_component development)
endif()
install(DIRECTORY examples DESTINATION ${examples} COMPONENT ${examples_component}
  PATTERN .clang-tidy EXCLUDE)
include(CPack)
