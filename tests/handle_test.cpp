// Transfers with a handle: limits, cancels, causes and reasons.
#include "handle.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "fixtures/dialogues.h"
#include "scratch_folder.h"

namespace {

using namespace scripted;

struct Option {
  int option;
  int64_t value;
};

struct Outcome {
  int code, cause, number;
  std::string reason;
};

Outcome outcome_of(zv_transfer_t* handle, const std::string& from, const std::string& to) {
  Outcome outcome = {};
  outcome.code = zv_transfer_run(handle, from.c_str(), to.c_str());
  outcome.cause = zv_transfer_cause(handle, &outcome.number);
  outcome.reason = reason(handle);
  return outcome;
}

std::string repeated(const std::string& text, size_t count) {
  std::string all;
  for (; count != 0; --count) all += text;
  return all;
}

TEST(Handle, OptionsAndTheirRanges) {
  struct Case {
    int option;
    int64_t most;
  };
  const Case cases[] = {
      {ZV_TRANSFER_SILENCE, INT32_MAX},
      {ZV_TRANSFER_TIME, INT32_MAX},
      {ZV_TRANSFER_SPEED, INT64_MAX},
      {ZV_TRANSFER_SIZE, INT64_MAX},
      {ZV_TRANSFER_IN_PLACE, 1},
      {ZV_TRANSFER_KEEP, 1},
      {ZV_TRANSFER_SYNC, 1},
  };
  const HandlePtr handle = new_handle();
  for (const auto& [option, most] : cases) {
    for (const int64_t good : {int64_t{0}, int64_t{1}, most, int64_t{-1}})
      EXPECT_EQ(zv_transfer_set(handle.get(), option, good), 1) << option << " " << good;
    EXPECT_EQ(zv_transfer_set(handle.get(), option, -2), 0);
    if (most != INT64_MAX) {
      EXPECT_EQ(zv_transfer_set(handle.get(), option, most + 1), 0);
    }
  }
  EXPECT_EQ(zv_transfer_set(handle.get(), 0, 0), 0);
  EXPECT_EQ(zv_transfer_set(handle.get(), 8, 0), 0);

  EXPECT_EQ(zv_transfer_login(handle.get(), 2, "u", "p"), 0);
  EXPECT_EQ(zv_transfer_login(handle.get(), 0, "u\n", "p"), 0);
  EXPECT_EQ(zv_transfer_login(handle.get(), 1, "u", "p\r"), 0);
  EXPECT_EQ(zv_transfer_login(handle.get(), 1, "u", nullptr), 1);
  EXPECT_EQ(zv_transfer_login(handle.get(), 1, nullptr, nullptr), 1);
  EXPECT_EQ(zv_transfer_destroy(nullptr), 0);
}

// Nothing is changed while a handle runs, and its progress can be seen.
TEST(Handle, WhileItRuns) {
  const ScratchFolder folder;
  const HandlePtr handle = new_handle();
  int seen = 0;
  DialogueServer server(ftp({{"RETR /f\r\n", "150 opening (5 bytes)\r\n"},
                             {data_out, "hello", "", [&] {
                                int64_t done = -2;
                                int64_t total = -2;
                                EXPECT_EQ(zv_transfer_run(handle.get(), "a", "b"), -1);
                                EXPECT_EQ(zv_transfer_set(handle.get(), ZV_TRANSFER_SIZE, 1), 0);
                                EXPECT_EQ(zv_transfer_login(handle.get(), 0, "u", "p"), 0);
                                EXPECT_EQ(zv_transfer_watch(handle.get(), nullptr, nullptr), 0);
                                EXPECT_EQ(zv_transfer_reset(handle.get()), 0);
                                EXPECT_EQ(zv_transfer_progress(handle.get(), &done, &total), 1);
                                EXPECT_EQ(done, 0);
                                ++seen;
                              }}}));
  EXPECT_EQ(outcome_of(handle.get(), server.url("ftp", "/f"), folder.path("got")).reason, "");
  EXPECT_EQ(server.stored(), "");
  EXPECT_EQ(seen, 1);
  int64_t done = 0;
  int64_t total = 0;
  EXPECT_EQ(zv_transfer_progress(handle.get(), &done, &total), 0);
  EXPECT_EQ(done, 5);
  EXPECT_EQ(total, 5);
  EXPECT_EQ(zv_transfer_progress(handle.get(), nullptr, nullptr), 0);
}

TEST(Handle, LocationsThatAreRefused) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "hello");
  const std::string closed = "127.0.0.1:" + std::to_string(closed_port());
  struct Case {
    std::string location;
    int cause;
    std::string reason;
    int number = 0;
  };
  const Case cases[] = {
      {"", ZV_CAUSE_LOCATION, "no location"},
      {"gopher://h/x", ZV_CAUSE_LOCATION, "gopher:// is not spoken"},
      {"a+b-1.c://h/x", ZV_CAUSE_LOCATION, "a+b-1.c:// is not spoken"},
      {"http://h", ZV_CAUSE_LOCATION, "no path after the host"},
      {"http:///x", ZV_CAUSE_LOCATION, "no usable host"},
      {"ftp://a b/x", ZV_CAUSE_LOCATION, "no usable host"},
      {"ftp://::1/x", ZV_CAUSE_LOCATION, "no usable"},
      {"ftp://[::g]/x", ZV_CAUSE_LOCATION, "no IPv6 address"},
      {"ftp://[127.0.0.1]/x", ZV_CAUSE_LOCATION, "no IPv6 address"},
      {"ftp://[::1]x/f", ZV_CAUSE_LOCATION, "no usable host"},
      {"ftp://h:0/x", ZV_CAUSE_LOCATION, "no usable port"},
      {"ftp://h:65536/x", ZV_CAUSE_LOCATION, "no usable port"},
      {"ftp://h:+21/x", ZV_CAUSE_LOCATION, "no usable port"},
      {"ftp://h:21x/x", ZV_CAUSE_LOCATION, "no usable port"},
      {"ftp://h/a%00b", ZV_CAUSE_LOCATION, "a %00"},
      {"ftp://h/a%0Db", ZV_CAUSE_LOCATION, "a line end"},
      {"ftp://h/a\nb", ZV_CAUSE_LOCATION, "a line end"},
      {"ftp://u%0a@h/f", ZV_CAUSE_LOCATION, "a line end"},
      {"http://a%3Ab@h/f", ZV_CAUSE_LOCATION, "a user with a colon"},
      {"file://a%00b", ZV_CAUSE_LOCATION, "a %00"},
      {"file://", ZV_CAUSE_LOCATION, "no path"},
      {std::string(320, 'x'), ZV_CAUSE_LOCATION, "longer than 319"},
      {"ftp://h/" + std::string(8185, 'x'), ZV_CAUSE_LOCATION, "longer than 8192"},
      {"http://no-such-host.invalid/f", ZV_CAUSE_LOOKUP, "look up no-such-host.invalid: "},
      {"http://127.1/f", ZV_CAUSE_LOOKUP, "look up 127.1: "},
      {"http://127.0.0.256/f", ZV_CAUSE_LOOKUP, "look up 127.0.0.256: "},
      {"http://0x7f000001/f", ZV_CAUSE_LOOKUP, "look up 0x7f000001: "},
      {"http://" + closed + "/f", ZV_CAUSE_CONNECT, "connect to " + closed + ": Connection refused",
       ECONNREFUSED},
  };
  const HandlePtr handle = new_handle();
  for (const Case& c : cases) {
    SCOPED_TRACE(c.location.substr(0, 40));
    for (const bool is_source : {true, false}) {
      const Outcome outcome = is_source ? outcome_of(handle.get(), c.location, folder.path("new"))
                                        : outcome_of(handle.get(), file, c.location);
      EXPECT_EQ(outcome.code, is_source ? -3 : -4);
      EXPECT_EQ(outcome.cause, c.cause);
      EXPECT_EQ(outcome.number, c.number);
      EXPECT_NE(outcome.reason.find(c.reason), std::string::npos) << outcome.reason;
      EXPECT_FALSE(folder.exists("new"));
    }
  }
  EXPECT_EQ(outcome_of(handle.get(), "smtp://h/x", file).cause, ZV_CAUSE_LOCATION);
}

// ---- What servers say ---------------------------------------------------------------------------

const std::string ok = "HTTP/1.1 200 OK\r\n";
const std::string chunked = ok + "Transfer-Encoding: chunked\r\n\r\n";

struct Answer {
  std::string answer;
  int cause;
  std::string content;  // after a success
  std::string reason = "";
  int number = 0;
};

TEST(Handle, HttpAnswers) {
  const std::string head = ok + "Content-Length: ";
  const std::string line = "X: " + std::string(8188, 'x') + "\r\n";
  const Answer cases[] = {
      {head + "5\r\n\r\nhello", ZV_CAUSE_NONE, "hello"},
      {head + "4\r\n\r\nhello", ZV_CAUSE_NONE, "hell"},
      {head + "0\r\n\r\n", ZV_CAUSE_NONE, ""},
      {head + "5\r\ncontent-length:5, 5\r\n\r\nhello", ZV_CAUSE_NONE, "hello"},
      {"HTTP/1.0 203 \nX\ncontent-Length : 5 \n\nhello", ZV_CAUSE_NONE, "hello"},
      {"HTTP/1.1 100 Go\r\n\r\nHTTP/1.1 103 x\r\nLink: y\r\n\r\n" + ok + "\r\nhello", ZV_CAUSE_NONE,
       "hello"},
      {ok + line + "\r\nhello", ZV_CAUSE_NONE, "hello"},
      {ok + "\r\n", ZV_CAUSE_NONE, ""},
      {chunked + "2\r\nhe\r\n03 ;a=\"b\"\r\nllo\r\n0\r\nX: y\r\n\r\nmore", ZV_CAUSE_NONE, "hello"},
      {chunked + "0\r\n\r\n", ZV_CAUSE_NONE, ""},
      {ok + "Content-Length: 9\r\ntransfer-encoding:Chunked\r\n\r\n5\r\nhello\r\n0\r\n\r\n",
       ZV_CAUSE_NONE, "hello"},

      {head + "6\r\n\r\nhello", ZV_CAUSE_CLOSED, "", "GET /f: the connection was closed"},
      {chunked + "5\r\nhell", ZV_CAUSE_CLOSED, ""},
      {chunked + "5\r\nhello\r\n", ZV_CAUSE_CLOSED, ""},
      {chunked + "5\r\nhello\r\n0\r\n", ZV_CAUSE_CLOSED, ""},
      {ok + "X: y\r\n", ZV_CAUSE_CLOSED, ""},
      {"", ZV_CAUSE_CLOSED, ""},
      {head + "5\r\nContent-Length: 6\r\n\r\nhello", ZV_CAUSE_PROTOCOL, ""},
      {head + "5, 6\r\n\r\nhello", ZV_CAUSE_PROTOCOL, ""},
      {head + "\r\n\r\nhello", ZV_CAUSE_PROTOCOL, ""},
      {head + "+5\r\n\r\nhello", ZV_CAUSE_PROTOCOL, ""},
      {head + "-5\r\n\r\nhello", ZV_CAUSE_PROTOCOL, ""},
      {head + "5x\r\n\r\nhello", ZV_CAUSE_PROTOCOL, ""},
      {head + "9223372036854775808\r\n\r\nhello", ZV_CAUSE_PROTOCOL, ""},
      {ok + "Transfer-Encoding: gzip, chunked\r\n\r\nhello", ZV_CAUSE_PROTOCOL, ""},
      {chunked + "5\r\nhellox\r\n0\r\n\r\n", ZV_CAUSE_PROTOCOL, ""},
      {chunked + "-1\r\n", ZV_CAUSE_PROTOCOL, ""},
      {chunked + "x\r\n", ZV_CAUSE_PROTOCOL, ""},
      {chunked + "5 5\r\nhello", ZV_CAUSE_PROTOCOL, ""},
      {chunked + "10000000000000000\r\nhello", ZV_CAUSE_PROTOCOL, ""},
      {chunked + "0\r\n" + repeated(line, 9), ZV_CAUSE_PROTOCOL, ""},
      {ok + repeated(line, 9), ZV_CAUSE_PROTOCOL, "", "longer than 64 KiB"},
      {ok + std::string(9000, 'x'), ZV_CAUSE_PROTOCOL, "", "longer than 8 KiB"},
      {"ICY 200 OK\r\n\r\n", ZV_CAUSE_PROTOCOL, "", "no HTTP"},
      {"HTTP/1.1 2000 OK\r\n\r\n", ZV_CAUSE_PROTOCOL, ""},
      {"HTTP/1.1 99 OK\r\n\r\n", ZV_CAUSE_PROTOCOL, ""},
      {"HTTP/1.1 101 Other\r\n\r\n", ZV_CAUSE_PROTOCOL, ""},
      {"HTTP/1.1 404 Not Found\r\n\r\n", ZV_CAUSE_REFUSED, "", "GET /f: 404 Not Found", 404},
      {"HTTP/1.1 204 Empty\r\n\r\n", ZV_CAUSE_REFUSED, "", "204", 204},
      {"HTTP/1.1 206 Part\r\n\r\n", ZV_CAUSE_REFUSED, "", "206", 206},
      {"HTTP/1.1 304 Same\r\n\r\n", ZV_CAUSE_REFUSED, "", "304", 304},
      {"HTTP/1.1 401 \x1b[31mno\x07\xc2\x9bm\r\n\r\n", ZV_CAUSE_LOGIN, "", "401 ?[31mno???m", 401},
      {"HTTP/1.1 403 not with secret\r\n\r\n", ZV_CAUSE_REFUSED, "", "GET /f: 403", 403},
      {"HTTP/1.1 403 nor dTpzZWNyZXQ=\r\n\r\n", ZV_CAUSE_REFUSED, "", "GET /f: 403", 403},
      {"HTTP/1.1 429 Later\r\n\r\n", ZV_CAUSE_REFUSED_NOW, "", "429", 429},
      {"HTTP/1.1 503 Later\r\n\r\n", ZV_CAUSE_REFUSED_NOW, "", "503", 503},
      {"HTTP/1.1 501 Never\r\n\r\n", ZV_CAUSE_REFUSED, "", "501", 501},
      {"HTTP/1.1 302 Off\r\nLocation: file:///etc/passwd\r\n\r\n", ZV_CAUSE_REFUSED, "", "302",
       302},
      {"HTTP/1.1 302 Off\r\nLocation: ftp://127.0.0.1/f\r\n\r\n", ZV_CAUSE_REFUSED, "", "302", 302},
      {"HTTP/1.1 302 Off\r\nLocation: http://a b/f\r\n\r\n", ZV_CAUSE_REFUSED, "", "302", 302},
      {"HTTP/1.1 302 Off\r\n\r\n", ZV_CAUSE_REFUSED, "", "302", 302},
  };
  const ScratchFolder folder;
  const HandlePtr handle = new_handle();
  for (const Answer& c : cases) {
    SCOPED_TRACE(c.answer.substr(0, 80));
    DialogueServer server({{"GET", c.answer}});
    folder.make_file("got", "old");
    const Outcome outcome =
        outcome_of(handle.get(), server.url("http", "/f", "u:secret@"), folder.path("got"));
    EXPECT_EQ(outcome.code, c.cause == ZV_CAUSE_NONE ? 0 : -3);
    EXPECT_EQ(outcome.cause, c.cause);
    EXPECT_EQ(outcome.number, c.number);
    EXPECT_NE(outcome.reason.find(c.reason), std::string::npos) << outcome.reason;
    EXPECT_EQ(outcome.reason.find("secret"), std::string::npos);
    EXPECT_EQ(folder.content("got"), c.cause == ZV_CAUSE_NONE ? c.content : "old");
  }
}

TEST(Handle, HttpRequests) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "hello");
  const std::string agent =
      "\r\nUser-Agent: zarvo/" + std::string(zarvo_version()) + "\r\nAccept-Encoding: identity\r\n";
  const std::string end = "Connection: close\r\n\r\n";
  struct Case {
    std::string path, credentials, target, login;
  };
  const Case cases[] = {
      {"/a%20b c?d=%zz#e", "", "/a%20b%20c?d=%zz", ""},
      {"/\xc3\xa4\"<>[]^`{|}\x7f", "", "/%C3%A4%22%3C%3E%5B%5D%5E%60%7B%7C%7D%7F", ""},
      {"/f", "u@", "/f", "Authorization: Basic dTo=\r\n"},
      {"/f", "u%40:p%2F@", "/f", "Authorization: Basic dUA6cC8=\r\n"},
  };
  const HandlePtr handle = new_handle();
  for (const Case& c : cases) {
    DialogueServer get({{"GET", ok + "Content-Length: 0\r\n\r\n"}});
    EXPECT_EQ(
        outcome_of(handle.get(), get.url("http", c.path, c.credentials), folder.path("got")).reason,
        "");
    const std::string host = "Host: 127.0.0.1:" + std::to_string(get.port());
    EXPECT_EQ(get.heard(), "GET " + c.target + " HTTP/1.1\r\n" + host + agent + c.login + end);
  }
  for (const char* const answer : {"HTTP/1.1 100 Go\r\n\r\nHTTP/1.1 201 Made\r\n\r\n",
                                   "HTTP/1.1 204 Empty\r\n\r\n", "HTTP/1.1 403 No\r\n\r\n"}) {
    DialogueServer put({{"PUT", ""}, {body, answer}});
    zv_transfer_login(handle.get(), 1, "u", "p");
    const Outcome outcome = outcome_of(handle.get(), file, put.url("http", "/f", "x:y@"));
    const bool refused = std::string(answer).find("403") != std::string::npos;
    EXPECT_EQ(outcome.code, refused ? -4 : 0);
    EXPECT_EQ(outcome.reason, refused ? "PUT /f: 403 No; the destination may hold a part" : "");
    EXPECT_EQ(put.stored(), "hello");
    EXPECT_EQ(put.heard(), "PUT /f HTTP/1.1\r\nHost: 127.0.0.1:" + std::to_string(put.port()) +
                               agent + "Authorization: Basic dTpw\r\nContent-Length: 5\r\n" + end);
  }
}

// What a server says before it has the whole body is why it takes no more.
TEST(Handle, EarlyAnswers) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", std::string(30000000, 'x'));
  const HandlePtr handle = new_handle();
  DialogueServer put({{"PUT", "HTTP/1.1 413 Too large\r\n\r\n"}, {until_closed, ""}});
  EXPECT_EQ(outcome_of(handle.get(), file, put.url("http", "/f")).reason,
            "PUT /f: 413 Too large; the destination may hold a part");
  DialogueServer stor(ftp({{"STOR", "150 send\r\n452 full\r\n"}, {data_in, ""}}));
  EXPECT_EQ(outcome_of(handle.get(), file, stor.url("ftp", "/f")).reason,
            "STOR /f: 452 full; the destination may hold a part");
}

// Five redirects, the login for its own server alone, and no way to go on in a circle.
TEST(Handle, Redirects) {
  const ScratchFolder folder;
  const HandlePtr handle = new_handle();
  DialogueServer last({{"GET /d ", ok + "Content-Length: 5\r\n\r\nhello"}});
  DialogueServer first(
      {{"GET", "HTTP/1.1 307 x\r\nLocation: " + last.url("http", "/a/../d", "x:y@") + "\r\n\r\n"}});
  EXPECT_EQ(outcome_of(handle.get(), first.url("http", "/f", "u:p@"), folder.path("got")).reason,
            "");
  EXPECT_EQ(folder.content("got"), "hello");
  EXPECT_NE(first.heard().find("Authorization: Basic dTpw"), std::string::npos);
  EXPECT_EQ(last.heard().find("Authorization"), std::string::npos);
}

struct FtpCase {
  Steps transfer;
  int cause;
  int number;
  std::string reason;
  std::vector<Option> options = {};
};

TEST(Handle, FtpReplies) {
  const auto pause = [] { std::this_thread::sleep_for(std::chrono::milliseconds(200)); };
  const Step retr = {"RETR", "150 opening\r\n"};
  const Step hello = {data_out, "hello"};
  const Step done = {unasked, "226 done\r\n"};
  const auto size = [](const std::string& reply) { return Step{"SIZE", reply + "\r\n"}; };
  const FtpCase cases[] = {
      {{size("213 5"), retr, hello, done}, ZV_CAUSE_NONE, 0, ""},
      {{retr, hello, done}, ZV_CAUSE_NONE, 0, ""},
      {{{"RETR", "125 (f) already (5 bytes)\r\n"}, hello, done}, ZV_CAUSE_NONE, 0, ""},
      {{size("550 no"), retr, hello, done}, ZV_CAUSE_NONE, 0, ""},
      {{size("213 0"), retr, {data_out, ""}, done}, ZV_CAUSE_NONE, 0, ""},
      {{{"RETR", "150-a\r\n 150 b\r\n151 c\r\n150-d\r\n150\r\n"}, hello, done},
       ZV_CAUSE_NONE,
       0,
       ""},
      {{size("213 6"), retr, hello}, ZV_CAUSE_CLOSED, 0, "RETR /f: the connection was closed"},
      {{size("213 4"), retr, hello}, ZV_CAUSE_PROTOCOL, 0, "more bytes than were told"},
      {{size("213 9223372036854775808")}, ZV_CAUSE_PROTOCOL, 0, "SIZE /f: "},
      {{size("213 -5")}, ZV_CAUSE_PROTOCOL, 0, "SIZE /f: "},
      {{size("213 5")}, ZV_CAUSE_TOO_LARGE, 0, "larger", {{ZV_TRANSFER_SIZE, 4}}},
      {{retr, hello}, ZV_CAUSE_TOO_LARGE, 0, "larger", {{ZV_TRANSFER_SIZE, 4}}},
      {{{"RETR", "550 No such file.\r\n"}}, ZV_CAUSE_REFUSED, 550, "RETR /f: 550 No such file."},
      {{{"RETR", "450 busy\r\n"}}, ZV_CAUSE_REFUSED_NOW, 450, "RETR /f: 450 busy"},
      {{{"RETR",
         "550 \x1b[2J\x9b"
         "1m\r\n"}},
       ZV_CAUSE_REFUSED,
       550,
       "550 ?[2J"},
      {{{"RETR", "250 done\r\n"}}, ZV_CAUSE_PROTOCOL, 250, "RETR /f: 250"},
      {{{"RETR", "999 what\r\n"}}, ZV_CAUSE_PROTOCOL, 0, "without a code"},
      {{{"RETR", "150-" + repeated("x\r\n150-", 20000)}}, ZV_CAUSE_PROTOCOL, 0, "64 KiB"},
      {{{"RETR", std::string(9000, '1')}}, ZV_CAUSE_PROTOCOL, 0, "8 KiB"},
      {{{"RETR", ""}},
       ZV_CAUSE_SILENCE,
       0,
       "RETR /f: no reply within 0.3 s",
       {{ZV_TRANSFER_SILENCE, 300}}},
      {{{"RETR", ""}}, ZV_CAUSE_TIME, 0, "within 0.35 s", {{ZV_TRANSFER_TIME, 350}}},
      {{{unasked, repeated("120 x\r\n", 5000000)}},
       ZV_CAUSE_SILENCE,
       0,
       "no reply within 0.1 s",
       {{ZV_TRANSFER_SILENCE, 100}}},
      {{{unasked, "421 full\r\n"}}, ZV_CAUSE_REFUSED_NOW, 421, "421 full"},
      {{{unasked, "530 no\r\n"}}, ZV_CAUSE_REFUSED, 530, "530 no"},
      {{{"PASS", "530 no secret\r\n"}}, ZV_CAUSE_LOGIN, 530, "PASS: 530"},
      {{{"PASS", "421 later\r\n"}}, ZV_CAUSE_REFUSED_NOW, 421, "PASS: 421 later"},
      {{{"USER", "332 account\r\n"}}, ZV_CAUSE_LOGIN, 332, "332"},
      {{{"PASS", "202 in\r\n"}, retr, hello, done}, ZV_CAUSE_NONE, 0, ""},
      {{{"PASV", "227 &\r\n"}, retr, hello, done}, ZV_CAUSE_NONE, 0, ""},
      {{{"RETR", "1"}, {unasked, "50", "", pause}, {unasked, " go\r\n", "", pause}},
       ZV_CAUSE_SILENCE,
       0,
       "RETR /f: no reply within 0.3 s",
       {{ZV_TRANSFER_SILENCE, 300}}},
      {{{"PASV", "227 no numbers\r\n"}}, ZV_CAUSE_PROTOCOL, 227, "PASV: 227"},
      {{{"PASV", "227 (127,0,0,256,1,1)\r\n"}}, ZV_CAUSE_PROTOCOL, 227, "PASV: 227"},
      {{{"PASV", "227 (127,0,0,1,0,0)\r\n"}}, ZV_CAUSE_PROTOCOL, 227, "PASV: 227"},
      {{{"PASV", "502 no\r\n"}}, ZV_CAUSE_REFUSED, 502, "PASV: 502 no"},
  };
  const ScratchFolder folder;
  for (const FtpCase& c : cases) {
    SCOPED_TRACE(c.transfer[0].said.substr(0, 60) + " " + c.reason);
    // What a case says stands before what is usual, but for another greeting.
    Steps steps = c.transfer;
    for (const Step& usual : ftp({})) steps.push_back(usual);
    std::rotate(steps.begin(), steps.begin() + static_cast<long>(c.transfer.size()),
                steps.begin() + static_cast<long>(c.transfer.size()) + 1);
    steps.resize(steps.size() - 2);
    if (c.transfer[0].heard == unasked) steps = c.transfer;
    DialogueServer server(steps);
    const HandlePtr handle = new_handle();
    for (const Option& option : c.options)
      EXPECT_EQ(zv_transfer_set(handle.get(), option.option, option.value), 1);
    folder.make_file("got", "old");
    const Outcome outcome =
        outcome_of(handle.get(), server.url("ftp", "/f", "u:secret@"), folder.path("got"));
    EXPECT_EQ(outcome.code, c.cause == ZV_CAUSE_NONE ? 0 : -3);
    EXPECT_EQ(outcome.cause, c.cause) << outcome.reason;
    EXPECT_EQ(outcome.number, c.number);
    EXPECT_NE(outcome.reason.find(c.reason), std::string::npos) << outcome.reason;
    EXPECT_EQ(outcome.reason.find("secret"), std::string::npos);
  }
}

TEST(Handle, MailReplies) {
  struct Case {
    Step changed;  // takes the place of the step that hears the same
    int cause;
    int number;
    std::string reason;
    const char* recipient = "/r%40x.test";
  };
  const auto login = [](const std::string& reply) { return Step{"AUTH LOGIN", reply + "\r\n"}; };
  const Case cases[] = {
      {{unasked, "421 busy\r\n"}, ZV_CAUSE_REFUSED_NOW, 421, "421 busy"},
      {{"EHLO", "421 busy\r\n"}, ZV_CAUSE_REFUSED_NOW, 421, "EHLO"},
      {{"cHc=", "535 not pw\r\n"}, ZV_CAUSE_LOGIN, 535, "AUTH LOGIN: 535"},
      {login("454 later"), ZV_CAUSE_REFUSED_NOW, 454, "AUTH LOGIN: 454 later"},
      {{"MAIL", "550 no\r\n"}, ZV_CAUSE_REFUSED, 550, "MAIL FROM:<"},
      {{"RCPT", "450 grey\r\n"}, ZV_CAUSE_REFUSED_NOW, 450, "RCPT TO:<r@x.test>: 450 grey"},
      {{"DATA", "250 ok\r\n"}, ZV_CAUSE_PROTOCOL, 250, "DATA"},
      {{mail_end, "552 full\r\n"}, ZV_CAUSE_REFUSED, 552, "552 full"},
      {{mail_end, ""}, ZV_CAUSE_SILENCE, 0, "may have been delivered"},
      {{"-", ""}, ZV_CAUSE_LOCATION, 0, "not an address", "/r%20x"},
      {{"-", ""}, ZV_CAUSE_LOCATION, 0, "not an address", "/"},
      {{"-", ""}, ZV_CAUSE_NONE, 0, ""},
  };
  const ScratchFolder folder;
  for (const Case& c : cases) {
    SCOPED_TRACE(c.changed.said + c.reason);
    Steps steps = mail({{"EHLO", "250 hello\r\n"},
                        login("334 user"),
                        {"dUBkLnRlc3Q=\r\n", "334 password\r\n"},
                        {"cHc=\r\n", "235 in\r\n"}});
    for (Step& step : steps)
      if (step.heard.starts_with(c.changed.heard) &&
          (c.changed.heard != unasked || step.heard == unasked))
        step.said = c.changed.said;
    DialogueServer server(steps);
    const HandlePtr handle = new_handle();
    zv_transfer_set(handle.get(), ZV_TRANSFER_SILENCE, c.cause == ZV_CAUSE_SILENCE ? 300 : 10000);
    const Outcome outcome = outcome_of(handle.get(), folder.make_file("a b.txt", "hello"),
                                       server.url("smtp", c.recipient, "u%40d.test:pw@"));
    EXPECT_EQ(outcome.code, c.cause == ZV_CAUSE_NONE ? 0 : -4);
    EXPECT_EQ(outcome.cause, c.cause) << outcome.reason;
    EXPECT_EQ(outcome.number, c.number);
    EXPECT_NE(outcome.reason.find(c.reason), std::string::npos) << outcome.reason;
    EXPECT_EQ(outcome.reason.find("pw"), std::string::npos) << outcome.reason;
    const bool delivered = outcome.reason.find("delivered") != std::string::npos;
    EXPECT_EQ(delivered, c.cause == ZV_CAUSE_SILENCE);
  }
}

// Around every piece in which a file leaves: its lines are those of its bytes.
TEST(Handle, MailOfEverySize) {
  const ScratchFolder folder;
  const std::string bytes48 = "0123456789 abcdefghijklmnopqrstuvwxyz, and a dot";
  const std::string line48 = "MDEyMzQ1Njc4OSBhYmNkZWZnaGlqa2xtbm9wcXJzdHV2d3h5eiwgYW5kIGEgZG90\r\n";
  struct Case {
    size_t lines;
    std::string rest, last;
  };
  const Case cases[] = {
      {0, "", "\r\n"}, {0, "rest", "cmVzdA==\r\n"}, {1024, "", ""}, {5500, "r", "cg==\r\n"}};
  for (const Case& c : cases) {
    SCOPED_TRACE(c.lines);
    const std::string file = folder.make_file("f", repeated(bytes48, c.lines) + c.rest);
    DialogueServer server(mail({{"EHLO", "250 hello\r\n"}}));
    const HandlePtr handle = new_handle();
    EXPECT_EQ(outcome_of(handle.get(), file, server.url("smtp", "/r%40x.test")).reason, "");
    const std::string& heard = server.heard();
    EXPECT_TRUE(heard.ends_with("\r\n\r\n" + repeated(line48, c.lines) + c.last +
                                "--===ZV_BOUNDARY_QM===--\r\n.\r\nQUIT\r\n"))
        << heard.substr(0, 1500);
    EXPECT_NE(heard.find("\r\nRCPT TO:<r@x.test>\r\nDATA\r\n"), std::string::npos);
  }
}

// ---- Limits of bodies, and cancels --------------------------------------------------------------

TEST(Handle, BodiesMustMove) {
  const ScratchFolder folder;
  const auto pause = [] { std::this_thread::sleep_for(std::chrono::milliseconds(200)); };
  struct Case {
    std::vector<Option> options;
    int cause;
  };
  const Case cases[] = {
      {{{ZV_TRANSFER_SILENCE, 1000}, {ZV_TRANSFER_SPEED, 0}}, ZV_CAUSE_NONE},
      {{{ZV_TRANSFER_SILENCE, 500}, {ZV_TRANSFER_SPEED, 1000}}, ZV_CAUSE_SPEED},
      {{{ZV_TRANSFER_SILENCE, 100}}, ZV_CAUSE_SILENCE},
      {{{ZV_TRANSFER_SILENCE, 0}, {ZV_TRANSFER_SPEED, 1000}}, ZV_CAUSE_NONE},
  };
  for (const Case& c : cases) {
    const HandlePtr handle = new_handle();
    for (const Option& option : c.options)
      zv_transfer_set(handle.get(), option.option, option.value);
    Steps steps = {{"GET", ok + "Content-Length: 5\r\n\r\n"}};
    for (const char* const letter : {"h", "e", "l", "l", "o"})
      steps.push_back({unasked, letter, "", pause});
    DialogueServer server(steps);
    EXPECT_EQ(outcome_of(handle.get(), server.url("http", "/f"), folder.path("got")).cause,
              c.cause);
  }
}

// At each step: by another thread, and by the watch. Nothing is left of a download.
TEST(Handle, CancelledAtEachStep) {
  const ScratchFolder folder;
  folder.make_file("file", "hello");
  for (const Dialogue& dialogue : dialogues()) {
    for (size_t step = 0; step < dialogue.steps.size(); ++step) {
      const std::string_view heard = dialogue.steps[step].heard;
      if (dialogue.steps[step].handled.find('0') != std::string_view::npos ||
          dialogue.steps[step].survived == never_said)
        continue;
      for (const bool by_watch : {false, true}) {
        // After a whole body the last reply may be there before the watch is asked.
        if (by_watch && (heard == data_in || heard == mail_end)) continue;
        SCOPED_TRACE(dialogue.name + std::to_string(step));
        const HandlePtr handle = new_handle();
        std::atomic<int> stop = 0;
        const auto watch = [](void* context, int64_t, int64_t) {
          return static_cast<std::atomic<int>*>(context)->load();
        };
        zv_transfer_watch(handle.get(), watch, &stop);
        Steps steps = dialogue.steps;
        steps[step].before = [&] {
          by_watch ? void(stop = 1) : void(zv_transfer_cancel(handle.get()));
        };
        DialogueServer server(steps, Fault::silent, step);
        const Route route(dialogue, server, folder);
        const auto begin = std::chrono::steady_clock::now();
        const Outcome outcome = outcome_of(handle.get(), route.from, route.to);
        EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(5));
        // An upload may just read its file.
        EXPECT_TRUE(outcome.code == dialogue.network_failed() ||
                    (!dialogue.download && outcome.code == -3));
        EXPECT_EQ(outcome.cause, ZV_CAUSE_CANCELLED) << outcome.reason;
        EXPECT_TRUE(outcome.reason.starts_with("cancelled"));
        EXPECT_FALSE(folder.exists("got"));
        // It stays until it is forgotten.
        EXPECT_EQ(outcome_of(handle.get(), folder.path("file"), folder.path("new")).code, -3);
        EXPECT_EQ(zv_transfer_reset(handle.get()), 1);
        EXPECT_EQ(zv_transfer_cause(handle.get(), nullptr), ZV_CAUSE_NONE);
      }
    }
  }
}

}  // namespace
