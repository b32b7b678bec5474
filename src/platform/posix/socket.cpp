// Stream sockets over IPv4.
#include <netdb.h>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "platform/socket_address.h"

namespace zv::platform {

namespace {

// Calls again for as long as a signal interrupts it.
template <class Call>
auto uninterrupted(Call call) {
  auto result = call();
  while (result == -1 && errno == EINTR) result = call();
  return result;
}

// A connect that a signal interrupts goes on by itself and must not be called again.
bool finish_connect(int socket) {
  pollfd wait = {socket, POLLOUT, 0};
  if (uninterrupted([&] { return poll(&wait, 1, -1); }) != 1) return false;
  int error = 0;
  socklen_t size = sizeof error;
  return getsockopt(socket, SOL_SOCKET, SO_ERROR, &error, &size) == 0 && error == 0;
}

int buffer_size(Socket socket, int option) {
  int size = 0;
  socklen_t length = sizeof size;
  const bool told = getsockopt(static_cast<int>(socket), SOL_SOCKET, option, &size, &length) == 0;
  return told ? size : 0;
}

}  // namespace

bool network_start() {
  return true;
}

void network_stop() {}

Socket socket_open() {
  const int opened = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, IPPROTO_TCP);
  if (opened < 0) return no_socket;
  // Without it a short line after a long one waits for the peer's delayed acknowledgement.
  const int on = 1;
  setsockopt(opened, IPPROTO_TCP, TCP_NODELAY, &on, sizeof on);
  return opened;
}

void socket_close(Socket socket) {
  close(static_cast<int>(socket));
}

bool socket_connect(Socket socket, const Address& address, unsigned port) {
  sockaddr_in peer = {};
  peer.sin_family = AF_INET;
  peer.sin_port = htons(static_cast<uint16_t>(port));
  std::memcpy(&peer.sin_addr, address.bytes, sizeof address.bytes);
  const int handle = static_cast<int>(socket);
  if (connect(handle, reinterpret_cast<const sockaddr*>(&peer), sizeof peer) == 0) return true;
  return errno == EINTR && finish_connect(handle);
}

int64_t socket_send(Socket socket, const char* data, size_t size) {
  return uninterrupted([&] { return send(static_cast<int>(socket), data, size, MSG_NOSIGNAL); });
}

int64_t socket_receive(Socket socket, char* room, size_t size) {
  return uninterrupted([&] { return recv(static_cast<int>(socket), room, size, 0); });
}

int receive_buffer_size(Socket socket) {
  return buffer_size(socket, SO_RCVBUF);
}

int send_buffer_size(Socket socket) {
  return buffer_size(socket, SO_SNDBUF);
}

bool resolve_name(const char* host, Address& out) {
  const AddressList list = look_up(host, AF_INET, 0);
  if (list == nullptr) return false;
  sockaddr_in first = {};
  std::memcpy(&first, list->ai_addr, sizeof first);
  std::memcpy(out.bytes, &first.sin_addr, sizeof out.bytes);
  return true;
}

bool official_host_name(TextBuffer<256>& out) {
  TextBuffer<256> name;
  if (!name.fill([](char* room, size_t size) { return gethostname(room, size) == 0; }))
    return false;
  const AddressList list = look_up(name.c_str(), AF_INET, AI_CANONNAME);
  return list != nullptr && list->ai_canonname != nullptr && out.assign(list->ai_canonname);
}

}  // namespace zv::platform
