// The mail sender byte for byte, and the clients' parts whose rules no server shows.
#include <gtest/gtest.h>

#include <ctime>
#include <regex>
#include <string>

#include "environment.h"
#include "fixtures/dialogues.h"
#include "scratch_folder.h"
#include "transfer/base64.h"
#include "transfer/body.h"
#include "transfer/connection.h"
#include "transfer/date_line.h"
#include "transfer/ftp.h"
#include "transfer/mail_message.h"
#include "transfer/reply.h"
#include "transfer/smtp.h"
#include "zarvo.h"

namespace {

using namespace scripted;

zv::Location location_at(unsigned port, std::string_view user, std::string_view path) {
  zv::Location location;
  location.addr = {{127, 0, 0, 1}};
  location.port = port;
  EXPECT_TRUE(location.user.assign(user) && location.path.assign(path));
  return location;
}

std::string official_name() {
  zv::TextBuffer<256> name;
  EXPECT_TRUE(zv::platform::official_host_name(name));
  return name.c_str();
}

std::string default_sender() {
  zv::PathBuffer sender;
  char login[257];
  zv_username(login, sizeof login);
  EXPECT_TRUE(zv::build_sender("", login, official_name(), sender));
  return sender.c_str();
}

std::string without_date(const std::string& text) {
  static const std::regex date(
      "Date: (Mon|Tue|Wed|Thu|Fri|Sat|Sun), \\d\\d "
      "(Jan|Feb|Mar|Apr|May|Jun|Jul|Aug|Sep|Oct|Nov|Dec) \\d{4} \\d\\d:\\d\\d:\\d\\d "
      "[+-]\\d{4}\r\n");
  return std::regex_replace(text, date, "Date\r\n");
}

std::string message(const std::string& sender, const std::string& lines) {
  return "From: " + sender +
         "\r\nTo: r@x.test\r\nSubject: a report.pdf\r\nDate\r\n"
         "MIME-Version: 1.0\r\n"
         "Content-type: multipart/mixed; boundary=\"===ZV_BOUNDARY_QM===\"\r\n"
         "\r\n"
         "--===ZV_BOUNDARY_QM===\r\n"
         "Content-type: text/plain; charset=iso-8859-1\r\n"
         "Content-transfer-encoding: 8bit\r\n"
         "Content-Disposition: inline\r\n"
         "\r\n"
         "Attached file: a report.pdf\r\n"
         "\r\n"
         "--===ZV_BOUNDARY_QM===\r\n"
         "Content-type: application/octet-stream\r\n"
         "Content-transfer-encoding: base64\r\n"
         "Content-Disposition: attachment; filename=\"a report.pdf\"\r\n"
         "\r\n" +
         lines +
         "--===ZV_BOUNDARY_QM===--\r\n"
         "\r\n.\r\n";
}

// 48 bytes, and the line that they are.
const std::string bytes48 = "0123456789 abcdefghijklmnopqrstuvwxyz, and a dot";
const std::string line48 = "MDEyMzQ1Njc4OSBhYmNkZWZnaGlqa2xtbm9wcXJzdHV2d3h5eiwgYW5kIGEgZG90\r\n";

std::string repeated(const std::string& text, size_t count) {
  std::string all;
  for (; count != 0; --count) all += text;
  return all;
}

TEST(Mail, ByteForByte) {
  if (!knows_own_name()) GTEST_SKIP() << "this host's own name has no address";
  struct Case {
    const char* credentials;
    std::string sender;
    Steps login;  // what the client says after EHLO
    std::string content, lines;
  };
  const std::string sender = default_sender();
  const Step password = {"cDpx\r\n", "235 in\r\n"};
  const Step refused = {"AUTH LOGIN\r\n", "504 no\r\n"};
  const Step login = {"AUTH LOGIN\r\n", "334 user\r\n"};
  const Step plain = {"AUTH PLAIN\r\n", "334 go on\r\n"};
  const Case cases[] = {
      {"", sender, {}, "", "\r\n"},
      {"", sender, {}, bytes48, line48},
      {"",
       sender,
       {},
       bytes48.substr(1),
       "MTIzNDU2Nzg5IGFiY2RlZmdoaWprbG1ub3BxcnN0dXZ3eHl6LCBhbmQgYSBkb3Q=\r\n"},
      {"", sender, {}, repeated(bytes48, 1200) + "rest", repeated(line48, 1200) + "cmVzdA==\r\n"},
      {"u@d:p:q@", "u@d", {login, {"dUBk\r\n", "334 password\r\n"}, password}, "x", "eA==\r\n"},
      {"u%40d@",
       sender,
       {login, {"dSU0MGQ=\r\n", "334 password\r\n"}, {"\r\n", "235 in\r\n"}},
       "x",
       "eA==\r\n"},
      {"u:p@", sender, {refused, plain, {"AHUAcA==\r\n", "235 in\r\n"}}, "x", "eA==\r\n"},
      {"u@", sender, {refused, plain, {"AHUAdQ==\r\n", "235 in\r\n"}}, "x", "eA==\r\n"},
  };
  const ScratchFolder folder;
  for (const Case& c : cases) {
    SCOPED_TRACE(c.credentials + std::to_string(c.content.size()));
    Steps begin = {{"EHLO", "250 hello\r\n"}};
    begin.insert(begin.end(), c.login.begin(), c.login.end());
    DialogueServer server(mail(begin));
    const std::string file = folder.make_file("a report.pdf", c.content);
    EXPECT_EQ(zv_copy(file.c_str(), server.url("smtp", "/r%40x.test", c.credentials).c_str()), 0);
    std::string expected = "EHLO " + official_name() + "\r\n";
    for (const Step& step : c.login) expected += step.heard;
    expected += "MAIL FROM:" + c.sender + "\r\nRCPT TO:r@x.test\r\nDATA\r\n" +
                message(c.sender, c.lines) + "QUIT\r\n";
    EXPECT_TRUE(without_date(server.heard()) == expected) << server.heard().substr(0, 2000);
  }
}

// The whole lines before the point where a file proves too short are sent, and no more.
TEST(Mail, AFileThatProvesShort) {
  const ScratchFolder folder;
  for (const size_t size : {0u, 47u, 48u, 100u}) {
    DialogueServer server({{unasked, ""}, {line48, ""}});
    {
      zv::Connection connection(zv::Direction::upload);
      EXPECT_EQ(connection.open(location_at(server.port(), "", "")), 0);
      const std::string content = repeated(bytes48, 3).substr(0, size);
      connection.file.reset(std::fopen(folder.make_file("f", content).c_str(), "rb"));
      EXPECT_EQ(zv::send_base64_file(connection.control.get(), connection.file.get(),
                                     connection.buffer.block(), 200),
                -3);
    }
    EXPECT_EQ(server.heard(), repeated(line48, size / 48));
  }
}

TEST(Mail, Sender) {
  const std::string long_name(256, 'n');
  struct Case {
    std::string user, login, host, sender;
  };
  const Case cases[] = {
      {"u@d", "me", "host.d.test", "u@d"},
      {"u", "me", "host.d.test", "me@d.test"},
      {"", "me", "host", "me@host"},
      {"", "me", "host.", "me@"},
      {std::string(318, 'u') + "@", "me", "host", std::string(318, 'u') + "@"},
      {"", long_name, std::string(62, 'h'), long_name + "@" + std::string(62, 'h')},
  };
  zv::PathBuffer sender;
  for (const Case& c : cases) {
    EXPECT_TRUE(zv::build_sender(c.user, c.login, c.host, sender));
    EXPECT_EQ(sender.view(), c.sender);
  }
  EXPECT_FALSE(zv::build_sender("", long_name, std::string(63, 'h'), sender));
  EXPECT_FALSE(zv::build_sender(std::string(319, 'u') + "@", "", "", sender));
}

// What would be a second line fails on the client's side: of a mail before any server is called.
TEST(Clients, NoTextAddsALine) {
  if (!knows_own_name()) GTEST_SKIP() << "this host's own name has no address";
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "hello");
  const auto send = [closed = closed_port()](const char* user, const std::string& local,
                                             const std::string& recipient) {
    return zv::smtp_send_file(local.c_str(), location_at(closed, user, "/" + recipient));
  };
  EXPECT_EQ(send("", file, "r@x"), -4);
  EXPECT_EQ(send("", file, "r@x\r\nBcc: s@x"), -3);
  EXPECT_EQ(send("u@d\nBcc: s@x", file, "r@x"), -3);
  for (const char* const name : {"a\nb", "a\rb"}) {
    std::error_code unnameable;  // Windows has no such names
    std::filesystem::copy(file, folder.path(name), unnameable);
    EXPECT_EQ(send("", folder.path(name), "r@x"), -3);
  }
  zv::Lines lines;
  lines.add({std::string(2047, 'x')});
  EXPECT_TRUE(lines.good());
  lines.add({std::string(2047, 'x')});
  EXPECT_FALSE(lines.good());

  for (const char* const injected : {"/f\nDELE g", "/f\rg"}) {
    DialogueServer server(ftp({{"RETR", "150 opening (5 bytes)\r\n"}, {data_out, "hello"}}));
    const std::string got = folder.path("got");
    EXPECT_EQ(zv::ftp_download(location_at(server.port(), "", injected), got.c_str()), -3);
    EXPECT_TRUE(server.heard().ends_with("\r\nPASV\r\n"));
  }
}

TEST(Clients, PassiveAddress) {
  struct Case {
    const char* reply;
    bool usable;
    zv::platform::Address addr;
    unsigned port;
  };
  constexpr zv::platform::Address untouched = {{9, 9, 9, 9}};
  const Case cases[] = {
      {"227 Entering Passive Mode (10,0,0,5,4,1)", true, {{10, 0, 0, 5}}, 1025},
      {"227 (256,-1, 3,4,255,255,7", true, {{0, 255, 3, 4}}, 65535},
      {"227 x(1,2,3,4,0,0)", true, {{1, 2, 3, 4}}, 0},
      {"227 10,0,0,5,4,1", false, untouched, 9},
      {"227 (10,0,0,5,4 ,1)", false, untouched, 9},
      {"227 (a)(1,2,3,4,5,6)", false, untouched, 9},
      {"227 (1,2,3,4,256,0)", false, untouched, 9},
      {"227 (1,2,3,4,-1,0)", false, untouched, 9},
      {"227 (1,2,3,4,2147483647,2147483647)", false, untouched, 9},
      {"227 (1,2,3,99999999999,5,6)", false, untouched, 9},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.reply);
    zv::platform::Address addr = untouched;
    unsigned port = 9;
    EXPECT_EQ(zv::parse_pasv(c.reply, addr, port), c.usable);
    EXPECT_TRUE(std::ranges::equal(addr.bytes, c.addr.bytes));
    EXPECT_EQ(port, c.port);
  }
}

TEST(Clients, Base64AndCredentials) {
  const std::string cases[][2] = {{"", ""},
                                  {"f", "Zg=="},
                                  {"fo", "Zm8="},
                                  {"foo", "Zm9v"},
                                  {"foob", "Zm9vYg=="},
                                  {"\xff\xfe\xfd", "//79"},
                                  {"\xfb\xff", "+/8="},
                                  {std::string(3, '\0'), "AAAA"}};
  for (const auto& [plain, text] : cases) {
    const auto* const bytes = reinterpret_cast<const unsigned char*>(plain.data());
    EXPECT_EQ(zv::HeapPtr<char>(zv::base64_encode(bytes, plain.size(), nullptr)).get(), text);
  }
  const std::string too_long(700, 'u');
  for (const char* const user : {"", static_cast<const char*>(nullptr), too_long.c_str()}) {
    EXPECT_EQ(zv::basic_credentials(user, "p"), nullptr);
    EXPECT_EQ(zv::plain_credentials(user, "p"), nullptr);
  }
  EXPECT_STREQ(zv::basic_credentials("u", nullptr).get(), "dQ==");
  EXPECT_STREQ(zv::plain_credentials("u", nullptr).get(), "AHUAdQ==");
}

TEST(Date, Line) {
  struct Case {
    std::tm time;
    int offset;
    const char* line;
  };
  const auto at = [](int weekday, int day, int month, int year, int hour, int minute, int second) {
    std::tm time = {};
    time.tm_wday = weekday, time.tm_mday = day, time.tm_mon = month, time.tm_year = year - 1900;
    time.tm_hour = hour, time.tm_min = minute, time.tm_sec = second;
    return time;
  };
  const Case cases[] = {
      {at(1, 16, 10, 2026, 21, 5, 0), 60, "Date: Mon, 16 Nov 2026 21:05:00 +0100"},
      {at(0, 1, 0, 2000, 0, 0, 9), 0, "Date: Sun, 01 Jan 2000 00:00:09 +0000"},
      {at(6, 31, 11, 2033, 23, 59, 60), 330, "Date: Sat, 31 Dec 2033 23:59:60 +0530"},
      {at(3, 9, 4, 2027, 1, 2, 3), -210, "Date: Wed, 09 May 2027 01:02:03 -0330"},
      {at(4, 9, 5, 2027, 1, 2, 3), -30, "Date: Thu, 09 Jun 2027 01:02:03 -0030"},
  };
  zv::DateLine line;
  for (const Case& c : cases) {
    EXPECT_TRUE(zv::format_date_line(c.time, c.offset, line));
    EXPECT_EQ(line.view(), c.line);
  }
  EXPECT_FALSE(zv::format_date_line(at(7, 1, 0, 2000, 0, 0, 0), 0, line));
  EXPECT_FALSE(zv::format_date_line(at(0, 1, 12, 2000, 0, 0, 0), 0, line));
}

// The local clock is what UTC is plus the offset, daylight saving included.
TEST(Date, LocalTime) {
  struct Case {
    const char* zone;
    int winter, summer;
  };
  const Case cases[] = {
      {"UTC0", 0, 0}, {"IST-5:30", 330, 330}, {"NST3:30NDT", -210, -150}, {"CET-1CEST", 60, 120}};
  const auto second_of_day = [](const std::tm& time) {
    return time.tm_hour * 3600 + time.tm_min * 60 + time.tm_sec;
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.zone);
    const Variable zone("TZ", c.zone);
    std::tm local = {};
    int offset = 1;
    ASSERT_TRUE(zv::platform::local_time(local, offset));
    EXPECT_EQ(offset, local.tm_isdst > 0 ? c.summer : c.winter);
    const std::time_t shown = std::time(nullptr) + offset * 60;
    const int behind = second_of_day(*std::gmtime(&shown)) - second_of_day(local);
    EXPECT_LE((behind + 86400) % 86400, 60);
  }
}

}  // namespace
