// Owners: each releases its resource when it goes out of scope.
#ifndef ZARVO_FRAME_OWNER_H
#define ZARVO_FRAME_OWNER_H

#include <cstdio>
#include <cstdlib>
#include <memory>

namespace zv {

struct FreeBlock {
  void operator()(void* block) const { std::free(block); }
};

// A block of the C heap: HeapPtr<char> a text, HeapPtr<char[]> a buffer.
template <class T>
using HeapPtr = std::unique_ptr<T, FreeBlock>;

struct CloseStream {
  void operator()(FILE* stream) const { std::fclose(stream); }
};

using StreamPtr = std::unique_ptr<FILE, CloseStream>;

// Closes a stream that was written to: only a close that succeeds makes the writes count.
inline bool close_stream(StreamPtr& stream) {
  return std::fclose(stream.release()) == 0;
}

}  // namespace zv

#endif
