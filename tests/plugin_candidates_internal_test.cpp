// Which libraries of a folder are worth trying.
#include <gtest/gtest.h>

#include <random>
#include <string>

#include "plugin/candidates.h"
#include "string_list.h"

namespace {

// The rule as it is said: name by name, and from the start after each one that is taken out.
std::string dropped_one_by_one(List& names) {
  for (int i = 0; names.list[i] != nullptr; ++i) {
    std::string variant = names.list[i];
    variant.insert(variant.rfind('.'), 1, 'd');
    const int found = zv_strlist_iidx(names.list, -1, variant.c_str());
    if (found == -1) continue;
    zv_free(zv_strlist_remove(names.list, -1, found));
    i = -1;
  }
  return names.text();
}

TEST(Candidates, AnyFolderAsNameByName) {
  std::mt19937 random(7);
  for (int round = 0; round < 3000; ++round) {
    std::string names;
    for (size_t n = random() % 12; n > 0; --n) {
      names += "aA"[random() % 2];
      for (size_t i = random() % 4; i > 0; --i) names += "ddD.b"[random() % 5];
      names += ".dll;";
    }
    List list(names), model(names);
    const int n = zv::drop_variants(list.list, zv_strlist_len(list.list));
    ASSERT_EQ(list.text(), dropped_one_by_one(model)) << names;
    ASSERT_EQ(n, zv_strlist_len(model.list));
  }
}

}  // namespace
