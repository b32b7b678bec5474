// Location texts: whatever is accepted is bounded, and holds nothing that could add a line to a
// dialogue.
#include <netdb.h>

#include <cstring>
#include <string>

#include "check.h"
#include "transfer/location.h"

extern "C" int __wrap_getaddrinfo(const char*, const char*, const addrinfo*, addrinfo**) {
  return EAI_NONAME;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  zv::Location location;
  const zv::LocationKind kind = zv::parse_location(text.c_str(), location);
  CHECK(kind == location.kind);
  if (kind == zv::LOC_NONE) return 0;

  CHECK(location.path.size() == std::strlen(location.path.c_str()));
  CHECK(location.user.size() == std::strlen(location.user.c_str()));
  CHECK(location.password.size() == std::strlen(location.password.c_str()));
  CHECK(location.port <= 65535);
  if (kind == zv::LOC_FILE) {
    CHECK(location.port == 0);
    return 0;
  }
  CHECK(location.path[0] == '/');
  for (const zv::PathBuffer* part : {&location.path, &location.user, &location.password})
    CHECK(std::strpbrk(part->c_str(), "\r\n") == nullptr);
  return 0;
}
