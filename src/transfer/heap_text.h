// A text of any length on the heap.
#ifndef ZARVO_TRANSFER_HEAP_TEXT_H
#define ZARVO_TRANSFER_HEAP_TEXT_H

#include <algorithm>
#include <initializer_list>
#include <string_view>
#include <utility>

#include "frame/owner.h"

namespace zv {

// Overwritten before its memory is given back, since it may be a password.
class HeapText {
 public:
  HeapText() = default;
  ~HeapText() { clear(); }
  HeapText(const HeapText&) = delete;
  HeapText& operator=(const HeapText&) = delete;

  // The words joined. False, and the text as it was, when memory ran out.
  [[nodiscard]] bool assign(std::initializer_list<std::string_view> words) {
    size_t size = 0;
    for (const std::string_view word : words) size += word.size();
    HeapPtr<char[]> joined(static_cast<char*>(std::malloc(size + 1)));
    if (joined == nullptr) return false;
    char* end = joined.get();
    for (const std::string_view word : words) end = std::copy(word.begin(), word.end(), end);
    *end = '\0';
    clear();
    text_ = std::move(joined);
    size_ = size;
    return true;
  }
  [[nodiscard]] bool assign(std::string_view text) { return assign({text}); }

  void swap(HeapText& other) {
    std::swap(text_, other.text_);
    std::swap(size_, other.size_);
  }

  void clear() {
    volatile char* const text = text_.get();
    for (size_t i = 0; i < size_; ++i) text[i] = '\0';
    text_.reset();
    size_ = 0;
  }

  // Lets an in-place edit that gives the new length, no longer one, work on the text.
  template <class Edit>
  void edit_shrinking(Edit edit) {
    if (size_ == 0) return;
    size_ = edit(text_.get(), size_);
    text_[size_] = '\0';
  }

  bool empty() const { return size_ == 0; }
  const char* c_str() const { return text_ != nullptr ? text_.get() : ""; }
  std::string_view view() const { return {c_str(), size_}; }

 private:
  HeapPtr<char[]> text_;
  size_t size_ = 0;
};

}  // namespace zv

#endif
