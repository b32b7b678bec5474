# What encrypts on Linux: a library of its own over OpenSSL, so that the other needs libc alone.
find_package(OpenSSL 3.0 QUIET)
if(NOT OpenSSL_FOUND)
  if(ZARVO_TLS STREQUAL "ON")
    message(FATAL_ERROR "ZARVO_TLS is ON, and OpenSSL 3 with its headers is not here")
  endif()
  message(STATUS "OpenSSL 3 is not here: no libzarvo_tls")
  return()
endif()

file(CONFIGURE OUTPUT zarvo_tls.map CONTENT
     "ZARVO_TLS_1 {\n  global:\n    zarvo_encryption;\n  local:\n    *;\n};\n")
add_library(zarvo_tls SHARED
  platform/encryption_reason.cpp
  platform/openssl/encryption.cpp
  platform/openssl/reason.cpp
  platform/openssl/transport.cpp
)
set_target_properties(zarvo_tls PROPERTIES
  VERSION ${PROJECT_VERSION}
  SOVERSION ${PROJECT_VERSION_MAJOR}
  LINKER_LANGUAGE C
  CXX_VISIBILITY_PRESET hidden
  VISIBILITY_INLINES_HIDDEN ON)
target_include_directories(zarvo_tls PRIVATE ${CMAKE_CURRENT_SOURCE_DIR}
                                             ${PROJECT_SOURCE_DIR}/include)
target_compile_options(zarvo_tls PRIVATE ${zarvo_without_runtime})
target_link_libraries(zarvo_tls PRIVATE zarvo_warnings zarvo_hardening OpenSSL::SSL)
target_link_options(zarvo_tls PRIVATE -Wl,--version-script,${CMAKE_CURRENT_BINARY_DIR}/zarvo_tls.map)
if(NOT ZARVO_SANITIZE)
  target_link_options(zarvo_tls PRIVATE -Wl,-z,defs)
endif()
# Nobody links it but by its file's name.
install(TARGETS zarvo_tls LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT encryption
                                  NAMELINK_SKIP)
