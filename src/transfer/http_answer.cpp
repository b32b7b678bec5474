// Reads the head of an HTTP answer.
#include "transfer/http_answer.h"

#include "transfer/decimal.h"

namespace zv {

namespace {

constexpr size_t longest_head = 65536;
constexpr size_t none = std::string_view::npos;

bool is_blank(char ch) {
  return ch == ' ' || ch == '\t';
}

std::string_view trimmed(std::string_view text) {
  while (!text.empty() && is_blank(text.front())) text.remove_prefix(1);
  while (!text.empty() && is_blank(text.back())) text.remove_suffix(1);
  return text;
}

bool is_word(std::string_view text, std::string_view word) {
  return text.size() == word.size() && zv_strnicmp(text.data(), word.data(), word.size()) == 0;
}

// A length may stand several times, in one line or in many, as long as it is the same.
Taken take_lengths(std::string_view list, HttpAnswer& answer) {
  for (;;) {
    const size_t comma = std::min(list.find(','), list.size());
    int64_t length = 0;
    if (!read_decimal({list.data(), comma}, length)) return Taken::bad;
    if (answer.length != HttpAnswer::unknown && answer.length != length) return Taken::bad;
    answer.length = length;
    if (comma == list.size()) return Taken::good;
    list.remove_prefix(comma + 1);
  }
}

bool fail(Wire& wire, Taken taken, std::string_view what) {
  if (taken == Taken::no_memory) return wire.fail(ZV_CAUSE_MEMORY, 0, {"out of memory"});
  return wire.fail(ZV_CAUSE_PROTOCOL, 0, {what});
}

}  // namespace

Taken take_status_line(std::string_view line, HttpAnswer& answer) {
  constexpr std::string_view name = "HTTP/";
  const size_t blank = line.find(' ');
  if (line.size() < 12 || blank == none || !is_word({line.data(), name.size()}, name))
    return Taken::bad;
  const std::string_view words = trimmed({line.data() + blank, line.size() - blank});
  std::string_view digits = words;
  int64_t status = 0;
  if (!take_decimal(digits, status) || words.size() - digits.size() != 3 || status < 100)
    return Taken::bad;
  if (!digits.empty() && !is_blank(digits.front())) return Taken::bad;
  answer.status = static_cast<int>(status);
  (void)answer.words.assign({words.data(), std::min(words.size(), StatusWords::capacity)});
  return Taken::good;
}

Taken take_header_line(std::string_view line, HttpAnswer& answer) {
  const size_t colon = line.find(':');
  if (colon == none) return Taken::good;
  const std::string_view name = trimmed({line.data(), colon});
  const std::string_view value = trimmed({line.data() + colon + 1, line.size() - colon - 1});
  if (is_word(name, "Content-Length")) return take_lengths(value, answer);
  if (is_word(name, "Transfer-Encoding")) {
    if (answer.is_chunked || !is_word(value, "chunked")) return Taken::bad;
    answer.is_chunked = true;
  }
  if (is_word(name, "Location") && !answer.location.assign(value)) return Taken::no_memory;
  return Taken::good;
}

Taken take_chunk_size(std::string_view line, int64_t& size) {
  if (!take_decimal(line, size, 16)) return Taken::bad;
  line = trimmed(line);
  return line.empty() || line.starts_with(';') ? Taken::good : Taken::bad;
}

bool read_head(Wire& wire, HttpAnswer& answer) {
  answer.status = 0;
  answer.length = HttpAnswer::unknown;
  answer.is_chunked = false;
  answer.location.clear();
  std::string_view line;
  if (!wire.read_line(line)) return false;
  Taken taken = take_status_line(line, answer);
  if (taken != Taken::good) return fail(wire, taken, "the answer is no HTTP");
  for (size_t size = line.size();;) {
    if (!wire.read_line(line)) return false;
    if (line.empty()) break;
    size += line.size() + 1;
    if (size > longest_head) return fail(wire, Taken::bad, "a header longer than 64 KiB");
    taken = take_header_line(line, answer);
    if (taken != Taken::good) return fail(wire, taken, "a header that tells no usable length");
  }
  return answer.status != 101 || fail(wire, Taken::bad, "another protocol");
}

bool read_answer(Wire& wire, HttpAnswer& answer) {
  do {
    if (!read_head(wire, answer)) return false;
  } while (answer.status < 200);
  return true;
}

bool skip_trailer(Wire& wire) {
  size_t size = 0;
  for (std::string_view line; size <= longest_head; size += line.size() + 1) {
    if (!wire.read_line(line)) return false;
    if (line.empty()) return true;
  }
  return fail(wire, Taken::bad, "a trailer longer than 64 KiB");
}

}  // namespace zv
