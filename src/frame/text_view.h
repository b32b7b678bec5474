// Views of texts: how much of one takes part, how it begins and ends, what its characters and names
// are, and a view handed to a caller's buffer. What std::string_view has only as functions that may
// throw, or that call others that may, stands here: a build without optimisation would need the C++
// runtime for those.
#ifndef ZARVO_FRAME_TEXT_VIEW_H
#define ZARVO_FRAME_TEXT_VIEW_H

#include <algorithm>
#include <cctype>
#include <cstddef>
#include <cstring>
#include <string_view>

namespace zv {

// At most the first `limit` characters of a text, of which no more is read.
inline std::string_view bounded(const char* text, size_t limit) {
  const void* const end = std::memchr(text, '\0', limit);
  return {text, end != nullptr ? static_cast<size_t>(static_cast<const char*>(end) - text) : limit};
}

// Writes to a caller's sized output what zv_strncpy() would, and gives its length. The text may lie
// in `out`.
inline size_t put(std::string_view text, char* out, size_t size) {
  if (size == 0) return 0;
  const size_t kept = std::min(text.size(), size - 1);
  if (kept != 0) std::memmove(out, text.data(), kept);
  out[kept] = '\0';
  return kept;
}

inline bool has_front(std::string_view text, std::string_view front) {
  return text.size() >= front.size() && std::string_view(text.data(), front.size()) == front;
}

inline bool has_tail(std::string_view text, std::string_view tail) {
  if (text.size() < tail.size()) return false;
  return std::string_view(text.data() + text.size() - tail.size(), tail.size()) == tail;
}

// What isspace() says. In every locale the blank and what moves the cursor are white space, and the
// graphic characters of ASCII are not.
inline bool is_space(char ch) {
  if (ch > ' ' && ch <= '~') return false;
  return ch == ' ' || (ch >= '\t' && ch <= '\r') ||
         std::isspace(static_cast<unsigned char>(ch)) != 0;
}

// The names by which a folder lists itself and its parent.
inline bool is_dot_or_dots(std::string_view name) {
  return name == "." || name == "..";
}

// From `begin` up to `end`, as far as the text goes.
inline std::string_view part(std::string_view text, size_t begin,
                             size_t end = std::string_view::npos) {
  begin = begin < text.size() ? begin : text.size();
  return {text.data() + begin, (end < text.size() ? end : text.size()) - begin};
}

}  // namespace zv

#endif
