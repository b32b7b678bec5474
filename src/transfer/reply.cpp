// Reads numbered replies and HTTP headers, each out of what one receive brings.
#include "transfer/reply.h"

#include <array>
#include <cstring>
#include <string_view>

#include "transfer/number.h"
#include "zarvo.h"

namespace zv {

namespace {

constexpr size_t none = std::string_view::npos;

// One receive's bytes with a NUL after them: their count, -1 on failure.
int64_t receive_text(platform::Socket socket, std::span<char> room) {
  const int64_t received = platform::socket_receive(socket, room.data(), room.size() - 1);
  room[received > 0 ? static_cast<size_t>(received) : 0] = '\0';
  return received;
}

// The last piece of the text between line feeds that is not empty, or the whole text.
std::string_view last_line(std::string_view text) {
  const size_t last = text.find_last_not_of('\n');
  if (last == none) return text;
  const std::string_view kept(text.data(), last + 1);
  const size_t feed = kept.rfind('\n');
  const size_t begin = feed == none ? 0 : feed + 1;
  return {kept.data() + begin, kept.size() - begin};
}

// Takes the next piece between line feeds that is not empty; "" when there is no more.
std::string_view take_line(std::string_view& text) {
  while (text.starts_with('\n')) text.remove_prefix(1);
  const size_t feed = text.find('\n');
  const std::string_view line(text.data(), feed == none ? text.size() : feed);
  text.remove_prefix(line.size());
  return line;
}

bool begins_with(std::string_view line, std::string_view word) {
  return line.size() >= word.size() && zv_strnicmp(line.data(), word.data(), word.size()) == 0;
}

int64_t find_content_length(std::string_view lines) {
  constexpr std::string_view name = "Content-Length:";
  std::string_view line = take_line(lines);
  while (!line.empty() && !begins_with(line, name)) line = take_line(lines);
  int64_t length = 0;
  return number_after_word(line, length) ? length : 0;
}

}  // namespace

int read_reply(platform::Socket socket, std::span<char> room) {
  bool continued = true;
  int code = 0;
  while (continued) {
    if (receive_text(socket, room) <= 0) return 0;
    std::string_view line = last_line(room.data());
    std::memmove(room.data(), line.data(), line.size());
    room[line.size()] = '\0';
    line = room.data();
    if (!take_number(line, code)) return 0;
    continued = line.starts_with('-');
  }
  return code;
}

HttpHeader read_http_header(platform::Socket socket, std::span<char> room) {
  constexpr std::string_view blank_line = "\r\n\r\n";
  HttpHeader header;
  const int64_t received = receive_text(socket, room);
  const std::string_view text = room.data();
  const size_t end = text.find(blank_line);
  if (received <= 0 || end == none) return header;

  std::string_view lines(text.data(), end);
  const std::string_view status_line = take_line(lines);
  if (!begins_with(status_line, "HTTP/")) return header;
  if (!number_after_word(status_line, header.status)) header.status = 0;
  header.content_length = find_content_length(lines);

  const size_t body = end + blank_line.size();
  header.body_bytes = received - static_cast<int64_t>(body);
  std::memmove(room.data(), room.data() + body, static_cast<size_t>(header.body_bytes));
  return header;
}

bool parse_pasv(const char* reply, platform::Address& address, unsigned& port) {
  std::string_view text = reply;
  const size_t open = text.find('(');
  if (open == none) return false;
  text.remove_prefix(open + 1);
  std::array<int, 6> numbers;
  if (!take_numbers(text, ',', numbers)) return false;

  const int64_t number = int64_t{numbers[4]} * 256 + numbers[5];
  if (number < 0 || number > 65535) return false;
  for (size_t i = 0; i < sizeof address.bytes; ++i)
    address.bytes[i] = static_cast<unsigned char>(numbers[i]);
  port = static_cast<unsigned>(number);
  return true;
}

}  // namespace zv
