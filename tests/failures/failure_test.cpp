// What a call that fails below the library makes of the result, and of what was there before. That
// no such call crashes or loses anything is seen in torture.cpp.
#include <gtest/gtest.h>

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <iterator>
#include <map>
#include <sstream>
#include <vector>

#include "environment.h"
#include "failures/failing_calls.h"
#include "fixtures/dialogues.h"
#include "fixtures/plugins/plugin_folder.h"
#include "handle.h"
#include "platform/platform.h"
#include "string_list.h"

namespace {

using namespace scripted;
using failing::Attempt, failing::disturbed, failing::shortened;
namespace fs = std::filesystem;

// `run` also looks at what a failure left, beside the result. Each failure has one or more calls,
// which are walked by themselves, how they fail, and what comes of it when the first of them fails,
// the second, and so on: the last result stands for all that follow, none for any.
struct Operation {
  std::string name;
  int good;  // the result when nothing fails
  std::function<int(Attempt&, const ScratchFolder&)> run;
  std::vector<std::string> failures;
};

// A row of a table, which keeps together on its lines.
Operation row(std::string name, int good, std::function<int(Attempt&, const ScratchFolder&)> run,
              std::vector<std::string> failures) {
  return {std::move(name), good, std::move(run), std::move(failures)};
}

// Runs it again and again, each time with a later call failing, until none does.
void walk(const Operation& operation, const std::string& call, int error,
          const std::vector<int>& results) {
  for (size_t skipped = 0;; ++skipped) {
    SCOPED_TRACE(operation.name + ": " + call + " " + std::to_string(skipped) + ", error " +
                 std::to_string(error));
    const ScratchFolder folder;
    Attempt attempt(call, error, static_cast<int>(skipped));
    const int result = operation.run(attempt, folder);
    if (attempt.failed.empty()) {
      EXPECT_EQ(result, operation.good);
      EXPECT_GT(skipped, 0u) << "never called";
    } else if (!results.empty()) {
      EXPECT_EQ(result, results[std::min(skipped, results.size() - 1)]);
    }
    if (attempt.failed.empty() || testing::Test::HasFailure()) return;
  }
}

void walk_all(const std::vector<Operation>& operations) {
  const std::map<std::string, int> errors = {
      {"EACCES", EACCES},         {"EBUSY", EBUSY},   {"ECONNREFUSED", ECONNREFUSED},
      {"ECONNRESET", ECONNRESET}, {"EEXIST", EEXIST}, {"EINTR", EINTR},
      {"EINVAL", EINVAL},         {"EIO", EIO},       {"EMFILE", EMFILE},
      {"ENOMEM", ENOMEM},         {"ENOSPC", ENOSPC}, {"ENOSYS", ENOSYS},
      {"ENOTSUP", ENOTSUP},       {"EPERM", EPERM},   {"ERANGE", ERANGE},
      {"EROFS", EROFS},           {"EXDEV", EXDEV},   {"disturbed", disturbed},
      {"shortened", shortened}};
  for (const Operation& operation : operations) {
    for (const std::string& failure : operation.failures) {
      std::istringstream words(failure);
      std::vector<std::string> calls;
      std::string word;
      while (words >> word && !errors.contains(word)) calls.push_back(word);
      const std::vector<int> results(std::istream_iterator<int>(words), {});
      for (const std::string& call : calls) {
#ifdef _WIN32  // where the library calls the system through its import table
        if (call != failing::all_memory && call != "pthread_mutex_lock") continue;
#endif
        walk(operation, call, errors.at(word), results);
      }
    }
  }
}

// ---- Memory, plugins and the host ---------------------------------------------------------------

// Either what is asked for or nothing.
Operation list_change(int (*change)(char***), const std::string& text, int good,
                      const std::string& after, int failed) {
  const auto run = [=](Attempt& attempt, const ScratchFolder&) {
    List list(text);
    const int result = attempt([&] { return change(&list.list); });
    EXPECT_EQ(list.text(), result == good ? after : text);
    return result;
  };
  return {"to " + after, good, run, {"memory ENOMEM " + std::to_string(failed)}};
}

std::string numbers(int count, const std::string& end) {
  std::string text;
  for (int i = 0; i < count; ++i) text += std::to_string(i % 100) + end;
  return text;
}

// Beside as many variables as there are buckets, one more also asks for more of those.
Operation put(const char* name, int append, const char* before, const char* after,
              const std::string& results) {
  const auto run = [=](Attempt& attempt, const ScratchFolder&) {
    for (int i = 0; i < 16; ++i) zv_putenv_private(std::to_string(i).c_str(), "kept", 0);
    const int result = attempt([&] { return zv_putenv_private(name, "value", append); });
    EXPECT_EQ(private_values(name), result == 1 ? after : before);
    EXPECT_EQ(private_values("8"), "kept|");
    zv_putenv_private(nullptr, nullptr, 0);
    return result;
  };
  return row("zv_putenv_private", 1, run, {"memory ENOMEM " + results});
}

// Maps "old" to one folder and then to another, and gives both results and where it leads then. A
// folder that was mapped keeps its old target.
int folder_mapped(Attempt& attempt, const ScratchFolder& folder) {
  const std::string old = folder.path("old/f");
  const std::string targets[] = {old, folder.make_file("one/f"), folder.make_file("two/f")};
  int last = 0;
  int results = 0;
  for (const int i : {1, 2}) {
    const int mapped = attempt([&] { return zv_pathmap(old.c_str(), targets[i].c_str()); });
    if (mapped == 1) last = i;
    results += mapped;
  }
  char path[ZV_PATH_MAX];
  zv_strncpy(path, old.c_str(), sizeof path);
  EXPECT_EQ(zv_pathmap_locate(path), last != 0);
  EXPECT_EQ(path, targets[last]);
  zv_pathmap_clear();
  return results;
}

// On Windows a lock takes memory when it is used first; nobody has held it then.
int first_locked(Attempt& attempt, const ScratchFolder& folder) {
  const int put = attempt([] { return zv_putenv_private("A", "v", 0); });
  EXPECT_EQ(private_values("A"), put == 1 ? "v|" : "none");
  zv_putenv_private(nullptr, nullptr, 0);
  return put + folder_mapped(attempt, folder);
}

// The plugins bring the shared library along, and this program has the static one. It is loaded for
// good, so that they find it and what they write into its environment is not lost. The code tells a
// library that cannot be loaded from memory that is not there; what cannot be loaded now can be
// loaded later.
int plugin_loaded(Attempt& attempt, const ScratchFolder&) {
  static void* const library = zv_dll_open(ZARVO_LIBRARY, 1);
  EXPECT_NE(library, nullptr);
  const PluginFolder folder;
  folder.add("accept", "a.dll");
  const std::string dir = folder.path();
  int code = 0;
  zv_plugin_t* record =
      attempt([&] { return zv_plugin_create(dir.c_str(), "a.dll", "img", 1, 5, &code); });
  const int made = record != nullptr;
  const std::string_view failed = attempt.failed;
  const bool is_memory = attempt.call == failing::all_memory && failed != "dlopen";
  const int refused = failed == "dlsym" ? ZV_PLUGIN_E_ENTRY : ZV_PLUGIN_E_LOAD;
  EXPECT_EQ(code, made ? 3 : is_memory ? ZV_PLUGIN_E_MEMORY : refused);
  if (!made) record = zv_plugin_create(dir.c_str(), "a.dll", "img", 1, 5, nullptr);
  zv_plugin_unload(record);
  const int loaded = attempt([&] { return zv_plugin_load(record); });
  EXPECT_EQ(record->refs, loaded);
  EXPECT_EQ(record->plugin != nullptr, loaded == 1);
  EXPECT_EQ(zv_plugin_load(record), 1);
  zv_plugin_destroy(record);
  return made + loaded;
}

std::string told(size_t (*query)(char*, size_t)) {
  char room[ZV_PATH_MAX] = "";
  query(room, sizeof room);
  return room;
}

// How many of the user, the host and the home folder are told; each of the others has its stand-in.
int names_asked(Attempt& attempt, const ScratchFolder&) {
  const Variable no_home("HOME", std::nullopt);
  const std::string user = attempt([] { return told(zv_username); });
  const bool no_user = attempt.failed == "getpwuid_r" && attempt.error != ERANGE;
  EXPECT_EQ(user, no_user ? "nobody" : told(zv_username));
  const std::string host = attempt([] { return told(zv_hostname); });
  EXPECT_EQ(host, attempt.failed == "gethostname" ? "localhost" : told(zv_hostname));
  const std::string home = attempt([] { return told(zv_homedir); });
  EXPECT_TRUE(home == told(zv_homedir) || home.empty());
  return !no_user + !home.empty();
}

TEST(Failures, OfMemoryPluginsAndTheHost) {
  walk_all({
      row("first locks", 3, first_locked, {"pthread_mutex_lock ENOMEM 2"}),
      list_change([](char*** l) { return zv_strlist_insert(l, -1, 0, "x"); }, "a;b;", 1, "x;a;b;",
                  0),
      list_change([](char*** l) { return zv_strlist_replace(*l, 0, "x"); }, "a;b;", 1, "x;b;", 0),
      list_change([](char*** l) { return zv_strlist_reduce(l, -1, 1); }, "a;b;", 1, "b;", 1),
      list_change([](char*** l) { return zv_fmt_composite(l, -1, "All"); }, "A|.a|;B|.B|;", 1,
                  "A|.a|;B|.B|;All|.a|.B|;", 0),
      // The index that finds duplicates is a luxury.
      list_change([](char*** l) { return zv_strlist_set(*l, -1) + zv_strlist_iset(*l, -1); },
                  numbers(150, "a;") + numbers(150, "A;"), 200, numbers(100, "a;"), 200),
      put("7", 1, "kept|", "kept|value|", "0"),
      put("new", 0, "none", "value|", "1 0"),  // it does with the buckets there are
      row("zv_pathmap", 2, folder_mapped, {"memory ENOMEM 1"}),
      row("a plugin", 2, plugin_loaded,
          {"memory open fstat pread dlopen dlsym EMFILE 1", "pread shortened 2 1 1 2 1"}),
      row("names", 2, names_asked,
          {"getpwuid_r EIO 1", "getpwuid_r ERANGE 2", "gethostname EIO 2"}),
  });
}

// ---- Files --------------------------------------------------------------------------------------

// A tree of five entries at "tree".
std::string make_tree(const ScratchFolder& folder) {
  for (const char* const file : {"tree/a/b/file", "tree/a/file", "tree/file", "outside/b/kept"})
    folder.make_file(file);
  return folder.path("tree");
}

int file_made(Attempt& attempt, const ScratchFolder& folder) {
  const std::string path = folder.path("a/b/made");
  const int made = attempt([&] { return zv_mkfile(path.c_str()); });
  EXPECT_TRUE(attempt.failed != "mkdir" || errno == EROFS);  // not what a later look says
  return made;
}

// Hidden and shown again, where the file system has attributes at all.
int file_hidden(Attempt& attempt, const ScratchFolder& folder) {
  const std::string path = folder.make_file("f");
  int good = 0;
  for (const int hidden : {0, 1}) {
    zv_set_hidden(path.c_str(), !hidden);
    const int result = attempt([&] { return zv_set_hidden(path.c_str(), hidden); });
    EXPECT_EQ(zv_get_hidden(path.c_str()), result != 0 ? hidden : !hidden);
    good += result;
  }
  return good;
}

// Where the system lacks the call for a name in an open folder, the path is asked.
int hidden_left_out(Attempt& attempt, const ScratchFolder& folder) {
  folder.make_file("shown");
  zv_set_hidden(folder.make_file("hidden").c_str(), 1);
  dirsel_t files = {nullptr, "*", nullptr, 0, 0};
  List list;
  const int count = attempt([&] {
    const auto filter = reinterpret_cast<dir_filter_t>(zv_dir_select);
    return zv_dir_scan(folder.path().c_str(), &list.list, filter, &files, 0, 0);
  });
  EXPECT_EQ(list.text(), "shown;");
  return count;
}

// A folder that cannot be opened has no entries, and a search that fails is at its end.
int tree_scanned(Attempt& attempt, const ScratchFolder& folder) {
  const std::string tree = make_tree(folder);
  List list;
  const int count =
      attempt([&] { return zv_dir_scan(tree.c_str(), &list.list, nullptr, nullptr, 1, 1); });
  for (int i = 0; i < count; ++i) EXPECT_TRUE(fs::exists(list.list[i]));
  return count;
}

// Where it fails, the folder is still there, and can be removed later. Another process may take a
// folder away, or put a link in its place: nothing is found nor removed where the link leads.
template <bool is_swapped>
int tree_removed(Attempt& attempt, const ScratchFolder& folder) {
  const std::string tree = make_tree(folder);
  attempt.meanwhile = [&] {
    std::error_code gone;
    fs::rename(folder.path("tree/a"), folder.path("moved"), gone);
    if (is_swapped && !gone) fs::create_symlink("../outside", folder.path("tree/a"));
  };
  List list;
  const int removed = attempt([&] {
    if (attempt.error == disturbed) zv_dir_scan(tree.c_str(), &list.list, nullptr, nullptr, 1, 1);
    return zv_rmpath(tree.c_str());
  });
  EXPECT_EQ(list.text().find("kept"), std::string::npos);
  EXPECT_EQ(fs::exists(tree), removed == 0);
  EXPECT_TRUE(removed == 1 || zv_rmpath(tree.c_str()) == 1);
  EXPECT_TRUE(folder.exists("outside/b/kept"));
  return removed;
}

// In place of an option: zv_copy().
constexpr int no_handle = -1;

// What stood at the destination is untouched where a handle's copy fails, and nothing else is left:
// only a flush of the folder comes after that. zv_copy() may leave a beginning of the source.
Operation copy_file(const std::string& from, const std::string& to, int option,
                    std::vector<std::string> failures) {
  const auto run = [=](Attempt& attempt, const ScratchFolder& folder) {
    const std::string large(300000, 'c');  // does not fit any buffer
    const std::string source = from[0] == '/' ? from : folder.make_file(from, large);
    folder.make_file("folder/old", "what was there before");
    std::error_code unknown;  // to Wine
    fs::create_symlink("folder/old", folder.path("link"), unknown);
    const std::string destination = folder.path(to);
    const std::string before = folder.content(to);
    const HandlePtr handle(zv_transfer_create());
    if (option > 0) zv_transfer_set(handle.get(), option, 1);
    const int result = attempt([&] {
      return option == no_handle
                 ? zv_copy(source.c_str(), destination.c_str())
                 : zv_transfer_run(handle.get(), source.c_str(), destination.c_str());
    });
    const std::string whole = folder.content(source);
    const std::string now = folder.content(to);
    const bool landed = now == whole;
    const bool is_part = option == no_handle && whole.starts_with(now);
    EXPECT_TRUE(landed || (result != 0 && (now == before || is_part)));
    EXPECT_TRUE(result == 0 || !landed || option == ZV_TRANSFER_SYNC || option == no_handle);
    const bool made = landed && to == "folder/new";
    EXPECT_EQ(std::distance(fs::directory_iterator(folder.path("folder")), {}), made ? 2 : 1);
    EXPECT_TRUE(from[0] == '/' || whole == large);
    return result;
  };
  return {from + " to " + to + ", option " + std::to_string(option), 0, run, std::move(failures)};
}

TEST(Failures, OfFiles) {
  const std::string walking = "open openat opendir fdopendir readdir closedir rmdir unlinkat";
  std::vector<Operation> all = {
      row("zv_mkfile", 1, file_made,
          {"memory ENOMEM 0", "fopen mkdir EROFS 0", "fclose stat EIO 1"}),
      row("zv_dir_scan", 5, tree_scanned, {"memory ENOMEM", "opendir EACCES 0", "closedir EIO 5"}),
      row("zv_rmpath", 1, tree_removed<false>,
          {"memory open openat opendir unlinkat rmdir EMFILE 0", "close closedir EIO 1",
           walking + " disturbed 1"}),
      row("a folder swapped for a link", 1, tree_removed<true>, {walking + " disturbed"}),
      // What the system does not move by itself is copied block by block. The source is looked at
      // first, and closed last.
      copy_file(
          "from", "link", no_handle,
          {"memory ENOMEM -3 -3 -4", "fopen fread EIO -3", "open fdopen ftruncate ENOSPC -4",
           "open EINTR -4", "fstat EIO -3 -4", "fclose ENOSPC -4 0", "copy_file_range EINTR 0",
           "copy_file_range EXDEV 0", "copy_file_range shortened 0"}),
      // The system makes it up as it is read, so it passes through the process.
      copy_file("/proc/version", "link", no_handle,
                {"fread EIO -3", "fwrite ENOSPC -4", "fwrite EINTR -4"}),
      copy_file("from", "link", 0,
                {"memory ENOMEM -3 -3 -4", "fopen read EIO -3", "fstat EIO -3 -4",
                 "open openat fstatat readlinkat statx faccessat fgetxattr getrandom fchmod "
                 "fremovexattr fdopen fsync renameat EIO -4",
                 "fclose EIO -4 0", "copy_file_range shortened 0", "read copy_file_range EINTR 0",
                 "fgetxattr fremovexattr ENOTSUP 0", "fsync EINVAL 0"}),
      copy_file("/proc/version", "link", 0, {"read EIO -3", "fwrite ENOSPC -4", "fwrite EINTR 0"}),
      copy_file("from", "link", ZV_TRANSFER_SYNC, {"fsync EIO -4"}),
      // Where no name can be taken without replacing, a second one is, or an empty file holds it.
      copy_file("from", "folder/new", ZV_TRANSFER_KEEP,
                {"renameat2 EIO -4", "renameat2 EINVAL 0", "linkat EEXIST -4", "linkat EPERM 0",
                 "renameat EIO -4"}),
  };
  const ScratchFolder folder;
  if (zv_set_hidden(folder.make_file("f").c_str(), 1) == 1) {
    all.push_back(row("zv_dir_select", 1, hidden_left_out, {"syscall ENOSYS 1"}));
    all.push_back(row("zv_set_hidden", 2, file_hidden, {"getxattr setxattr removexattr EIO 1"}));
  }
  walk_all(all);
}

#ifndef _WIN32
// Here the opening would refuse a link; Windows, which Wine knows no links for, would follow it.
TEST(Failures, NothingTriesToOpenALinkBelowAScan) {
  const ScratchFolder folder;
  const std::string top = folder.make_folder("top");
  fs::create_symlink("../outside", folder.path("top/link"));
  Attempt attempt("openat", EIO, 0);
  List list;
  attempt([&] { return zv_dir_scan(top.c_str(), &list.list, nullptr, nullptr, 1, 1); });
  EXPECT_EQ(attempt([&] { return zv_rmpath(top.c_str()); }), 1);
  EXPECT_EQ(attempt.met, 0);
}
#endif

// ---- The network --------------------------------------------------------------------------------

int relayed(Attempt& attempt, const ScratchFolder& folder) {
  const Variable temporary("TMP", folder.path());
  const std::string found = "HTTP/1.0 200 ok\r\nContent-Length: 5\r\n\r\nhello";
  DialogueServer source({{"GET /f", found}});
  DialogueServer destination({{"PUT /g", ""}, {body, found}});
  const std::string from = source.url("http", "/f");
  const std::string to = destination.url("http", "/g");
  const int result = attempt([&] { return zv_copy(from.c_str(), to.c_str()); });
  EXPECT_TRUE(result != 0 || destination.stored() == "hello");
  EXPECT_TRUE(fs::is_empty(folder.path()) || attempt.failed.starts_with('r'));  // a removal
  return result;
}

// Whatever fails, a handle leaves nothing of a download, and tells why.
Operation copy_along(const Dialogue& dialogue, bool with_handle,
                     std::vector<std::string> failures) {
  const auto run = [=, &dialogue](Attempt& attempt, const ScratchFolder& folder) {
    folder.make_file("file", "hello");
    DialogueServer server(dialogue.steps);
    const Route route(dialogue, server, folder);
    const HandlePtr handle(zv_transfer_create());
    const int result = attempt([&] {
      return with_handle ? zv_transfer_run(handle.get(), route.from.c_str(), route.to.c_str())
                         : zv_copy(route.from.c_str(), route.to.c_str());
    });
    EXPECT_TRUE(result != 0 || arrived(dialogue, server, folder));
    EXPECT_TRUE(with_handle ? result == 0 || !folder.exists("got")
                            : std::string("hello").starts_with(folder.content("got")));
    EXPECT_EQ(zv_transfer_cause(handle.get(), nullptr) != 0, with_handle && result != 0);
    return result;
  };
  failures.push_back("send shortened 0");
  failures.push_back("poll send recv EINTR 0");
  return {dialogue.name, 0, run, std::move(failures)};
}

// An interrupted connect goes on, and may be refused then.
int refused(Attempt& attempt, const ScratchFolder&) {
  const zv::platform::Socket socket = zv::platform::socket_open();
  const int connected = attempt([port = closed_port(), socket] {
    return zv::platform::socket_connect(socket, {{127, 0, 0, 1}}, port);
  });
  zv::platform::socket_close(socket);
  return connected;
}

TEST(Failures, OfTheNetwork) {
  std::vector<Operation> all = {
      row("a refused connect", 0, refused, {"connect poll EINTR 0"}),
      row("zv_copy between servers", 0, relayed,
          {"memory ENOMEM -4 -4 -3", "mkdtemp fread EACCES -3", "remove rmdir EBUSY 0",
           "fclose ENOSPC -4 0", "connect ECONNREFUSED -3 -4"})};
  for (const Dialogue& dialogue : dialogues()) {
    const std::string local = std::to_string(dialogue.local_failed());
    const std::string network = std::to_string(dialogue.network_failed());
    all.push_back(copy_along(
        dialogue, false,
        {"memory ENOMEM " + local, "connect EINTR 0",
         "socket connect poll send recv ECONNRESET " + network,
         (dialogue.download ? "fopen fwrite fclose EIO " : "fopen fread fstat EIO ") + local}));
  }
  for (const Dialogue& dialogue : dialogues(true))
    all.push_back(copy_along(
        dialogue, true,
        {"memory ENOMEM", "socket connect poll send recv ECONNRESET", "setsockopt close EIO 0"}));
  // What a mail says of its host: zv_copy() does not go without it.
  if (knows_own_name()) {
    all.push_back(copy_along(dialogues()[4], false, {"gethostname EIO -3"}));
    all.push_back(copy_along(dialogues()[4], true, {"gethostname EIO 0"}));
  }
  walk_all(all);
}

}  // namespace
