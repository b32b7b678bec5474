// The readers of replies, each fed by a scripted server.
#include "transfer/reply.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "fixtures/scripted_server.h"
#include "transfer/connection.h"

namespace {

constexpr zv::platform::Address loopback = {{127, 0, 0, 1}};

// What a server sends before it closes, or resets, the connection. Where the pieces arrive in one
// receive after all, the results below are the same.
struct Sent {
  std::vector<std::string> pieces;
  bool reset = false;
};

// Calls read(socket) on a connection to such a server.
template <class Read>
auto read_from(const Sent& sent, Read read) {
  scripted::Server server([&sent](scripted::Peer& peer) {
    for (const std::string& piece : sent.pieces) {
      peer.send(piece);
      scripted::pause(10);
    }
    if (sent.reset) peer.reset();
  });
  zv::Connection connection(zv::Direction::download);
  EXPECT_EQ(connection.open(loopback, server.port()), 0);
  return read(connection.control.get());
}

TEST(Reply, LastLineCounts) {
  struct Case {
    Sent sent;
    int code;
    const char* text;
  };
  const Case cases[] = {
      {{{"220 ready\r\n"}}, 220, "220 ready\r"},
      {{{"220-Welcome\r\n", "220 Ready\r\n"}}, 220, "220 Ready\r"},
      {{{"250-a\r\n250-b\r\n", "250-c\r\n", "250 d\r\n"}}, 250, "250 d\r"},
      {{{"150 Opening (12 bytes)\r\n226 Done\r\n"}}, 226, "226 Done\r"},
      {{{"230 no carriage return\n\n\n"}}, 230, "230 no carriage return"},
      {{{"\n\n221 bye"}}, 221, "221 bye"},
      {{{" +42\r\n"}}, 42, " +42\r"},
      {{{"220"}}, 220, "220"},
      {{{"-5 x\r\n"}}, -5, "-5 x\r"},
      {{{"220 a\0 b\r\n"}}, 220, "220 a"},
      {{{"ready 220\r\n"}}, 0, nullptr},
      {{{"220 a\r\nb\r\n"}}, 0, nullptr},
      {{{"99999999999 x\r\n"}}, 0, nullptr},
      {{{"\n\n"}}, 0, nullptr},
      {{{"220-Welcome\r\n"}}, 0, nullptr},  // and closes
      {{{}}, 0, nullptr},
      {{{}, true}, 0, nullptr},
      {{{"220-Welcome\r\n"}, true}, 0, nullptr},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.sent.pieces.empty() ? "nothing" : c.sent.pieces[0]);
    std::vector<char> room(64, 'x');
    const int code = read_from(
        c.sent, [&](zv::platform::Socket socket) { return zv::read_reply(socket, room); });
    EXPECT_EQ(code, c.code);
    if (c.text != nullptr) {
      EXPECT_STREQ(room.data(), c.text);
    }
  }
}

TEST(Reply, LongerThanItsRoom) {
  std::vector<char> room(16, 'x');
  const std::string text = "220 456789abcdefghij\r\n";
  const int code =
      read_from({{text}}, [&](zv::platform::Socket s) { return zv::read_reply(s, room); });
  EXPECT_EQ(code, 220);
  EXPECT_EQ(std::string(room.data(), 16), text.substr(0, 15) + '\0');
}

TEST(Reply, HttpHeader) {
  struct Case {
    Sent sent;
    int status;
    int64_t length;
    std::string body;
  };
  const Case cases[] = {
      {{{"http/1.1 200 OK\r\ncontent-length: 5\r\n\r\nhello"}}, 200, 5, "hello"},
      {{{"HTTP/1.0 404 Not Found\r\n\r\n"}}, 404, 0, ""},
      {{{"HTTP/1.0 200\r\nA: b\r\nContent-Length:  7 x\r\nContent-Length: 8\r\n\r\n"}}, 200, 7, ""},
      {{{"HTTP/1.0 200 OK\r\nX-Content-Length: 7\r\n\r\na\r\n\r\nb"}}, 200, 0, "a\r\n\r\nb"},
      {{{"HTTP/1.0 200 OK\r\nContent-Length:12\r\n\r\n"}}, 200, 0, ""},
      {{{"HTTP/1.0 200 OK\r\nContent-Length: -12\r\n\r\n"}}, 200, -12, ""},
      {{{"HTTP/1.0 200 OK\r\nContent-Length: 9223372036854775807\r\n\r\n"}}, 200, INT64_MAX, ""},
      {{{"HTTP/1.0 200 OK\r\nContent-Length: 9223372036854775808\r\n\r\n"}}, 200, 0, ""},
      {{{"HTTP/1.0 200 OK\nContent-Length: 3\r\n\r\n"}}, 200, 3, ""},
      {{{"\nHTTP/1.0 204 \r\n\r\n"}}, 204, 0, ""},
      {{{"HTTP/1.0\r\n\r\n"}}, 0, 0, ""},
      {{{"HTTP/1.0 OK\r\n\r\n"}}, 0, 0, ""},
      {{{"HTTP/1.0 99999999999\r\n\r\n"}}, 0, 0, ""},
      {{{"ICY 200 OK\r\n\r\n"}}, 0, 0, ""},
      {{{"HTT\r\n\r\n"}}, 0, 0, ""},
      {{{"\r\n\r\n"}}, 0, 0, ""},
      {{{"HTTP/1.0 200 OK\r\nContent-Length: 5\r\n"}}, 0, 0, ""},  // the rest never comes
      {{{std::string(70, 'x')}}, 0, 0, ""},
      {{{}}, 0, 0, ""},
      {{{}, true}, 0, 0, ""},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.sent.pieces.empty() ? "nothing" : c.sent.pieces[0]);
    std::vector<char> room(128, 'x');
    const zv::HttpHeader header = read_from(
        c.sent, [&](zv::platform::Socket socket) { return zv::read_http_header(socket, room); });
    EXPECT_EQ(header.status, c.status);
    EXPECT_EQ(header.content_length, c.length);
    ASSERT_EQ(header.body_bytes, static_cast<int64_t>(c.body.size()));
    EXPECT_EQ(std::string(room.data(), c.body.size()), c.body);
  }
}

TEST(Reply, PassiveAddress) {
  struct Case {
    const char* reply;
    bool usable;
    zv::platform::Address addr;
    unsigned port;
  };
  const Case cases[] = {
      {"227 Entering Passive Mode (10,0,0,5,4,1)", true, {{10, 0, 0, 5}}, 1025},
      {"227 (256,-1, 3,4,255,255,7", true, {{0, 255, 3, 4}}, 65535},
      {"227 x(1,2,3,4,0,0)", true, {{1, 2, 3, 4}}, 0},
      {"227 10,0,0,5,4,1", false, {}, 0},
      {"227 (10,0,0,5,4)", false, {}, 0},
      {"227 (10,0,0,5,4 ,1)", false, {}, 0},
      {"227 (a)(1,2,3,4,5,6)", false, {}, 0},
      {"227 (1,2,3,4,256,0)", false, {}, 0},
      {"227 (1,2,3,4,-1,0)", false, {}, 0},
      {"227 (1,2,3,4,2147483647,2147483647)", false, {}, 0},
      {"227 (1,2,3,99999999999,5,6)", false, {}, 0},
      {"", false, {}, 0},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.reply);
    zv::platform::Address addr = {{9, 9, 9, 9}};
    unsigned port = 9;
    EXPECT_EQ(zv::parse_pasv(c.reply, addr, port), c.usable);
    for (int i = 0; i < 4; ++i) EXPECT_EQ(addr.bytes[i], c.usable ? c.addr.bytes[i] : 9);
    EXPECT_EQ(port, c.usable ? c.port : 9);
  }
}

}  // namespace
