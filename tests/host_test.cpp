// Memory and version texts; standard folders, user and host; the private environment.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <string>
#include <tuple>

#include "environment.h"
#include "scratch_folder.h"
#include "string_list.h"

#ifndef _WIN32
#include <pwd.h>
#include <unistd.h>
#endif

namespace {

TEST(Memory, SizeZeroIsARealBlockAndAFailedResizeKeepsIt) {
  int ok = -1;
  void* const blocks[] = {zv_malloc(0), zv_calloc(0), zv_realloc(nullptr, 0, &ok),
                          zv_dalloc("ab", 0), zv_dalloc(nullptr, 16)};
  for (void* const block : blocks) ASSERT_NE(block, nullptr);
  EXPECT_EQ(ok, 1);
  EXPECT_EQ(*static_cast<char*>(blocks[1]), '\0');
  EXPECT_EQ(*static_cast<char*>(blocks[3]), 'a');
  std::memset(blocks[4], 1, 16);
  for (void* const block : blocks) {
    *static_cast<char*>(block) = 'x';
    EXPECT_EQ(zv_free(block), 0);
  }
  char* const block = static_cast<char*>(zv_dalloc("kept", 5));
  volatile size_t too_much = SIZE_MAX / 2;
  EXPECT_EQ(zv_realloc(block, too_much, &ok), block);
  EXPECT_EQ(ok, 0);
  EXPECT_STREQ(block, "kept");
  zv_free(block);
}

TEST(Version, Split) {
  const std::tuple<const char*, int, int, int, const char*> cases[] = {
      {zarvo_version(), 1, 0, 0, "Beta"},
      {"2.5", 2, 5, 0, "Release"},
      {"1.2.3.4", 1, 2, 3, "Release"},
      {"4.1e", 4, 1, 0, "Educational"},
      {"1.0.0B", 1, 0, 0, "Release"},
      {"b", 0, 0, 0, "Beta"},
      {"1.0.0rc", 1, 0, 0, "Custom"},
      {"3.1d", 3, 1, 0, "Demo"},
      {"1..3", 1, 0, 3, "Release"},
      {" -7.x9.2a", -7, 0, 2, "Alpha"},
      {"1.2.000000000000000000000000000d", 1, 2, 0, "Release"},
  };
  for (const auto& [text, major, minor, patch, release] : cases) {
    int numbers[] = {-9, -9, -9};
    char name[12] = "";
    EXPECT_EQ(zv_split_version(text, &numbers[0], &numbers[1], &numbers[2], name), 1);
    EXPECT_EQ(std::tie(numbers[0], numbers[1], numbers[2]), std::tie(major, minor, patch)) << text;
    EXPECT_STREQ(name, release);
    EXPECT_EQ(zv_split_version(text, nullptr, nullptr, nullptr, nullptr), 1);
  }
  int major = -9;
  char release[12] = "kept";
  EXPECT_EQ(zv_split_version("", &major, nullptr, nullptr, release), 0);
  EXPECT_EQ(major, -9);
  EXPECT_STREQ(release, "kept");
}

// What a query says and leaves in a buffer of `size` bytes, such as "4 /tmp".
template <class Query>
std::string ask(Query query, size_t size = 4 * ZV_PATH_MAX) {
  char buf[4 * ZV_PATH_MAX] = "untouched";
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
  const std::pair<std::string, std::string> cases[] = {
      {folder, usable(folder)},
      {foreign, usable(folder)},
      {root, is_writable ? usable(root) : "0 " + root},
      {folder + "/missing/", "0 " + folder + "/missing"},
      {scratch.make_file("file"), "0 " + folder + "/file"},
  };
  for (const auto& [named, answer] : cases) {
    name_it(named);
    EXPECT_EQ(ask(query), answer);
  }
  // What is tested is what the caller sees: here the folder above.
  name_it(scratch.make_folder("sub"));
  EXPECT_EQ(ask(query, folder.size() + 2), usable(folder));
  EXPECT_EQ(ask(query, 1), "0 ");
  EXPECT_EQ(ask(query, 0), failed);
}

TEST(Host, HomeFolder) {
  const ScratchFolder scratch;
  Home home(std::nullopt);
#ifndef _WIN32  // an empty variable names nothing
  const std::string from_database = ask(zv_homedir);
  EXPECT_EQ(from_database == failed, getpwuid(getuid()) == nullptr);
  home.set("");
  EXPECT_EQ(ask(zv_homedir), from_database);
#endif
  expect_folder_rules(scratch, zv_homedir, [&](const std::string& named) { home.set(named); });
  home.set(std::string(ZV_PATH_MAX, 'x'));
  EXPECT_EQ(ask(zv_homedir), failed);
}

// The first that is set, and not empty, decides.
TEST(Host, TemporaryFolder) {
  const ScratchFolder scratch;
  const std::string folder = scratch.path(), other = scratch.make_folder("other");
  // Cut, it would name the folder above.
  const std::string cut = folder + std::string(ZV_PATH_MAX - 1 - folder.size(), '/') + "sub";
  Variable tmp("TMP", ""), temp("TEMP", other), tmpdir("TMPDIR", folder);
  expect_folder_rules(scratch, zv_tempdir, [&](const std::string& named) { tmp.set(named); });
  const std::optional<std::string> cases[][4] = {
      {std::nullopt, other, folder, usable(other)},
      {"", other, folder, usable(other)},
      {cut, other, folder, failed},
      {std::nullopt, std::nullopt, std::nullopt, failed},
      {"", "", "", failed},
#ifndef _WIN32
      {"", "", folder, usable(folder)},
#endif
  };
  for (const auto& [first, second, third, answer] : cases) {
    tmp.set(first);
    temp.set(second);
    tmpdir.set(third);
    EXPECT_EQ(ask(zv_tempdir), answer);
  }
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
  EXPECT_EQ(ask(zv_getcwd, folder.size()), "0 ");
  EXPECT_EQ(ask(zv_getcwd, folder.size() + 1), "1 " + folder);
  const WorkingDirectory at_root(root_of(folder));
  EXPECT_EQ(ask(zv_getcwd), "1 " + root_of(folder));

  const std::string deep = scratch.make_folder(std::string(120, 'a') + "/" + std::string(90, 'b'));
  const WorkingDirectory below(deep);
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
    EXPECT_EQ(whole.size() > 2, whole.size() < 3 + (query == zv_hostname ? 15 : 256));
  }
}

TEST(Environment, PutAndGet) {
  const std::tuple<const char*, const char*, int, int, const char*> steps[] = {
      {nullptr, "i\x1E", 1, 1, "none"},
      {"A", nullptr, 0, 1, "none"},
      {"A", "x", 0, 1, "x|"},
      {"a", "y", 1, 1, "x|y|"},
      {"A", "x", 1, 1, "x|y|"},
      {"A", "X", 1, 1, "x|y|X|"},
      {"A", "xy", 1, 1, "x|y|X|xy|"},
      {"AB", "z", 1, 1, "z|"},
      {"", "e", 0, 1, "e|"},
      {"A", "l", 0, 1, "l|"},
      {"A", "b\x1E", 1, 0, "l|"},
      {"\x1E", nullptr, 0, 0, "none"},
      {"ab", nullptr, 1, 1, "none"},
      {"A", "m", 1, 1, "l|m|"},
      {nullptr, nullptr, 0, 1, "none"},
  };
  for (const auto& [name, value, append, result, values] : steps) {
    EXPECT_EQ(zv_putenv_private(name, value, append), result);
    EXPECT_EQ(private_values(name != nullptr ? name : "A"), values);
  }
  for (const char* const value : {"", "", "b"}) ASSERT_EQ(zv_putenv_private("A", value, 1), 1);
  char* const block = zv_getenv_private("a");
  ASSERT_NE(block, nullptr);
  zv_putenv_private("A", "changed", 0);
  EXPECT_EQ(std::string(block, 4), std::string("\0b\0\0", 4));
  zv_free(block);
  zv_putenv_private(nullptr, nullptr, 0);
}

TEST(Environment, ManyVariables) {
  constexpr int count = 2000;
  const auto name = [](int i) { return "Variable" + std::to_string(i); };
  for (int i = 0; i < count; ++i) zv_putenv_private(name(i).c_str(), name(i).c_str(), 0);
  for (int i = 0; i < count; i += 3) zv_putenv_private(name(i).c_str(), nullptr, 0);
  for (int i = 1; i < count; i += 3) zv_putenv_private(name(i).c_str(), "more", 1);
  for (int i = 0; i < count; ++i) {
    const std::string expected[] = {"none", name(i) + "|more|", name(i) + "|"};
    ASSERT_EQ(private_values("vARIABLE" + std::to_string(i)), expected[i % 3]);
  }
  zv_putenv_private(nullptr, nullptr, 0);
}

}  // namespace
