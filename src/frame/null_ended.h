// Arrays of pointers that a NULL ends, which callers get: string lists and arrays of plugins.
#ifndef ZARVO_FRAME_NULL_ENDED_H
#define ZARVO_FRAME_NULL_ENDED_H

#include <bit>
#include <cstddef>
#include <cstdlib>

namespace zv {

// Gives an array, nullptr for none yet, room for so many pointers and the NULL. False when memory
// ran out, and then the array is as it was.
template <class T>
[[nodiscard]] bool resize_array(T**& array, size_t count) {
  void* const block = std::realloc(array, (count + 1) * sizeof *array);
  if (block == nullptr) return false;
  array = static_cast<T**>(block);
  return true;
}

// The same for an array that may grow further. What it asks for depends on the count alone, whoever
// made the array, and is the same until the count has doubled: growing one by one takes linear
// time.
template <class T>
[[nodiscard]] bool grow_array(T**& array, size_t count) {
  return resize_array(array, std::bit_ceil(count + 1) - 1);
}

}  // namespace zv

#endif
