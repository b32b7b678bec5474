// The FTP client: what it sends, and what it makes of replies that no table of codes covers.
#include "transfer/ftp.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "fixtures/dialogue_server.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

using namespace scripted;

constexpr zv::platform::Address loopback = {{127, 0, 0, 1}};
const std::string anonymous = "USER anonymous\r\nPASS zarvo@zarvo.test\r\n";

// A server that lets everyone in and hands out, or takes, one file.
std::vector<Step> server_of(const std::string& opening = "150 opening (5 bytes)\r\n",
                            const std::string& passive = "227 at %\r\n") {
  return {{unasked, "220 ready\r\n"},
          {"USER", "331 password\r\n"},
          {"PASS", "230 in\r\n"},
          {"TYPE I\r\n", "200 binary\r\n"},
          {"PASV\r\n", passive},
          {"STOR", "150 send\r\n"},
          {data_in, ""},
          {unasked, "226 done\r\n"},
          {"QUIT\r\n", "221 bye\r\n"},
          {"RETR", opening},
          {data_out, "hello"},
          {unasked, "226 done\r\n"}};
}

int download(const DialogueServer& server, const ScratchFolder& folder,
             const std::string& credentials = "") {
  return zv_copy(server.url("ftp", "/pub/a%20b", credentials).c_str(), folder.path("got").c_str());
}

TEST(Ftp, Logins) {
  struct Case {
    const char* credentials;
    const char* greeting;
    const char* after_user;
    std::string login;
  };
  const Case cases[] = {
      {"", "220 ready\r\n", "331 password\r\n", anonymous},
      {"u:p@", "220 ready\r\n", "331 password\r\n", "USER u\r\nPASS p\r\n"},
      {"u@", "220 ready\r\n", "331 password\r\n", "USER u\r\nPASS zarvo@zarvo.test\r\n"},
      {":p@", "220 ready\r\n", "331 password\r\n", "USER anonymous\r\nPASS p\r\n"},
      {"u:p@", "220 ready\r\n", "230 in\r\n", "USER u\r\n"},
      {"u:p@", "230 in\r\n", "", ""},
      {"u:p@", "220-a\r\n220-b\r\n220 c\r\n", "331 password\r\n", "USER u\r\nPASS p\r\n"},
  };
  const ScratchFolder folder;
  for (const Case& c : cases) {
    SCOPED_TRACE(c.login);
    std::vector<Step> steps = server_of();
    steps[0].said = c.greeting;
    steps[1].said = c.after_user;
    DialogueServer server(steps);
    EXPECT_EQ(download(server, folder, c.credentials), 0);
    EXPECT_EQ(server.heard(), c.login + "TYPE I\r\nPASV\r\nRETR /pub/a b\r\nQUIT\r\n");
    EXPECT_EQ(folder.content("got"), "hello");
  }
}

TEST(Ftp, AnnouncedSize) {
  struct Case {
    const char* announced;
    int result;
  };
  const Case cases[] = {
      {"(5 bytes)", 0},   {"( 5)", 0},          {"f (5) (9)", 0},  {"(5x", 0},
      {"f(1) (5)", -3},   {"(4 bytes)", -3},    {"(6 bytes)", -3}, {"(0 bytes)", -3},
      {"(-5 bytes)", -3}, {"(five bytes)", -3}, {"5 bytes", -3},   {"(99999999999999999999)", -3},
  };
  const ScratchFolder folder;
  for (const Case& c : cases) {
    SCOPED_TRACE(c.announced);
    DialogueServer server(server_of("150 opening " + std::string(c.announced) + "\r\n"));
    EXPECT_EQ(download(server, folder), c.result);
  }
}

TEST(Ftp, PassiveAddress) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "hello");
  const unsigned closed = closed_port();
  for (const std::string& address :
       {std::string("nowhere"), std::string("(127,0,0,1,4)"),
        "(127,0,0,1," + std::to_string(closed / 256) + "," + std::to_string(closed % 256) + ")"}) {
    SCOPED_TRACE(address);
    DialogueServer from(server_of("", "227 at " + address + "\r\n"));
    EXPECT_EQ(download(from, folder), -3);
    EXPECT_EQ(from.heard(), anonymous + "TYPE I\r\nPASV\r\n");
    DialogueServer to(server_of("", "227 at " + address + "\r\n"));
    EXPECT_EQ(zv_copy(file.c_str(), to.url("ftp", "/f").c_str()), -4);
  }
}

TEST(Ftp, Uploads) {
  const ScratchFolder folder;
  for (const size_t size : std::vector<size_t>{0, 1, 5000000}) {
    const std::string content(size, 'x');
    DialogueServer server(server_of());
    EXPECT_EQ(zv_copy(folder.make_file("file", content).c_str(),
                      server.url("ftp", "/in/f", "u:p@").c_str()),
              0);
    EXPECT_EQ(server.heard(), "USER u\r\nPASS p\r\nTYPE I\r\nPASV\r\nSTOR /in/f\r\nQUIT\r\n");
    EXPECT_EQ(server.stored(), content);
  }
}

// A path as long as they come is sent whole; one with a line end is not sent at all.
TEST(Ftp, PathsInCommands) {
  const ScratchFolder folder;
  const std::string local = folder.path("got");
  const std::string path = "/" + std::string(318, 'p');
  DialogueServer long_path(server_of());
  EXPECT_EQ(zv::ftp_download(loopback, long_path.port(), "", "", path.c_str(), local.c_str()), 0);
  EXPECT_NE(long_path.heard().find("RETR " + path + "\r\n"), std::string::npos);

  for (const char* const injected : {"/f\r\nDELE g", "/f\nDELE g", "/f\rg"}) {
    DialogueServer server(server_of());
    EXPECT_EQ(zv::ftp_download(loopback, server.port(), "", "", injected, local.c_str()), -3);
    EXPECT_EQ(server.heard(), anonymous + "TYPE I\r\nPASV\r\n");
  }
}

}  // namespace
