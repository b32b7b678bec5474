// What a client holds while it runs, released in one order on every way out.
#ifndef ZARVO_TRANSFER_CONNECTION_H
#define ZARVO_TRANSFER_CONNECTION_H

#include <span>

#include "frame/owner.h"
#include "platform/platform.h"
#include "transfer/result.h"

namespace zv {

// Keeps the network layer started for a scope; starts are counted, so guards may nest.
class NetworkGuard {
 public:
  NetworkGuard() : started_(platform::network_start()) {}
  ~NetworkGuard() {
    if (started_) platform::network_stop();
  }
  NetworkGuard(const NetworkGuard&) = delete;
  NetworkGuard& operator=(const NetworkGuard&) = delete;

  bool started() const { return started_; }

 private:
  bool started_;
};

// A stream socket, or none.
class SocketOwner {
 public:
  SocketOwner() = default;
  ~SocketOwner() { close(); }
  SocketOwner(const SocketOwner&) = delete;
  SocketOwner& operator=(const SocketOwner&) = delete;

  bool open();
  void close();  // no effect when it is closed already
  platform::Socket get() const { return socket_; }

 private:
  platform::Socket socket_ = platform::no_socket;
};

// Room for one block of data, or for one reply and the NUL behind it.
class TransferBuffer {
 public:
  bool allocate(size_t block_size);
  std::span<char> block() const { return {bytes_.get(), block_size_}; }
  std::span<char> room() const { return {bytes_.get(), block_size_ + 1}; }

 private:
  HeapPtr<char[]> bytes_;
  size_t block_size_ = 0;
};

// One client's run. The members are released from the last to the first: the local file, the
// buffer, the data socket, the control socket, the network layer.
struct Connection {
  explicit Connection(Direction way) : direction(way) {}

  // Makes the control socket and the buffer, which follows the socket's own buffer for that
  // direction, and connects. Gives `copied`, or the code of the side that failed.
  int open(const platform::Address& address, unsigned port);

  int network_failed() const { return zv::network_failed(direction); }
  int local_failed() const { return zv::local_failed(direction); }

  const Direction direction;
  NetworkGuard network;  // a client gives network_failed() at once unless it started
  SocketOwner control;
  SocketOwner data;
  TransferBuffer buffer;
  StreamPtr file;
};

// The source of an upload: its size, and the file opened for reading. A directory is refused.
bool open_source(const char* path, StreamPtr& file, int64_t& size);

// The destination of a download, made or emptied.
bool open_destination(const char* path, StreamPtr& file);

}  // namespace zv

#endif
