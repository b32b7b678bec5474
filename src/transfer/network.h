// Owners of what the platform's network layer hands out.
#ifndef ZARVO_TRANSFER_NETWORK_H
#define ZARVO_TRANSFER_NETWORK_H

#include "platform/platform.h"

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

  bool open() {
    close();
    socket_ = platform::socket_open();
    return socket_ != platform::no_socket;
  }

  // No effect when it is closed already.
  void close() {
    if (socket_ != platform::no_socket) platform::socket_close(socket_);
    socket_ = platform::no_socket;
  }

  platform::Socket get() const { return socket_; }

 private:
  platform::Socket socket_ = platform::no_socket;
};

}  // namespace zv

#endif
