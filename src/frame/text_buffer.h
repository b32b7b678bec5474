// The bounded text that the library works in instead of raw character arrays.
#ifndef ZARVO_FRAME_TEXT_BUFFER_H
#define ZARVO_FRAME_TEXT_BUFFER_H

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <string_view>

#include "frame/text_view.h"
#include "zarvo.h"

namespace zv {

// A NUL-terminated text of at most Size - 1 characters that knows its length. What does not fit is
// refused and leaves the text as it was; only assign_cut() cuts.
template <size_t Size>
class TextBuffer {
 public:
  static constexpr size_t capacity = Size - 1;

  TextBuffer() { text_[0] = '\0'; }

  const char* c_str() const { return text_; }
  size_t size() const { return size_; }
  bool empty() const { return size_ == 0; }
  std::string_view view() const { return {text_, size_}; }
  char back() const { return size_ == 0 ? '\0' : text_[size_ - 1]; }
  char operator[](size_t i) const { return i < size_ ? text_[i] : '\0'; }

  [[nodiscard]] bool assign(std::string_view text) {
    if (text.size() > capacity) return false;
    set(text.data(), text.size());
    return true;
  }

  // Keeps what fits, as zv_strncpy() does; tells whether all of it did. Reads no more of the text
  // than can be kept.
  bool assign_cut(const char* text) {
    const std::string_view read = bounded(text, Size);
    set(read.data(), read.size());
    return read.size() <= capacity;
  }

  [[nodiscard]] bool append(std::string_view text) {
    if (text.size() > capacity - size_) return false;
    if (!text.empty()) std::memmove(text_ + size_, text.data(), text.size());
    measure(size_ + text.size());
    return true;
  }

  [[nodiscard]] bool append(char ch) {
    if (size_ == capacity) return false;
    text_[size_] = ch;
    measure(size_ + 1);
    return true;
  }

  // Cuts the text to its first `size` characters; a longer size changes nothing.
  void shorten(size_t size) { measure(std::min(size, size_)); }

  void clear() { shorten(0); }

  void replace(char from, char to) {
    for (size_t i = 0; i < size_; ++i) text_[i] = text_[i] == from ? to : text_[i];
  }

  // Lets `write(char* room, size_t size)` fill the room with a NUL-terminated text and measures it.
  // Where that tells failure, or left no NUL, the text is empty and the result false.
  template <class Write>
  [[nodiscard]] bool fill(Write write) {
    text_[0] = '\0';
    const size_t written = write(text_, Size) ? bounded(text_, Size).size() : Size;
    measure(written <= capacity ? written : 0);
    return written <= capacity;
  }

  // Lets an in-place edit that never makes the text longer work on it, then measures it anew.
  template <class Edit>
  void edit_shrinking(Edit edit) {
    edit(text_);
    size_ = std::strlen(text_);
  }

 private:
  void set(const char* text, size_t size) {
    if (size != 0) std::memmove(text_, text, size);  // it takes no nullptr
    measure(size);
  }

  void measure(size_t size) {
    size_ = std::min(size, capacity);
    text_[size_] = '\0';
  }

  size_t size_ = 0;
  char text_[Size];
};

using PathBuffer = TextBuffer<ZV_PATH_MAX>;

// Ends a folder with its separator; an empty one, which is the current folder, has none.
template <size_t Size>
[[nodiscard]] bool end_with_slash(TextBuffer<Size>& folder) {
  return folder.empty() || folder.back() == '/' || folder.append('/');
}

// Appends a name in a folder. False when it does not fit.
template <size_t Size>
[[nodiscard]] bool append_name(TextBuffer<Size>& folder, std::string_view name) {
  return end_with_slash(folder) && folder.append(name);
}

}  // namespace zv

#endif
