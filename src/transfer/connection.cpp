// A client's buffer and its control connection.
#include "transfer/connection.h"

#include <algorithm>

namespace zv {

namespace {

// The platform's answer, where there is one and it is no small one: blocks of 64 KiB made large
// files take a quarter longer.
size_t block_size(int told) {
  constexpr int least = 512 * 1024;
  return static_cast<size_t>(std::max(told, least));
}

}  // namespace

bool TransferBuffer::allocate(size_t block_size) {
  bytes_.reset(static_cast<char*>(std::malloc(block_size + 1)));
  block_size_ = block_size;
  return bytes_ != nullptr;
}

int Connection::open(const Location& location) {
  if (!control.open()) return network_failed();
  const int told = direction == Direction::download ? platform::receive_buffer_size(control.get())
                                                    : platform::send_buffer_size(control.get());
  if (!buffer.allocate(block_size(told))) return local_failed();
  const bool connected = platform::socket_connect(control.get(), location.addr, location.port);
  return connected ? copied : network_failed();
}

}  // namespace zv
