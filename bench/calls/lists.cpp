// String lists: split, appended to, freed of duplicates.
#ifndef _WIN32
#include <glib.h>
#endif

#include <cstring>
#include <memory>
#include <string>
#include <string_view>
#include <unordered_set>
#include <vector>

#include "frame/measure.h"
#include "zarvo.h"

namespace {

const bench::Item item("lists");

using Texts = std::vector<std::string>;

struct FreeList {
  void operator()(char** list) const { zv_strlist_free(list, -1); }
};
using List = std::unique_ptr<char*[], FreeList>;

#ifndef _WIN32
struct FreeArray {
  void operator()(GPtrArray* array) const { g_ptr_array_unref(array); }
};
using Array = std::unique_ptr<GPtrArray, FreeArray>;
#endif

// File names, each one `copies` times, the copies far from each other.
Texts make_texts(int count, int copies) {
  Texts texts;
  const int different = count / copies;
  for (int i = 0; i < count; ++i)
    texts.push_back("pictures/IMG_" + std::to_string(10007 * (i % different) % 999983) + ".jpeg");
  return texts;
}

std::vector<std::string> split_by_find(std::string_view text) {
  std::vector<std::string> pieces;
  for (size_t start = 0; start < text.size();) {
    const size_t end = text.find(',', start);
    pieces.emplace_back(text.substr(start, end - start));
    start = end + 1;
  }
  return pieces;
}

void add_split(int count) {
  std::string text;
  for (const std::string& piece : make_texts(count, 1)) text += piece + ',';
  const std::string what = "split and free @" + std::to_string(count);
  item.add(what, "zarvo", [=] {
    char** list = nullptr;
    const int pieces = zv_strlist(&list, text.c_str(), ',');
    zv_strlist_free(list, pieces);
    return pieces;
  });
#ifndef _WIN32
  item.add(what, "g_strsplit", [=] {
    char** const list = g_strsplit(text.c_str(), ",", -1);
    const guint pieces = g_strv_length(list) - 1;  // it counts the empty one at the end
    g_strfreev(list);
    return pieces;
  });
#endif
  item.add(what, "std::vector<std::string>", [=] { return split_by_find(text).size(); });
}

void add_append(int count) {
  const Texts texts = make_texts(count, 1);
  const std::string what = "append @" + std::to_string(count);
  item.add(what, "zarvo", [=] {
    char** list = nullptr;
    zv_strlist(&list, nullptr, 0);
    int n = 0;
    for (const std::string& text : texts) n += zv_strlist_insert(&list, n, n, text.c_str());
    zv_strlist_free(list, n);
    return n;
  });
#ifndef _WIN32
  item.add(what, "GPtrArray", [=] {
    const Array array(g_ptr_array_new_with_free_func(g_free));
    for (const std::string& text : texts) g_ptr_array_add(array.get(), g_strdup(text.c_str()));
    return array->len;
  });
#endif
  item.add(what, "std::vector<std::string>", [=] {
    std::vector<std::string> list;
    for (const std::string& text : texts) list.emplace_back(text.c_str());
    return list.size();
  });
}

List make_list(const Texts& texts) {
  std::string joined;
  for (const std::string& text : texts) joined += text + ',';
  char** list = nullptr;
  zv_strlist(&list, joined.c_str(), ',');
  return List(list);
}

#ifndef _WIN32
Array make_array(const Texts& texts) {
  Array array(g_ptr_array_new_with_free_func(g_free));
  for (const std::string& text : texts) g_ptr_array_add(array.get(), g_strdup(text.c_str()));
  return array;
}
#endif

// The first of each stays. What is left is moved up, as the list does it.
void keep_first(Texts& texts) {
  std::unordered_set<std::string> seen;
  std::erase_if(texts, [&seen](const std::string& text) { return !seen.insert(text).second; });
}

void keep_first_by_views(Texts& texts) {
  std::vector<size_t> kept;
  {
    std::unordered_set<std::string_view> seen(texts.size());
    for (size_t i = 0; i < texts.size(); ++i)
      if (seen.insert(texts[i]).second) kept.push_back(i);
  }
  for (size_t i = 0; i < kept.size(); ++i)
    if (kept[i] != i) texts[i] = std::move(texts[kept[i]]);
  texts.resize(kept.size());
}

#ifndef _WIN32
void keep_first_in_array(Array& array) {
  GHashTable* const seen = g_hash_table_new(g_str_hash, g_str_equal);
  GPtrArray* const kept = g_ptr_array_new_with_free_func(g_free);
  for (guint i = 0; i < array->len; ++i)
    if (g_hash_table_add(seen, array->pdata[i]))
      g_ptr_array_add(kept, std::exchange(array->pdata[i], nullptr));
  g_hash_table_unref(seen);
  array.reset(kept);
}
#endif

void add_duplicates(int count) {
  const Texts texts = make_texts(count, 4);
  const std::string what = "remove duplicates @" + std::to_string(count);
  const auto size = [](const Texts& kept) { return kept.size(); };
  item.add_prepared(
      what, "zarvo", [=] { return make_list(texts); },
      [=](List& list) { zv_strlist_set(list.get(), count); },
      [](const List& list) { return zv_strlist_len(list.get()); });
  item.add_prepared(
      what, "std::unordered_set", [=] { return texts; }, keep_first, size);
  item.add_prepared(
      what, "std::unordered_set of views", [=] { return texts; }, keep_first_by_views, size);
#ifndef _WIN32
  item.add_prepared(
      what, "GHashTable", [=] { return make_array(texts); }, keep_first_in_array,
      [](const Array& array) { return array->len; });
#endif
}

}  // namespace

void bench::add_cases() {
  for (const int count : {1000, 10000, 100000}) add_split(count);
  for (const int count : {1000, 10000, 100000}) add_append(count);
  for (const int count : {1000, 20000, 100000}) add_duplicates(count);
}
