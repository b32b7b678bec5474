// Takes certificates out of a PEM text.
#include "transfer/pem.h"

#include <cstdint>

#include "frame/der.h"

namespace zv {

namespace {

constexpr std::string_view begin_line = "-----BEGIN CERTIFICATE-----";
constexpr std::string_view end_line = "-----END CERTIFICATE-----";
constexpr size_t none = std::string_view::npos;

// 0 to 63; -1 for what is no base64.
int digit_of(char ch) {
  if (ch >= 'A' && ch <= 'Z') return ch - 'A';
  if (ch >= 'a' && ch <= 'z') return ch - 'a' + 26;
  if (ch >= '0' && ch <= '9') return ch - '0' + 52;
  if (ch == '+') return 62;
  return ch == '/' ? 63 : -1;
}

bool is_blank(char ch) {
  return ch == ' ' || ch == '\t' || ch == '\r' || ch == '\n';
}

// The bytes that base64 in lines stands for: their number, 0 when it is not well formed.
size_t decode_lines(std::string_view text, unsigned char* out) {
  uint32_t bits = 0;
  size_t digits = 0;
  size_t padding = 0;
  size_t size = 0;
  for (const char ch : text) {
    if (is_blank(ch)) continue;
    const int digit = digit_of(ch);
    if (ch != '=' && (digit < 0 || padding != 0)) return 0;
    padding += ch == '=' ? 1U : 0U;
    bits = bits << 6 | (ch == '=' ? 0U : static_cast<uint32_t>(digit));
    if (++digits % 4 != 0) continue;
    for (int shift = 16; shift >= 0; shift -= 8)
      out[size++] = static_cast<unsigned char>(bits >> shift);
  }
  return digits % 4 == 0 && padding <= 2 && size > padding ? size - padding : 0;
}

}  // namespace

size_t decode_certificates(std::string_view text, unsigned char* room) {
  size_t size = 0;
  for (size_t at = text.find(begin_line); at != none; at = text.find(begin_line, at)) {
    at += begin_line.size();
    const size_t end = text.find(end_line, at);
    if (end == none) return 0;
    const size_t count = decode_lines({text.data() + at, end - at}, room + size);
    // Every certificate is one sequence.
    if (count == 0 || sequence_size(room + size, count) != count) return 0;
    size += count;
    at = end;
  }
  return size;
}

}  // namespace zv
