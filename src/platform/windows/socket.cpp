// Stream sockets over IPv4: Winsock 2.
#include <winsock2.h>

#include <algorithm>
#include <climits>
#include <cstring>

#include "platform/platform.h"

namespace zv::platform {

namespace {

static_assert(static_cast<Socket>(INVALID_SOCKET) == no_socket);

SOCKET handle(Socket socket) {
  return static_cast<SOCKET>(socket);
}

int chunk(size_t size) {
  return static_cast<int>(std::min<size_t>(size, INT_MAX));
}

int buffer_size(Socket socket, int option) {
  int size = 0;
  int length = sizeof size;
  const int told =
      getsockopt(handle(socket), SOL_SOCKET, option, reinterpret_cast<char*>(&size), &length);
  return told == 0 ? size : 0;
}

// The result belongs to the calling thread, so threads do not meet in it.
const hostent* look_up(const char* host) {
  const hostent* const found = gethostbyname(host);
  return found != nullptr && found->h_addrtype == AF_INET ? found : nullptr;
}

}  // namespace

bool network_start() {
  WSADATA details;
  return WSAStartup(MAKEWORD(2, 2), &details) == 0;
}

void network_stop() {
  WSACleanup();
}

Socket socket_open() {
  const SOCKET opened = socket(AF_INET, SOCK_STREAM, IPPROTO_TCP);
  if (opened == INVALID_SOCKET) return no_socket;
  SetHandleInformation(reinterpret_cast<HANDLE>(opened), HANDLE_FLAG_INHERIT, 0);
  // Without it a short line after a long one waits for the peer's delayed acknowledgement.
  const int on = 1;
  setsockopt(opened, IPPROTO_TCP, TCP_NODELAY, reinterpret_cast<const char*>(&on), sizeof on);
  return static_cast<Socket>(opened);
}

void socket_close(Socket socket) {
  closesocket(handle(socket));
}

bool socket_connect(Socket socket, const Address& address, unsigned port) {
  sockaddr_in peer = {};
  peer.sin_family = AF_INET;
  peer.sin_port = htons(static_cast<u_short>(port));
  std::memcpy(&peer.sin_addr, address.bytes, sizeof address.bytes);
  return connect(handle(socket), reinterpret_cast<const sockaddr*>(&peer), sizeof peer) == 0;
}

int64_t socket_send(Socket socket, const char* data, size_t size) {
  return send(handle(socket), data, chunk(size), 0);
}

int64_t socket_receive(Socket socket, char* room, size_t size) {
  return recv(handle(socket), room, chunk(size), 0);
}

int receive_buffer_size(Socket socket) {
  return buffer_size(socket, SO_RCVBUF);
}

int send_buffer_size(Socket socket) {
  return buffer_size(socket, SO_SNDBUF);
}

bool resolve_name(const char* host, Address& out) {
  const hostent* const found = look_up(host);
  if (found == nullptr || found->h_addr_list[0] == nullptr) return false;
  std::memcpy(out.bytes, found->h_addr_list[0], sizeof out.bytes);
  return true;
}

bool official_host_name(TextBuffer<256>& out) {
  TextBuffer<256> name;
  const auto ask = [](char* room, size_t size) {
    return gethostname(room, static_cast<int>(size)) == 0;
  };
  if (!name.fill(ask)) return false;
  const hostent* const found = look_up(name.c_str());
  return found != nullptr && found->h_name != nullptr && out.assign(found->h_name);
}

}  // namespace zv::platform
