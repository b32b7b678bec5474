// The owner of a string list.
#include "strlist/list_owner.h"

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <utility>

#include "frame/null_ended.h"

namespace zv {

ListOwner::ListOwner(char** list, int count) : list_(list) {
  if (list == nullptr) return;
  count_ = capacity_ = count < 0 ? zv_strlist_len(list) : count;
}

bool ListOwner::reserve(int count) {
  return count <= capacity_ || resize(count);
}

bool ListOwner::append(std::string_view text) {
  HeapPtr<char> copy(static_cast<char*>(std::malloc(text.size() + 1)));
  if (copy == nullptr) return false;
  std::copy(text.begin(), text.end(), copy.get());
  copy.get()[text.size()] = '\0';
  return append(std::move(copy));
}

bool ListOwner::append(HeapPtr<char> text) {
  if (count_ >= capacity_ && !grow()) return false;
  list_[count_] = text.release();
  list_[++count_] = nullptr;
  return true;
}

char** ListOwner::release() {
  if (!reserve(0)) return nullptr;  // the empty list is an array too
  count_ = 0;
  capacity_ = -1;
  return std::exchange(list_, nullptr);
}

bool ListOwner::grow() {
  return count_ < INT_MAX / 2 && resize(std::max(count_ * 2 + 1, 7));
}

bool ListOwner::resize(int capacity) {
  if (!resize_array(list_, static_cast<size_t>(capacity))) return false;
  list_[count_] = nullptr;
  capacity_ = capacity;
  return true;
}

}  // namespace zv
