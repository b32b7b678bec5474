#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>

#include "environment.h"
#include "failures/operations.h"
#include "fixtures/dialogues.h"
#include "zarvo.h"

namespace failing {

namespace {

namespace fs = std::filesystem;

const std::string large(300000, 'c');  // does not fit any buffer

// A tree of five entries at "tree".
std::string make_tree(const ScratchFolder& folder) {
  folder.make_file("tree/a/b/file");
  folder.make_file("tree/a/file");
  folder.make_file("tree/file");
  return folder.path("tree");
}

// zv_mkpath() or zv_mkfile(), two folders deep.
template <int (*make)(const char*)>
int made(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string path = folder.path("a/b/made");
  const int result = attempt([&] { return make(path.c_str()); });
  EXPECT_TRUE(result == 0 || folder.exists("a/b/made"));
  return result;
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

int file_opened(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string path = folder.make_file("file");
  FILE* const file = attempt([&] { return zv_fopen(path.c_str(), "r", nullptr); });
  zv_fclose(file);
  return file != nullptr;
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

int folder_read(Attempt& attempt) {
  const ScratchFolder folder;
  folder.make_file("file");
  const std::string path = folder.path();
  return attempt([&] {
    char name[ZV_PATH_MAX] = "untouched";
    intptr_t search = zv_dir_readfirst(path.c_str(), name, sizeof name);
    if (search == -1) return name == std::string("untouched") ? 0 : -1;
    int count = 1;
    while (zv_dir_readnext(search, name, sizeof name) == 1) ++count;
    zv_dir_close(search);
    return count;
  });
}

// A folder that cannot be opened has no entries; a list that cannot be made is a failure, except
// that no entry before it reads as an empty folder.
int tree_scanned(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string tree = make_tree(folder);
  char** list = nullptr;
  const int count =
      attempt([&] { return zv_dir_scan(tree.c_str(), &list, nullptr, nullptr, 1, 1); });
  EXPECT_EQ(list == nullptr, count == -1);
  EXPECT_EQ(list == nullptr ? -1 : zv_strlist_len(list), count);
  for (int i = 0; i < count; ++i) EXPECT_TRUE(fs::exists(list[i]));
#ifndef _WIN32  // where a search needs a block too
  EXPECT_TRUE(!attempt.failed().ends_with("alloc") || count <= 0 || count == 5);
#endif
  zv_strlist_free(list, -1);
  return count;
}

std::string first_entry(const std::string& tree) {
  char** list = nullptr;
  zv_dir_scan(tree.c_str(), &list, nullptr, nullptr, 1, 1);
  std::string first = list[0];
  zv_strlist_free(list, -1);
  return first;
}

// Where it fails, the folder is still there, and can be removed later. The last entry goes first,
// and nothing behind a failure.
int tree_removed(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string tree = make_tree(folder);
  const std::string first = first_entry(tree);
  folder.make_file("beside");
  const int removed = attempt([&] { return zv_rmpath(tree.c_str()); });
  EXPECT_EQ(fs::exists(tree), removed == 0);
  EXPECT_TRUE(attempt.failed() != "unlinkat" || fs::exists(first));
  EXPECT_TRUE(removed == 1 || zv_rmpath(tree.c_str()) == 1);
  EXPECT_TRUE(folder.exists("beside"));
  return removed;
}

// Another process takes a folder away, or puts a link in its place: nothing is found nor removed
// where the link leads.
template <bool is_swapped>
int disturbed_tree(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string tree = make_tree(folder);
  folder.make_file("outside/b/kept");
  attempt.meanwhile = [&folder] {
    std::error_code gone;
    fs::rename(folder.path("tree/a"), folder.path("moved"), gone);
    if (is_swapped && !gone) fs::create_symlink("../outside", folder.path("tree/a"));
  };
  char** list = nullptr;
  const int removed = attempt([&] {
    zv_dir_scan(tree.c_str(), &list, nullptr, nullptr, 1, 1);
    return zv_rmpath(tree.c_str());
  });
  for (int i = 0; list[i] != nullptr; ++i) EXPECT_FALSE(std::string(list[i]).ends_with("kept"));
  EXPECT_TRUE(folder.exists("outside/b/kept"));
  EXPECT_EQ(fs::exists(tree), removed == 0);
  zv_strlist_free(list, -1);
  return removed;
}

// The destination holds what it held, or the beginning of the source.
Operation copy_file(const std::string& from, const std::string& to, int good,
                    std::vector<Failing> failures) {
  const auto run = [=](Attempt& attempt) {
    const ScratchFolder folder;
    const std::string source = folder.path(from);
    const std::string destination = folder.path(to);
    folder.make_file("from", large);
    folder.make_file("to", "what was there before");
    const int result = attempt([&] { return zv_copy(source.c_str(), destination.c_str()); });
    const std::string expected = folder.content(from);
    const std::string copied = folder.content(to);
    EXPECT_TRUE(folder.content("from") == large);
    EXPECT_TRUE(expected.starts_with(copied) || copied == "what was there before");
    EXPECT_TRUE(result != 0 || copied == expected);
    return result;
  };
  return {"zv_copy of " + from, good, run, std::move(failures)};
}

// A host that is named; nobody listens there.
int name_resolved(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string file = folder.path("f");
  const std::string url = "http://localhost:" + std::to_string(scripted::closed_port()) + "/f";
  EXPECT_EQ(attempt([&] { return zv_copy(url.c_str(), file.c_str()); }), -3);
  return folder.exists("f");  // made once the location is known to be usable
}

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
    EXPECT_EQ(folder.content("file"), "hello");
    EXPECT_TRUE(std::string("hello").starts_with(folder.content("got")));
    server.heard();  // the server's end
    return result;
  };
  const int network = dialogue.network_failed();
  const int local = dialogue.local_failed();
  std::vector<Failing> failures = {
      out_of_memory({local}),
      {"socket connect poll send recv", ECONNRESET, {network}},
      {"connect poll send recv", EINTR, {0}},
      {"send", shortened, {0}},
      {"setsockopt getsockopt close", EIO, {0}},
      {dialogue.download ? "fopen fwrite fclose" : "fopen fread stat", EIO, {local}}};
  if (!dialogue.download) failures.push_back({"fclose", EIO, {0}});
  if (dialogue.scheme == std::string("smtp"))
    failures.push_back({"gethostname getaddrinfo localtime_r", EAGAIN, {local}});
  return {dialogue.name, 0, run, failures};
}

}  // namespace

std::vector<Operation> file_operations() {
  const std::string walking = "open openat opendir fdopendir readdir closedir rmdir";
  std::vector<Operation> all = {
      // The making tells what the looking did not.
      row("zv_mkpath", 1, made<zv_mkpath>, {{"mkdir", ENOSPC, {0}}, {"stat", EIO, {1}}}),
      row("zv_mkfile", 1, made<zv_mkfile>,
          {out_of_memory({0}), {"fopen", EROFS, {0}}, {"fclose", EIO, {1}}}),
      row("zv_stat, zv_access", 1, path_asked, {{"stat access", EACCES, {0}}}),
      row("zv_fopen", 1, file_opened, {out_of_memory({0})}),
      row("streams", 1, stream_used, {{"fwrite fseeko ftello fread", ENOSPC, {0}}}),
      row("zv_dir_readfirst", 3, folder_read,
          {out_of_memory({0}),
           {"opendir", EMFILE, {0}},
           {"readdir", EIO, {0, 1, 2, 3}},
           {"closedir", EIO, {3}}}),
      // A folder that cannot be opened has no entries, and a search that fails is at its end.
      row("zv_dir_scan", 5, tree_scanned,
          {out_of_memory({-1, 0, 1, 2, 3, 4, 5}, true),
           {"opendir", EACCES, {0}},
           {"openat fdopendir", EMFILE, {1, 2, 3, 4}, true},
           {"readdir", EIO, {0, 1, 2, 3, 4, 5}, true},
           {"closedir", EIO, {5}}}),
      row("zv_rmpath", 1, tree_removed,
          {out_of_memory({0}),
           {"open openat opendir unlinkat rmdir", EMFILE, {0}},
           {"close closedir", EIO, {1}}}),
      row("a folder that vanishes", 1, disturbed_tree<false>,
          {{walking + " unlinkat", disturbed, {1}}}),
      // A folder that is none any more when its own removal comes is a failure.
      row("a folder swapped for a link", 1, disturbed_tree<true>,
          {{walking, disturbed, {1}}, {"unlinkat", disturbed, {0, 1}, true}}),
      // What the system does not move by itself is copied block by block. The source is looked at
      // first, and closed last.
      copy_file("from", "to", 0,
                {out_of_memory({-3, -3, -4}),
                 {"fopen fread", EIO, {-3}},
                 {"open fdopen ftruncate", ENOSPC, {-4}},
                 {"open", EINTR, {-4}},
                 {"fstat", EIO, {-3, -4}},
                 {"fclose", ENOSPC, {-4, 0}},
                 {"copy_file_range", EINTR, {0}},
                 {"copy_file_range", EXDEV, {0}},
                 {"copy_file_range", shortened, {0}}}),
      // The system makes it up as it is read, so it passes through the process.
      copy_file("/proc/version", "to", 0,
                {{"fread", EIO, {-3}}, {"fwrite", ENOSPC, {-4}}, {"fwrite", EINTR, {-4}}}),
      copy_file("from", "./from", -4, {{"fstat", EIO, {-3, -4}}}),
  };
  if (keeps_attributes())
    all.push_back(
        {"zv_set_hidden", 1, file_hidden, {{"getxattr setxattr removexattr stat", EIO, {0}}}});
  return all;
}

std::vector<Operation> network_operations() {
  std::vector<Operation> all = {
      row("zv_copy from a named host", 1, name_resolved, {{"getaddrinfo", EAGAIN, {0}}}),
      row("zv_copy between servers", 0, relayed,
          {out_of_memory({-4, -4, -3}),
           {"mkdtemp fread", EACCES, {-3}},
           {"remove rmdir", EBUSY, {0}},
           {"fclose", ENOSPC, {-4, 0}},
           {"connect", ECONNREFUSED, {-3, -4}}}),
  };
  for (const scripted::Dialogue& dialogue : scripted::dialogues())
    all.push_back(copy_along(dialogue));
  return all;
}

}  // namespace failing
