// Stream sockets that never wait in a call, over IPv6 and IPv4.
#include <arpa/inet.h>
#include <linux/sockios.h>
#include <netdb.h>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cerrno>

#include "platform/socket_address.h"

namespace zv::platform {

namespace {}  // namespace

size_t look_up_name(const char* name, std::span<HostAddress> room) {
  if (look_up(name, AF_INET, AI_NUMERICHOST) != nullptr) return 0;
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
    const int family = address.is_six ? AF_INET6 : AF_INET;
    return inet_ntop(family, address.bytes.data(), room, static_cast<socklen_t>(size)) != nullptr;
  });
  return text;
}

Socket socket_begin(const HostAddress& address, unsigned port) {
  sockaddr_storage peer;
  const socklen_t size = to_system(address, port, peer);
  const int opened =
      socket(peer.ss_family, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, IPPROTO_TCP);
  if (opened < 0) return no_socket;
  const int on = 1;
  setsockopt(opened, IPPROTO_TCP, TCP_NODELAY, &on, sizeof on);
  if (connect(opened, reinterpret_cast<const sockaddr*>(&peer), size) == 0 ||
      errno == EINPROGRESS || errno == EINTR)
    return opened;
  const int error = errno;
  close(opened);
  errno = error;
  return no_socket;
}

int connect_error(Socket socket) {
  int error = 0;
  socklen_t size = sizeof error;
  const int told = getsockopt(static_cast<int>(socket), SOL_SOCKET, SO_ERROR, &error, &size);
  return told == 0 ? error : errno;
}

bool wait_for_sockets(std::span<Waiting> sockets, int milliseconds) {
  std::array<pollfd, 2> waits = {};
  const size_t count = std::min(sockets.size(), waits.size());
  for (size_t i = 0; i < count; ++i) {
    const int events = (sockets[i].to_read ? POLLIN : 0) | (sockets[i].to_write ? POLLOUT : 0);
    waits[i] = {static_cast<int>(sockets[i].socket), static_cast<int16_t>(events), 0};
  }
  const int ready = poll(waits.data(), count, milliseconds);
  if (ready < 0 && errno != EINTR) return false;
  for (size_t i = 0; i < count; ++i) {
    const int found = ready > 0 ? waits[i].revents : 0;
    const bool failed = (found & (POLLERR | POLLHUP | POLLNVAL)) != 0;
    sockets[i].can_read = sockets[i].to_read && (failed || (found & POLLIN) != 0);
    sockets[i].can_write = sockets[i].to_write && (failed || (found & POLLOUT) != 0);
  }
  return true;
}

void socket_end(Socket socket) {
  shutdown(static_cast<int>(socket), SHUT_WR);
}

void socket_reset(Socket socket) {
  const linger at_once = {1, 0};
  setsockopt(static_cast<int>(socket), SOL_SOCKET, SO_LINGER, &at_once, sizeof at_once);
  close(static_cast<int>(socket));
}

bool peer_address(Socket socket, HostAddress& out) {
  return address_of(static_cast<int>(socket), out, getpeername);
}

bool local_address(Socket socket, HostAddress& out) {
  return address_of(static_cast<int>(socket), out, getsockname);
}

int64_t unsent_bytes(Socket socket) {
  int count = 0;
  return ioctl(static_cast<int>(socket), SIOCOUTQ, &count) == 0 ? count : 0;
}

}  // namespace zv::platform
