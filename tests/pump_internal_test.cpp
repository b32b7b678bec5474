// The pumps between a socket and a stream.
#include "transfer/pump.h"

#include <gtest/gtest.h>

#include <functional>
#include <initializer_list>
#include <string>
#include <vector>

#include "fixtures/scripted_server.h"
#include "scratch_folder.h"
#include "transfer/base64.h"
#include "transfer/connection.h"

namespace {

constexpr zv::platform::Address loopback = {{127, 0, 0, 1}};

using Sizes = std::initializer_list<size_t>;
using Script = std::function<void(scripted::Peer&)>;

// Runs a pump with a socket that leads to the script; gives its result.
int pumped(const Script& script, const std::function<int(zv::platform::Socket)>& pump) {
  scripted::Server server(script);
  int result = 0;
  {
    zv::Connection connection(zv::Direction::upload);
    EXPECT_EQ(connection.open(loopback, server.port()), 0);
    result = pump(connection.control.get());
  }
  EXPECT_EQ(server.outcome(), "");
  return result;
}

TEST(Pump, ReceivesExactlyTheCount) {
  struct Case {
    const char* sent;
    bool slowly, reset;
    int64_t count;
    int result;
  };
  const Case cases[] = {
      {"0123456789", false, false, 10, 0},
      {"0123456789", true, false, 10, 0},
      {"", false, false, 0, 0},
      {"", false, true, 0, -3},
      {"0123456789", false, false, 11, -3},  // closed too early
      {"0123456789", false, true, 11, -3},
      {"0123456789", false, false, 9, -3},  // too much
      {"0", false, false, 0, -3},
      {"", false, false, 1, -3},
      {"0", false, false, INT64_MAX, -3},
      {"0", false, false, -1, -3},
  };
  const ScratchFolder folder;
  for (const Case& c : cases) {
    SCOPED_TRACE(std::string(c.sent) + " for " + std::to_string(c.count));
    const auto script = [&c](scripted::Peer& peer) {
      c.slowly ? peer.send_slowly(c.sent) : peer.send(c.sent);
      if (c.reset) peer.reset();
    };
    zv::StreamPtr file(std::fopen(folder.path("f").c_str(), "wb"));
    std::vector<char> block(16);
    EXPECT_EQ(
        pumped(script, [&](auto s) { return zv::recv_to_file(s, file.get(), block, c.count); }),
        c.result);
    ASSERT_TRUE(zv::close_stream(file));
    if (c.result == 0) {
      EXPECT_EQ(folder.content("f"), c.sent);
    }
  }
}

// What is too much already is not waited behind.
TEST(Pump, ReceivesNoMoreWhenThereIsTooMuch) {
  const ScratchFolder folder;
  const zv::StreamPtr file(std::fopen(folder.path("f").c_str(), "wb"));
  std::vector<char> block(16);
  EXPECT_EQ(pumped([](scripted::Peer& peer) { peer.expect_close(); },
                   [&](auto s) { return zv::recv_to_file(s, file.get(), block, 4, 5); }),
            -3);
}

std::string pattern(size_t size) {
  std::string text;
  for (size_t i = 0; i < size; ++i) text += static_cast<char>(i * 7 + i / 256);
  return text;
}

TEST(Pump, SendsBase64Lines) {
  const ScratchFolder folder;
  for (const size_t size : Sizes{0, 1, 47, 48, 49, 96, 100, 4800, 5001}) {
    SCOPED_TRACE(size);
    const std::string content = pattern(size);
    std::string lines = size == 0 ? "\r\n" : "";
    for (size_t at = 0; at < size; at += 48) {
      const auto* const bytes = reinterpret_cast<const unsigned char*>(content.data() + at);
      const zv::HeapPtr<char> line(
          zv::base64_encode(bytes, std::min<size_t>(48, size - at), nullptr));
      lines.append(line.get()).append("\r\n");
    }
    for (const size_t block_size : Sizes{114, 300, 4096}) {
      const zv::StreamPtr file(std::fopen(folder.make_file("f", content).c_str(), "rb"));
      std::vector<char> block(block_size);
      std::string got;
      const auto count = static_cast<int64_t>(size);
      EXPECT_EQ(pumped([&got](scripted::Peer& peer) { got = peer.receive_all(); },
                       [&](auto s) { return zv::send_base64_file(s, file.get(), block, count); }),
                0);
      EXPECT_EQ(got, lines);
    }
  }
}

// The whole lines before the point where a file proves too short are sent, and no more.
TEST(Pump, ShortFileSendsItsWholeLines) {
  const ScratchFolder folder;
  for (const size_t size : Sizes{0, 47, 48, 100}) {
    const zv::StreamPtr file(std::fopen(folder.make_file("f", pattern(size)).c_str(), "rb"));
    std::vector<char> block(4096);
    std::string got;
    EXPECT_EQ(pumped([&got](scripted::Peer& peer) { got = peer.receive_all(); },
                     [&](auto s) { return zv::send_base64_file(s, file.get(), block, 200); }),
              -3);
    EXPECT_EQ(got.size(), size / 48 * 66);
  }
}

}  // namespace
