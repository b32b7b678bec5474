// A buffer of exactly the size a contract asks for, between guard bytes that nothing may touch: the
// buffer looks after them itself when its test is done with it.
#ifndef ZARVO_TESTS_GUARDED_H
#define ZARVO_TESTS_GUARDED_H

#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

class Guarded {
 public:
  // A text in a buffer that it fills with its NUL, and `room` bytes more.
  explicit Guarded(const std::string& text, size_t room = 0)
      : Guarded(text.size() + 1 + room, {text.c_str(), text.size() + 1}) {}
  ~Guarded() { EXPECT_TRUE(intact()) << "written beside " << testing::PrintToString(all()); }
  Guarded(const Guarded&) = delete;
  Guarded& operator=(const Guarded&) = delete;

  // `size` bytes, of which the first are given.
  static Guarded buffer(std::string_view first, size_t size) { return Guarded(size, first); }

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
  Guarded(size_t size, std::string_view first) : bytes_(size + 2 * fence, guard) {
    std::copy(first.begin(), first.end(), data());
  }

  static constexpr std::ptrdiff_t fence = 16;
  std::vector<char> bytes_;
};

// What an edit in place gives and leaves, with room for the longer of both texts and no more.
template <class Edit>
void expect_edit(const std::string& before, Edit edit, int64_t result, const std::string& after) {
  SCOPED_TRACE(testing::PrintToString(before));
  Guarded text(before, after.size() - std::min(after.size(), before.size()));
  EXPECT_EQ(static_cast<int64_t>(edit(text.data())), result);
  EXPECT_EQ(text.all().substr(0, after.size() + 1), after + '\0');
}

#endif
