// Addresses of IPv4 and IPv6, looked up and brought from the system's form to the library's and
// back: the same calls on both platforms.
#ifndef ZARVO_PLATFORM_SOCKET_ADDRESS_H
#define ZARVO_PLATFORM_SOCKET_ADDRESS_H

#include <cstring>
#include <memory>

#include "platform/platform.h"

namespace zv::platform {

struct FreeAddresses {
  void operator()(addrinfo* list) const { freeaddrinfo(list); }
};

using AddressList = std::unique_ptr<addrinfo, FreeAddresses>;

// The thread-safe look-up. Not empty unless it is nullptr.
inline AddressList look_up(const char* host, int family, int flags) {
  addrinfo hints = {};
  hints.ai_family = family;
  hints.ai_socktype = SOCK_STREAM;
  hints.ai_flags = flags;
  addrinfo* list = nullptr;
  return AddressList(getaddrinfo(host, nullptr, &hints, &list) == 0 ? list : nullptr);
}

inline bool from_system(const sockaddr* address, HostAddress& out) {
  out = {};
  if (address->sa_family == AF_INET) {
    sockaddr_in four;
    std::memcpy(&four, address, sizeof four);
    std::memcpy(out.bytes.data(), &four.sin_addr, sizeof four.sin_addr);
    return true;
  }
  if (address->sa_family != AF_INET6) return false;
  sockaddr_in6 six;
  std::memcpy(&six, address, sizeof six);
  out.is_six = true;
  std::memcpy(out.bytes.data(), &six.sin6_addr, sizeof six.sin6_addr);
  out.scope = six.sin6_scope_id;
  return true;
}

inline socklen_t to_system(const HostAddress& address, unsigned port, sockaddr_storage& out) {
  out = {};
  if (!address.is_six) {
    sockaddr_in four = {};
    four.sin_family = AF_INET;
    four.sin_port = htons(static_cast<uint16_t>(port));
    std::memcpy(&four.sin_addr, address.bytes.data(), sizeof four.sin_addr);
    std::memcpy(&out, &four, sizeof four);
    return sizeof four;
  }
  sockaddr_in6 six = {};
  six.sin6_family = AF_INET6;
  six.sin6_port = htons(static_cast<uint16_t>(port));
  six.sin6_scope_id = address.scope;
  std::memcpy(&six.sin6_addr, address.bytes.data(), sizeof six.sin6_addr);
  std::memcpy(&out, &six, sizeof six);
  return sizeof six;
}

// What `ask`, getsockname() or getpeername(), tells of a system's socket.
template <class SystemSocket, class Ask>
bool address_of(SystemSocket socket, HostAddress& out, Ask ask) {
  sockaddr_storage address = {};
  socklen_t size = sizeof address;
  auto* const name = reinterpret_cast<sockaddr*>(&address);
  return ask(socket, name, &size) == 0 && from_system(name, out);
}

}  // namespace zv::platform

#endif
