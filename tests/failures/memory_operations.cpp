#include <cerrno>
#include <cstring>

#include "environment.h"
#include "failures/operations.h"
#include "fixtures/plugins/plugin_folder.h"
#include "fixtures/private_values.h"
#include "zarvo.h"

namespace failing {

namespace {

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

// A change of a list, made of a text if there is one, and what a success makes of it.
template <class Change>
Operation list_change(const char* name, const std::string& text, int good, const char* after,
                      int failed, Change change) {
  const auto run = [=](Attempt& attempt) {
    char** list = nullptr;
    if (!text.empty()) zv_strlist(&list, text.c_str(), ';');
    const std::string before = texts(list);
    const int result = attempt([&] { return change(&list); });
    EXPECT_EQ(texts(list), result == good ? after : before);
    zv_strlist_free(list, -1);
    return result;
  };
  return {name, good, run, {out_of_memory({failed})}};
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

int collected_formats(Attempt& attempt) {
  zv_plugin_t record = {};
  zv_strlist(&record.formats, "A|.a|;B|.b|;C|.c|;", ';');
  zv_plugin_t* plugins[] = {&record, nullptr};
  char** all = nullptr;
  const int count = attempt([&] { return zv_plugin_formats(plugins, &all); });
  EXPECT_TRUE(count == 3 ? texts(all).size() >= 10 : all == nullptr);
  zv_strlist_free(all, -1);
  zv_strlist_free(record.formats, -1);
  return count;
}

// ---- Private environment, path map, search path -------------------------------------------------

// Beside as many variables as there are buckets, one more also asks for more of those.
Operation put(const char* name, const std::string& value, int append, const char* before,
              const std::string& after, std::vector<int> results, int others = 16) {
  const auto run = [=](Attempt& attempt) {
    for (int i = 0; i < others; ++i) zv_putenv_private(std::to_string(i).c_str(), "kept", 0);
    const int result = attempt([&] { return zv_putenv_private(name, value.c_str(), append); });
    EXPECT_EQ(private_values(name), result == 1 ? after : before);
    EXPECT_EQ(private_values("8"), others > 8 ? "kept|" : "none");
    zv_putenv_private(nullptr, nullptr, 0);
    return result;
  };
  return {"zv_putenv_private " + value, 1, run, {out_of_memory(std::move(results))}};
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
template <bool is_new>
int folder_mapped(Attempt& attempt) {
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
}

int search_folders(Attempt& attempt) {
  const Variable path("PATH", "a;b;c;d;e;f;g;h;i;j");
  char** list = nullptr;
  const int count = attempt([&] { return zv_pathlist(&list); });
  EXPECT_EQ(texts(list), count == 0 ? "" : "a|b|c|d|e|f|g|h|i|j|");
  zv_strlist_free(list, -1);
  return count;
}

int file_located(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string second = folder.make_file("two/f");
  const std::string first = folder.make_file("one/f");
  const Variable path("PATH", folder.path("one") + ";" + folder.path("two"));
  char name[ZV_PATH_MAX] = "f";
  const int found = attempt([&] { return zv_path_locate(name); });
  EXPECT_EQ(name, attempt.failed().empty() ? first : second);
  return found;
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

int library_opened(Attempt& attempt) {
  const PluginFolder folder = plugin_folder();
  const std::string path = folder.add("accept", "a.dll");
  void* const none = zv_dll_close(reinterpret_cast<void*>(intptr_t{-1}));
  void* const library = attempt([&] { return zv_dll_open(path.c_str(), 1); });
  void* const entry = attempt([&] { return zv_dll_getptr(library, "zv_plugin", nullptr); });
  zv_dll_close(library);
  return library != none && entry != nullptr;
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

// What cannot be loaded now stays a record that can be loaded later.
int plugin_loaded(Attempt& attempt) {
  const PluginFolder folder = plugin_folder();
  folder.add("accept", "a.dll");
  zv_plugin_t* const record =
      zv_plugin_create(folder.path().c_str(), "a.dll", "img", 1, 5, nullptr);
  zv_plugin_unload(record);
  const int loaded = attempt([&] { return zv_plugin_load(record); });
  EXPECT_EQ(record->refs, loaded);
  EXPECT_EQ(record->plugin != nullptr, loaded == 1);
  EXPECT_EQ(zv_plugin_load(record), 1);
  zv_plugin_destroy(record);
  return loaded;
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

// ---- The host -----------------------------------------------------------------------------------

// Names and folders, each with what stands for it when it cannot be had.
int host_asked(Attempt& attempt) {
  const Variable no_home("HOME", std::nullopt);
  char names[5][ZV_PATH_MAX] = {};
  constexpr size_t size = ZV_PATH_MAX;
  zv_username(names[3], size);
  zv_hostname(names[4], size);
  attempt([&] {
    zv_username(names[0], size);
    zv_hostname(names[1], size);
    zv_getcwd(names[2], size);
  });
  const bool user = std::strcmp(names[0], names[3]) == 0;
  const bool host = std::strcmp(names[1], names[4]) == 0;
  EXPECT_TRUE(user || std::strcmp(names[0], "nobody") == 0);
  EXPECT_TRUE(host || std::strcmp(names[1], "localhost") == 0);
  return user && host && names[2][0] == '/';
}

int home_asked(Attempt& attempt) {
  const Variable no_home("HOME", std::nullopt);
  char folder[ZV_PATH_MAX];
  const size_t usual = zv_homedir(folder, sizeof folder);
  const size_t length = attempt([&] { return zv_homedir(folder, sizeof folder); });
  EXPECT_TRUE(length == usual || length == 0);
  return length == usual;
}

}  // namespace

std::vector<Operation> memory_operations() {
  const std::string large(100, 'v');
  const std::string loading = "open fstat pread dlopen dlsym";
  return {
      row("zv_malloc, zv_calloc, zv_dalloc", 3, new_blocks, {out_of_memory({2})}),
      row("zv_realloc", 1, resized_block, {out_of_memory({0})}),
      list_change("zv_strlist", "", 2, "a|b|", -1,
                  [](char*** l) { return zv_strlist(l, "a;b;", ';'); }),
      list_change("zv_strlist_insert", "a;b;", 1, "x|a|b|", 0,
                  [](char*** l) { return zv_strlist_insert(l, -1, 0, "x"); }),
      list_change("zv_strlist_replace", "a;b;", 1, "x|b|", 0,
                  [](char*** l) { return zv_strlist_replace(*l, 0, "x"); }),
      list_change("zv_strlist_reduce", "a;b;", 1, "b|", 1,
                  [](char*** l) { return zv_strlist_reduce(l, -1, 1); }),
      list_change("zv_fmt_composite", "A|.a|.b|;B|.B|;", 1, "A|.a|.b||B|.B||All|.a|.b||", 0,
                  [](char*** l) { return zv_fmt_composite(l, -1, "All"); }),
      row("zv_strlist_cat", 3, concatenated_list, {out_of_memory({-1})}),
      row("zv_strlist_set, zv_strlist_iset", 200, list_as_set, {out_of_memory({200})}),
      row("zv_plugin_formats", 3, collected_formats, {out_of_memory({0, 3}, true)}),
      put("7", large, 1, "kept|", "kept|" + large + "|", {0}),
      put("7", "anew", 0, "none", "anew|", {0}),
      put("new", "v", 0, "none", "v|", {1, 0}),  // it does with the buckets there are
      put("new", "w", 1, "none", "w|", {1, 0}),
      put("A", "the first", 0, "none", "the first|", {0}, 0),
      row("zv_getenv_private", 1, variable_got, {out_of_memory({0})}),
      row("zv_pathmap adds", 1, folder_mapped<true>, {out_of_memory({0})}),
      row("zv_pathmap changes", 1, folder_mapped<false>, {out_of_memory({0})}),
      row("zv_pathlist", 10, search_folders, {out_of_memory({0, 10}, true)}),  // 10: only not cut
      row("zv_path_locate", 1, file_located, {{"stat", EACCES, {1}}}),
      // A header that comes in pieces is read to its end.
      row("zv_dll_open, zv_dll_getptr", 1, library_opened,
          {{loading, EIO, {0}},
           {"pread", shortened, {1}},
           {"dlopen", ENOMEM, {0}},
           {"close", EIO, {1}}}),
      row("zv_plugin_create", 1, new_record, {out_of_memory({0})}),
      row("zv_plugin_load", 1, plugin_loaded, {{loading, EMFILE, {0}}}),
      row("zv_plugin_add_lib", 1, added_library, {out_of_memory({0})}),
      row("zv_plugin_enumerate", 2, enumeration, {out_of_memory({0, 1, 2}, true)}),
      row("zv_username, zv_hostname, zv_getcwd", 1, host_asked,
          {{"getpwuid_r gethostname getcwd", EIO, {0}}}),
      row("zv_homedir", 1, home_asked, {{"getpwuid_r", EIO, {0}}, {"getpwuid_r", ERANGE, {1}}}),
  };
}

}  // namespace failing
