// zv_copy() between local files, and from and to an HTTP server that follows a script.
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <initializer_list>
#include <string>

#include "fixtures/scripted_server.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

namespace fs = std::filesystem;
using Sizes = std::initializer_list<size_t>;

// Nothing stays open behind a test, or behind a part of it.
struct SameHandles {
  const int before = scripted::open_handles();
  ~SameHandles() { EXPECT_EQ(scripted::open_handles(), before); }
};

int copy(const std::string& from, const std::string& to) {
  const SameHandles same;
  return zv_copy(from.c_str(), to.c_str());
}

std::string pattern(size_t size) {
  std::string text(size, '\0');
  for (size_t i = 0; i < size; ++i) text[i] = static_cast<char>(i * 7 + i / 256);
  return text;
}

TEST(CopyLocal, EverySize) {
  const ScratchFolder folder;
  for (const size_t size : Sizes{0, 1, 511, 512, 513, 65535, 65536, 65537, 300000}) {
    SCOPED_TRACE(size);
    const std::string from = folder.make_file("from", pattern(size));
    folder.make_file("to", "what was there before");
    EXPECT_EQ(copy(from, folder.path("to")), 0);
    EXPECT_EQ(folder.content("to"), pattern(size));
    EXPECT_EQ(copy("file://" + from, "FILE://" + folder.path("new")), 0);
    EXPECT_EQ(folder.content("new"), pattern(size));
    fs::remove(folder.path("new"));
  }
}

TEST(CopyLocal, NamesInEveryForm) {
  const ScratchFolder folder;
  std::string from = folder.make_file("a b.txt", "x");
  EXPECT_EQ(copy("file://" + folder.path("a%20b.txt"), folder.path("c%20d")), 0);
  EXPECT_TRUE(folder.exists("c%20d"));
  for (char& ch : from)
    if (ch == '/') ch = '\\';
  EXPECT_EQ(copy(from, folder.path("e")), 0);
  EXPECT_EQ(folder.content("e"), "x");
}

TEST(CopyLocal, Failures) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "content");
  const std::string directory = folder.make_folder("directory");
  EXPECT_EQ(copy(folder.path("missing"), folder.path("new")), -3);
  EXPECT_EQ(copy(folder.path("missing"), directory), -3);
  EXPECT_FALSE(folder.exists("new"));
  EXPECT_EQ(copy(directory, folder.path("new")), -3);
  EXPECT_EQ(copy(directory, file), -3);
  EXPECT_EQ(folder.content("file"), "content");
  EXPECT_EQ(copy(file, directory), -4);
  EXPECT_EQ(copy(file, folder.path("missing/new")), -4);
  EXPECT_EQ(copy("file://", file), -3);
  EXPECT_EQ(copy(file, "file://"), -4);
  EXPECT_EQ(zv_copy(nullptr, file.c_str()), -3);
  EXPECT_EQ(zv_copy(file.c_str(), nullptr), -4);
  fs::permissions(file, fs::perms::owner_read);
  if (!std::ofstream(file, std::ios::app)) {
    EXPECT_EQ(copy(directory + "/../file", file), -4);
  }
}

TEST(CopyLocal, OntoItself) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "content");
  folder.make_folder("sub");
  std::error_code failed;
  fs::create_hard_link(file, folder.path("link"), failed);
  for (const std::string other : {"file", "sub/../file", failed ? "file" : "link"}) {
    EXPECT_EQ(copy(file, folder.path(other)), -4);
    EXPECT_EQ(copy(folder.path(other), file), -4);
    EXPECT_EQ(folder.content("file"), "content");
  }
}

TEST(Copy, LocationsThatAreRefused) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "content");
  const std::string closed = "127.0.0.1:" + std::to_string(scripted::closed_port());
  for (const std::string location :
       {"", "http://host", "ftp://user@host", "http://3com/f", "http://no-such-host.invalid/f",
        "http://1.2.3.4:70000/f", "http://1.2.3.4/a%0d%0ab"}) {
    EXPECT_EQ(copy(location, file), -3) << location;
    EXPECT_EQ(copy(file, location), -4) << location;
    EXPECT_EQ(copy(location, location), -3) << location;
  }
  EXPECT_EQ(copy("smtp://" + closed + "/x", file), -3);
  EXPECT_EQ(folder.content("file"), "content");

  EXPECT_EQ(copy("http://" + closed + "/f", folder.path("new")), -3);
  EXPECT_EQ(folder.content("new"), "");
  EXPECT_TRUE(folder.exists("new"));
  EXPECT_EQ(copy(file, "http://" + closed + "/f"), -4);
  EXPECT_EQ(copy("http://" + closed + "/f", folder.path("missing/new")), -4);
  EXPECT_EQ(copy(folder.path("missing"), "http://" + closed + "/f"), -3);
  EXPECT_EQ(copy(folder.path(), "http://" + closed + "/f"), -3);
}

// A GET from a server that reads the request, sends what it is given and then closes.
struct Response {
  std::string text;
  int result;
  std::string content;
  bool slowly_behind_header = false;
};

TEST(HttpGet, EveryResponse) {
  const SameHandles same;
  const std::string ok = "HTTP/1.0 200 OK\r\n";
  const std::string large = pattern(500000);
  const Response cases[] = {
      {ok + "Content-Length: 5\r\n\r\nhello", 0, "hello"},
      {"http/1.1 299 x\r\nServer: y\r\ncontent-length: 5\r\n\r\nhello", 0, "hello"},
      {ok + "Content-Length: 500000\r\n\r\n" + large, 0, large},
      {ok + "Content-Length: 40\r\n\r\n" + std::string(40, 'x'), 0, std::string(40, 'x'), true},
      {ok + "Content-Length: 6\r\n\r\nhello", -3, "hello"},
      {ok + "Content-Length: 4\r\n\r\nhello", -3, "hello"},
      {ok + "Content-Length: 500001\r\n\r\n" + large, -3, large},
      {ok + "Content-Length: 0\r\n\r\n", -3, ""},
      {ok + "Content-Length: -5\r\n\r\nhello", -3, ""},
      {ok + "Content-Length: 99999999999999999999\r\n\r\nhello", -3, ""},
      {ok + "\r\nhello", -3, ""},
      {"HTTP/1.0 199 x\r\nContent-Length: 5\r\n\r\nhello", -3, ""},
      {"HTTP/1.0 300 x\r\nContent-Length: 5\r\n\r\nhello", -3, ""},
      {"HTTP/1.0 200 OK\r\nContent-Length: 5\r\n", -3, ""},
      {"", -3, ""},
  };
  const ScratchFolder folder;
  for (const Response& c : cases) {
    SCOPED_TRACE(c.text.substr(0, 60));
    scripted::Server server([&c](scripted::Peer& peer) {
      peer.expect("GET /a b.txt HTTP/1.0\r\n\r\n");
      const size_t header = c.text.find("\r\n\r\n") + 4;
      if (!c.slowly_behind_header) return peer.send(c.text);
      peer.send(c.text.substr(0, header));
      peer.send_slowly(c.text.substr(header));
    });
    const std::string url = server.url("http", "/a%20b.txt");
    EXPECT_EQ(zv_copy(url.c_str(), folder.path("got").c_str()), c.result);
    EXPECT_EQ(server.outcome(), "");
    EXPECT_EQ(folder.content("got"), c.content);
  }
}

TEST(HttpGet, Requests) {
  const SameHandles same;
  const std::string answer = "HTTP/1.0 200 OK\r\nContent-Length: 5\r\n\r\n";
  struct Case {
    const char* credentials;
    std::string header;
  };
  const Case cases[] = {{"u:p@", "Authorization: Basic dTpw\r\n"},
                        {"u@", "Authorization: Basic dQ==\r\n"},
                        {":p@", ""}};
  const ScratchFolder folder;
  for (const Case& c : cases) {
    scripted::Server server([&](scripted::Peer& peer) {
      peer.expect("GET /a.txt HTTP/1.0\r\n" + c.header + "\r\n");
      peer.send(answer + "hello");
      peer.close();
    });
    EXPECT_EQ(
        zv_copy(server.url("http", "/a.txt", c.credentials).c_str(), folder.path("got").c_str()),
        0);
    EXPECT_EQ(server.outcome(), "");
  }
}

TEST(HttpPut, RequestAndResponse) {
  const SameHandles same;
  struct Case {
    const char* credentials;
    std::string header;
    size_t size;
    const char* response;
    int result;
  };
  const Case cases[] = {
      {"", "", 5, "HTTP/1.0 201 Created\r\n\r\n", 0},
      {"", "", 0, "HTTP/1.1 204 No Content\r\n\r\n", 0},
      {"", "", 1000000, "HTTP/1.0 200 OK\r\nContent-Length: 2\r\n\r\nok", 0},
      {"u:p@", "Authorization: Basic dTpw\r\n", 5, "HTTP/1.0 201 Created\r\n\r\n", 0},
      {"", "", 5, "HTTP/1.0 403 Forbidden\r\n\r\n", -4},
      {"", "", 5, "HTTP/1.0 100 Continue\r\n\r\n", -4},
      {"", "", 5, "", -4},
  };
  const ScratchFolder folder;
  for (const Case& c : cases) {
    SCOPED_TRACE(c.response);
    const std::string content = pattern(c.size);
    const std::string file = folder.make_file("f", content);
    scripted::Server server([&](scripted::Peer& peer) {
      peer.expect("PUT /up/f HTTP/1.0\r\n" + c.header +
                  "Content-Length: " + std::to_string(c.size) + "\r\n\r\n" + content);
      peer.send(c.response);
    });
    EXPECT_EQ(zv_copy(file.c_str(), server.url("http", "/up/f", c.credentials).c_str()), c.result);
    EXPECT_EQ(server.outcome(), "");
  }
}

// The longest texts that a location can hold reach the server whole.
TEST(Http, LongestRequest) {
  const SameHandles same;
  const ScratchFolder folder;
  const std::string file = folder.make_file("f", "x");
  std::string path;
  std::string user;
  std::string got;
  scripted::Server server([&got](scripted::Peer& peer) {
    got = peer.receive_until("\r\n\r\n");
    got += peer.receive(1);
    peer.send("HTTP/1.0 200 OK\r\n\r\n");
  });
  const size_t room = 318 - (server.url("http", "", ":@").size() - 7);
  user.assign(room / 3, 'u');
  path.assign("/").append(room - 2 * user.size() - 1, 'p');
  const std::string url = server.url("http", path, user + ":" + user + "@");
  ASSERT_EQ(url.size(), 318u + 7);
  EXPECT_EQ(zv_copy(file.c_str(), url.c_str()), 0);
  EXPECT_EQ(server.outcome(), "");
  EXPECT_TRUE(got.starts_with("PUT " + path + " HTTP/1.0\r\nAuthorization: Basic dXV1"));
  EXPECT_TRUE(got.ends_with("\r\nContent-Length: 1\r\n\r\nx"));
}

}  // namespace
