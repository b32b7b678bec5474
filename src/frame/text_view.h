// What std::string_view has only as functions that may throw, or call others that may: a build
// without optimisation would need the C++ runtime for them.
#ifndef ZARVO_FRAME_TEXT_VIEW_H
#define ZARVO_FRAME_TEXT_VIEW_H

#include <string_view>

namespace zv {

inline bool has_front(std::string_view text, std::string_view front) {
  return text.size() >= front.size() && std::string_view(text.data(), front.size()) == front;
}

inline bool has_tail(std::string_view text, std::string_view tail) {
  if (text.size() < tail.size()) return false;
  return std::string_view(text.data() + text.size() - tail.size(), tail.size()) == tail;
}

}  // namespace zv

#endif
