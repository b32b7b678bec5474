// String lists and private variables as texts, which a test writes down and compares.
#ifndef ZARVO_TESTS_STRING_LIST_H
#define ZARVO_TESTS_STRING_LIST_H

#include <cstring>
#include <string>

#include "zarvo.h"

// The entries, ';' after each; "none" where there is no list.
inline std::string joined(char** list) {
  if (list == nullptr) return "none";
  std::string text;
  for (; *list != nullptr; ++list) text.append(*list).append(";");
  return text;
}

// A list for one test.
class List {
 public:
  List() = default;  // none yet
  // Made of entries with ';' after each; at the second try where memory fails on purpose.
  explicit List(const std::string& entries) {
    if (zv_strlist(&list, entries.c_str(), ';') < 0) zv_strlist(&list, entries.c_str(), ';');
  }
  ~List() {
    if (list != nullptr) zv_strlist_free(list, -1);
  }
  List(const List&) = delete;
  List& operator=(const List&) = delete;

  std::string text() const { return joined(list); }

  char** list = nullptr;
};

// The texts of a sequence, '|' after each.
inline std::string barred(const char* sequence) {
  std::string text;
  for (; *sequence != '\0'; sequence += std::strlen(sequence) + 1)
    text.append(sequence).append("|");
  return text;
}

// The values of a private variable; "none" when it is not there.
inline std::string private_values(const std::string& name) {
  char* const block = zv_getenv_private(name.c_str());
  const std::string values = block != nullptr ? barred(block) : "none";
  zv_free(block);
  return values;
}

#endif
