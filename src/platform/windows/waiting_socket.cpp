// Stream sockets that never wait in a call, over IPv6 and IPv4.
#include <winsock2.h>
#include <ws2tcpip.h>

#include <cerrno>
#include <cstdio>

#include "platform/socket_address.h"

namespace zv::platform {

namespace {

SOCKET handle(Socket socket) {
  return static_cast<SOCKET>(socket);
}

bool never_waits(SOCKET socket) {
  u_long on = 1;
  return ioctlsocket(socket, static_cast<long>(FIONBIO), &on) == 0;
}

// FD_SET() compares numbers of different signs.
void add(fd_set& set, SOCKET socket) {
  set.fd_array[set.fd_count++] = socket;
}

bool is_in(const fd_set& set, SOCKET socket) {
  for (u_int i = 0; i < set.fd_count; ++i)
    if (set.fd_array[i] == socket) return true;
  return false;
}

}  // namespace

size_t look_up_name(const char* name, std::span<HostAddress> room) {
  if (inet_addr(name) != INADDR_NONE) return 0;
  const AddressList list = look_up(name, AF_UNSPEC, 0);
  size_t count = 0;
  for (const addrinfo* at = list.get(); at != nullptr && count < room.size(); at = at->ai_next)
    if (from_system(at->ai_addr, room[count])) ++count;
  return count;
}

bool read_address_six(const char* text, HostAddress& out) {
  const AddressList list = look_up(text, AF_INET6, AI_NUMERICHOST);
  return list != nullptr && from_system(list->ai_addr, out);
}

AddressText address_text(const HostAddress& address) {
  AddressText text;
  (void)text.fill([&address](char* room, size_t size) {
    sockaddr_storage system;
    const int length = to_system({address.is_six, address.bytes, 0}, 0, system);
    return getnameinfo(reinterpret_cast<const sockaddr*>(&system), length, room,
                       static_cast<DWORD>(size), nullptr, 0, NI_NUMERICHOST) == 0;
  });
  return text;
}

Socket socket_begin(const HostAddress& address, unsigned port) {
  sockaddr_storage peer;
  const int size = to_system(address, port, peer);
  const SOCKET opened = socket(peer.ss_family, SOCK_STREAM, IPPROTO_TCP);
  if (opened == INVALID_SOCKET) return no_socket;
  SetHandleInformation(reinterpret_cast<HANDLE>(opened), HANDLE_FLAG_INHERIT, 0);
  const int on = 1;
  setsockopt(opened, IPPROTO_TCP, TCP_NODELAY, reinterpret_cast<const char*>(&on), sizeof on);
  // Else urgent data would be an exception.
  setsockopt(opened, SOL_SOCKET, SO_OOBINLINE, reinterpret_cast<const char*>(&on), sizeof on);
  if (never_waits(opened) &&
      (connect(opened, reinterpret_cast<const sockaddr*>(&peer), size) == 0 ||
       WSAGetLastError() == WSAEWOULDBLOCK))
    return static_cast<Socket>(opened);
  const int error = WSAGetLastError();
  closesocket(opened);
  WSASetLastError(error);
  return no_socket;
}

int connect_error(Socket socket) {
  int error = 0;
  int size = sizeof error;
  if (getsockopt(handle(socket), SOL_SOCKET, SO_ERROR, reinterpret_cast<char*>(&error), &size) != 0)
    return last_error();
  if (error == 0) return 0;
  WSASetLastError(error);
  return last_error();
}

// select(), since WSAPoll() did not report a connection that failed before Windows 10 2004. Such a
// failure is an exception here.
bool wait_for_sockets(std::span<Waiting> sockets, int milliseconds) {
  fd_set readable = {};
  fd_set writable = {};
  fd_set failed = {};
  for (const Waiting& waiting : sockets) {
    if (waiting.to_read) add(readable, handle(waiting.socket));
    if (waiting.to_write) add(writable, handle(waiting.socket));
    add(failed, handle(waiting.socket));
  }
  timeval time = {milliseconds / 1000, milliseconds % 1000 * 1000};
  const int ready = select(0, &readable, &writable, &failed, &time);
  if (ready == SOCKET_ERROR) return false;
  for (Waiting& waiting : sockets) {
    const SOCKET socket = handle(waiting.socket);
    const bool error = is_in(failed, socket);
    waiting.can_read = waiting.to_read && (error || is_in(readable, socket));
    waiting.can_write = waiting.to_write && (error || is_in(writable, socket));
  }
  return true;
}

void socket_end(Socket socket) {
  shutdown(handle(socket), SD_SEND);
}

void socket_reset(Socket socket) {
  const linger at_once = {1, 0};
  setsockopt(handle(socket), SOL_SOCKET, SO_LINGER, reinterpret_cast<const char*>(&at_once),
             sizeof at_once);
  closesocket(handle(socket));
}

bool peer_address(Socket socket, HostAddress& out) {
  return address_of(handle(socket), out, getpeername);
}

bool local_address(Socket socket, HostAddress& out) {
  return address_of(handle(socket), out, getsockname);
}

int64_t unsent_bytes(Socket) {
  return 0;
}

}  // namespace zv::platform
