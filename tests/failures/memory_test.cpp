// Every exported function that allocates, with each allocation failing in turn: the documented
// result, nothing lost, and what was there before as documented.
#include "environment.h"
#include "failures/operations.h"
#include "fixtures/plugins/plugin_folder.h"
#include "fixtures/private_values.h"
#include "zarvo.h"

namespace {

using namespace failing;

std::string texts(char** list) {
  std::string all;
  for (; list != nullptr && *list != nullptr; ++list) all += std::string(*list) + '|';
  return all;
}

// ---- Blocks and lists ---------------------------------------------------------------------------

int new_blocks(Attempt& attempt) {
  void* blocks[3];
  attempt([&] {
    blocks[0] = zv_malloc(5);
    blocks[1] = zv_calloc(5);
    blocks[2] = zv_dalloc("text", 5);
  });
  int made = 0;
  for (void* const block : blocks) made += block != nullptr && zv_free(block) == 0;
  return made;
}

int resized_block(Attempt& attempt) {
  int ok = -1;
  void* const block = zv_dalloc("kept", 5);
  void* const moved = attempt([&] { return zv_realloc(block, 100000, &ok); });
  EXPECT_TRUE(ok == 1 || moved == block);
  EXPECT_STREQ(static_cast<char*>(moved), "kept");
  zv_free(moved);
  return ok;
}

int new_list(Attempt& attempt) {
  char** list = nullptr;
  const int count = attempt([&] { return zv_strlist(&list, "a;b;", ';'); });
  EXPECT_EQ(texts(list), count < 0 ? "" : "a|b|");
  zv_strlist_free(list, -1);
  return count;
}

// A change of the list "a|b|", and what a success makes of it.
template <class Change>
Operation list_change(const char* name, const char* after, Change change) {
  return {name, 1, [=](Attempt& attempt) {
            char** list = nullptr;
            zv_strlist(&list, "a;b;", ';');
            const int result = attempt([&] { return change(&list); });
            EXPECT_EQ(texts(list), result == 1 ? after : "a|b|");
            zv_strlist_free(list, -1);
            return result;
          }};
}

int concatenated_list(Attempt& attempt) {
  char** list = nullptr;
  zv_strlist(&list, "a;b;", ';');  // in a block that has room for no more
  char* other[] = {zv_strredup(nullptr, "c"), nullptr};
  const int count = attempt([&] { return zv_strlist_cat(&list, -1, other, -1); });
  EXPECT_EQ(texts(list), count < 0 ? "a|b|" : "a|b|c|");
  zv_strlist_free(list, -1);
  if (count < 0) zv_free(other[0]);
  return count;
}

// The index that finds duplicates is a luxury.
int list_as_set(Attempt& attempt) {
  std::string text;
  for (int i = 0; i < 300; ++i) text += std::to_string(i % 100) + (i < 150 ? "a;" : "A;");
  char** list = nullptr;
  zv_strlist(&list, text.c_str(), ';');
  const int removed = attempt([&] { return zv_strlist_set(list, -1) + zv_strlist_iset(list, -1); });
  EXPECT_EQ(zv_strlist_len(list), 100);
  EXPECT_STREQ(list[99], "99a");
  zv_strlist_free(list, -1);
  return removed;
}

// ---- Private environment, path map, search path, the user ---------------------------------------

// With as many variables as there are buckets, so that one more also asks for more of those.
Operation put(const char* name, const std::string& value, int append, const char* before,
              const std::string& after) {
  return {"zv_putenv_private " + value, 1, [=](Attempt& attempt) {
            for (int i = 0; i < 16; ++i) zv_putenv_private(std::to_string(i).c_str(), "kept", 0);
            const int result =
                attempt([&] { return zv_putenv_private(name, value.c_str(), append); });
            EXPECT_EQ(private_values(name), result == 1 ? after : before);
            EXPECT_EQ(private_values("8"), "kept|");
            zv_putenv_private(nullptr, nullptr, 0);
            return result;
          }};
}

int first_variable(Attempt& attempt) {
  const int result = attempt([] { return zv_putenv_private("A", "v", 0); });
  EXPECT_EQ(private_values("A"), result == 1 ? "v|" : "none");
  zv_putenv_private(nullptr, nullptr, 0);
  return result;
}

int variable_got(Attempt& attempt) {
  zv_putenv_private("A", "v", 0);
  char* const value = attempt([] { return zv_getenv_private("A"); });
  const bool got = value != nullptr;
  zv_free(value);
  EXPECT_EQ(private_values("A"), "v|");
  zv_putenv_private(nullptr, nullptr, 0);
  return got;
}

// A new record of the path map, or another target for one that is there.
Operation map_folder(bool is_new) {
  return {is_new ? "zv_pathmap adds" : "zv_pathmap changes", 1, [=](Attempt& attempt) {
            const ScratchFolder folder;
            const std::string old = folder.path("old/f");
            const std::string one = folder.make_file("one/f");
            const std::string two = folder.make_file("two/f");
            if (!is_new) zv_pathmap(old.c_str(), one.c_str());
            const int result = attempt([&] { return zv_pathmap(old.c_str(), two.c_str()); });
            char path[ZV_PATH_MAX];
            zv_strncpy(path, old.c_str(), sizeof path);
            zv_pathmap_locate(path);
            EXPECT_EQ(path, result == 1 ? two : is_new ? old : one);
            zv_pathmap_clear();
            return result;
          }};
}

int search_folders(Attempt& attempt) {
  const Variable path("PATH", "a;b;c;d;e;f;g;h;i;j");
  char** list = nullptr;
  const int count = attempt([&] { return zv_pathlist(&list); });
  EXPECT_EQ(texts(list), count == 0 ? "" : "a|b|c|d|e|f|g|h|i|j|");
  zv_strlist_free(list, -1);
  return count;
}

// ---- Plugins ------------------------------------------------------------------------------------

// The plugins bring the shared library along, and this program has the static one. It is loaded for
// good, so that they find it and what they write into its environment is not lost.
PluginFolder plugin_folder() {
  static void* const library = zv_dll_open(ZARVO_LIBRARY, 1);
  EXPECT_NE(library, nullptr);
  return PluginFolder();
}

void destroy(zv_plugin_t** plugins) {
  for (int i = 0; plugins != nullptr && plugins[i] != nullptr; ++i) zv_plugin_destroy(plugins[i]);
  zv_free(plugins);
}

int expected_code(const Attempt& attempt) {
  if (attempt.failed().empty()) return 3;
  return attempt.failed() == "dlopen" ? ZV_PLUGIN_E_LOAD : ZV_PLUGIN_E_MEMORY;
}

int new_record(Attempt& attempt) {
  const PluginFolder folder = plugin_folder();
  folder.add("accept", "a.dll");
  const std::string dir = folder.path();
  int code = 0;
  zv_plugin_t* const record =
      attempt([&] { return zv_plugin_create(dir.c_str(), "a.dll", "img", 1, 5, &code); });
  EXPECT_EQ(code, expected_code(attempt));
  const bool made = record != nullptr;
  zv_plugin_destroy(record);
  return made;
}

int added_library(Attempt& attempt) {
  const PluginFolder folder = plugin_folder();
  const std::string second = folder.add("accept", "b.dll");
  zv_plugin_t** plugins = nullptr;
  zv_plugin_add_lib(&plugins, folder.add("accept", "a.dll").c_str(), "img", 1, 5, nullptr, 0);
  int code = 0;
  const int result =
      attempt([&] { return zv_plugin_add_lib(&plugins, second.c_str(), "img", 1, 5, &code, 0); });
  EXPECT_EQ(code, expected_code(attempt));
  EXPECT_STREQ(plugins[0]->lib, "a.dll");
  EXPECT_EQ(plugins[1] != nullptr, result == 1);
  destroy(plugins);
  return result;
}

// Whatever fails, no folder but the one that is set is searched.
int enumeration(Attempt& attempt) {
  const PluginFolder folder = plugin_folder();
  for (const char* const name : {"img_a.dll", "img_b.dll", "img_bd.dll", "other/img_c.dll"})
    folder.add("accept", name);
  zv_putenv_private("img", folder.path().c_str(), 0);
  zv_putenv_private("PLG", folder.path("other").c_str(), 0);
  zv_plugin_t** plugins = nullptr;
  testing::internal::CaptureStderr();
  const int count = attempt([&] { return zv_plugin_enumerate(&plugins, "img", 1, 5, 0); });
  const std::string report = testing::internal::GetCapturedStderr();
  for (int i = 0; i < count; ++i) EXPECT_EQ(plugins[i]->dir, folder.path());
  EXPECT_TRUE(count != 1 || report.find("rejected: memory") != report.npos ||
              attempt.failed() == "dlopen");
  destroy(plugins);
  zv_putenv_private(nullptr, nullptr, 0);
  return count;
}

int collected_formats(Attempt& attempt) {
  zv_plugin_t record = {};
  zv_strlist(&record.formats, "A|.a|;B|.b|;C|.c|;", ';');
  zv_plugin_t* plugins[] = {&record, nullptr};
  char** all = nullptr;
  const int count = attempt([&] { return zv_plugin_formats(plugins, &all); });
  EXPECT_TRUE(count == 3 || all == nullptr);
  EXPECT_GE(texts(all).size(), count == 3 ? 10u : 0u);
  zv_strlist_free(all, -1);
  zv_strlist_free(record.formats, -1);
  return count;
}

int composite_format(Attempt& attempt) {
  char** list = nullptr;
  zv_strlist(&list, "A|.a|.b|;B|.B|;", ';');
  const int result = attempt([&] { return zv_fmt_composite(&list, -1, "All"); });
  EXPECT_EQ(texts(list), result == 1 ? "A|.a|.b||B|.B||All|.a|.b||" : "A|.a|.b||B|.B||");
  zv_strlist_free(list, -1);
  return result;
}

Row row(const Operation& operation, std::vector<int> results, bool in_any_order = false) {
  return {operation, std::string(all_memory), ENOMEM, std::move(results), in_any_order};
}

std::vector<Row> rows() {
  const std::string large(100, 'v');
  std::vector<Row> all = {
      row({"zv_malloc, zv_calloc, zv_dalloc", 3, new_blocks}, {2}),
      row({"zv_realloc", 1, resized_block}, {0}),
      row({"zv_strlist", 2, new_list}, {-1}),
      row(list_change("zv_strlist_insert", "x|a|b|",
                      [](char*** l) { return zv_strlist_insert(l, -1, 0, "x"); }),
          {0}),
      row(list_change("zv_strlist_replace", "x|b|",
                      [](char*** l) { return zv_strlist_replace(*l, 0, "x"); }),
          {0}),
      row(list_change("zv_strlist_reduce", "b|",
                      [](char*** l) { return zv_strlist_reduce(l, -1, 1); }),
          {1}),
      row({"zv_strlist_cat", 3, concatenated_list}, {-1}),
      row({"zv_strlist_set, zv_strlist_iset", 200, list_as_set}, {200}),
      row(put("7", large, 1, "kept|", "kept|" + large + "|"), {0}),
      row(put("7", "anew", 0, "none", "anew|"), {0}),
      row(put("new", "v", 0, "none", "v|"), {1, 0}),  // it does with the buckets there are
      row(put("new", "w", 1, "none", "w|"), {1, 0}),
      row({"the first zv_putenv_private", 1, first_variable}, {0}),
      row({"zv_getenv_private", 1, variable_got}, {0}),
      row(map_folder(true), {0}),
      row(map_folder(false), {0}),
      row({"zv_pathlist", 10, search_folders}, {0, 10}, true),  // 10: it was only not cut
      row({"zv_plugin_create", 1, new_record}, {0}),
      row({"zv_plugin_add_lib", 1, added_library}, {0}),
      row({"zv_plugin_enumerate", 2, enumeration}, {0, 1, 2}, true),
      row({"zv_plugin_formats", 3, collected_formats}, {0, 3}, true),
      row({"zv_fmt_composite", 1, composite_format}, {0}),
      row(make_file, {0}),
      row(open_file, {0}),
      row(read_folder, {0}),
      row(scan_tree, {-1, 0, 1, 2, 3, 4, 5}, true),
      row(remove_tree, {0}),
      row(copy_file, {-3, -3, -4}),
      row(copy_between_servers, {-4, -4, -3}),
  };
  for (const scripted::Dialogue& dialogue : scripted::dialogues())
    all.push_back(row(copy_along(dialogue), {dialogue.local_failed()}));
  return all;
}

// On Windows a lock itself takes memory when it is first used. Later tests find it made.
TEST(OutOfMemory, TheFirstLock) {
  for (const bool is_map : {true, false}) {
    Attempt attempt({all_memory, ENOMEM}, 0);
    EXPECT_EQ(attempt([is_map] {
                return is_map ? zv_pathmap("/a/f", "/b/f") : zv_putenv_private("A", "v", 0);
              }),
              0);
    EXPECT_FALSE(attempt.failed().empty());
  }
  char path[ZV_PATH_MAX] = "/a/f";
  EXPECT_EQ(zv_pathmap_locate(path), 0);
  EXPECT_EQ(private_values("A"), "none");
}

TEST(OutOfMemory, EveryAllocationOfEveryFunction) {
  const scripted::Network network;
  zv_pathmap_clear();
  zv_putenv_private(nullptr, nullptr, 0);
  walk_all("failing allocations", rows());
}

}  // namespace
