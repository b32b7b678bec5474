# The Debian packages: libzarvo1, what applications run with; libzarvo-tls1, what it loads for
# encrypted transfers; libzarvo-dev, what applications are built with; zv, the tool. The version
# sorts before the release that follows the beta.
if(NOT TARGET zarvo_tls)
  message(FATAL_ERROR "libzarvo-tls1 needs OpenSSL 3 with its headers, which is not here")
endif()
set(CPACK_GENERATOR DEB)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_COMPONENTS_ALL library encryption development tool)
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_VERSION ${PROJECT_VERSION}~beta)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR}/src)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS_POLICY ">=")
set(version ${CPACK_DEBIAN_PACKAGE_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE})

# The first line is the summary; one that is the same for all packages would come before it.
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "")
set(purpose "Strings, path algebra, files and trees, plugins, and copies between local files
and FTP, HTTP and mail: one C interface, which behaves alike on Windows and on
Linux.")

set(CPACK_DEBIAN_LIBRARY_PACKAGE_NAME libzarvo${PROJECT_VERSION_MAJOR})
set(CPACK_DEBIAN_LIBRARY_PACKAGE_SECTION libs)
set(CPACK_DEBIAN_LIBRARY_DESCRIPTION "portable utility functions - shared library\n${purpose}")
set(CPACK_DEBIAN_LIBRARY_PACKAGE_CONTROL_EXTRA ${PROJECT_BINARY_DIR}/debian/symbols
                                               ${PROJECT_BINARY_DIR}/debian/triggers)

set(CPACK_DEBIAN_ENCRYPTION_PACKAGE_NAME libzarvo-tls${PROJECT_VERSION_MAJOR})
set(CPACK_DEBIAN_ENCRYPTION_PACKAGE_SECTION libs)
set(CPACK_DEBIAN_ENCRYPTION_PACKAGE_RECOMMENDS ca-certificates)
set(CPACK_DEBIAN_ENCRYPTION_DESCRIPTION "portable utility functions - encrypted transfers\n${purpose}
.
What its transfers over https, ftps and smtps need. The library loads it when a
transfer first does.")
set(CPACK_DEBIAN_ENCRYPTION_PACKAGE_CONTROL_EXTRA ${PROJECT_BINARY_DIR}/debian/triggers)

set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME libzarvo-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS
    "${CPACK_DEBIAN_LIBRARY_PACKAGE_NAME} (= ${version})")
set(CPACK_DEBIAN_DEVELOPMENT_DESCRIPTION "portable utility functions - development files\n${purpose}
.
The header, the static library, manual pages, and what pkg-config and CMake
need to find them.")

set(CPACK_DEBIAN_TOOL_PACKAGE_NAME zv)
set(CPACK_DEBIAN_TOOL_PACKAGE_SECTION utils)
set(CPACK_DEBIAN_TOOL_PACKAGE_DEPENDS
    "${CPACK_DEBIAN_LIBRARY_PACKAGE_NAME} (>= ${CPACK_DEBIAN_PACKAGE_VERSION})")
set(CPACK_DEBIAN_TOOL_PACKAGE_RECOMMENDS ${CPACK_DEBIAN_ENCRYPTION_PACKAGE_NAME})
set(CPACK_DEBIAN_TOOL_DESCRIPTION "files, paths and plugins at a shell's prompt\n${purpose}
.
This is its command-line tool.")

# What dpkg-shlibdeps reads to find out which version of the library an application needs.
set(symbols "libzarvo.so.1 libzarvo1 #MINVER#\n")
foreach(name ZARVO_1.0 ${zarvo_exports})
  string(APPEND symbols " ${name}@ZARVO_1.0 ${CPACK_DEBIAN_PACKAGE_VERSION}\n")
endforeach()
file(CONFIGURE OUTPUT debian/symbols CONTENT "${symbols}" @ONLY)
file(CONFIGURE OUTPUT debian/triggers CONTENT "activate-noawait ldconfig\n")

# Every package carries its licence and its changes. gzip -n leaves the time out.
file(CONFIGURE OUTPUT debian/changelog.Debian CONTENT
"zarvo (${version}) unstable; urgency=medium

  * As CHANGELOG.md tells.

 -- ${CPACK_PACKAGE_CONTACT}  Thu, 01 Jan 2026 00:00:00 +0000
")
configure_file(CHANGELOG.md debian/changelog COPYONLY)
foreach(name changelog changelog.Debian)
  execute_process(COMMAND gzip -9nf debian/${name}
    WORKING_DIRECTORY ${PROJECT_BINARY_DIR} COMMAND_ERROR_IS_FATAL ANY)
endforeach()
foreach(component LIBRARY ENCRYPTION DEVELOPMENT TOOL)
  set(folder ${CMAKE_INSTALL_DATADIR}/doc/${CPACK_DEBIAN_${component}_PACKAGE_NAME})
  string(TOLOWER ${component} component)
  install(FILES LICENSE DESTINATION ${folder} RENAME copyright COMPONENT ${component})
  install(FILES ${PROJECT_BINARY_DIR}/debian/changelog.gz
                ${PROJECT_BINARY_DIR}/debian/changelog.Debian.gz
          DESTINATION ${folder} COMPONENT ${component})
endforeach()
