# zarvo_add_plugin(<name> <api> SOURCES <file>...)
#
# Builds a plugin of an API: the target BASE_<name>, whose file BASE_<name>.dll (BASE_<name>d.dll in
# the Debug configuration) exports nothing but what is marked ZV_PLUGIN_EXPORT. BASE is the API's
# name up to its first dot, so that plugins of `img` and of `img.reader` are all called img_*.dll.
# The target is a MODULE library and links zarvo::zarvo; set its properties as any target's, such as
# LIBRARY_OUTPUT_DIRECTORY for the folder that it is written to.
function(zarvo_add_plugin name api)
  cmake_parse_arguments(PARSE_ARGV 2 plugin "" "" "SOURCES")
  if(NOT plugin_SOURCES OR plugin_UNPARSED_ARGUMENTS)
    message(FATAL_ERROR "zarvo_add_plugin(<name> <api> SOURCES <file>...)")
  endif()
  string(REGEX REPLACE "[.].*" "" base "${api}")
  set(target ${base}_${name})
  add_library(${target} MODULE ${plugin_SOURCES})
  set_target_properties(${target} PROPERTIES
    PREFIX ""
    SUFFIX .dll
    DEBUG_POSTFIX d
    C_VISIBILITY_PRESET hidden
    CXX_VISIBILITY_PRESET hidden
    VISIBILITY_INLINES_HIDDEN ON)
  target_link_libraries(${target} PRIVATE zarvo::zarvo)
endfunction()
