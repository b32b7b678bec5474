// Standard folders, user and host.
#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "environment.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

constexpr char untouched[] = "untouched";

// What a query says and leaves in a buffer of `size` bytes.
struct Answer {
  size_t result;
  std::string text;
};

template <class Query>
Answer ask(Query query, size_t size = ZV_PATH_MAX) {
  char buf[ZV_PATH_MAX] = "untouched";
  const auto result = static_cast<size_t>(query(buf, size));
  return {result, buf};
}

std::string with_backslashes(std::string path) {
  std::replace(path.begin(), path.end(), '/', '\\');
  return path;
}

std::string root_of(const std::string& path) {
  return std::filesystem::path(path).root_path().generic_string();
}

// What holds for a folder whatever names it; `name_it` makes the platform name it.
template <class Query, class NameIt>
void expect_folder_rules(const ScratchFolder& scratch, Query query, NameIt name_it) {
  const std::string folder = scratch.path();
  const struct {
    std::string named;
    size_t result;
    std::string text;
  } cases[] = {
      {folder, folder.size(), folder},
      {folder + "//", folder.size(), folder},
      {with_backslashes(folder) + "\\", folder.size(), folder},
      {root_of(folder), root_of(folder).size(), root_of(folder)},
      {folder + "/missing/", 0, folder + "/missing"},
      {scratch.make_file("file"), 0, folder + "/file"},
  };
  for (const auto& c : cases) {
    SCOPED_TRACE(c.named);
    name_it(c.named);
    const Answer answer = ask(query);
    EXPECT_EQ(answer.result, c.result);
    EXPECT_EQ(answer.text, c.text);
  }

  // What is tested is what the caller sees: here the folder above.
  name_it(scratch.make_folder("sub"));
  const Answer cut = ask(query, folder.size() + 2);
  EXPECT_EQ(cut.result, folder.size());
  EXPECT_EQ(cut.text, folder);
  EXPECT_EQ(ask(query, 1).result, 0u);
}

TEST(Host, HomeFolder) {
  const ScratchFolder scratch;
  Home home(std::nullopt);
  expect_folder_rules(scratch, zv_homedir,
                      [&home](const std::string& folder) { home.set(folder); });
  home.set(std::string(ZV_PATH_MAX, 'x'));
  EXPECT_EQ(ask(zv_homedir).result, 0u);
  EXPECT_EQ(ask(zv_homedir).text, untouched);
}

TEST(Host, TemporaryFolder) {
  const ScratchFolder scratch;
  const std::string folder = scratch.path();
  Variable tmp("TMP", std::nullopt);
  Variable temp("TEMP", scratch.make_file("file"));  // never looked at while TMP is set
  expect_folder_rules(scratch, zv_tempdir, [&tmp](const std::string& named) { tmp.set(named); });

  temp.set(folder);
  tmp.set(folder + "/missing");
  EXPECT_EQ(ask(zv_tempdir).result, 0u);
  tmp.set(std::nullopt);
  EXPECT_EQ(ask(zv_tempdir).text, folder);

  temp.set(std::nullopt);
  Variable tmpdir("TMPDIR", std::nullopt);
  const Answer none = ask(zv_tempdir);
  EXPECT_EQ(none.result, 0u);
  EXPECT_EQ(none.text, untouched);
}

#ifndef _WIN32
TEST(Host, EmptyVariablesNameNothing) {
  const ScratchFolder scratch;
  const Variable tmp("TMP", "");
  const Variable temp("TEMP", "");
  Variable tmpdir("TMPDIR", scratch.path());
  EXPECT_EQ(ask(zv_tempdir).text, scratch.path());
  tmpdir.set("");
  EXPECT_EQ(ask(zv_tempdir).text, untouched);

  Home home(std::nullopt);
  const Answer from_database = ask(zv_homedir);
  EXPECT_NE(from_database.text, untouched);
  home.set("");
  EXPECT_EQ(ask(zv_homedir).text, from_database.text);
}
#else
TEST(Host, ShortNamesBecomeLong) {
  const ScratchFolder scratch;
  const std::string folder = scratch.make_folder("A long folder name");
  char brief[MAX_PATH];
  if (GetShortPathNameA(folder.c_str(), brief, MAX_PATH) == 0 || folder == brief)
    GTEST_SKIP() << "no short names on this file system";
  const Variable tmp("TMP", brief);
  EXPECT_EQ(ask(zv_tempdir).text, folder);
}
#endif

TEST(Host, WorkingDirectory) {
  const ScratchFolder scratch;
  const std::string folder = scratch.path();
  const auto getcwd_into = [](size_t size) { return ask(zv_getcwd, size); };
  const WorkingDirectory inside(folder);
  for (const size_t size : {size_t{1}, folder.size(), folder.size() + 1}) {
    const bool fits = size > folder.size();
    EXPECT_EQ(getcwd_into(size).result, fits) << size;
    EXPECT_EQ(getcwd_into(size).text, fits ? folder : "") << size;
  }
  std::string wide(4 * ZV_PATH_MAX, 'x');
  EXPECT_EQ(zv_getcwd(wide.data(), wide.size()), 1);
  EXPECT_STREQ(wide.c_str(), folder.c_str());

  const WorkingDirectory at_root(root_of(folder));
  EXPECT_EQ(getcwd_into(ZV_PATH_MAX).text, root_of(folder));
}

TEST(Host, TooDeepAWorkingDirectoryFails) {
  const ScratchFolder scratch;
  const std::string deep = scratch.make_folder(std::string(120, 'a') + "/" + std::string(90, 'b'));
  WorkingDirectory inside(deep);
  const std::string last(ZV_PATH_MAX - deep.size(), 'c');
  std::error_code refused;
  std::filesystem::create_directory(last, refused);
  std::filesystem::current_path(last, refused);
  if (refused) GTEST_SKIP() << "the platform makes no folder that deep";
  EXPECT_EQ(ask(zv_getcwd).result, 0u);
  EXPECT_EQ(ask(zv_getcwd).text, "");
}

TEST(Host, UserAndHost) {
  for (const auto query : {zv_username, zv_hostname}) {
    const Answer whole = ask(query);
    EXPECT_GT(whole.result, 0u);
    EXPECT_EQ(whole.result, whole.text.size());
    const Answer cut = ask(query, 3);
    EXPECT_EQ(cut.text, whole.text.substr(0, 2));
    EXPECT_EQ(cut.result, cut.text.size());
    EXPECT_EQ(ask(query, 0).text, untouched);
  }
  EXPECT_LE(ask(zv_hostname).result, 15u);
}

}  // namespace
