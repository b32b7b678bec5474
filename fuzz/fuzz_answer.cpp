// What servers say in a run, in pieces of any size: replies, heads, chunks, trailers, passive
// ports. Whatever comes ends within bounds.
#include <fuzzer/FuzzedDataProvider.h>
#include <poll.h>
#include <sys/socket.h>

#include <vector>

#include "check.h"
#include "transfer/commands.h"
#include "transfer/http_answer.h"
#include "transfer/run_ftp.h"

namespace {

FuzzedDataProvider* peer = nullptr;

void read_replies(zv::Wire& wire) {
  zv::Commands server(wire);
  while (const int code = server.read_reply()) {
    CHECK(code >= 100 && code <= 599);
    CHECK(server.reply().size() <= 8192);
    CHECK(zv::passive_port(server.reply()) <= 65535);
    CHECK(zv::extended_passive_port(server.reply()) <= 65535);
    CHECK(zv::announced_bytes(server.reply()) >= -1);
  }
}

void read_answers(zv::Wire& wire) {
  zv::HttpAnswer answer;
  std::vector<char> room(100);
  while (zv::read_answer(wire, answer)) {
    CHECK(answer.status >= 200 && answer.status <= 999);
    CHECK(answer.length >= -1);
    CHECK(answer.location.view().size() <= 8192);
    std::string_view line;
    int64_t size = 0;
    if (answer.is_chunked && wire.read_line(line) &&
        zv::take_chunk_size(line, size) == zv::Taken::good) {
      CHECK(size >= 0);
      CHECK(wire.receive(room) <= static_cast<int64_t>(room.size()));
    }
    if (answer.is_chunked && !zv::skip_trailer(wire)) return;
  }
}

}  // namespace

extern "C" ssize_t __wrap_recv(int, void* room, size_t size, int) {
  if (peer->remaining_bytes() == 0) return 0;
  const size_t piece = peer->ConsumeIntegralInRange<size_t>(1, size);
  return static_cast<ssize_t>(peer->ConsumeData(room, piece));
}

extern "C" int __wrap_connect(int, const sockaddr*, socklen_t) {
  return 0;
}

extern "C" int __wrap_poll(pollfd* waits, nfds_t count, int) {
  for (nfds_t i = 0; i < count; ++i) waits[i].revents = waits[i].events;
  return static_cast<int>(count);
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider provider(data, size);
  peer = &provider;
  zv::Signals signals;
  zv::Run run(zv::Options(), zv::Watch(), signals);
  zv::Wire wire(run, -3);
  if (!wire.connect(zv::platform::HostAddress(), 1)) return 0;
  wire.expect_reply();
  provider.ConsumeBool() ? read_replies(wire) : read_answers(wire);
  CHECK(run.failed());
  for (const char ch : run.failure().reason.view()) CHECK(ch < 0 || (ch >= ' ' && ch != 127));
  return 0;
}
