// A buffer of exactly the size a contract asks for, between guard bytes that nothing may touch.
#ifndef ZARVO_TESTS_GUARDED_H
#define ZARVO_TESTS_GUARDED_H

#include <algorithm>
#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

class Guarded {
 public:
  // A text in a buffer that it fills with its NUL, and `room` bytes more.
  explicit Guarded(const std::string& text, size_t room = 0) : Guarded(text.size() + 1 + room) {
    std::copy_n(text.c_str(), text.size() + 1, data());
  }

  // `size` bytes, of which the first are given.
  static Guarded buffer(std::string_view first, size_t size) {
    Guarded made(size);
    std::copy(first.begin(), first.end(), made.data());
    return made;
  }

  char* data() { return bytes_.data() + fence; }
  const char* text() { return data(); }
  // The buffer's whole contents, guard bytes for what was never written.
  std::string all() const { return {bytes_.data() + fence, bytes_.size() - 2 * fence}; }

  bool intact() const {
    const auto is_guard = [](char ch) { return ch == guard; };
    return std::all_of(bytes_.begin(), bytes_.begin() + fence, is_guard) &&
           std::all_of(bytes_.end() - fence, bytes_.end(), is_guard);
  }

  static constexpr char guard = '#';

 private:
  explicit Guarded(size_t size) : bytes_(size + 2 * fence, guard) {}

  static constexpr std::ptrdiff_t fence = 16;
  std::vector<char> bytes_;
};

#endif
