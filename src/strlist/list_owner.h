// The owner of a string list, and the way lists are built inside the library: it knows its count,
// grows by doubling, and frees what it holds unless the list is handed over.
#ifndef ZARVO_STRLIST_LIST_OWNER_H
#define ZARVO_STRLIST_LIST_OWNER_H

#include <string_view>

#include "frame/owner.h"
#include "zarvo.h"

namespace zv {

class ListOwner {
 public:
  ListOwner() = default;
  // Takes over a list, nullptr for none; a negative count means: count them.
  explicit ListOwner(char** list, int count = -1);
  ~ListOwner() { zv_strlist_free(list_, count_); }
  ListOwner(const ListOwner&) = delete;
  ListOwner& operator=(const ListOwner&) = delete;

  int count() const { return count_; }
  char* operator[](int i) const { return list_[i]; }
  char** begin() const { return list_; }
  char** end() const { return list_ + count_; }

  // false when memory ran out, and then the list is as it was.
  [[nodiscard]] bool reserve(int count);
  [[nodiscard]] bool append(std::string_view text);
  [[nodiscard]] bool append(HeapPtr<char> text);

  // Hands the list over. nullptr only when it has no entry and memory ran out.
  [[nodiscard]] char** release();

 private:
  [[nodiscard]] bool grow();
  [[nodiscard]] bool resize(int capacity);

  char** list_ = nullptr;
  int count_ = 0;
  int capacity_ = -1;  // entries that fit in front of the NULL; -1 without an array
};

}  // namespace zv

#endif
