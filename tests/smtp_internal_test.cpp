// The mail sender: its dialogue and message byte for byte, its sender's address and its date.
#include "transfer/smtp.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <ctime>
#include <regex>
#include <string>
#include <vector>

#include "environment.h"
#include "fixtures/dialogue_server.h"
#include "scratch_folder.h"
#include "transfer/date_line.h"
#include "transfer/letter.h"
#include "zarvo.h"

namespace {

using namespace scripted;

std::string official_name() {
  const Network network;
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

std::string message(const std::string& sender, const std::string& recipient,
                    const std::string& name, const std::string& lines) {
  return "From: " + sender + "\r\nTo: " + recipient + "\r\nSubject: " + name +
         "\r\nDate\r\n"
         "MIME-Version: 1.0\r\n"
         "Content-type: multipart/mixed; boundary=\"===ZV_BOUNDARY_QM===\"\r\n"
         "\r\n"
         "--===ZV_BOUNDARY_QM===\r\n"
         "Content-type: text/plain; charset=iso-8859-1\r\n"
         "Content-transfer-encoding: 8bit\r\n"
         "Content-Disposition: inline\r\n"
         "\r\n"
         "Attached file: " +
         name +
         "\r\n\r\n"
         "--===ZV_BOUNDARY_QM===\r\n"
         "Content-type: application/octet-stream\r\n"
         "Content-transfer-encoding: base64\r\n"
         "Content-Disposition: attachment; filename=\"" +
         name +
         "\"\r\n"
         "\r\n" +
         lines +
         "--===ZV_BOUNDARY_QM===--\r\n"
         "\r\n.\r\n";
}

TEST(Mail, ByteForByte) {
  const std::string host = official_name();
  const std::string sender = default_sender();
  const std::string block64 =
      "eHh4eHh4eHh4eHh4eHh4eHh4eHh4eHh4eHh4eHh4eHh4eHh4eHh4eHh4eHh4eHh4\r\n";
  struct Case {
    const char* credentials;
    std::string sender;
    const char* login_reply;  // to AUTH LOGIN
    std::string login;        // what the client says after EHLO
    size_t size;
    std::string lines;
  };
  const Case cases[] = {
      {"", sender, "", "", 0, "\r\n"},
      {"", sender, "", "", 48, block64},
      {"", sender, "", "", 100, block64 + block64 + "eHh4eA==\r\n"},
      {"u@d:p:q@", "u@d", "334 user\r\n", "AUTH LOGIN\r\ndUBk\r\ncDpx\r\n", 1, "eA==\r\n"},
      {"u%40d@", sender, "334 user\r\n", "AUTH LOGIN\r\ndSU0MGQ=\r\n\r\n", 1, "eA==\r\n"},
      {"u:p@", sender, "504 no\r\n", "AUTH LOGIN\r\nAUTH PLAIN\r\nAHUAcA==\r\n", 1, "eA==\r\n"},
      {"u@", sender, "504 no\r\n", "AUTH LOGIN\r\nAUTH PLAIN\r\nAHUAdQ==\r\n", 1, "eA==\r\n"},
  };
  const ScratchFolder folder;
  for (const Case& c : cases) {
    SCOPED_TRACE(c.login + std::to_string(c.size));
    DialogueServer server({{unasked, "220 ready\r\n"},
                           {"EHLO", "250 hello\r\n"},
                           {"AUTH LOGIN\r\n", c.login_reply},
                           {"dUBk\r\n", "334 password\r\n"},
                           {"cDpx\r\n", "235 in\r\n"},
                           {"dSU0MGQ=\r\n", "334 password\r\n"},
                           {"\r\n", "235 in\r\n"},
                           {"AUTH PLAIN\r\n", "334 go on\r\n"},
                           {"AHUA", "235 in\r\n"},
                           {"MAIL FROM:", "250 ok\r\n"},
                           {"RCPT TO:", "250 ok\r\n"},
                           {"DATA\r\n", "354 go on\r\n"},
                           {mail_end, "250 taken\r\n"},
                           {"QUIT\r\n", "221 bye\r\n"}});
    const std::string file = folder.make_file("a report.pdf", std::string(c.size, 'x'));
    EXPECT_EQ(zv_copy(file.c_str(), server.url("smtp", "/r%40x.test", c.credentials).c_str()), 0);
    EXPECT_EQ(without_date(server.heard()),
              "EHLO " + host + "\r\n" + c.login + "MAIL FROM:" + c.sender +
                  "\r\nRCPT TO:r@x.test\r\nDATA\r\n" +
                  message(c.sender, "r@x.test", "a report.pdf", c.lines) + "QUIT\r\n");
  }
}

TEST(Mail, Sender) {
  const std::string long_name(256, 'n');
  struct Case {
    std::string user, login, host, sender;
  };
  const Case cases[] = {
      {"u@d", "me", "host.d.test", "u@d"},
      {"@", "me", "host.d.test", "@"},
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

// What would be a second line fails on the sender's side before any server is called.
TEST(Mail, NoTextAddsALine) {
  constexpr zv::platform::Address loopback = {{127, 0, 0, 1}};
  const unsigned closed = closed_port();
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "hello");
  const auto send = [&](const char* user, const std::string& local, const char* recipient) {
    return zv::smtp_send_file(loopback, closed, user, "p", local.c_str(), recipient);
  };
  EXPECT_EQ(send("", file, "r@x"), -4);
  EXPECT_EQ(send("", file, "r@x\r\nBcc: s@x"), -3);
  EXPECT_EQ(send("u@d\nBcc: s@x", file, "r@x"), -3);
  EXPECT_EQ(send("", folder.path("missing"), "r@x"), -3);
  EXPECT_EQ(send("", folder.path(), "r@x"), -3);
  for (const char* const name : {"a\r\nBcc: s@x", "a\nb", "a\rb"}) {
    std::error_code unnameable;  // Windows has no such names
    std::filesystem::copy(file, folder.path(name), unnameable);
    EXPECT_EQ(send("", folder.path(name), "r@x"), -3);
  }
  zv::Lines lines;
  lines.add({std::string(2047, 'x')});
  EXPECT_TRUE(lines.good());
  lines.add({std::string(2047, 'x')});
  EXPECT_FALSE(lines.good());
}

TEST(Mail, DateLine) {
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
      {at(6, 31, 11, 2033, 23, 59, 60), -300, "Date: Sat, 31 Dec 2033 23:59:60 -0500"},
      {at(3, 9, 4, 2027, 1, 2, 3), 330, "Date: Wed, 09 May 2027 01:02:03 +0530"},
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
TEST(Mail, LocalTime) {
  struct Case {
    const char* zone;
    int winter, summer;
  };
  const Case cases[] = {{"UTC0", 0, 0},
                        {"IST-5:30", 330, 330},
                        {"NST3:30NDT", -210, -150},
                        {"CET-1CEST", 60, 120},
                        {"EST5EDT", -300, -240}};
  for (const Case& c : cases) {
    SCOPED_TRACE(c.zone);
    const Variable zone("TZ", c.zone);
    std::tm local = {};
    int offset = 1;
    ASSERT_TRUE(zv::platform::local_time(local, offset));
    EXPECT_EQ(offset, local.tm_isdst > 0 ? c.summer : c.winter);
    const std::time_t shown = std::time(nullptr) + offset * 60;
    const std::tm* const clock = std::gmtime(&shown);
    const auto second_of_day = [](const std::tm& time) {
      return time.tm_hour * 3600 + time.tm_min * 60 + time.tm_sec;
    };
    EXPECT_LE((second_of_day(*clock) - second_of_day(local) + 86400) % 86400, 60);
  }
}

}  // namespace
