// The handle that stands for no library.
#ifndef ZARVO_PLUGIN_NO_LIBRARY_H
#define ZARVO_PLUGIN_NO_LIBRARY_H

#include <cstdint>

namespace zv {

inline void* no_library() {
  return reinterpret_cast<void*>(intptr_t{-1});
}

}  // namespace zv

#endif
