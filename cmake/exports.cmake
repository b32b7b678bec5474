# The names that the library exports are those that the public header declares with ZV_API:
# writes them as a version script for ELF and as a module definition for Windows, and lists them in
# zarvo_exports.
function(zarvo_write_exports header version_script definition)
  set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${header})
  file(READ ${header} text)
  string(REGEX MATCHALL "\nZV_API [^;(]*\\(" declarations "${text}")
  set(names "")
  foreach(declaration IN LISTS declarations)
    string(REGEX REPLACE "^.*[ *]([A-Za-z0-9_]+)\\($" "\\1" name "${declaration}")
    list(APPEND names ${name})
  endforeach()
  list(SORT names)
  list(LENGTH names count)
  if(count EQUAL 0)
    message(FATAL_ERROR "${header} declares nothing with ZV_API")
  endif()
  set(zarvo_exports ${names} PARENT_SCOPE)
  list(JOIN names ";\n    " elf_names)
  list(JOIN names "\n  " windows_names)
  file(CONFIGURE OUTPUT ${version_script} CONTENT
       "ZARVO_1.0 {\n  global:\n    ${elf_names};\n  local:\n    *;\n};\n")
  file(CONFIGURE OUTPUT ${definition} CONTENT "LIBRARY zarvo.dll\nEXPORTS\n  ${windows_names}\n")
endfunction()
