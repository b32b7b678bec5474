// The FTP client: what it sends, and what it makes of replies that no table of codes covers.
#include <gtest/gtest.h>

#include <chrono>
#include <initializer_list>
#include <string>
#include <thread>

#include "fixtures/dialogues.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

using namespace scripted;

const std::string anonymous = "USER anonymous\r\nPASS zarvo@zarvo.test\r\n";

enum Place { greeting, user, password, type, size, passive, retrieval, data, stored, end };

// The steps of a download.
Steps steps_with(Place place, const std::string& said) {
  Steps steps = ftp({{"RETR /a b\r\n", "150 opening (5 bytes)\r\n"}, {data_out, "hello"}});
  steps[place].said = said;
  return steps;
}

int download(const DialogueServer& server, const ScratchFolder& folder,
             const std::string& credentials = "") {
  return zv_copy(server.url("ftp", "/a%20b", credentials).c_str(), folder.path("got").c_str());
}

TEST(Ftp, Logins) {
  struct Case {
    const char* credentials;
    Place place;
    const char* said;
    std::string login;
  };
  const Case cases[] = {
      {"", user, "331 password\r\n", anonymous},
      {"u:p@", user, "331 password\r\n", "USER u\r\nPASS p\r\n"},
      {"u@", user, "331 password\r\n", "USER u\r\nPASS zarvo@zarvo.test\r\n"},
      {":p@", user, "331 password\r\n", "USER anonymous\r\nPASS p\r\n"},
      {"u:p@", user, "230 in\r\n", "USER u\r\n"},
      {"u:p@", greeting, "230 in\r\n", ""},
      {"u:p@", greeting, "220-a\r\n220-b\r\n220 c\r\n", "USER u\r\nPASS p\r\n"},
  };
  const ScratchFolder folder;
  for (const Case& c : cases) {
    SCOPED_TRACE(c.login);
    DialogueServer server(steps_with(c.place, c.said));
    EXPECT_EQ(download(server, folder, c.credentials), 0);
    EXPECT_EQ(server.heard(), c.login + "TYPE I\r\nPASV\r\nRETR /a b\r\nQUIT\r\n");
    EXPECT_EQ(folder.content("got"), "hello");
  }
}

TEST(Ftp, RepliesTakenApart) {
  struct Case {
    Place place;
    std::initializer_list<const char*> good, bad;
  };
  const Case cases[] = {
      {end,
       {"150 Opening (12 bytes)\r\n221 Done\r\n", "221 no carriage return\n\n\n", "\n\n221 bye",
        " +221\r\n", "221"},
       {"-221 bye\r\n", "bye 221\r\n", "221 a\r\nb\r\n", "99999999999 x\r\n", "4294967517 x\r\n",
        "\n\n"}},
      {retrieval,
       {"150 (5 bytes)", "150 ( 5)", "150 f (5) (9)", "150 (5x"},
       {"150 f(1) (5)", "150 (4 bytes)", "150 (6 bytes)", "150 (0 bytes)", "150 (-5 bytes)",
        "150 (five bytes)", "150 5 bytes", "150 (99999999999999999999)"}},
      {passive, {"227 %"}, {"227 nowhere", "227 (127,0,0,1,4)"}},
  };
  const ScratchFolder folder;
  const auto result_with = [&](Place place, const char* said) {
    return download(DialogueServer(steps_with(place, said)), folder);
  };
  for (const Case& c : cases) {
    for (const char* const said : c.good) EXPECT_EQ(result_with(c.place, said), 0) << said;
    for (const char* const said : c.bad) EXPECT_EQ(result_with(c.place, said), -3) << said;
  }
}

TEST(Ftp, ALineThatContinuesIsWaitedBehind) {
  const ScratchFolder folder;
  Steps steps = steps_with(greeting, "220-Welcome\r\n");
  const auto pause = [] { std::this_thread::sleep_for(std::chrono::milliseconds(200)); };
  steps.insert(steps.begin() + 1, {unasked, "220 ready\r\n", "", pause});
  steps[2].before = pause;  // so that this line and the answer to USER arrive apart
  EXPECT_EQ(download(DialogueServer(steps), folder), 0);
  EXPECT_EQ(download(DialogueServer(steps, Fault::close, 1), folder), -3);
  EXPECT_EQ(download(DialogueServer(steps, Fault::reset, 1), folder), -3);
}

TEST(Ftp, Uploads) {
  const ScratchFolder folder;
  for (const size_t length : {0u, 1u, 5000000u}) {
    const std::string content(length, 'x');
    DialogueServer server(ftp({{"STOR", "150 send\r\n"}, {data_in, ""}}));
    EXPECT_EQ(zv_copy(folder.make_file("file", content).c_str(),
                      server.url("ftp", "/in/f", "u:p@").c_str()),
              0);
    EXPECT_EQ(server.heard(), "USER u\r\nPASS p\r\nTYPE I\r\nPASV\r\nSTOR /in/f\r\nQUIT\r\n");
    EXPECT_EQ(server.stored(), content);
  }
}

}  // namespace
