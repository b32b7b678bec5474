// Every reply of every dialogue, with every fault that a reply can have: each copy ends in the
// documented result, at once, with nothing left open.
#include <gtest/gtest.h>

#include <chrono>
#include <string>
#include <vector>

#include "fixtures/dialogue_server.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

using namespace scripted;

struct Dialogue {
  const char* name;
  const char* scheme;
  const char* credentials;
  bool download;
  std::vector<Step> steps;
};

// Without a fault: what only a client that falls back on it hears.
constexpr std::string_view never_said = "never said";

// Each step's last column names the faults that the copy survives; any other is its network side's
// failure. What survives follows from three rules: only the last line of a receive counts, a code
// before the login is carried on, and a refused EHLO or AUTH LOGIN has its second choice.
const std::vector<Dialogue>& dialogues() {
  static const std::string http = "HTTP/1.0 200 ok\r\nContent-Length: 5\r\n\r\n";
  static const std::vector<Dialogue> all = {
      {"FTP download",
       "ftp",
       "",
       true,
       {{unasked, "220 ready\r\n", "x"},
        {"USER anonymous", "331 password\r\n", "x"},
        {"PASS zarvo@zarvo.test", "230 in\r\n"},
        {"TYPE I", "200 binary\r\n"},
        {"PASV", "227 at %\r\n"},
        {"RETR /f", "150 opening (5 bytes)\r\n"},
        {data_out, "hello", "b"},
        {unasked, "226 done\r\n"},
        {"QUIT", "221 bye\r\n", "x"}}},
      {"FTP upload",
       "ftp",
       "u:p@",
       false,
       {{unasked, "220 ready\r\n", "x"},
        {"USER u", "331 password\r\n", "x"},
        {"PASS p", "230 in\r\n"},
        {"TYPE I", "200 binary\r\n"},
        {"PASV", "227 at %\r\n"},
        {"STOR /f", "150 send\r\n"},
        {data_in, ""},
        {unasked, "226 done\r\n"},
        {"QUIT", "221 bye\r\n", "x"}}},
      {"HTTP GET", "http", "", true, {{"GET /f", http, "x"}, {unasked, "hello", "bx"}}},
      {"HTTP PUT", "http", "u:p@", false, {{"PUT /f", ""}, {body, http, "x"}}},
      {"mail",
       "smtp",
       "",
       false,
       {{unasked, "220 ready\r\n"},
        {"EHLO", "250-hello\r\n250 all\r\n", "wtnx"},
        {"HELO", "250 hello\r\n", never_said},
        {"MAIL FROM:", "250 ok\r\n", "x"},
        {"RCPT TO:f\r\n", "250 ok\r\n"},
        {"DATA", "354 go on\r\n"},
        {mail_end, "250 taken\r\n"},
        {"QUIT", "221 bye\r\n", "x"}}},
      {"mail with HELO",
       "smtp",
       "",
       false,
       {{unasked, "220 ready\r\n"},
        {"EHLO", "502 what\r\n", "wtnx"},
        {"HELO", "250 hello\r\n", "x"},
        {"MAIL FROM:", "250 ok\r\n"},
        {"RCPT TO:f\r\n", "251 forwarded\r\n"},
        {"DATA", "354 go on\r\n"},
        {mail_end, "250 taken\r\n"},
        {"QUIT", "221 bye\r\n", "x"}}},
      {"mail with AUTH LOGIN",
       "smtp",
       "u:p@",
       false,
       {{unasked, "220 ready\r\n"},
        {"EHLO", "250 hello\r\n", "wtnx"},
        {"HELO", "250 hello\r\n", never_said},
        {"AUTH LOGIN", "334 user\r\n", "x"},
        {"dQ==", "334 password\r\n"},
        {"cA==", "235 in\r\n"},
        {"MAIL FROM:", "250 ok\r\n", "x"},
        {"RCPT TO:f\r\n", "250 ok\r\n"},
        {"DATA", "354 go on\r\n"},
        {mail_end, "250 taken\r\n"},
        {"QUIT", "221 bye\r\n", "x"}}},
      {"mail with AUTH PLAIN",
       "smtp",
       "u:p@",
       false,
       {{unasked, "220 ready\r\n"},
        {"EHLO", "250 hello\r\n"},
        {"AUTH LOGIN", "504 not that\r\n", "wtn"},
        {"AUTH PLAIN", "334 go on\r\n"},
        {"AHUAcA==", "235 in\r\n"},
        {"MAIL FROM:", "250 ok\r\n", "x"},
        {"RCPT TO:f\r\n", "250 ok\r\n"},
        {"DATA", "354 go on\r\n"},
        {mail_end, "250 taken\r\n"},
        {"QUIT", "221 bye\r\n", "x"}}},
  };
  return all;
}

constexpr Fault faults[] = {Fault::wrong_code, Fault::cut_short, Fault::no_number, Fault::close,
                            Fault::reset,      Fault::bytewise,  Fault::with_next};

int copy_against(const Dialogue& dialogue, Fault fault, size_t step, const ScratchFolder& folder) {
  DialogueServer server(dialogue.steps, fault, step);
  const std::string remote = server.url(dialogue.scheme, "/f", dialogue.credentials);
  const std::string local = folder.path(dialogue.download ? "got" : "file");
  const auto begin = std::chrono::steady_clock::now();
  const int result = dialogue.download ? zv_copy(remote.c_str(), local.c_str())
                                       : zv_copy(local.c_str(), remote.c_str());
  // Far from a hang, even on a busy machine under Wine.
  EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(20));
  const std::string stored = server.stored();
  if (result == 0 && dialogue.download) {
    EXPECT_EQ(folder.content("got"), "hello");
  }
  if (result == 0 && dialogue.scheme != std::string("smtp") && !dialogue.download) {
    EXPECT_EQ(stored, "hello");
  }
  return result;
}

TEST(FaultMatrix, EveryReplyWithEveryFault) {
  const Network network;
  const ScratchFolder folder;
  folder.make_file("file", "hello");
  for (const Dialogue& dialogue : dialogues()) {
    const int before = open_handles();
    EXPECT_EQ(copy_against(dialogue, Fault::none, 0, folder), 0) << dialogue.name;
    for (size_t step = 0; step < dialogue.steps.size(); ++step) {
      const auto& [heard, said, survived] = dialogue.steps[step];
      for (const Fault fault : faults) {
        if (said.empty() || survived == never_said) continue;
        if (heard == data_out && fault == Fault::with_next) continue;
        SCOPED_TRACE(std::string(dialogue.name) + ": " + said + " with fault " +
                     static_cast<char>(fault));
        const bool survives = survived.find(static_cast<char>(fault)) != std::string_view::npos;
        const int failure = dialogue.download ? -3 : -4;
        EXPECT_EQ(copy_against(dialogue, fault, step, folder), survives ? 0 : failure);
      }
    }
    EXPECT_EQ(open_handles(), before) << dialogue.name;
  }
}

}  // namespace
