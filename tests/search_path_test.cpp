// The folders of the search path.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "environment.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

// The list's entries with '|' behind each; "none" when there is no list.
std::string folders() {
  char** list = nullptr;
  const int count = zv_pathlist(&list);
  EXPECT_EQ(count == 0, list == nullptr);
  if (count == 0) return "none";
  EXPECT_EQ(zv_strlist_len(list), count);
  std::string text;
  for (int i = 0; i < count; ++i) text += std::string(list[i]) + '|';
  zv_strlist_free(list, count);
  return text;
}

std::string locate(const std::string& path) {
  char buffer[ZV_PATH_MAX];
  zv_strncpy(buffer, path.c_str(), sizeof buffer);
  if (zv_path_locate(buffer) == 1) return buffer;
  EXPECT_EQ(buffer, path);
  return "none";
}

TEST(SearchPath, Folders) {
  const ScratchFolder scratch;
  const std::string folder = scratch.path();
  const std::string too_long(400, 'x');
  Variable path("PATH", std::nullopt);
  EXPECT_EQ(folders(), "none");
  const struct {
    std::string value;
    std::string folders;
  } cases[] = {
      {folder, folder + "|"},
      {folder + ";" + folder + "\\;", folder + "|" + folder + "/||"},
      {"Q:\\no\\such;;x", "Q:/no/such||x|"},
      {";", "||"},
      {too_long + "\\;y", too_long + "/|y|"},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.value);
    path.set(c.value);
    EXPECT_EQ(folders(), c.folders);
  }
#ifndef _WIN32
  path.set("");
  EXPECT_EQ(folders(), "none");
  path.set("/no/such:" + folder + ":");
  EXPECT_EQ(folders(), "/no/such|" + folder + "||");
  path.set("/a:b;c");
  EXPECT_EQ(folders(), "/a:b|c|");
#endif
}

TEST(SearchPath, Locates) {
  const ScratchFolder scratch;
  for (const char* const file : {"one/tool", "two/tool", "two/only", "two/folder/x"})
    scratch.make_file(file);
  Variable path("PATH", scratch.path("missing") + ";" + std::string(318, 'x') + ";" +
                            scratch.path("one") + "/;" + scratch.path("two"));
  EXPECT_EQ(locate("any/where/tool"), scratch.path("one/tool"));
  EXPECT_EQ(locate("only"), scratch.path("two/only"));
  EXPECT_EQ(locate("folder/"), scratch.path("two/folder"));
  EXPECT_EQ(locate("any/x"), "none");
  EXPECT_EQ(locate(std::string(319, 'n')), "none");
  {
    const WorkingDirectory inside(scratch.path("two"));
    path.set(scratch.path("one"));
    EXPECT_EQ(locate("only"), "none");
    path.set(scratch.path("one") + ";");
    EXPECT_EQ(locate("only"), "only");  // an empty element is the working directory
  }
  path.set(std::nullopt);
  EXPECT_EQ(locate("tool"), "none");
}

}  // namespace
