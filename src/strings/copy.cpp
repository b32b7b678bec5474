// Copies: the bounded one, by whose rule every sized output is written, and the one on the heap.
#include <cstdlib>
#include <cstring>

#include "frame/text_view.h"
#include "zarvo.h"

size_t zv_strncpy(char* dst, const char* src, size_t size) {
  return zv::put(zv::bounded(src, size), dst, size);
}

char* zv_strredup(char* old, const char* s) {
  std::free(old);
  return s != nullptr ? static_cast<char*>(zv_dalloc(s, std::strlen(s) + 1)) : nullptr;
}
