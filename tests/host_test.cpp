// Standard folders, user and host.
#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "environment.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

// What a query says and leaves in a buffer of `size` bytes, such as "4 /tmp".
template <class Query>
std::string ask(Query query, size_t size = ZV_PATH_MAX) {
  char buf[ZV_PATH_MAX] = "untouched";
  const auto result = static_cast<size_t>(query(buf, size));
  return std::to_string(result) + ' ' + buf;
}

constexpr char failed[] = "0 untouched";

std::string usable(const std::string& folder) {
  return std::to_string(folder.size()) + ' ' + folder;
}

std::string root_of(const std::string& path) {
  return std::filesystem::path(path).root_path().generic_string();
}

// What holds for a folder whatever names it; `name_it` makes the platform name it.
template <class Query, class NameIt>
void expect_folder_rules(const ScratchFolder& scratch, Query query, NameIt name_it) {
  const std::string folder = scratch.path();
  std::string foreign = folder + "/\\";
  std::replace(foreign.begin(), foreign.end(), '/', '\\');
  const std::string root = root_of(folder);
  const bool is_writable = zv_access(root.c_str(), 6) == 0;  // for whoever runs the test
  const struct {
    std::string named, answer;
  } cases[] = {
      {folder, usable(folder)},
      {foreign, usable(folder)},
      {root, is_writable ? usable(root) : "0 " + root},
      {folder + "/missing/", "0 " + folder + "/missing"},
      {scratch.make_file("file"), "0 " + folder + "/file"},
  };
  for (const auto& c : cases) {
    name_it(c.named);
    EXPECT_EQ(ask(query), c.answer);
  }
  // What is tested is what the caller sees: here the folder above.
  name_it(scratch.make_folder("sub"));
  EXPECT_EQ(ask(query, folder.size() + 2), usable(folder));
  EXPECT_EQ(ask(query, 1), "0 ");
}

TEST(Host, HomeFolder) {
  const ScratchFolder scratch;
  Home home(std::nullopt);
#ifndef _WIN32  // an empty variable names nothing
  const std::string from_database = ask(zv_homedir);
  EXPECT_NE(from_database, failed);
  home.set("");
  EXPECT_EQ(ask(zv_homedir), from_database);
#endif
  expect_folder_rules(scratch, zv_homedir,
                      [&home](const std::string& folder) { home.set(folder); });
  home.set(std::string(ZV_PATH_MAX, 'x'));
  EXPECT_EQ(ask(zv_homedir), failed);
}

TEST(Host, TemporaryFolder) {
  const ScratchFolder scratch;
  const std::string folder = scratch.path();
  Variable tmp("TMP", std::nullopt);
  Variable temp("TEMP", scratch.make_folder("unused"));  // never looked at while TMP is set
  expect_folder_rules(scratch, zv_tempdir, [&tmp](const std::string& named) { tmp.set(named); });
  tmp.set(std::nullopt);
  EXPECT_EQ(ask(zv_tempdir), usable(folder + "/unused"));

  temp.set(std::nullopt);
  Variable tmpdir("TMPDIR", std::nullopt);
  EXPECT_EQ(ask(zv_tempdir), failed);
  tmp.set("");  // an empty variable names nothing
  temp.set("");
  tmpdir.set("");
  EXPECT_EQ(ask(zv_tempdir), failed);
  temp.set(folder);
  EXPECT_EQ(ask(zv_tempdir), usable(folder));
  // Cut, it would name the folder above.
  tmp.set(folder + std::string(ZV_PATH_MAX - 1 - folder.size(), '/') + "sub");
  EXPECT_EQ(ask(zv_tempdir), failed);
#ifdef _WIN32  // short names become long ones
  const std::string name = scratch.make_folder("A long folder name");
  char brief[MAX_PATH];
  if (GetShortPathNameA(name.c_str(), brief, MAX_PATH) == 0) return;
  tmp.set(brief);
  EXPECT_EQ(ask(zv_tempdir), usable(name));
#endif
}

TEST(Host, WorkingDirectory) {
  const ScratchFolder scratch;
  const std::string folder = scratch.path();
  const WorkingDirectory inside(folder);
  EXPECT_EQ(ask(zv_getcwd, 0), failed);
  EXPECT_EQ(ask(zv_getcwd, 1), "0 ");
  EXPECT_EQ(ask(zv_getcwd, folder.size()), "0 ");
  EXPECT_EQ(ask(zv_getcwd, folder.size() + 1), "1 " + folder);
  std::string wide(4 * ZV_PATH_MAX, 'x');
  EXPECT_EQ(zv_getcwd(wide.data(), wide.size()), 1);
  EXPECT_STREQ(wide.c_str(), folder.c_str());
  const WorkingDirectory at_root(root_of(folder));
  EXPECT_EQ(ask(zv_getcwd), "1 " + root_of(folder));
}

TEST(Host, TooDeepAWorkingDirectoryFails) {
  const ScratchFolder scratch;
  const std::string deep = scratch.make_folder(std::string(120, 'a') + "/" + std::string(90, 'b'));
  const WorkingDirectory inside(deep);
  const std::string last(ZV_PATH_MAX - deep.size(), 'c');
  std::error_code refused;
  std::filesystem::create_directory(last, refused);
  std::filesystem::current_path(last, refused);
  if (refused) GTEST_SKIP() << "the platform makes no folder that deep";
  EXPECT_EQ(ask(zv_getcwd), "0 ");
}

TEST(Host, UserAndHost) {
  for (const auto query : {zv_username, zv_hostname}) {
    const std::string whole = ask(query);
    const std::string name = whole.substr(whole.find(' ') + 1);
    EXPECT_EQ(whole, usable(name));
    EXPECT_EQ(ask(query, 3), usable(name.substr(0, 2)));
    EXPECT_EQ(ask(query, 0), failed);
    EXPECT_NE(name, "");
  }
  EXPECT_LE(ask(zv_hostname).size(), std::string("15 ").size() + 15);
}

}  // namespace
