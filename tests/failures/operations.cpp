#include "failures/operations.h"

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <sstream>

#include "environment.h"
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

int file_made(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string path = folder.path("a/b/file");
  const int made = attempt([&] { return zv_mkfile(path.c_str()); });
  EXPECT_TRUE(made == 0 || folder.exists("a/b/file"));
  return made;
}

int file_opened(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string path = folder.make_file("file");
  FILE* const file = attempt([&] { return zv_fopen(path.c_str(), "r", nullptr); });
  zv_fclose(file);
  return file != nullptr;
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

// Where it fails, the folder is still there, and can be removed later.
int tree_removed(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string tree = make_tree(folder);
  folder.make_file("beside");
  const int removed = attempt([&] { return zv_rmpath(tree.c_str()); });
  EXPECT_EQ(fs::exists(tree), removed == 0);
  EXPECT_TRUE(removed == 1 || zv_rmpath(tree.c_str()) == 1);
  EXPECT_TRUE(folder.exists("beside"));
  return removed;
}

// The destination holds what it held, or the beginning of the source.
int file_copied(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string from = folder.make_file("from", large);
  const std::string to = folder.make_file("to", "what was there before");
  const int result = attempt([&] { return zv_copy(from.c_str(), to.c_str()); });
  const std::string copied = folder.content("to");
  EXPECT_TRUE(folder.content("from") == large);
  EXPECT_TRUE(large.starts_with(copied) || copied == "what was there before");
  EXPECT_TRUE(result != 0 || copied == large);
  return result;
}

// The system makes the file up as it is read, so it passes through the process.
int made_up_file_copied(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string to = folder.path("to");
  const int result = attempt([&] { return zv_copy("/proc/version", to.c_str()); });
  EXPECT_TRUE(result != 0 || folder.content("to").starts_with("Linux"));
  return result;
}

int file_copied_onto_itself(Attempt& attempt) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", large);
  const std::string again = folder.path("./file");
  const int result = attempt([&] { return zv_copy(file.c_str(), again.c_str()); });
  EXPECT_TRUE(folder.content("file") == large);
  return result;
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

bool allows(const Row& row, size_t failure, int result) {
  if (row.in_any_order)
    return std::find(row.results.begin(), row.results.end(), result) != row.results.end();
  return result == row.results.at(std::min(failure, row.results.size() - 1));
}

int walk_row(const Row& row, const std::string& call) {
  SCOPED_TRACE(row.operation.name);
  size_t failure = 0;
  const int met = walk({call, row.error}, [&](Attempt& attempt) {
    const int result = row.operation.run(attempt);
    const bool expected =
        attempt.failed().empty() ? result == row.operation.good : allows(row, failure++, result);
    EXPECT_TRUE(expected) << attempt.failed() << " gave " << result;
  });
  EXPECT_GT(met, 0) << call << " was never called";
  return met;
}

}  // namespace

void walk_all(const char* what, const std::vector<Row>& rows) {
  int pairs = 0;
  int points = 0;
  for (const Row& row : rows) {
    std::istringstream calls(row.calls);
    for (std::string call; calls >> call; ++pairs) points += walk_row(row, call);
  }
  std::printf("%s: %d points under %d operations and calls\n", what, points, pairs);
}

const Operation make_file = {"zv_mkfile", 1, file_made};
const Operation open_file = {"zv_fopen", 1, file_opened};
const Operation read_folder = {"zv_dir_readfirst", 3, folder_read};
const Operation scan_tree = {"zv_dir_scan", 5, tree_scanned};
const Operation remove_tree = {"zv_rmpath", 1, tree_removed};
const Operation copy_file = {"zv_copy of a file", 0, file_copied};
const Operation copy_made_up = {"zv_copy of a made-up file", 0, made_up_file_copied};
const Operation copy_onto_itself = {"zv_copy onto itself", -4, file_copied_onto_itself};
const Operation copy_between_servers = {"zv_copy between servers", 0, relayed};

Operation copy_along(const scripted::Dialogue& dialogue) {
  return {dialogue.name, 0, [&dialogue](Attempt& attempt) {
            const ScratchFolder folder;
            folder.make_file("file", "hello");
            scripted::DialogueServer server(dialogue.steps);
            const scripted::Route route(dialogue, server, folder);
            const int result =
                attempt([&] { return zv_copy(route.from.c_str(), route.to.c_str()); });
            EXPECT_TRUE(result != 0 || arrived(dialogue, server, folder));
            EXPECT_EQ(folder.content("file"), "hello");
            EXPECT_TRUE(std::string("hello").starts_with(folder.content("got")));
            server.heard();  // the server's end
            return result;
          }};
}

}  // namespace failing
