// Which libraries of a folder are worth trying.
#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include "plugin/candidates.h"
#include "zarvo.h"

namespace {

using Names = std::vector<std::string>;

Names dropped(const Names& names) {
  std::string text;
  for (const std::string& name : names) text += name + ';';
  char** list = nullptr;
  zv_strlist(&list, text.c_str(), ';');
  const int n = zv::drop_variants(list, static_cast<int>(names.size()));
  EXPECT_EQ(zv_strlist_len(list), n);
  Names left(list, list + n);
  zv_strlist_free(list, -1);
  return left;
}

// The rule as it is said: name by name, and from the start after each one that is taken out.
Names dropped_one_by_one(Names names) {
  const auto take_one = [&names] {
    for (const std::string& name : names) {
      std::string variant = name;
      variant.insert(variant.rfind('.'), 1, 'd');
      const auto found = std::find_if(names.begin(), names.end(), [&](const std::string& other) {
        return zv_stricmp(other.c_str(), variant.c_str()) == 0;
      });
      if (found == names.end()) continue;
      names.erase(found);
      return true;
    }
    return false;
  };
  while (take_one()) continue;
  return names;
}

TEST(Candidates, VariantsAreDropped) {
  const struct {
    Names names, left;
  } cases[] = {
      {{}, {}},
      {{"img_a.dll"}, {"img_a.dll"}},
      {{"img_a.dll", "IMG_AD.DLL"}, {"img_a.dll"}},
      {{"img_ad.dll", "x_c.dll", "img_A.dll", "img_aD.dll"}, {"x_c.dll", "img_A.dll"}},
      {{"a.dll", "ad.dll", "add.dll"}, {"a.dll", "add.dll"}},
      {{"ad.dll", "add.dll", "a.dll"}, {"a.dll"}},
      {{"a.b.dll", "ad.b.dll", "a.bd.dll"}, {"a.b.dll", "ad.b.dll"}},
  };
  for (const auto& c : cases) EXPECT_EQ(dropped(c.names), c.left);
}

TEST(Candidates, AnyFolderAsNameByName) {
  std::mt19937 random(7);
  for (int round = 0; round < 2000; ++round) {
    Names names;
    for (size_t n = random() % 12; names.size() < n;) {
      std::string name = random() % 2 != 0 ? "a" : "A";
      for (size_t i = random() % 4; i > 0; --i) name += random() % 3 != 0 ? 'd' : 'D';
      names.push_back(name + ".dll");
    }
    ASSERT_EQ(dropped(names), dropped_one_by_one(names)) << testing::PrintToString(names);
  }
}

}  // namespace
