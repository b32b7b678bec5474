// Encodes names for the header lines of a mail.
#include "transfer/mail_words.h"

#include <algorithm>
#include <cstdio>

#include "transfer/base64.h"

namespace zv {

namespace {

constexpr size_t longest_line = 78;  // RFC 5322 2.1.1

// Bytes of the text's first character; 0 where that is not well-formed.
size_t character_size(std::string_view text) {
  const auto byte = [text](size_t i) {
    return i < text.size() ? static_cast<unsigned char>(text[i]) : 0U;
  };
  const unsigned lead = byte(0);
  if (lead < 0x80) return text.empty() ? 0 : 1;
  if (lead < 0xC2 || lead > 0xF4) return 0;
  const size_t size = lead >= 0xF0 ? 4 : lead >= 0xE0 ? 3 : 2;
  unsigned value = lead & (0x7FU >> size);
  for (size_t i = 1; i < size; ++i) {
    if ((byte(i) & 0xC0) != 0x80) return 0;
    value = value << 6 | (byte(i) & 0x3F);
  }
  constexpr unsigned least[] = {0, 0, 0x80, 0x800, 0x10000};
  const bool surrogate = value >= 0xD800 && value < 0xE000;
  return value < least[size] || value > 0x10FFFF || surrogate ? 0 : size;
}

// Those of ASCII, and those beyond it.
bool is_control(std::string_view character) {
  const auto lead = static_cast<unsigned char>(character[0]);
  const auto next = character.size() > 1 ? static_cast<unsigned char>(character[1]) : 0U;
  return lead < ' ' || lead == 0x7F || (lead == 0xC2 && next < 0xA0);
}

std::string_view first_character(std::string_view text) {
  return {text.data(), std::max<size_t>(character_size(text), 1)};
}

// Takes whole characters of at most so many bytes off the front.
std::string_view take_front(std::string_view& text, size_t most) {
  std::string_view rest = text;
  while (!rest.empty() && rest.data() + first_character(rest).size() - text.data() <=
                              static_cast<std::ptrdiff_t>(most))
    rest.remove_prefix(first_character(rest).size());
  const std::string_view front(text.data(), text.size() - rest.size());
  text = rest;
  return front;
}

bool is_printable(std::string_view text) {
  return std::all_of(text.begin(), text.end(), [](char ch) { return ch >= ' ' && ch <= '~'; });
}

// Readers take it for one that is encoded.
bool looks_encoded(std::string_view text) {
  return text.find("=?") != std::string_view::npos;
}

template <size_t Size>
bool put_base64(std::string_view bytes, TextBuffer<Size>& out) {
  TextBuffer<128> text;
  return text.fill([bytes](char* room, size_t size) {
    if (base64_length(bytes.size()) >= size) return false;
    base64_encode(reinterpret_cast<const unsigned char*>(bytes.data()), bytes.size(), room);
    return true;
  }) && out.append(text.view());
}

// ---- Parameters ----

using Line = TextBuffer<longest_line + 1>;

// In quotes, as long as it fits. Some readers trim blanks even there.
bool quote(std::string_view parameter, std::string_view name, Line& line) {
  if (!is_plain(name, 0)) return false;
  bool fits = line.append(parameter) && line.append("=\"");
  for (const char ch : name)
    fits = fits && (ch != '"' && ch != '\\' ? true : line.append('\\')) && line.append(ch);
  return fits && line.append('"');
}

bool needs_no_escape(char ch) {
  return (ch >= 'a' && ch <= 'z') || (ch >= 'A' && ch <= 'Z') || (ch >= '0' && ch <= '9') ||
         ch == '-' || ch == '.' || ch == '_';
}

// Appends characters as long as they fit, with room for what ends the line.
void append_escaped(std::string_view& name, Line& line) {
  constexpr size_t ending = 1;
  constexpr std::string_view digits = "0123456789ABCDEF";
  while (!name.empty()) {
    TextBuffer<16> escaped;
    bool fits = true;
    for (const char ch : first_character(name)) {
      const auto byte = static_cast<unsigned char>(ch);
      fits =
          fits && (needs_no_escape(ch) ? escaped.append(ch)
                                       : escaped.append('%') && escaped.append(digits[byte / 16]) &&
                                             escaped.append(digits[byte % 16]));
    }
    if (!fits || line.size() + escaped.size() + ending > longest_line) return;
    if (!line.append(escaped.view())) return;
    name.remove_prefix(first_character(name).size());
  }
}

// " filename*=UTF-8''..." where that is all, else " filename*0*=UTF-8''...", " filename*1*=..."
bool put_sections(std::string_view parameter, std::string_view name, MailText& out) {
  std::string_view rest = name;
  Line whole;
  if (!whole.append(parameter) || !whole.append("*=UTF-8''")) return false;
  append_escaped(rest, whole);
  if (rest.empty()) return out.append(whole.view()) && out.append("\r\n");
  for (int number = 0; !name.empty(); ++number) {
    TextBuffer<16> count;
    const bool counted = count.fill([number](char* room, size_t size) {
      return std::snprintf(room, size, "*%d*=%s", number, number == 0 ? "UTF-8''" : "") > 0;
    });
    Line line;
    const size_t before = name.size();
    if (!counted || !line.append(parameter) || !line.append(count.view())) return false;
    append_escaped(name, line);
    if (name.size() == before || (!name.empty() && !line.append(';'))) return false;
    if (!out.append(line.view()) || !out.append("\r\n")) return false;
  }
  return true;
}

}  // namespace

bool is_mail_name(std::string_view text) {
  while (!text.empty()) {
    const size_t size = character_size(text);
    if (size == 0 || is_control({text.data(), size})) return false;
    text.remove_prefix(size);
  }
  return true;
}

bool is_plain(std::string_view name, size_t others) {
  return name.size() + others <= longest_line && is_printable(name) && !looks_encoded(name) &&
         !name.starts_with(' ') && !name.ends_with(' ');
}

// An encoded word holds whole characters (RFC 2047 5), and a line with one has 76 at most: 39 bytes
// are 64 characters.
bool put_field(std::string_view field, std::string_view name, MailText& out) {
  constexpr size_t word_bytes = 39;
  if (!out.append(field)) return false;
  if (is_plain(name, field.size())) return out.append(name) && out.append("\r\n");
  while (!name.empty()) {
    const bool put = out.append("=?UTF-8?B?") && put_base64(take_front(name, word_bytes), out) &&
                     out.append(name.empty() ? "?=" : "?=\r\n ");
    if (!put) return false;
  }
  return out.append("\r\n");
}

bool put_parameter(std::string_view parameter, std::string_view name, MailText& out) {
  Line line;
  if (quote(parameter, name, line)) return out.append(line.view()) && out.append("\r\n");
  return put_sections(parameter, name, out);
}

// In lines of 64 characters.
bool put_base64_line(std::string_view label, std::string_view name, MailText& out) {
  constexpr size_t line_bytes = 48;
  MailText text;
  if (!text.append(label) || !text.append(name) || !text.append("\r\n")) return false;
  for (std::string_view rest = text.view(); !rest.empty();) {
    const size_t size = std::min(line_bytes, rest.size());
    if (!put_base64({rest.data(), size}, out) || !out.append("\r\n")) return false;
    rest.remove_prefix(size);
  }
  return true;
}

}  // namespace zv
