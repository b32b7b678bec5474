// The mail of a run: names and addresses in its lines, and all of it.
#include <gtest/gtest.h>

#include <regex>
#include <string>

#include "scratch_folder.h"
#include "transfer/connection.h"
#include "transfer/run_message.h"

namespace {

std::string repeated(const std::string& text, size_t count) {
  std::string all;
  for (; count != 0; --count) all += text;
  return all;
}

TEST(MailWords, WhichNamesAreWellFormed) {
  for (const std::string good :
       {"", "a", "\x7e", "\xC2\xA0", "\xDF\xBF", "\xE0\xA0\x80", "\xED\x9F\xBF", "\xEF\xBF\xBF",
        "\xF0\x90\x80\x80", "\xF4\x8F\xBF\xBF"})
    EXPECT_TRUE(zv::is_mail_name(good)) << good;
  for (const std::string bad :
       {"\x1f", "\x7f", "a\nb", "\x80", "\xC1\xBF", "\xC2", "\xC2\x9F", "\xC3(", "\xE0\x9F\xBF",
        "\xED\xA0\x80", "\xE2\x82", "\xF0\x8F\xBF\xBF", "\xF4\x90\x80\x80", "\xF8\x88\x80\x80\x80"})
    EXPECT_FALSE(zv::is_mail_name(bad)) << bad;
}

TEST(MailWords, NamesInLines) {
  const std::string a36(36, 'a');
  const std::string a39 = repeated("YWFh", 13);
  struct Case {
    std::string name, subject, parameter;
  };
  const Case cases[] = {
      {"a report.pdf", "a report.pdf", "=\"a report.pdf\""},
      {"", "", "=\"\""},
      {" a", "=?UTF-8?B?IGE=?=", "*=UTF-8''%20a"},
      {"a\"b\\c", "a\"b\\c", "=\"a\\\"b\\\\c\""},
      {"=?x", "=?UTF-8?B?PT94?=", "*=UTF-8''%3D%3Fx"},
      {"B\xC3\xA4r_1.txt", "=?UTF-8?B?QsOkcl8xLnR4dA==?=", "*=UTF-8''B%C3%A4r_1.txt"},
      // The longest that stands in one line as it is, and one more.
      {std::string(66, 'a'), std::string(66, 'a'), "=\"" + std::string(66, 'a') + "\""},
      {std::string(67, 'a'), std::string(67, 'a'),
       "*0*=UTF-8''" + std::string(57, 'a') + ";\r\n filename*1*=" + std::string(10, 'a')},
      {std::string(69, 'a'), std::string(69, 'a'),
       "*0*=UTF-8''" + std::string(57, 'a') + ";\r\n filename*1*=" + std::string(12, 'a')},
      {std::string(70, 'a'),
       "=?UTF-8?B?" + a39 + "?=\r\n =?UTF-8?B?" + a39.substr(0, 40) + "YQ==?=",
       "*0*=UTF-8''" + std::string(57, 'a') + ";\r\n filename*1*=" + std::string(13, 'a')},
      // A character is never divided.
      {std::string(38, 'a') + "\xE2\x82\xAC",
       "=?UTF-8?B?" + a39.substr(0, 48) + "YWE=?=\r\n =?UTF-8?B?4oKs?=",
       "*=UTF-8''" + std::string(38, 'a') + "%E2%82%AC"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    zv::MailText subject;
    zv::MailText parameter;
    EXPECT_TRUE(zv::put_field("Subject: ", c.name, subject));
    EXPECT_EQ(subject.c_str(), "Subject: " + c.subject + "\r\n");
    EXPECT_TRUE(zv::put_parameter(" filename", c.name, parameter));
    EXPECT_EQ(parameter.c_str(), " filename" + c.parameter + "\r\n");
  }
}

zv::Failure written(const char* local, const std::string& user, const std::string& recipient,
                    zv::RunMessage& message) {
  const zv::NetworkGuard network;
  zv::Signals signals;
  zv::Run run({}, {}, signals);
  const bool good = zv::write_run_message(run, local, user, recipient, message);
  EXPECT_NE(good, run.failed());
  return run.failure();
}

TEST(MailMessage, WhatIsRefused) {
  zv::RunMessage message;
  const std::string longest = std::string(250, 'u') + "@d.x";
  for (const std::string& good : {std::string("r@x"), std::string("r"), longest}) {
    EXPECT_EQ(written("f", good, good, message).code, 0);
    EXPECT_EQ(message.recipient.view(), good);
  }
  for (const std::string& bad :
       {std::string(), std::string("r @x"), std::string("<r@x>"), std::string("r@x\tb"),
        std::string("r\xC3\xA4@x"), "u" + longest}) {
    const zv::Failure failure = written("f", "", bad, message);
    EXPECT_EQ(failure.code, -4) << bad;
    EXPECT_EQ(failure.cause, ZV_CAUSE_LOCATION);
    EXPECT_EQ(written("f", bad + "@d", "r@x", message).cause,
              bad.empty() ? ZV_CAUSE_NONE : ZV_CAUSE_LOCATION);
  }
  for (const char* const bad : {"a\x1b[b", "a\x7f"}) {
    const zv::Failure failure = written(bad, "", "r@x", message);
    EXPECT_EQ(failure.code, -3);
    EXPECT_EQ(failure.cause, ZV_CAUSE_LOCAL);
  }
}

TEST(MailMessage, Lines) {
  zv::RunMessage message;
  ASSERT_EQ(written("/folder/=?a", "u@d.test", "r@x", message).code, 0);
  const std::string head = std::regex_replace(
      std::regex_replace(std::string(message.head.view()), std::regex("Date: [^\r]+"), "Date"),
      std::regex("<[0-9a-f]{16}@[a-zA-Z0-9.-]+>"), "<id>");
  EXPECT_EQ(head,
            "From: u@d.test\r\nTo: r@x\r\nSubject: =?UTF-8?B?PT9h?=\r\nDate\r\nMessage-ID: <id>\r\n"
            "MIME-Version: 1.0\r\n"
            "Content-Type: multipart/mixed; boundary=\"===ZV_BOUNDARY_QM===\"\r\n\r\n"
            "--===ZV_BOUNDARY_QM===\r\n"
            "Content-Type: text/plain; charset=utf-8\r\nContent-Transfer-Encoding: base64\r\n"
            "Content-Disposition: inline\r\n\r\nQXR0YWNoZWQgZmlsZTogPT9hDQo=\r\n\r\n"
            "--===ZV_BOUNDARY_QM===\r\n"
            "Content-Type: application/octet-stream\r\nContent-Transfer-Encoding: base64\r\n"
            "Content-Disposition: attachment;\r\n filename*=UTF-8''%3D%3Fa\r\n\r\n");
  const std::string sender(80, 'u');
  ASSERT_EQ(written("plain.txt", sender + "@d", "r@x", message).code, 0);
  const std::string all(message.head.view());
  EXPECT_TRUE(all.starts_with("From:\r\n " + sender + "@d\r\n"));
  EXPECT_NE(all.find("us-ascii\r\nContent-Transfer-Encoding: 7bit\r\nContent-Disposition: "
                     "inline\r\n\r\nAttached file: plain.txt\r\n\r\n--"),
            std::string::npos);
}

}  // namespace
