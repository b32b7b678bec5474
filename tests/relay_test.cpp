// Copies between two network locations, and the temporary file between them.
#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "environment.h"
#include "fixtures/dialogues.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

using namespace scripted;
namespace fs = std::filesystem;
using Names = std::vector<std::string>;

const std::string length = "Content-Length: 5\r\n\r\n";

Names entries(const std::string& folder) {
  Names names;
  for (const auto& entry : fs::directory_iterator(folder))
    names.push_back(entry.path().filename().string());
  return names;
}

// The file keeps its name, in a folder that nobody else can read, and is gone at the end; a file of
// the user's beside it is not touched. Each leg's result is the copy's.
TEST(Relay, ThroughAPrivateFile) {
  struct Case {
    std::string source_reply, destination_reply;
    int result;
    const char* held;
  };
  const Case cases[] = {
      {"200", "201", 0, "hello"}, {"404", "201", -3, ""}, {"200", "403", -4, "hello"}};
  const ScratchFolder folder;
  folder.make_file("a b.txt", "the user's own");
  const Variable temporary("TMP", folder.path());
  for (const Case& c : cases) {
    std::string held;
    const auto look = [&] {
      for (const std::string& name : entries(folder.path())) {
        if (name == "a b.txt") continue;
        held = folder.content(name + "/a b.txt");
#ifndef _WIN32
        EXPECT_EQ(fs::status(folder.path(name)).permissions(), fs::perms::owner_all);
#endif
      }
    };
    DialogueServer source({{"GET /dir/a b.txt ", "HTTP/1.0 " + c.source_reply + "\r\n" + length},
                           {unasked, "hello"}});
    DialogueServer destination(
        {{"PUT /up ", ""}, {body, "HTTP/1.0 " + c.destination_reply + "\r\n\r\n", "", look}});
    EXPECT_EQ(zv_copy(source.url("http", "/dir/a%20b.txt").c_str(),
                      destination.url("http", "/up").c_str()),
              c.result);
    EXPECT_EQ(destination.stored(), c.held);
    EXPECT_EQ(held, c.held);
    EXPECT_EQ(entries(folder.path()), Names{"a b.txt"});
    EXPECT_EQ(folder.content("a b.txt"), "the user's own");
  }
}

// Names that would not be a file inside the private folder, and folders that cannot hold it. The
// servers are not asked for anything.
TEST(Relay, Refusals) {
  const ScratchFolder folder;
  const ScratchFolder beside;
  const std::string to = "http://127.0.0.1:" + std::to_string(closed_port()) + "/up";
  struct Case {
    std::string name, folder;
  };
  std::vector<Case> cases = {
      {"/" + std::string(120, 'f'), beside.path("missing")},
      {"/" + std::string(120, 'f'), beside.make_folder(std::string(200, 'd'))}};
  for (const char* const name : {"/", "/..", "/dir/.", "/..%5C..%5Cf", "/a%5Cb"})
    cases.push_back({name, folder.path()});
#ifdef _WIN32
  for (const char* const name :
       {"/f:stream", "/NUL", "/con.txt", "/aux%20.x", "/Com1", "/LPT%B9.x", "/conOUT$", "/f.",
        "/f%20", "/f?", "/f*", "/f%3C", "/f%22", "/f%7C", "/f%07"})
    cases.push_back({name, folder.path()});
#endif
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    const Variable temporary("TMP", c.folder);
    DialogueServer source({{"GET", "HTTP/1.0 200\r\n" + length + "hello"}});
    EXPECT_EQ(zv_copy(source.url("http", c.name).c_str(), to.c_str()), -3);
    EXPECT_EQ(source.heard(), "");
    EXPECT_TRUE(!fs::exists(c.folder) || fs::is_empty(c.folder));
  }
}

}  // namespace
