// String lists as texts, which a test writes down and compares.
#ifndef ZARVO_TESTS_STRING_LIST_H
#define ZARVO_TESTS_STRING_LIST_H

#include <string>

#include "zarvo.h"

// The entries, ';' behind each; "none" where there is no list.
inline std::string joined(char** list) {
  if (list == nullptr) return "none";
  std::string text;
  for (; *list != nullptr; ++list) text.append(*list).append(";");
  return text;
}

// A list for one test.
class List {
 public:
  // Made of entries with ';' behind each; at the second try where memory fails on purpose.
  explicit List(const std::string& entries = "") {
    if (zv_strlist(&list, entries.c_str(), ';') < 0) zv_strlist(&list, entries.c_str(), ';');
  }
  ~List() { zv_strlist_free(list, -1); }
  List(const List&) = delete;
  List& operator=(const List&) = delete;

  std::string text() const { return joined(list); }

  char** list = nullptr;
};

#endif
