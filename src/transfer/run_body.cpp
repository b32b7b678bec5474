// Receives the body of a download.
#include "transfer/run_body.h"

#include "transfer/result.h"

namespace zv {

bool RunBody::begin(int64_t size) {
  constexpr size_t block_size = size_t{512} * 1024;
  size_ = size;
  run_.begin_body(size);
  if (buffer_.allocate(block_size)) return true;
  run_.fail(destination_failed, ZV_CAUSE_MEMORY, 0, {"out of memory"});
  return false;
}

// What comes next, at most so many bytes: their number, 0 at the end, -1 when the run has failed.
int64_t RunBody::take(Wire& wire, int64_t most) {
  std::span<char> room = buffer_.block();
  if (most < static_cast<int64_t>(room.size())) room = room.first(static_cast<size_t>(most));
  const int64_t got = wire.receive(room);
  if (got <= 0) return got;
  done_ += got;
  if (!run_.allows(done_)) return -1;
  if (landing_.write({room.data(), static_cast<size_t>(got)}) != copied) return -1;
  run_.advance(got);
  return got;
}

bool RunBody::receive(Wire& wire, int64_t count) {
  while (count > 0) {
    const int64_t got = take(wire, count);
    if (got == 0) wire.fail(ZV_CAUSE_CLOSED, 0, {"the connection was closed too early"});
    if (got <= 0) return false;
    count -= got;
  }
  return true;
}

bool RunBody::receive_until_end(Wire& wire) {
  int64_t got = 1;
  while (got > 0) {
    got = take(wire, INT64_MAX);
    if (size_ >= 0 && done_ > size_)
      return wire.fail(ZV_CAUSE_PROTOCOL, 0, {"more bytes than were told"});
  }
  // Whether the peer meant its end counts only where nothing else told it.
  if (got == 0 && size_ < 0 && wire.is_cut())
    return wire.fail(ZV_CAUSE_CLOSED, 0, {"the connection was closed without an announced end"});
  if (got == 0 && done_ < size_)
    return wire.fail(ZV_CAUSE_CLOSED, 0, {"the connection was closed too early"});
  return got == 0;
}

}  // namespace zv
