# The shared library: what it exports, and what it is linked with.
include(${PROJECT_SOURCE_DIR}/cmake/exports.cmake)
zarvo_write_exports(${PROJECT_SOURCE_DIR}/include/zarvo.h
                    ${CMAKE_CURRENT_BINARY_DIR}/zarvo.map ${CMAKE_CURRENT_BINARY_DIR}/zarvo.def)

add_library(zarvo SHARED $<TARGET_OBJECTS:zarvo_objects>)
set_target_properties(zarvo PROPERTIES
  VERSION ${PROJECT_VERSION}
  SOVERSION ${PROJECT_VERSION_MAJOR}
  LINKER_LANGUAGE C)
target_link_libraries(zarvo PRIVATE zarvo_hardening)

if(WIN32)
  target_compile_definitions(zarvo INTERFACE ZARVO_DLL)
  set_target_properties(zarvo PROPERTIES PREFIX "" IMPORT_PREFIX "lib" DLL_NAME_WITH_SOVERSION OFF)
  enable_language(RC)
  configure_file(version.rc.in version.rc @ONLY)
  target_sources(zarvo PRIVATE platform/windows/start.cpp
                               ${CMAKE_CURRENT_BINARY_DIR}/zarvo.def
                               ${CMAKE_CURRENT_BINARY_DIR}/version.rc)
  target_link_libraries(zarvo PRIVATE ws2_32 advapi32 crypt32 secur32 pthread)
  # libzarvo.dll.a comes from the linker; other compilers' import library, zarvo.lib, from LLVM.
  find_program(ZARVO_DLLTOOL NAMES llvm-dlltool llvm-dlltool-14 NO_CMAKE_FIND_ROOT_PATH)
  if(ZARVO_DLLTOOL)
    set(zarvo_import_library ${PROJECT_BINARY_DIR}/src/zarvo.lib)
    add_custom_command(TARGET zarvo POST_BUILD BYPRODUCTS ${zarvo_import_library}
      COMMAND ${ZARVO_DLLTOOL} -m i386:x86-64 -d zarvo.def -l ${zarvo_import_library})
    install(FILES ${zarvo_import_library} DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT development)
  endif()
else()
  # libzarvo_tls is looked for beside it too, wherever it is installed.
  set_target_properties(zarvo PROPERTIES BUILD_RPATH $ORIGIN INSTALL_RPATH $ORIGIN
    LINK_DEPENDS ${CMAKE_CURRENT_BINARY_DIR}/zarvo.map)
  target_link_libraries(zarvo PRIVATE ${CMAKE_DL_LIBS})
  target_link_options(zarvo PRIVATE
    -Wl,--version-script,${CMAKE_CURRENT_BINARY_DIR}/zarvo.map
    -Wl,-Bsymbolic-functions)  # the library's own calls are bound when it is linked, not when it loads
  if(NOT ZARVO_SANITIZE)
    target_link_options(zarvo PRIVATE -Wl,-z,defs)
  endif()
endif()
