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

// Whole blocks are read and written: a stream's own buffer would cut each of them in two.
bool take_unbuffered(FILE* opened, StreamPtr& file) {
  file.reset(opened);
  return opened != nullptr && std::setvbuf(opened, nullptr, _IONBF, 0) == 0;
}

bool is_directory(const struct _stat64& st) {
  return (st.st_mode & 0xF000) == 0x4000;
}

}  // namespace

bool SocketOwner::open() {
  close();
  socket_ = platform::socket_open();
  return socket_ != platform::no_socket;
}

void SocketOwner::close() {
  if (socket_ != platform::no_socket) platform::socket_close(socket_);
  socket_ = platform::no_socket;
}

bool TransferBuffer::allocate(size_t block_size) {
  bytes_.reset(static_cast<char*>(std::malloc(block_size + 1)));
  block_size_ = block_size;
  return bytes_ != nullptr;
}

int Connection::open(const platform::Address& address, unsigned port) {
  if (!control.open()) return network_failed();
  const int told = direction == Direction::download ? platform::receive_buffer_size(control.get())
                                                    : platform::send_buffer_size(control.get());
  if (!buffer.allocate(block_size(told))) return local_failed();
  return platform::socket_connect(control.get(), address, port) ? copied : network_failed();
}

bool open_source(const char* path, StreamPtr& file, int64_t& size) {
  struct _stat64 st;
  if (platform::status(path, &st) != 0 || is_directory(st)) return false;
  size = st.st_size;
  return take_unbuffered(platform::open_to_read(path), file);
}

bool open_destination(const char* path, StreamPtr& file) {
  return take_unbuffered(platform::open_to_write(path), file);
}

}  // namespace zv
