// Copies between two network locations, and the temporary file between them.
#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "environment.h"
#include "fixtures/dialogue_server.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

using namespace scripted;
namespace fs = std::filesystem;

const std::string ok = "HTTP/1.0 200 ok\r\nContent-Length: 5\r\n\r\n";

std::vector<std::string> entries(const std::string& folder) {
  std::vector<std::string> names;
  for (const auto& entry : fs::directory_iterator(folder))
    names.push_back(entry.path().filename().string());
  return names;
}

// Each leg's result is the copy's; nothing of the user's is touched and nothing is left behind.
TEST(Relay, ResultsOfTheLegs) {
  struct Case {
    const char* source_reply;
    const char* destination_reply;
    int result;
    const char* stored;
  };
  const Case cases[] = {{"200", "201", 0, "hello"}, {"404", "201", -3, ""}, {"200", "403", -4, ""}};
  const ScratchFolder folder;
  folder.make_file("f.txt", "the user's own");
  const Variable temporary("TMP", folder.path());
  for (const Case& c : cases) {
    const std::string code = c.source_reply;
    DialogueServer source(
        {{"GET /dir/f.txt", "HTTP/1.0 " + code + " x\r\nContent-Length: 5\r\n\r\nhello"}});
    DialogueServer destination(
        {{"PUT /up", ""}, {body, "HTTP/1.0 " + std::string(c.destination_reply) + " x\r\n\r\n"}});
    EXPECT_EQ(
        zv_copy(source.url("http", "/dir/f.txt").c_str(), destination.url("http", "/up").c_str()),
        c.result);
    if (c.result == 0) {
      EXPECT_EQ(destination.stored(), c.stored);
    }
    EXPECT_EQ(entries(folder.path()), std::vector<std::string>{"f.txt"});
    EXPECT_EQ(folder.content("f.txt"), "the user's own");
  }
}

TEST(Relay, TheFileIsPrivateAndKeepsItsName) {
  const ScratchFolder folder;
  const Variable temporary("TMP", folder.path());
  DialogueServer source({{"GET /dir/a b.txt", ok + "hello"}});
  std::string held;
  auto rights = fs::perms::none;
  Server destination([&](Peer& peer) {
    peer.receive_until("\r\n\r\nhello");
    const std::string name = entries(folder.path()).at(0);
    rights = fs::status(folder.path(name)).permissions();
    held = folder.content(name + "/a b.txt");
    peer.send("HTTP/1.0 200 ok\r\n\r\n");
  });
  EXPECT_EQ(
      zv_copy(source.url("http", "/dir/a%20b.txt").c_str(), destination.url("http", "/up").c_str()),
      0);
  EXPECT_EQ(destination.outcome(), "");
  EXPECT_EQ(held, "hello");
#ifndef _WIN32
  EXPECT_EQ(rights, fs::perms::owner_all);
#endif
  EXPECT_TRUE(entries(folder.path()).empty());
}

// Names that would not be a file inside the private folder, and folders that cannot hold it. The
// servers are not asked for anything.
TEST(Relay, Refusals) {
  const ScratchFolder folder;
  const std::string to = "http://127.0.0.1:" + std::to_string(closed_port()) + "/up";
  Variable temporary("TMP", folder.path());
  std::vector<const char*> names = {"/", "/..", "/dir/.", "/..%5C..%5Cf", "/a%5Cb"};
#ifdef _WIN32
  names.insert(names.end(),
               {"/f:stream", "/NUL", "/con.txt", "/aux%20.x", "/Com1", "/LPT%B9.x", "/conOUT$",
                "/f.", "/f%20", "/f?", "/f*", "/f%3C", "/f%22", "/f%7C", "/f%07"});
#endif
  for (const char* const name : names) {
    SCOPED_TRACE(name);
    DialogueServer source({{"GET", ok + "hello"}});
    EXPECT_EQ(zv_copy(source.url("http", name).c_str(), to.c_str()), -3);
    EXPECT_EQ(source.heard(), "");
    EXPECT_TRUE(entries(folder.path()).empty());
  }
  const std::string deep = folder.make_folder(std::string(200, 'd'));
  for (const std::string& unusable : {folder.path("missing"), deep}) {
    temporary.set(unusable);
    DialogueServer source({{"GET", ok + "hello"}});
    EXPECT_EQ(zv_copy(source.url("http", "/" + std::string(120, 'f')).c_str(), to.c_str()), -3);
    EXPECT_EQ(source.heard(), "");
  }
  EXPECT_TRUE(entries(deep).empty());
}

}  // namespace
