// Names in the header lines of a mail: what is put there is 7-bit, short, and reads back as the
// name.
#include <algorithm>
#include <string>

#include "check.h"
#include "transfer/mail_words.h"

namespace {

std::string base64_decoded(const std::string& text) {
  const std::string alphabet = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
  std::string bytes;
  unsigned bits = 0;
  int count = 0;
  for (const char ch : text) {
    if (ch == '=') break;
    CHECK(alphabet.find(ch) != std::string::npos);
    bits = bits << 6 | static_cast<unsigned>(alphabet.find(ch));
    if ((count += 6) >= 8) bytes += static_cast<char>(bits >> (count -= 8) & 255);
  }
  return bytes;
}

void check_lines(const std::string& text) {
  CHECK(text.ends_with("\r\n"));
  size_t length = 0;
  for (const char ch : text) {
    CHECK((ch >= ' ' && ch <= '~') || ch == '\r' || ch == '\n');
    length = ch == '\n' ? 0 : length + 1;
    CHECK(length <= 78 + 1);
  }
}

// Encoded words that white space separates are one text (RFC 2047 6.2).
std::string read_field(const std::string& text) {
  const std::string value = text.substr(9, text.size() - 11);
  if (value.find("=?") == std::string::npos) return value;
  std::string name;
  for (size_t at = 0; at < value.size();) {
    CHECK(value.compare(at, 10, "=?UTF-8?B?") == 0);
    const size_t end = value.find("?=", at + 10);
    CHECK(end != std::string::npos && end + 2 - at <= 75);
    const std::string word = base64_decoded(value.substr(at + 10, end - at - 10));
    CHECK(zv::is_mail_name(word));
    name += word;
    at = end + 2;
    if (at < value.size()) CHECK(value.compare(at, 3, "\r\n ") == 0);
    if (at < value.size()) at += 3;
  }
  return name;
}

std::string read_quoted(const std::string& text) {
  std::string name;
  for (size_t i = 0; i < text.size(); ++i) name += text[i] == '\\' ? text[++i] : text[i];
  return name;
}

std::string read_escaped(const std::string& text) {
  std::string name;
  for (size_t i = 0; i < text.size(); ++i) {
    const bool escape = text[i] == '%';
    name += escape ? static_cast<char>(std::stoi(text.substr(i + 1, 2), nullptr, 16)) : text[i];
    if (escape) i += 2;
  }
  return name;
}

std::string read_parameter(std::string text) {
  if (text.starts_with(" filename=\"")) return read_quoted(text.substr(11, text.size() - 14));
  const std::string charset = "UTF-8''";
  std::string name;
  for (int number = 0; !text.empty(); ++number) {
    const size_t end = text.find("\r\n");
    const bool last = end + 2 == text.size();
    const bool alone = text.starts_with(" filename*=");
    const std::string begin = alone ? " filename*=" : " filename*" + std::to_string(number) + "*=";
    CHECK(text.starts_with(begin) && (!alone || last));
    CHECK(last || text[end - 1] == ';');
    size_t at = begin.size();
    if (number == 0) CHECK(text.compare(at, charset.size(), charset) == 0);
    if (number == 0) at += charset.size();
    name += read_escaped(text.substr(at, end - at - (last ? 0 : 1)));
    text.erase(0, end + 2);
  }
  return name;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string name(reinterpret_cast<const char*>(data), size);
  if (!zv::is_mail_name(name)) return 0;
  CHECK(std::none_of(name.begin(), name.end(), [](unsigned char ch) { return ch < ' '; }));
  zv::MailText field;
  zv::MailText parameter;
  const bool fits =
      zv::put_field("Subject: ", name, field) && zv::put_parameter(" filename", name, parameter);
  CHECK(fits || size > 1000);
  if (!fits) return 0;
  check_lines(field.c_str());
  check_lines(parameter.c_str());
  CHECK(read_field(field.c_str()) == name);
  CHECK(read_parameter(parameter.c_str()) == name);
  return 0;
}
