// A buffer of exactly the size a contract asks for, between guard bytes that nothing may touch: it
// looks after them itself when its test is done with it.
#ifndef ZARVO_TESTS_GUARDED_H
#define ZARVO_TESTS_GUARDED_H

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <type_traits>

class Guarded {
 public:
  // `size` bytes, of which the first are given; '#' stands where nothing was written.
  Guarded(const std::string& first, size_t size)
      : bytes_(fence() + std::string(size, '#').replace(0, first.size(), first) + fence()) {}
  ~Guarded() {
    EXPECT_TRUE(bytes_.starts_with(fence()) && bytes_.ends_with(fence())) << "beside " << all();
  }
  Guarded(const Guarded&) = delete;
  Guarded& operator=(const Guarded&) = delete;

  char* data() { return bytes_.data() + fence().size(); }
  const char* text() { return data(); }
  std::string all() const { return bytes_.substr(16, bytes_.size() - 32); }

 private:
  static std::string fence() { return std::string(16, '#'); }

  std::string bytes_;
};

// What an edit in place gives (for a pointer how far into the text it leads, 0 for nothing) and
// leaves, with room for the longer of both texts and no more.
template <class Edit, class... Arguments>
void expect_edit(const std::string& before, int64_t result, const std::string& after, Edit edit,
                 Arguments... arguments) {
  SCOPED_TRACE(testing::PrintToString(before));
  Guarded text(before + '\0', std::max(before.size(), after.size()) + 1);
  char* const s = text.data();
  if constexpr (std::is_void_v<decltype(edit(s, arguments...))>)
    edit(s, arguments...);
  else if constexpr (std::is_pointer_v<decltype(edit(s, arguments...))>)
    EXPECT_EQ(edit(s, arguments...) - s, result);
  else
    EXPECT_EQ(static_cast<int64_t>(edit(s, arguments...)), result);
  EXPECT_EQ(text.all().substr(0, after.size() + 1), after + '\0');
}

#endif
