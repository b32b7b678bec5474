// zv_copy() between local files, and and from and to an HTTP server.
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <initializer_list>
#include <string>
#include <thread>

#include "fixtures/dialogues.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

namespace fs = std::filesystem;
using scripted::DialogueServer;
using scripted::Fault;
using scripted::unasked;

// Nothing stays open behind it.
int copy(const std::string& from, const std::string& to) {
  const int before = scripted::open_handles();
  const int result = zv_copy(from.c_str(), to.c_str());
  EXPECT_EQ(scripted::open_handles(), before);
  return result;
}

std::string pattern(size_t size) {
  std::string text(size, '\0');
  for (size_t i = 0; i < size; ++i) text[i] = static_cast<char>(i * 7 + i / 256);
  return text;
}

TEST(CopyLocal, EverySize) {
  const ScratchFolder folder;
  for (const size_t size : std::initializer_list<size_t>{0, 1, 65535, 65536, 65537, 300000}) {
    SCOPED_TRACE(size);
    const std::string from = folder.make_file("from", pattern(size));
    folder.make_file("to", "what was there before");
    EXPECT_EQ(copy(from, folder.path("to")), 0);
    EXPECT_TRUE(folder.content("to") == pattern(size));
    EXPECT_EQ(copy("file://" + from, "FILE://" + folder.path("new")), 0);
    EXPECT_TRUE(folder.content("new") == pattern(size));
    fs::remove(folder.path("new"));
  }
}

TEST(CopyLocal, NamesInEveryForm) {
  const ScratchFolder folder;
  std::string from = folder.make_file("a b.txt", "x");
  EXPECT_EQ(copy("file://" + folder.path("a%20b.txt"), folder.path("c%20d")), 0);
  EXPECT_TRUE(folder.exists("c%20d"));
  std::replace(from.begin(), from.end(), '/', '\\');
  EXPECT_EQ(copy(from, folder.path("e")), 0);
  EXPECT_EQ(folder.content("e"), "x");
#ifndef _WIN32  // a name that is there as it is written
  folder.make_file("a\\b", "y");
  folder.make_folder("f");
  for (const std::string& form : {folder.path("a\\b"), "file://" + folder.path("a\\b")}) {
    EXPECT_EQ(copy(form, folder.path("f\\g")), 0);
    EXPECT_EQ(folder.content("f/g"), "y");
  }
#endif
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
  for (const std::string location : {"", "http://host", "http://no-such-host.invalid/f"}) {
    EXPECT_EQ(copy(location, file), -3) << location;
    EXPECT_EQ(copy(file, location), -4) << location;
    EXPECT_EQ(copy(location, location), -3) << location;
  }
  EXPECT_EQ(copy("smtp://" + closed + "/x", file), -3);
  EXPECT_EQ(folder.content("file"), "content");

  EXPECT_EQ(copy("http://" + closed + "/f", folder.path("new")), -3);
  EXPECT_TRUE(folder.exists("new"));
  EXPECT_EQ(copy(file, "http://" + closed + "/f"), -4);
  EXPECT_EQ(copy("http://" + closed + "/f", folder.path("missing/new")), -4);
  EXPECT_EQ(copy(folder.path("missing"), "http://" + closed + "/f"), -3);
  EXPECT_EQ(copy(folder.path(), "http://" + closed + "/f"), -3);
}

const std::string ok = "HTTP/1.0 200 OK\r\n";

TEST(HttpGet, EveryResponse) {
  struct Case {
    std::string response;
    int result;
    std::string content;
    std::string slowly = "";  // sent behind the response, byte by byte
  };
  const std::string five = "Content-Length: 5\r\n\r\nhello";
  const std::string large = pattern(1500000);
  const std::string length = ok + "Content-Length: ";
  const Case cases[] = {
      {ok + five, 0, "hello"},
      {"http/1.1 299 x\r\nServer: y\r\ncontent-length: 5\r\n\r\nhello", 0, "hello"},
      {"HTTP/1.0 200 OK\nServer: y\r\n" + five, 0, "hello"},
      {"\nHTTP/1.0 204 \r\n" + five, 0, "hello"},
      {length + "  5 x\r\nContent-Length: 8\r\n\r\nhello", 0, "hello"},
      {length + "6\r\n\r\na\r\n\r\nb", 0, "a\r\n\r\nb"},
      {length + "1500000\r\n\r\n" + large, 0, large},
      {length + "40\r\n\r\n", 0, std::string(40, 'x'), std::string(40, 'x')},
      {length + "6\r\n\r\nhello", -3, "hello"},
      {length + "4\r\n\r\nhello", -3, "hello"},
      {length + "1500001\r\n\r\n" + large, -3, large},
      {length + "9223372036854775807\r\n\r\nhello", -3, "hello"},
      {length + "9223372036854775808\r\n\r\nhello", -3, ""},
      {length + "0\r\n\r\n", -3, ""},
      {length + "-5\r\n\r\nhello", -3, ""},
      {ok + "Content-Length:5\r\n\r\nhello", -3, ""},
      {ok + "X-" + five, -3, ""},
      {ok + "\r\nhello", -3, ""},
      {ok + "Content-Length: 5\r\n", -3, ""},
      {"HTTP/1.0 199 x\r\n" + five, -3, ""},
      {"HTTP/1.0 300 x\r\n" + five, -3, ""},
      {"HTTP/1.0 4294967496 x\r\n" + five, -3, ""},
      {"HTTP/1.0 OK 200\r\n" + five, -3, ""},
      {"HTTP/1.0\r\n" + five, -3, ""},
      {"ICY 200 OK\r\n" + five, -3, ""},
      {"HTT\r\n\r\n", -3, ""},
      {"\r\n\r\n", -3, ""},
      {"", -3, ""},
  };
  const ScratchFolder folder;
  for (const Case& c : cases) {
    SCOPED_TRACE(c.response.substr(0, 60));
    const Fault fault = c.slowly.empty() ? Fault::none : Fault::bytewise;
    DialogueServer server({{"GET", c.response}, {unasked, c.slowly}}, fault, 1);
    const std::string url = server.url("http", "/a%20b.txt", "u:p@");
    EXPECT_EQ(zv_copy(url.c_str(), folder.path("got").c_str()), c.result);
    EXPECT_EQ(server.heard(), "GET /a b.txt HTTP/1.0\r\nAuthorization: Basic dTpw\r\n\r\n");
    EXPECT_TRUE(folder.content("got") == c.content);
  }
}

// Behind a body that came with its header the server has to close; too much is not waited behind.
TEST(HttpGet, TheEndOfTheBody) {
  const ScratchFolder folder;
  const std::string got = folder.path("got");
  const auto result_of = [&got](DialogueServer& server) {
    return zv_copy(server.url("http", "/f").c_str(), got.c_str());
  };
  const std::string announced = ok + "Content-Length: 5\r\n\r\n";
  // Wine loses a reset that comes before it is waited for.
  const auto pause = [] { std::this_thread::sleep_for(std::chrono::milliseconds(200)); };
  DialogueServer resets({{"GET", announced + "hello"}, {unasked, "", "", pause}}, Fault::reset, 1);
  EXPECT_EQ(result_of(resets), -3);
  DialogueServer goes_on({{"GET", announced + "hello"}, {unasked, "!"}});
  EXPECT_EQ(result_of(goes_on), -3);
  DialogueServer waits({{"GET", announced + "hello!"}, {scripted::until_closed, ""}});
  EXPECT_EQ(result_of(waits), -3);
  EXPECT_EQ(waits.stored(), "closed");
}

TEST(HttpPut, RequestAndResponse) {
  struct Case {
    const char* credentials;
    std::string header;
    size_t size;
    const char* response;
    int result;
  };
  const Case cases[] = {
      {"", "", 5, "HTTP/1.0 201 Created\r\n\r\n", 0},
      {":p@", "", 0, "HTTP/1.1 204 No Content\r\n\r\n", 0},
      {"u@", "Authorization: Basic dQ==\r\n", 1000000, "HTTP/1.0 299 OK\r\n\r\nok", 0},
      {"u:p@", "Authorization: Basic dTpw\r\n", 5, "HTTP/1.0 200 OK\r\n\r\n", 0},
      {"", "", 5, "HTTP/1.0 403 Forbidden\r\n\r\n", -4},
      {"", "", 5, "HTTP/1.0 100 Continue\r\n\r\n", -4},
      {"", "", 5, "", -4},
  };
  const ScratchFolder folder;
  for (const Case& c : cases) {
    SCOPED_TRACE(c.response);
    const std::string content = pattern(c.size);
    const std::string file = folder.make_file("f", content);
    DialogueServer server({{"PUT", ""}, {scripted::body, c.response}});
    EXPECT_EQ(zv_copy(file.c_str(), server.url("http", "/up/f", c.credentials).c_str()), c.result);
    EXPECT_EQ(server.heard(), "PUT /up/f HTTP/1.0\r\n" + c.header +
                                  "Content-Length: " + std::to_string(c.size) + "\r\n\r\n");
    EXPECT_TRUE(server.stored() == content);
  }
}

// The longest texts that a location can hold reach the server whole.
TEST(Http, LongestRequest) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("f", "x");
  DialogueServer server({{"PUT", ""}, {scripted::body, ok + "\r\n"}});
  const size_t room = 318 - (server.url("http", "", ":@").size() - 7);
  const std::string user(room / 3, 'u');
  const std::string path = "/" + std::string(room - 2 * user.size() - 1, 'p');
  const std::string url = server.url("http", path, user + ":" + user + "@");
  ASSERT_EQ(url.size(), 318u + 7);
  EXPECT_EQ(zv_copy(file.c_str(), url.c_str()), 0);
  EXPECT_TRUE(server.heard().starts_with("PUT " + path + " HTTP/1.0\r\nAuthorization: Basic dXV1"));
  EXPECT_TRUE(server.heard().ends_with("\r\nContent-Length: 1\r\n\r\n"));
}

}  // namespace
