// Tree removal over a stand-in for the platform: a tree in memory that changes while it is removed.
// Shows the rules about links that no file system under Wine can show.
#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "platform/platform.h"
#include "zarvo.h"

namespace zv::platform {

namespace {

// A platform by paths, as Windows is one: full paths and what lies there.
std::map<std::string, EntryKind> tree;
std::vector<std::string> removed;
std::function<void()> after_listing;  // what another process does meanwhile
std::set<std::string> stuck;

struct FakeSearch {
  std::vector<std::string> names;
  size_t next = 0;
};

std::vector<FakeSearch> searches;

EntryKind kind_at(const std::string& path) {
  const auto found = tree.find(path);
  return found != tree.end() ? found->second : EntryKind::unknown;
}

}  // namespace

intptr_t search_first(const char* directory, Entry& entry) {
  const std::string prefix = std::string(directory) + "/";
  if (kind_at(directory) != EntryKind::directory && kind_at(directory) != EntryKind::link)
    return no_search;
  FakeSearch search = {{".", ".."}};
  for (const auto& [path, kind] : tree)
    if (path.starts_with(prefix) && path.find('/', prefix.size()) == std::string::npos)
      search.names.push_back(path.substr(prefix.size()) + "\n" + path);
  searches.push_back(search);
  search_next(static_cast<intptr_t>(searches.size()) - 1, entry);
  return static_cast<intptr_t>(searches.size()) - 1;
}

intptr_t search_below(intptr_t, const char*, const char* path, Entry& entry) {
  EXPECT_EQ(kind_at(path), EntryKind::directory) << path << " was searched";
  return search_first(path, entry);
}

bool search_next(intptr_t handle, Entry& entry) {
  static std::string name;
  FakeSearch& search = searches[static_cast<size_t>(handle)];
  if (search.next == search.names.size()) return false;
  name = search.names[search.next++];
  const size_t end = std::min(name.find('\n'), name.size());
  const EntryKind kind = end < name.size() ? kind_at(name.substr(end + 1)) : EntryKind::directory;
  name.resize(end);
  entry = {name.c_str(), kind};
  return true;
}

void search_close(intptr_t handle) {
  if (handle == 0 && after_listing) after_listing();
}

EntryKind entry_kind(const char* path) {
  return kind_at(path);
}

intptr_t folder_open(const char* path) {
  return kind_at(path) == EntryKind::directory ? 0 : no_folder;
}

intptr_t folder_open_below(intptr_t, const char*, const char* path) {
  return folder_open(path);
}

void folder_close(intptr_t) {}

Removal remove_below(intptr_t, const char* name, const char* path) {
  EXPECT_TRUE(std::string(path).ends_with(std::string("/") + name)) << path << ' ' << name;
  if (tree.count(path) == 0) return Removal::gone;
  if (stuck.count(path) != 0) return Removal::failed;
  tree.erase(path);
  removed.push_back(path);
  return Removal::removed;
}

bool remove_folder(const char* path) {
  return remove_below(0, std::string(path).substr(std::string(path).rfind('/') + 1).c_str(),
                      path) == Removal::removed;
}

const char* native_path(const char* path, PathBuffer&) {
  return path;
}

// A removal selects nothing.
int status(const char*, struct _stat64*) {
  return -1;
}

bool is_hidden(const char*) {
  return false;
}

}  // namespace zv::platform

namespace {

using zv::platform::EntryKind;
using Paths = std::vector<std::string>;
namespace stand_in = zv::platform;

class TreeRemoval : public testing::Test {
 protected:
  void SetUp() override {
    stand_in::tree = {{"/t", EntryKind::directory},   {"/t/a", EntryKind::other},
                      {"/t/d", EntryKind::directory}, {"/t/d/e", EntryKind::directory},
                      {"/t/d/e/f", EntryKind::other}, {"/t/d/g", EntryKind::other},
                      {"/t/link", EntryKind::link},   {"/t/link/inner", EntryKind::other},
                      {"/out", EntryKind::directory}, {"/out/kept", EntryKind::other}};
    stand_in::removed.clear();
    stand_in::searches.clear();
    stand_in::stuck.clear();
    stand_in::after_listing = nullptr;
  }
};

TEST_F(TreeRemoval, LastEntryFirstAndLinksThemselves) {
  EXPECT_EQ(zv_rmpath("/t/"), 1);
  EXPECT_EQ(stand_in::removed,
            (Paths{"/t/link", "/t/d/g", "/t/d/e/f", "/t/d/e", "/t/d", "/t/a", "/t"}));
  EXPECT_EQ(stand_in::tree.count("/t/link/inner"), 1u);
}

TEST_F(TreeRemoval, ALinkInPlaceOfTheTopIsRefused) {
  EXPECT_EQ(zv_rmpath("/t/link"), 0);
  EXPECT_EQ(zv_rmpath("/t/link/"), 0);
  EXPECT_TRUE(stand_in::removed.empty());
}

TEST_F(TreeRemoval, TheFirstFailureEndsIt) {
  stand_in::stuck = {"/t/d/e/f"};
  EXPECT_EQ(zv_rmpath("/t"), 0);
  EXPECT_EQ(stand_in::removed, (Paths{"/t/link", "/t/d/g"}));
}

TEST_F(TreeRemoval, WhatVanishedIsPassedOver) {
  stand_in::after_listing = [] { stand_in::tree.erase("/t/d/g"); };
  EXPECT_EQ(zv_rmpath("/t"), 1);
}

TEST_F(TreeRemoval, AFolderSwappedForALinkIsNotEntered) {
  stand_in::after_listing = [] { stand_in::tree["/t/d"] = EntryKind::link; };
  EXPECT_EQ(zv_rmpath("/t"), 1);
  EXPECT_EQ(stand_in::removed, (Paths{"/t/link", "/t/d", "/t/a", "/t"}));
  EXPECT_EQ(stand_in::tree.count("/t/d/e/f"), 1u);  // reached through the link alone
}

}  // namespace
