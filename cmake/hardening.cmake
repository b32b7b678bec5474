# What makes a slip harder to exploit, in everything that is installed: guarded stacks, checked calls
# of the C library, marked jump targets, and addresses that are spread, fixed early and never both
# writable and executable. A sanitizer brings checks of its own.
include(CheckCXXCompilerFlag)
include(CheckCXXSourceCompiles)

add_library(zarvo_hardening INTERFACE)
if(ZARVO_SANITIZE)
  return()
endif()

check_cxx_compiler_flag(-fcf-protection ZARVO_MARKS_JUMP_TARGETS)  # not every processor has it
# Level 3 also checks sizes that only a run tells; C libraries say when their compiler cannot.
set(CMAKE_REQUIRED_FLAGS "-O2 -Werror -U_FORTIFY_SOURCE -D_FORTIFY_SOURCE=3")
check_cxx_source_compiles("#include <stdio.h>\nint main() { return 0; }" ZARVO_FORTIFIES_AT_RUN_TIME)
unset(CMAKE_REQUIRED_FLAGS)
if(ZARVO_FORTIFIES_AT_RUN_TIME)
  set(fortify_level 3)
else()
  set(fortify_level 2)
endif()

set(optimised $<NOT:$<CONFIG:Debug>>)
set(hardening -fstack-protector-strong
  $<${optimised}:-U_FORTIFY_SOURCE> $<${optimised}:-D_FORTIFY_SOURCE=${fortify_level}>)
if(ZARVO_MARKS_JUMP_TARGETS)
  list(APPEND hardening -fcf-protection)
endif()
target_compile_options(zarvo_hardening INTERFACE "$<$<COMPILE_LANGUAGE:C,CXX>:${hardening}>")
if(WIN32)
  target_link_libraries(zarvo_hardening INTERFACE ssp)
  target_link_options(zarvo_hardening INTERFACE -Wl,--high-entropy-va,--dynamicbase,--nxcompat)
else()
  target_link_options(zarvo_hardening INTERFACE -Wl,-z,relro,-z,now,-z,noexecstack)
endif()
