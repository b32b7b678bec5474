// String list operations as a program, beside a model that is a vector.
#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <cctype>
#include <cstring>
#include <string>
#include <vector>

#include "check.h"
#include "zarvo.h"

namespace {

using Model = std::vector<std::string>;

bool same(const std::string& a, const std::string& b, bool any_case) {
  return any_case ? zv_stricmp(a.c_str(), b.c_str()) == 0 : a == b;
}

int remove_duplicates(Model& model, bool any_case) {
  Model kept;
  for (const std::string& text : model) {
    const bool known = std::any_of(kept.begin(), kept.end(), [&](const std::string& other) {
      return same(other, text, any_case);
    });
    if (!known) kept.push_back(text);
  }
  const auto removed = static_cast<int>(model.size() - kept.size());
  model = kept;
  return removed;
}

int find(const Model& model, const std::string& text, bool any_case) {
  for (size_t i = 0; i < model.size(); ++i)
    if (same(model[i], text, any_case)) return static_cast<int>(i);
  return -1;
}

void check_equal(char** list, const Model& model) {
  CHECK(zv_strlist_len(list) == static_cast<int>(model.size()));
  for (size_t i = 0; i < model.size(); ++i) CHECK(model[i] == list[i]);
}

void append_split(char*** list, Model& model, std::string text, char separator) {
  char** other = nullptr;
  const int count = zv_strlist(&other, text.c_str(), separator);
  const int total = zv_strlist_cat(list, -1, other, count);
  CHECK(total == static_cast<int>(model.size()) + count);
  zv_free(other);
  for (size_t end = text.find(separator); end != std::string::npos; end = text.find(separator)) {
    model.push_back(text.substr(0, end));
    text.erase(0, end + 1);
  }
}

void run_step(FuzzedDataProvider& program, char*** list, Model& model) {
  const std::string text = program.ConsumeRandomLengthString(12).c_str();
  const int size = static_cast<int>(model.size());
  const int pos = program.ConsumeIntegralInRange<int>(0, size);
  const int n = program.ConsumeBool() ? -1 : size;
  const bool any_case = program.ConsumeBool();
  switch (program.ConsumeIntegralInRange<int>(0, 7)) {
    case 0:
      CHECK(zv_strlist_insert(list, n, pos, text.c_str()) == 1);
      model.insert(model.begin() + pos, text);
      break;
    case 1: {
      char* const removed = zv_strlist_remove(*list, n, pos);
      CHECK((removed == nullptr) == (pos == size));
      if (removed == nullptr) break;
      CHECK(model[static_cast<size_t>(pos)] == removed);
      model.erase(model.begin() + pos);
      zv_free(removed);
      break;
    }
    case 2:
      if (pos == size) break;
      CHECK(zv_strlist_replace(*list, pos, text.c_str()) == 1);
      model[static_cast<size_t>(pos)] = text;
      break;
    case 3:
      CHECK((any_case ? zv_strlist_iset : zv_strlist_set)(*list, n) ==
            remove_duplicates(model, any_case));
      break;
    case 4:
      CHECK((any_case ? zv_strlist_iidx : zv_strlist_idx)(*list, n, text.c_str()) ==
            find(model, text, any_case));
      break;
    case 5:
      if (pos == size) break;
      CHECK(zv_strlist_reduce(list, n, pos) == 1);
      model = {Model{model[static_cast<size_t>(pos)]}};
      break;
    case 6:
      CHECK(zv_strlist_insert(list, n, -1, text.c_str()) == 1);
      model.push_back(text);
      break;
    default:
      append_split(list, model, text, program.PickValueInArray({';', 'a', '|'}));
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider program(data, size);
  char** list = nullptr;
  CHECK(zv_strlist(&list, nullptr, 0) == 0);
  Model model;
  while (program.remaining_bytes() > 0) {
    run_step(program, &list, model);
    check_equal(list, model);
  }
  zv_strlist_free(list, -1);
  return 0;
}
