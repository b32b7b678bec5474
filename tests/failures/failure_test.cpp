// What a call that fails below the library makes of the result, and of what was there before. That
// no such call crashes or loses anything is seen in torture.cpp.
#include <gtest/gtest.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <sstream>
#include <vector>

#include "environment.h"
#include "failures/failing_calls.h"
#include "fixtures/dialogues.h"
#include "fixtures/plugins/plugin_folder.h"
#include "fixtures/private_values.h"
#include "string_list.h"
#include "transfer/local.h"
#include "transfer/run.h"

namespace {

using namespace failing;
namespace fs = std::filesystem;

struct Failing {
  std::string calls;  // one or more, each walked by itself
  int error;          // as of a Fault
  // What comes of it when the first call fails, the second, and so on; the last one stands for all
  // that follow. None: anything may.
  std::vector<int> results;
};

// `run` also looks at what a failure left, beside the result.
struct Operation {
  std::string name;
  int good;  // the result when nothing fails
  std::function<int(Attempt&)> run;
  std::vector<Failing> failures;
};

Failing out_of_memory(std::vector<int> results) {
  return {std::string(all_memory), ENOMEM, std::move(results)};
}

// Runs it again and again, each time with a later call failing, until none does.
void walk(const Operation& operation, const Failing& failing, const std::string& call) {
  for (size_t skipped = 0;; ++skipped) {
    SCOPED_TRACE(operation.name + ": " + call + " " + std::to_string(skipped) + ", error " +
                 std::to_string(failing.error));
    Attempt attempt({call, failing.error}, static_cast<int>(skipped));
    const int result = operation.run(attempt);
    if (attempt.failed().empty()) {
      EXPECT_EQ(result, operation.good);
      EXPECT_GT(skipped, 0u) << "never called";
      return;
    }
    const std::vector<int>& results = failing.results;
    const int expected = results.empty() ? result : results[std::min(skipped, results.size() - 1)];
    EXPECT_EQ(result, expected);
    if (testing::Test::HasFailure()) return;
  }
}

void walk_all(const std::vector<Operation>& operations) {
  for (const Operation& operation : operations) {
    for (const Failing& failing : operation.failures) {
#ifdef _WIN32  // where the library calls the system through its import table
      if (failing.calls != all_memory) continue;
#endif
      std::istringstream calls(failing.calls);
      for (std::string call; calls >> call;) walk(operation, failing, call);
    }
  }
}

// ---- Memory, plugins and the host ---------------------------------------------------------------

// Either what is asked for or nothing.
template <class Change>
Operation list_change(const char* name, const char* text, int good, const char* after, int failed,
                      Change change) {
  const auto run = [=](Attempt& attempt) {
    List list(text);
    const int result = attempt([&] { return change(&list.list); });
    EXPECT_EQ(list.text(), result == good ? after : text);
    return result;
  };
  return {name, good, run, {out_of_memory({failed})}};
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

// The index that finds duplicates is a luxury.
int list_as_set(Attempt& attempt) {
  std::string text;
  for (int i = 0; i < 300; ++i) text += std::to_string(i % 100) + (i < 150 ? "a;" : "A;");
  const List list(text);
  const int removed =
      attempt([&] { return zv_strlist_set(list.list, -1) + zv_strlist_iset(list.list, -1); });
  EXPECT_EQ(zv_strlist_len(list.list), 100);
  return removed;
}

// Beside as many variables as there are buckets, one more also asks for more of those.
Operation put(const char* name, int append, const char* before, const char* after,
              std::vector<int> results) {
  const auto run = [=](Attempt& attempt) {
    for (int i = 0; i < 16; ++i) zv_putenv_private(std::to_string(i).c_str(), "kept", 0);
    const int result = attempt([&] { return zv_putenv_private(name, "value", append); });
    EXPECT_EQ(private_values(name), result == 1 ? after : before);
    EXPECT_EQ(private_values("8"), "kept|");
    zv_putenv_private(nullptr, nullptr, 0);
    return result;
  };
  return {"zv_putenv_private", 1, run, {out_of_memory(std::move(results))}};
}

// A folder that was mapped keeps its old target.
int folder_mapped(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string old = folder.path("old/f");
  const std::string one = folder.make_file("one/f");
  const std::string two = folder.make_file("two/f");
  zv_pathmap(old.c_str(), one.c_str());
  const int result = attempt([&] { return zv_pathmap(old.c_str(), two.c_str()); });
  char path[ZV_PATH_MAX];
  zv_strncpy(path, old.c_str(), sizeof path);
  EXPECT_EQ(zv_pathmap_locate(path), 1);
  EXPECT_EQ(path, result == 1 ? two : one);
  zv_pathmap_clear();
  return result;
}

// On Windows a lock takes memory when it is used first; nobody has held it then.
int first_locked(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string old = folder.path("old/f");
  const std::string target = folder.make_file("new/f");
  const int results = attempt(
      [&] { return zv_pathmap(old.c_str(), target.c_str()) + zv_putenv_private("A", "v", 0); });
  char path[ZV_PATH_MAX];
  zv_strncpy(path, old.c_str(), sizeof path);
  EXPECT_EQ(zv_pathmap_locate(path) + (private_values("A") == "v|"), results);
  zv_pathmap_clear();
  zv_putenv_private(nullptr, nullptr, 0);
  return results;
}

// The plugins bring the shared library along, and this program has the static one. It is loaded for
// good, so that they find it and what they write into its environment is not lost.
PluginFolder plugin_folder() {
  static void* const library = zv_dll_open(ZARVO_LIBRARY, 1);
  EXPECT_NE(library, nullptr);
  return PluginFolder();
}

// The code tells a library that cannot be loaded from memory that is not there.
int new_record(Attempt& attempt) {
  const PluginFolder folder = plugin_folder();
  folder.add("accept", "a.dll");
  const std::string dir = folder.path();
  int code = 0;
  zv_plugin_t* const record =
      attempt([&] { return zv_plugin_create(dir.c_str(), "a.dll", "img", 1, 5, &code); });
  const bool is_loading = attempt.failed() == "dlopen" || attempt.failed() == "pread";
  EXPECT_EQ(code, record != nullptr ? 3 : is_loading ? ZV_PLUGIN_E_LOAD : ZV_PLUGIN_E_MEMORY);
  zv_plugin_destroy(record);
  return code == 3;
}

// What cannot be loaded now can be loaded later.
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

std::string told(size_t (*query)(char*, size_t)) {
  char room[ZV_PATH_MAX] = "";
  query(room, sizeof room);
  return room;
}

// Names, each with what stands for it when it cannot be had.
int names_asked(Attempt& attempt) {
  const std::string user = attempt([] { return told(zv_username); });
  const std::string host = attempt([] { return told(zv_hostname); });
  EXPECT_TRUE(user == told(zv_username) || user == "nobody") << user;
  EXPECT_TRUE(host == told(zv_hostname) || host == "localhost") << host;
  return 1;
}

int home_asked(Attempt& attempt) {
  const Variable no_home("HOME", std::nullopt);
  return attempt([] { return told(zv_homedir); }) == told(zv_homedir);
}

TEST(Failures, OfMemoryPluginsAndTheHost) {
  const std::string loading = "open fstat pread dlopen dlsym";
  walk_all({
      {"two first locks", 2, first_locked, {{"pthread_mutex_lock", ENOMEM, {1, 1}}}},
      {"zv_realloc", 1, resized_block, {out_of_memory({0})}},
      list_change("zv_strlist_insert", "a;b;", 1, "x;a;b;", 0,
                  [](char*** l) { return zv_strlist_insert(l, -1, 0, "x"); }),
      list_change("zv_strlist_replace", "a;b;", 1, "x;b;", 0,
                  [](char*** l) { return zv_strlist_replace(*l, 0, "x"); }),
      list_change("zv_strlist_reduce", "a;b;", 1, "b;", 1,
                  [](char*** l) { return zv_strlist_reduce(l, -1, 1); }),
      list_change("zv_fmt_composite", "A|.a|.b|;B|.B|;", 1, "A|.a|.b|;B|.B|;All|.a|.b|;", 0,
                  [](char*** l) { return zv_fmt_composite(l, -1, "All"); }),
      {"zv_strlist_set, zv_strlist_iset", 200, list_as_set, {out_of_memory({200})}},
      put("7", 1, "kept|", "kept|value|", {0}),
      put("new", 0, "none", "value|", {1, 0}),  // it does with the buckets there are
      {"zv_pathmap", 1, folder_mapped, {out_of_memory({0})}},
      {"zv_plugin_create", 1, new_record, {out_of_memory({0}), {"pread", shortened, {1, 0}}}},
      {"zv_plugin_load", 1, plugin_loaded, {{loading, EMFILE, {0}}}},
      {"user and host", 1, names_asked, {{"getpwuid_r gethostname", EIO, {1}}}},
      {"home", 1, home_asked, {{"getpwuid_r", EIO, {0}}, {"getpwuid_r", ERANGE, {1}}}},
  });
}

// ---- Files --------------------------------------------------------------------------------------

// A tree of five entries at "tree".
std::string make_tree(const ScratchFolder& folder) {
  for (const char* const file : {"tree/a/b/file", "tree/a/file", "tree/file", "outside/b/kept"})
    folder.make_file(file);
  return folder.path("tree");
}

int file_made(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string path = folder.path("a/b/made");
  int error = 0;
  const int made = attempt([&] {
    const int result = zv_mkfile(path.c_str());
    error = errno;
    return result;
  });
  EXPECT_TRUE(attempt.failed() != "mkdir" || error == EROFS);  // not what a later look says
  return made;
}

// Hidden and shown again, where the file system has attributes at all.
int file_hidden(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string path = folder.make_file("f");
  zv_set_hidden(path.c_str(), 1);
  const int shown = attempt([&] { return zv_set_hidden(path.c_str(), 0); });
  EXPECT_EQ(zv_get_hidden(path.c_str()), shown == 0);
  zv_set_hidden(path.c_str(), 0);
  const int hidden = attempt([&] { return zv_set_hidden(path.c_str(), 1); });
  EXPECT_EQ(zv_get_hidden(path.c_str()), hidden);
  return shown != 0 && hidden != 0;
}

// Where the system lacks the call for a name in an open folder, the path is asked.
int hidden_left_out(Attempt& attempt) {
  const ScratchFolder folder;
  folder.make_file("shown");
  zv_set_hidden(folder.make_file("hidden").c_str(), 1);
  const std::string path = folder.path();
  dirsel_t files = {nullptr, "*", nullptr, 0, 0};
  List list;
  const int count = attempt([&] {
    const auto filter = reinterpret_cast<dir_filter_t>(zv_dir_select);
    return zv_dir_scan(path.c_str(), &list.list, filter, &files, 0, 0);
  });
  EXPECT_EQ(list.text(), "shown;");
  return count;
}

// A folder that cannot be opened has no entries, and a search that fails is at its end.
int tree_scanned(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string tree = make_tree(folder);
  List list;
  const int count =
      attempt([&] { return zv_dir_scan(tree.c_str(), &list.list, nullptr, nullptr, 1, 1); });
  for (int i = 0; i < count; ++i) EXPECT_TRUE(fs::exists(list.list[i]));
  return count;
}

// Where it fails, the folder is still there, and can be removed later.
int tree_removed(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string tree = make_tree(folder);
  const int removed = attempt([&] { return zv_rmpath(tree.c_str()); });
  EXPECT_EQ(fs::exists(tree), removed == 0);
  EXPECT_TRUE(removed == 1 || zv_rmpath(tree.c_str()) == 1);
  EXPECT_TRUE(folder.exists("outside/b/kept"));
  return removed;
}

// Another process takes a folder away, or puts a link in its place: nothing is found nor removed
// where the link leads.
template <bool is_swapped>
int disturbed_tree(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string tree = make_tree(folder);
  attempt.meanwhile = [&folder] {
    std::error_code gone;
    fs::rename(folder.path("tree/a"), folder.path("moved"), gone);
    if (is_swapped && !gone) fs::create_symlink("../outside", folder.path("tree/a"));
  };
  List list;
  const int removed = attempt([&] {
    zv_dir_scan(tree.c_str(), &list.list, nullptr, nullptr, 1, 1);
    return zv_rmpath(tree.c_str());
  });
  EXPECT_EQ(list.text().find("kept"), std::string::npos);
  EXPECT_TRUE(folder.exists("outside/b/kept"));
  EXPECT_EQ(fs::exists(tree), removed == 0);
  return removed;
}

const std::string large(300000, 'c');  // does not fit any buffer

// The destination holds what it held, or the beginning of the source.
Operation copy_file(const std::string& from, std::vector<Failing> failures) {
  const auto run = [=](Attempt& attempt) {
    const ScratchFolder folder;
    const std::string source = folder.path(from);
    const std::string destination = folder.make_file("to", "what was there before");
    folder.make_file("from", large);
    const int result = attempt([&] { return zv_copy(source.c_str(), destination.c_str()); });
    const std::string expected = folder.content(from);
    const std::string copied = folder.content("to");
    EXPECT_TRUE(folder.content("from") == large);
    EXPECT_TRUE(expected.starts_with(copied) || copied == "what was there before");
    EXPECT_TRUE(result != 0 || copied == expected);
    return result;
  };
  return {"zv_copy of " + from, 0, run, std::move(failures)};
}

// A copy in a run. Whatever fails, what stood there is untouched and nothing else is left; only the
// flush of the folder comes after that.
Operation land(const std::string& from, const std::string& to, const zv::Options& options,
               std::vector<Failing> failures) {
  const auto run = [=](Attempt& attempt) {
    const ScratchFolder folder;
    const std::string source = from[0] == '/' ? from : folder.make_file(from, large);
    folder.make_file("folder/old", "what was there before");
    std::error_code unknown;  // to Wine
    fs::create_symlink("folder/old", folder.path("link"), unknown);
    const std::string destination = folder.path(to);
    const std::string before = folder.content(to);
    zv::Signals signals;
    zv::Run running(options, {}, signals);
    const int result =
        attempt([&] { return zv::copy_local(running, source.c_str(), destination.c_str()); });
    EXPECT_EQ(running.failure().code, result);
    const std::string now = folder.content(to);
    const bool landed = !now.empty() && now == folder.content(source);
    EXPECT_TRUE(landed || (result != 0 && now == before));
    EXPECT_TRUE(result == 0 || options.sync || !landed);
    const bool made = landed && to == "folder/new";
    EXPECT_EQ(std::distance(fs::directory_iterator(folder.path("folder")), {}), made ? 2 : 1);
    return result;
  };
  return {"a run from " + from + " to " + to, 0, run, std::move(failures)};
}

TEST(Failures, OfFiles) {
  const std::string walking = "open openat opendir fdopendir readdir closedir rmdir unlinkat";
  std::vector<Operation> all = {
      {"zv_mkfile",
       1,
       file_made,
       {out_of_memory({0}), {"fopen mkdir", EROFS, {0}}, {"fclose stat", EIO, {1}}}},
      {"zv_dir_scan",
       5,
       tree_scanned,
       {out_of_memory({}), {"opendir", EACCES, {0}}, {"closedir", EIO, {5}}}},
      {"zv_rmpath",
       1,
       tree_removed,
       {out_of_memory({0}),
        {"open openat opendir unlinkat rmdir", EMFILE, {0}},
        {"close closedir", EIO, {1}}}},
      {"a folder that vanishes", 1, disturbed_tree<false>, {{walking, disturbed, {1}}}},
      {"a folder swapped for a link", 1, disturbed_tree<true>, {{walking, disturbed, {}}}},
      // What the system does not move by itself is copied block by block. The source is looked at
      // first, and closed last.
      copy_file("from", {out_of_memory({-3, -3, -4}),
                         {"fopen fread", EIO, {-3}},
                         {"open fdopen ftruncate", ENOSPC, {-4}},
                         {"open", EINTR, {-4}},
                         {"fstat", EIO, {-3, -4}},
                         {"fclose", ENOSPC, {-4, 0}},
                         {"copy_file_range", EINTR, {0}},
                         {"copy_file_range", EXDEV, {0}},
                         {"copy_file_range", shortened, {0}}}),
      // The system makes it up as it is read, so it passes through the process.
      copy_file("/proc/version",
                {{"fread", EIO, {-3}}, {"fwrite", ENOSPC, {-4}}, {"fwrite", EINTR, {-4}}}),
      land("from", "link", {},
           {out_of_memory({-3, -3, -4}),
            {"fopen read", EIO, {-3}},
            {"fstat", EIO, {-3, -4}},
            {"open openat fstatat readlinkat statx faccessat fgetxattr getrandom fchmod "
             "fremovexattr fdopen fsync renameat",
             EIO,
             {-4}},
            {"fclose", EIO, {-4, 0}},
            {"copy_file_range", shortened, {0}},
            {"read copy_file_range", EINTR, {0}},
            {"fgetxattr fremovexattr", ENOTSUP, {0}},
            {"fsync", EINVAL, {0}}}),
      land("/proc/version", "link", {},
           {{"read", EIO, {-3}}, {"fwrite", ENOSPC, {-4}}, {"fwrite", EINTR, {0}}}),
      land("from", "link", {.sync = true}, {{"fsync", EIO, {-4}}}),
      // Where no name can be taken without replacing, a second one is, or an empty file holds it.
      land("from", "folder/new", {.keep = true},
           {{"renameat2", EIO, {-4}},
            {"renameat2", EINVAL, {0}},
            {"linkat", EEXIST, {-4}},
            {"linkat", EPERM, {0}},
            {"renameat", EIO, {-4}}}),
  };
  const ScratchFolder folder;
  if (zv_set_hidden(folder.make_file("f").c_str(), 1) == 1) {
    all.push_back({"zv_dir_select", 1, hidden_left_out, {{"syscall", ENOSYS, {1}}}});
    all.push_back({"zv_set_hidden", 1, file_hidden, {{"getxattr setxattr removexattr", EIO, {0}}}});
  }
  walk_all(all);
}

#ifndef _WIN32
// Here the opening would refuse a link; Windows, which Wine knows no links for, would follow it.
TEST(Failures, NothingTriesToOpenALinkBelowAScan) {
  const ScratchFolder folder;
  const std::string top = folder.make_folder("top");
  fs::create_symlink("../outside", folder.path("top/link"));
  Attempt attempt({"openat", EIO}, 0);
  List list;
  EXPECT_EQ(attempt([&] { return zv_dir_scan(top.c_str(), &list.list, nullptr, nullptr, 1, 1); }),
            1);
  EXPECT_EQ(attempt([&] { return zv_rmpath(top.c_str()); }), 1);
  EXPECT_EQ(attempt.failed(), "");
}
#endif

// ---- The network --------------------------------------------------------------------------------

int relayed(Attempt& attempt) {
  const ScratchFolder folder;
  const Variable temporary("TMP", folder.path());
  const std::string found = "HTTP/1.0 200 ok\r\nContent-Length: 5\r\n\r\nhello";
  scripted::DialogueServer source({{"GET /f", found}});
  scripted::DialogueServer destination({{"PUT /g", ""}, {scripted::body, found}});
  const std::string from = source.url("http", "/f");
  const std::string to = destination.url("http", "/g");
  const int result = attempt([&] { return zv_copy(from.c_str(), to.c_str()); });
  EXPECT_TRUE(result != 0 || destination.stored() == "hello");
  EXPECT_TRUE(fs::is_empty(folder.path()) || attempt.failed() == "remove" ||
              attempt.failed() == "rmdir");
  return result;
}

Operation copy_along(const scripted::Dialogue& dialogue) {
  const auto run = [&dialogue](Attempt& attempt) {
    const ScratchFolder folder;
    folder.make_file("file", "hello");
    scripted::DialogueServer server(dialogue.steps);
    const scripted::Route route(dialogue, server, folder);
    const int result = attempt([&] { return zv_copy(route.from.c_str(), route.to.c_str()); });
    EXPECT_TRUE(result != 0 || arrived(dialogue, server, folder));
    EXPECT_TRUE(std::string("hello").starts_with(folder.content("got")));
    return result;
  };
  const int local = dialogue.local_failed();
  return {dialogue.name,
          0,
          run,
          {out_of_memory({local}),
           {"socket connect poll send recv", ECONNRESET, {dialogue.network_failed()}},
           {"connect poll send recv", EINTR, {0}},
           {"send", shortened, {0}},
           {dialogue.download ? "fopen fwrite fclose" : "fopen fread fstat", EIO, {local}}}};
}

// Whatever fails, a download leaves nothing, and why is told.
Operation run_along(const scripted::Dialogue& dialogue) {
  const auto run = [&dialogue](Attempt& attempt) {
    const ScratchFolder folder;
    folder.make_file("file", "hello");
    scripted::DialogueServer server(dialogue.steps);
    const scripted::Route route(dialogue, server, folder);
    zv_transfer_t* handle = nullptr;
    const int result = attempt([&] {
      handle = zv_transfer_create();
      return handle == nullptr ? dialogue.local_failed()
                               : zv_transfer_run(handle, route.from.c_str(), route.to.c_str());
    });
    EXPECT_TRUE(handle == nullptr || (zv_transfer_cause(handle, nullptr) == 0) == (result == 0));
    zv_transfer_destroy(handle);
    EXPECT_TRUE(result != 0 || arrived(dialogue, server, folder));
    EXPECT_TRUE(result == 0 || !folder.exists("got"));
    return result;
  };
  return {std::string("a run of ") + dialogue.name,
          0,
          run,
          {out_of_memory({}),
           {"socket connect poll send recv", ECONNRESET, {}},
           {"poll send recv", EINTR, {0}},
           {"send", shortened, {0}},
           {"setsockopt close", EIO, {0}}}};
}

TEST(Failures, OfTheNetwork) {
  std::vector<Operation> all = {{"zv_copy between servers",
                                 0,
                                 relayed,
                                 {out_of_memory({-4, -4, -3}),
                                  {"mkdtemp fread", EACCES, {-3}},
                                  {"remove rmdir", EBUSY, {0}},
                                  {"fclose", ENOSPC, {-4, 0}},
                                  {"connect", ECONNREFUSED, {-3, -4}}}}};
  for (const scripted::Dialogue& dialogue : scripted::dialogues()) {
    all.push_back(copy_along(dialogue));
    all.push_back(run_along(dialogue));
  }
  walk_all(all);
}

}  // namespace
