# The warnings that every target of this tree is built with.
add_library(zarvo_warnings INTERFACE)
target_compile_options(zarvo_warnings INTERFACE
  -Wall -Wextra -Wpedantic -Wconversion -Wshadow
  $<$<BOOL:${ZARVO_WARNINGS_AS_ERRORS}>:-Werror>)
