// Replies, HTTP headers and passive-mode addresses, as a peer may send them: in pieces of any size.
#include <fuzzer/FuzzedDataProvider.h>
#include <sys/socket.h>

#include <algorithm>
#include <cstring>
#include <vector>

#include "check.h"
#include "transfer/reply.h"

namespace {

FuzzedDataProvider* peer = nullptr;

}  // namespace

extern "C" ssize_t __wrap_recv(int, void* room, size_t size, int) {
  if (peer->remaining_bytes() == 0) return 0;
  const size_t piece = peer->ConsumeIntegralInRange<size_t>(0, size);
  return static_cast<ssize_t>(peer->ConsumeData(room, piece));
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider provider(data, size);
  peer = &provider;
  // On the heap, and exactly as large as it is said to be, so that a byte behind it is seen.
  std::vector<char> room(provider.ConsumeIntegralInRange<size_t>(128, 600));

  if (provider.ConsumeBool()) {
    zv::read_reply(0, room);
    CHECK(std::memchr(room.data(), '\0', room.size()) != nullptr);
    zv::platform::Address address = {};
    unsigned port = 0;
    if (zv::parse_pasv(room.data(), address, port)) CHECK(port <= 65535);
  } else {
    const zv::HttpHeader header = zv::read_http_header(0, room);
    CHECK(header.body_bytes >= 0);
    CHECK(header.body_bytes < static_cast<int64_t>(room.size()));
  }
  return 0;
}
