// The promise that a fuzz target tests: broken, it ends the run with the place and the condition.
#ifndef ZARVO_FUZZ_CHECK_H
#define ZARVO_FUZZ_CHECK_H

#include <cstdio>
#include <cstdlib>

#define CHECK(condition)                                                           \
  do {                                                                             \
    if (!(condition)) {                                                            \
      std::fprintf(stderr, "%s:%d: broken: %s\n", __FILE__, __LINE__, #condition); \
      std::abort();                                                                \
    }                                                                              \
  } while (false)

#endif
