# The same cross build on Windows' universal C runtime, which MSVC, clang and newer mingw use. It is
# for C, and for C++ without wide characters, locales and std::filesystem: the C++ library of Debian's
# mingw was made for the older runtime, whose mbstate_t is another type.
include(${CMAKE_CURRENT_LIST_DIR}/mingw-w64.cmake)
list(APPEND CMAKE_C_COMPILER -specs=${CMAKE_CURRENT_LIST_DIR}/ucrt.specs)
list(APPEND CMAKE_CXX_COMPILER -specs=${CMAKE_CURRENT_LIST_DIR}/ucrt.specs)
