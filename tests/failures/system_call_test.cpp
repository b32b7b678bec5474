// Every call of the system that the library makes, with each failing in turn in the ways it can:
// the documented result, nothing left open, and what is written as documented.
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "environment.h"
#include "failures/operations.h"
#include "fixtures/plugins/plugin_folder.h"
#include "zarvo.h"

namespace {

using namespace failing;

// ---- Small operations: 1 when they succeed ------------------------------------------------------

int path_made(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string path = folder.path("a/b");
  const int made = attempt([&] { return zv_mkpath(path.c_str()); });
  EXPECT_EQ(made == 1, folder.exists("a/b"));
  return made;
}

int path_asked(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string path = folder.make_file("f");
  struct _stat64 st;
  return attempt(
      [&] { return zv_stat(path.c_str(), &st) == 0 && zv_access(path.c_str(), 6) == 0; });
}

// Hidden, looked at and shown again, where the file system has attributes at all.
int file_hidden(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string path = folder.make_file("f");
  if (zv_set_hidden(path.c_str(), 1) == 0) return 1;
  const int shown = attempt([&] { return zv_set_hidden(path.c_str(), 0); });
  EXPECT_EQ(zv_get_hidden(path.c_str()), shown == 0);
  zv_set_hidden(path.c_str(), 0);
  const int hidden = attempt([&] { return zv_set_hidden(path.c_str(), 1); });
  EXPECT_EQ(zv_get_hidden(path.c_str()), hidden);
  return shown != 0 && hidden != 0;
}

bool keeps_attributes() {
  const ScratchFolder folder;
  return zv_set_hidden(folder.make_file("f").c_str(), 1) == 1;
}

int library_opened(Attempt& attempt) {
  static void* const needed = zv_dll_open(ZARVO_LIBRARY, 1);
  EXPECT_NE(needed, nullptr);
  void* const none = zv_dll_close(reinterpret_cast<void*>(intptr_t{-1}));
  void* const library =
      attempt([] { return zv_dll_open(ZARVO_FIXTURE_PLUGINS "/fixture_accept.dll", 1); });
  void* const entry = attempt([&] { return zv_dll_getptr(library, "zv_plugin", nullptr); });
  zv_dll_close(library);
  return library != none && entry != nullptr;
}

// What cannot be loaded now stays a record that can be loaded later.
int plugin_loaded(Attempt& attempt) {
  const PluginFolder folder;
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

int stream_used(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string path = folder.path("f");
  std::string block = "01234567";
  FILE* const file = zv_fopen(path.c_str(), "w+", nullptr);
  const bool written = attempt([&] {
    return zv_fwrite(block.data(), 4, 2, file, 1) == 2 && zv_fputs("a\nb\n", file, 1) >= 0;
  });
  const bool moved = attempt([&] { return zv_fseek(file, 0, SEEK_SET) == 0; });
  const bool told = attempt([&] { return zv_ftell(file) == (moved ? 0 : 14); });
  char back[8];
  const size_t read = attempt([&] { return zv_fread(back, 4, 2, file, 1); });
  zv_fclose(file);
  EXPECT_EQ(block, "01234567");
  EXPECT_TRUE(read == 0 || std::memcmp(back, "0123", 4) == 0);
  return written && moved && told && read == 2;
}

// A host that is named; nobody listens there.
int name_resolved(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string file = folder.path("f");
  const std::string url = "http://localhost:" + std::to_string(scripted::closed_port()) + "/f";
  EXPECT_EQ(attempt([&] { return zv_copy(url.c_str(), file.c_str()); }), -3);
  return folder.exists("f");  // made once the location is known to be usable
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

// ---- The table ----------------------------------------------------------------------------------

const Operation make_path = {"zv_mkpath", 1, path_made};
const Operation ask_path = {"zv_stat, zv_access", 1, path_asked};
const Operation hide_file = {"zv_set_hidden", 1, file_hidden};
const Operation open_library = {"zv_dll_open, zv_dll_getptr", 1, library_opened};
const Operation load_plugin = {"zv_plugin_load", 1, plugin_loaded};
const Operation ask_host = {"zv_username, zv_hostname, zv_getcwd", 1, host_asked};
const Operation ask_home = {"zv_homedir", 1, home_asked};
const Operation use_stream = {"streams", 1, stream_used};
const Operation resolve_name = {"zv_copy from a named host", 1, name_resolved};
const Operation locate_file = {"zv_path_locate", 1, file_located};

std::vector<Row> local_rows() {
  return {
      {copy_file, "fopen fread", EIO, {-3}},
      {copy_file, "open fdopen ftruncate", ENOSPC, {-4}},
      {copy_file, "open", EINTR, {-4}},
      {copy_file, "fstat", EIO, {-3, -4}},     // of the source, of the destination
      {copy_file, "fclose", ENOSPC, {-4, 0}},  // the destination, then the source
      // What the system does not move by itself is copied block by block.
      {copy_file, "copy_file_range", EINTR, {0}},
      {copy_file, "copy_file_range", EXDEV, {0}},
      {copy_file, "copy_file_range", shortened, {0}},
      {copy_made_up, "fread", EIO, {-3}},
      {copy_made_up, "fwrite", ENOSPC, {-4}},
      {copy_made_up, "fwrite", EINTR, {-4}},
      {copy_onto_itself, "fstat", EIO, {-3, -4}},

      {make_path, "mkdir", ENOSPC, {0}},
      {make_path, "stat", EIO, {1}},  // the making tells what the looking did not
      {make_file, "fopen", EROFS, {0}},
      {make_file, "fclose", EIO, {1}},  // nothing was written
      {ask_path, "stat access", EACCES, {0}},
      {locate_file, "stat", EACCES, {1}},
      {open_library, "open fstat pread dlopen dlsym", EIO, {0}},
      {open_library, "pread", shortened, {1}},  // the rest is read by itself
      {open_library, "dlopen", ENOMEM, {0}},
      {open_library, "close", EIO, {1}},
      {load_plugin, "open fstat pread dlopen dlsym", EMFILE, {0}},
      {ask_host, "getpwuid_r gethostname getcwd", EIO, {0}},
      {ask_home, "getpwuid_r", EIO, {0}},
      {ask_home, "getpwuid_r", ERANGE, {1}},
      {use_stream, "fwrite fseeko ftello fread", ENOSPC, {0}},

      {read_folder, "opendir", EMFILE, {0}},
      {read_folder, "readdir", EIO, {0, 1, 2, 3}},
      {read_folder, "closedir", EIO, {3}},
      {scan_tree, "opendir", EACCES, {0}},
      // A folder that cannot be opened has no entries, and a search that fails is at its end.
      {scan_tree, "openat fdopendir", EMFILE, {1, 2, 3, 4}, true},
      {scan_tree, "readdir", EIO, {0, 1, 2, 3, 4, 5}, true},
      {scan_tree, "closedir", EIO, {5}},
      {remove_tree, "open openat opendir unlinkat rmdir", EMFILE, {0}},
      {remove_tree, "close closedir", EIO, {1}},
  };
}

// What every dialogue meets alike.
std::vector<Row> network_rows() {
  std::vector<Row> rows = {
      {resolve_name, "getaddrinfo", EAGAIN, {0}},
      {copy_between_servers, "mkdtemp fread", EACCES, {-3}},
      {copy_between_servers, "remove rmdir", EBUSY, {0}},
      {copy_between_servers, "fclose", ENOSPC, {-4, 0}},
      {copy_between_servers, "connect", ECONNREFUSED, {-3, -4}},
  };
  for (const scripted::Dialogue& dialogue : scripted::dialogues()) {
    const Operation copy = copy_along(dialogue);
    const int network = dialogue.network_failed();
    const int local = dialogue.local_failed();
    const bool download = dialogue.download;
    rows.insert(rows.end(),
                {{copy, "socket connect poll send recv", ECONNRESET, {network}},
                 {copy, "connect poll send recv", EINTR, {0}},
                 {copy, "send", shortened, {0}},
                 {copy, "setsockopt getsockopt close", EIO, {0}},
                 {copy, download ? "fopen fwrite fclose" : "fopen fread stat", EIO, {local}}});
    if (!download) rows.push_back({copy, "fclose", EIO, {0}});
    if (dialogue.scheme == std::string("smtp"))
      rows.push_back({copy, "gethostname getaddrinfo localtime_r", EAGAIN, {local}});
  }
  return rows;
}

TEST(SystemCalls, OnFilesAndTheHost) {
  std::vector<Row> rows = local_rows();
  if (keeps_attributes())
    rows.push_back({hide_file, "getxattr setxattr removexattr stat", EIO, {0}});
  walk_all("failing system calls on files and the host", rows);
}

TEST(SystemCalls, OnTheNetwork) {
  walk_all("failing system calls on the network", network_rows());
}

}  // namespace
