// Copies over the network: every fault that a reply can have, what the FTP client of zv_copy()
// sends and takes, and the private file between two servers.
#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <string>
#include <thread>
#include <vector>

#include "environment.h"
#include "fixtures/dialogues.h"
#include "handle.h"

namespace {

using namespace scripted;
namespace fs = std::filesystem;

// ---- Every reply of every dialogue, with every fault --------------------------------------------

int copy_against(const Dialogue& dialogue, bool with_handle, Fault fault, size_t step,
                 const ScratchFolder& folder) {
  DialogueServer server(dialogue.steps, fault, step);
  const Route route(dialogue, server, folder);
  const HandlePtr handle = new_handle();
  // What is cut short is waited for.
  if (fault == Fault::cut_short) zv_transfer_set(handle.get(), ZV_TRANSFER_SILENCE, 100);
  const auto begin = std::chrono::steady_clock::now();
  const int result = with_handle
                         ? zv_transfer_run(handle.get(), route.from.c_str(), route.to.c_str())
                         : zv_copy(route.from.c_str(), route.to.c_str());
  // Far from a hang, even on a busy machine under Wine.
  EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(20));
  const bool failed = with_handle && result != 0;
  EXPECT_EQ(zv_transfer_cause(handle.get(), nullptr) != ZV_CAUSE_NONE, failed);
  EXPECT_EQ(!reason(handle.get()).empty(), failed);
  EXPECT_TRUE(result != 0 || arrived(dialogue, server, folder));
  return result;
}

// Some bytes of a body can take the place of others.
bool is_tried(const Dialogue& dialogue, size_t number, bool with_handle, char fault) {
  const auto is_one_of = [fault](std::string_view faults) { return faults.find(fault) < 9; };
  const Step& step = dialogue.steps[number];
  const bool is_last = number + 1 == dialogue.steps.size();
  if (step.said.empty() || step.survived == never_said) return false;
  if (step.survived == handle_only && !with_handle) return false;
  if (!is_last && dialogue.steps[number + 1].survived == never_said && is_one_of("g")) return false;
  if (step.heard == data_out && is_one_of("xg")) return false;
  return !(with_handle && dialogue.scheme == "http" && step.heard == unasked && is_one_of("wn"));
}

void check_matrix(bool with_handle, std::string_view faults) {
  const ScratchFolder folder;
  folder.make_file("file", "hello");
  for (const Dialogue& dialogue : dialogues(with_handle)) {
    const int handles = open_handles();
    EXPECT_EQ(copy_against(dialogue, with_handle, Fault::none, 0, folder), 0) << dialogue.name;
    for (size_t i = 0; i < dialogue.steps.size(); ++i) {
      const Step& step = dialogue.steps[i];
      const std::string survived =
          with_handle ? "gs" + std::string(step.handled) : std::string(step.survived);
      for (const char fault : faults) {
        if (!is_tried(dialogue, i, with_handle, fault)) continue;
        SCOPED_TRACE(std::string(dialogue.name) + ": " + step.said + " with fault " + fault);
        EXPECT_EQ(copy_against(dialogue, with_handle, static_cast<Fault>(fault), i, folder),
                  survived.find(fault) != std::string::npos ? 0 : dialogue.network_failed());
      }
    }
    EXPECT_EQ(open_handles(), handles) << dialogue.name;
  }
}

TEST(FaultMatrix, OfACopy) {
  check_matrix(false, "wtncrbx");
}

TEST(FaultMatrix, OfAHandle) {
  check_matrix(true, "wtncrsg");
}

// ---- FTP ----------------------------------------------------------------------------------------

enum Place { greeting, user, password, type, size, passive, retrieval, data, stored, end };

// The steps of a download.
Steps steps_with(Place place, const std::string& said) {
  Steps steps = ftp({{"RETR /a b\r\n", "150 opening (5 bytes)\r\n"}, {data_out, "hello"}});
  steps[place].said = said;
  return steps;
}

int download(const DialogueServer& server, const std::string& credentials = "") {
  const ScratchFolder folder;
  const int result =
      zv_copy(server.url("ftp", "/a%20b", credentials).c_str(), folder.path("got").c_str());
  EXPECT_TRUE(result != 0 || folder.content("got") == "hello");
  return result;
}

TEST(Ftp, Logins) {
  const std::string anonymous = "USER anonymous\r\nPASS zarvo@zarvo.test\r\n";
  struct Case {
    const char* credentials;
    std::string login;
    Place place = user;
    const char* said = "331 password\r\n";
  };
  const Case cases[] = {
      {"", anonymous},
      {"u:p@", "USER u\r\nPASS p\r\n"},
      {"u@", "USER u\r\nPASS zarvo@zarvo.test\r\n"},
      {":p@", "USER anonymous\r\nPASS p\r\n"},
      {"u:p@", "USER u\r\n", user, "230 in\r\n"},
      {"u:p@", "", greeting, "230 in\r\n"},
      {"u:p@", "USER u\r\nPASS p\r\n", greeting, "220-a\r\n220-b\r\n220 c\r\n"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.login);
    DialogueServer server(steps_with(c.place, c.said));
    EXPECT_EQ(download(server, c.credentials), 0);
    EXPECT_EQ(server.heard(), c.login + "TYPE I\r\nPASV\r\nRETR /a b\r\nQUIT\r\n");
  }
}

TEST(Ftp, RepliesTakenApart) {
  struct Case {
    Place place;
    std::vector<const char*> good, bad;
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
  for (const Case& c : cases)
    for (const bool good : {true, false})
      for (const char* const said : good ? c.good : c.bad)
        EXPECT_EQ(download(DialogueServer(steps_with(c.place, said))), good ? 0 : -3) << said;
  Steps nothing = steps_with(retrieval, "150 (0 bytes)");
  nothing[data].said = "";
  EXPECT_EQ(download(DialogueServer(nothing)), -3);
}

TEST(Ftp, ALineThatContinuesIsWaitedBehind) {
  Steps steps = steps_with(greeting, "220-Welcome\r\n");
  const auto pause = [] { std::this_thread::sleep_for(std::chrono::milliseconds(200)); };
  steps.insert(steps.begin() + 1, {unasked, "220 ready\r\n", "", pause});
  steps[2].before = pause;  // so that this line and the answer to USER arrive apart
  EXPECT_EQ(download(DialogueServer(steps)), 0);
  EXPECT_EQ(download(DialogueServer(steps, Fault::close, 1)), -3);
  EXPECT_EQ(download(DialogueServer(steps, Fault::reset, 1)), -3);
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

// ---- Between two servers ------------------------------------------------------------------------

std::string hello_from(const std::string& code) {
  return "HTTP/1.0 " + code + " x\r\nContent-Length: 5\r\n\r\nhello";
}

// The file keeps its name, in a folder that nobody else can read, and is gone at the end; a file of
// the user's beside it is not touched. Each leg's result is the copy's. No program that another
// thread starts meanwhile gets a connection.
TEST(Relay, ThroughAPrivateFile) {
  struct Case {
    std::string source_reply, destination_reply;
    int result;
    std::string held;
  };
  const Case cases[] = {
      {"200", "201", 0, "hello"}, {"404", "201", -3, ""}, {"200", "403", -4, "hello"}};
  for (const bool with_handle : {false, true}) {
    for (const Case& c : cases) {
      SCOPED_TRACE(c.source_reply + c.destination_reply);
      const ScratchFolder folder;
      const Variable temporary("TMP", folder.path());
      folder.make_file("a b.txt", "the user's own");
      std::string held;
      unsigned port = 0;
      const auto look = [&] {
        EXPECT_EQ(private_connections(port), c.held.empty() ? 0 : 1);
        for (const auto& entry : fs::directory_iterator(folder.path())) {
          if (!entry.is_directory()) continue;
          held = folder.content(entry.path().filename().string() + "/a b.txt");
#ifndef _WIN32
          EXPECT_EQ(entry.status().permissions(), fs::perms::owner_all);
#endif
        }
      };
      DialogueServer source(
          {{"GET /dir/a", "HTTP/1.0 " + c.source_reply + " x\r\nContent-Length: 5\r\n\r\nhello"}});
      DialogueServer destination(
          {{"PUT /up ", ""}, {body, "HTTP/1.0 " + c.destination_reply + " x\r\n\r\n", "", look}});
      port = destination.port();
      const std::string from = source.url("http", "/dir/a%20b.txt");
      const std::string to = destination.url("http", "/up");
      const HandlePtr handle = new_handle();
      EXPECT_EQ(with_handle ? zv_transfer_run(handle.get(), from.c_str(), to.c_str())
                            : zv_copy(from.c_str(), to.c_str()),
                c.result);
      EXPECT_EQ(destination.stored(), c.held);
      EXPECT_EQ(held, c.held);
      fs::remove(folder.path("a b.txt"));
      EXPECT_TRUE(fs::is_empty(folder.path()));
    }
  }
}

// Names that would not be a file inside the private folder, and folders that cannot hold it. The
// server is not asked for anything, unless the file's path is as long as one may be.
TEST(Relay, Refusals) {
  const ScratchFolder folder;
  const std::string to = "http://127.0.0.1:" + std::to_string(closed_port()) + "/up";
  const std::string long_name = "/" + std::string(120, 'f');
  const size_t room = folder.path().size() + std::string("//zarvo-XXXXXX").size() + 121;
  const auto folder_for = [&](size_t length) {
    return folder.make_folder(std::string(length - room, 'd'));
  };
  struct Case {
    std::string name, folder;
    bool good = false;
  };
  std::vector<Case> cases = {{long_name, folder.path("missing")},
#ifndef _WIN32
                             {long_name, folder_for(318), true},
#endif
                             {long_name, folder_for(319)}};
  std::vector<const char*> names = {"/", "/..", "/dir/.", "/..%5C..%5Cf", "/a%5Cb"};
#ifdef _WIN32
  names.insert(names.end(),
               {"/f:stream", "/NUL", "/con.txt", "/aux%20.x", "/Com1", "/LPT%B9.x", "/conOUT$",
                "/f.", "/f%20", "/f?", "/f*", "/f%3C", "/f%22", "/f%7C", "/f%07"});
#endif
  for (const char* const name : names) cases.push_back({name, folder.make_folder("short")});
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    const Variable temporary("TMP", c.folder);
    DialogueServer source({{"GET", hello_from("200")}});
    EXPECT_EQ(zv_copy(source.url("http", c.name).c_str(), to.c_str()), c.good ? -4 : -3);
    EXPECT_EQ(source.heard().empty(), !c.good);
    EXPECT_TRUE(!fs::exists(c.folder) || fs::is_empty(c.folder));
  }
}

}  // namespace
