// Base64, and the login texts made with it.
#include "transfer/base64.h"

#include "frame/text_buffer.h"

namespace zv {

namespace {

constexpr char alphabet[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

// Room for a user and a password as a location holds them, or the user twice.
using Credentials = TextBuffer<2 * ZV_PATH_MAX + 2>;

// `count` characters of the 24 bits, high bits first.
char* put_group(char* out, unsigned bits, int count) {
  for (int i = 0; i < count; ++i) *out++ = alphabet[bits >> (18 - 6 * i) & 63];
  return out;
}

}  // namespace

char* base64_encode(const unsigned char* data, size_t size, char* out) {
  if (out == nullptr) out = static_cast<char*>(std::malloc(base64_length(size) + 1));
  if (out == nullptr) return nullptr;

  char* end = out;
  const unsigned char* const whole = data + size / 3 * 3;
  for (; data != whole; data += 3)
    end = put_group(end, unsigned{data[0]} << 16 | unsigned{data[1]} << 8 | data[2], 4);
  const size_t rest = size % 3;
  if (rest == 1) end = put_group(end, unsigned{data[0]} << 16, 2);
  if (rest == 2) end = put_group(end, unsigned{data[0]} << 16 | unsigned{data[1]} << 8, 3);
  for (size_t i = rest; i != 0 && i < 3; ++i) *end++ = '=';
  *end = '\0';
  return out;
}

size_t base64_lines(std::span<const char> bytes, char* text) {
  const auto* const data = reinterpret_cast<const unsigned char*>(bytes.data());
  char* end = text;
  size_t done = 0;
  do {
    const size_t piece = std::min(base64_line_bytes, bytes.size() - done);
    base64_encode(data + done, piece, end);
    end += base64_length(piece);
    *end++ = '\r';
    *end++ = '\n';
    done += piece;
  } while (done < bytes.size());
  return static_cast<size_t>(end - text);
}

HeapPtr<char> base64_text(std::string_view text) {
  const auto* const bytes = reinterpret_cast<const unsigned char*>(text.data());
  return HeapPtr<char>(base64_encode(bytes, text.size(), nullptr));
}

HeapPtr<char> basic_credentials(const char* user, const char* password) {
  Credentials text;
  if (user == nullptr || *user == '\0' || !text.append(user)) return nullptr;
  const bool has_password = password != nullptr && *password != '\0';
  if (has_password && !(text.append(':') && text.append(password))) return nullptr;
  return base64_text(text.view());
}

HeapPtr<char> plain_credentials(const char* user, const char* password) {
  if (user == nullptr || *user == '\0') return nullptr;
  const bool has_password = password != nullptr && *password != '\0';
  Credentials text;
  const bool fits = text.append('\0') && text.append(user) && text.append('\0') &&
                    text.append(has_password ? password : user);
  return fits ? base64_text(text.view()) : nullptr;
}

}  // namespace zv
