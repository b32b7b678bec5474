// Paths as somebody wrote them, brought into canonical form.
#include <gtest/gtest.h>

#include <cctype>
#include <cstring>
#include <string>

#include "environment.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

// The current drive, such as "C:"; nothing where there are no drives.
std::string drive() {
  return std::filesystem::current_path().root_name().string();
}

bool has_drives() {
  return !drive().empty();
}

struct Normal {
  int result;
  std::string path;
};

Normal normalize(const std::string& path) {
  char buffer[ZV_PATH_MAX];
  zv_strncpy(buffer, path.c_str(), sizeof buffer);
  const int result = zv_normalize_path(buffer);
  return {result, buffer};
}

struct NormalizeCase {
  const char* path;
  int result;
  const char* normal;  // '@' in front is the current drive
};

void expect_normal(const NormalizeCase& c) {
  SCOPED_TRACE(c.path);
  const Normal normal = normalize(c.path);
  EXPECT_EQ(normal.result, c.result);
  EXPECT_EQ(normal.path, *c.normal == '@' ? drive() + (c.normal + 1) : c.normal);
}

TEST(Normalize, Text) {
  const NormalizeCase cases[] = {
      {"", 1, ""},
      {" \t\r\n ", 1, ""},
      {"  a b\n", 1, "a b"},
      {"D:\\a\\.\\b\\..\\d\\", 1, "D:/a/d"},
      {"a/b/../../..", 1, ".."},
      {"/x//y/", 1, "@/x/y"},
      {"/", 1, "@/"},
      {"///", 1, "@/"},
      {"/.", 1, "@/"},
      {"D:/", 1, "D:/"},
      {"D://.//", 1, "D:/"},
      {".", 1, "."},
      {"./", 1, "."},
      {"./a", 1, "./a"},
      {".//./a", 1, "./a"},
      {"a/./b", 1, "a/b"},
      {"a/././/.", 1, "a"},
      {"a/..", 1, ""},
      {"./..", 1, ".."},
      {"./../a/..", 1, ".."},
      {"../a", 1, "../a"},
      {"a/../../b", 1, "../b"},
      {"a/b/../d/../../e", 1, "e"},
      {"...", 1, "..."},
      {".a/..b/c.", 1, ".a/..b/c."},
      {"/..", 0, ""},
      {"D:/..", 0, ""},
      {"D:/a/../..", 0, ""},
      {"//srv/sh/a/../..", 0, ""},
      {"\\\\srv\\sh\\x", 1, "//srv/sh/x"},
      {"//srv/sh", 1, "//srv/sh/"},
      {"//srv/sh//a/./b", 1, "//srv/sh/a/b"},
      {"//srv/./sh/a", 1, "//srv/sh/a"},
      {"//srv/./", 1, "/"},  // the share is gone, and with it the UNC form
      {"//srv//sh", 1, "@/srv/sh"},
      {"///srv/sh", 1, "@/srv/sh"},
      {"//srv", 1, "@/srv"},
      {"1:x", 0, ""},
      {"/:x", 0, ""},
      {"a/D:", 1, "a/D:"},
      {"a/../D:", 1, "D:/"},
  };
  for (const NormalizeCase& c : cases) expect_normal(c);
}

TEST(Normalize, Variables) {
  const Variable folder("ZV_DIR", "D:\\v\\w\\");
  const Variable dots("ZV_DOTS", "./../..");
  const Variable root("ZV_ROOT", "D:/");
  const Variable share("ZV_SHARE", "\\\\srv\\sh");
  const Variable unset("ZV_UNSET", std::nullopt);
  const NormalizeCase cases[] = {
      {"%ZV_DIR%/log", 1, "D:/v/w/log"},
      {"$ZV_DIR", 1, "D:/v/w"},
      {"x/$ZV_DIR/y", 1, "x/D:/v/w/y"},
      {"%ZV_DIR%/../x", 1, "x"},
      {"a/$ZV_DOTS/b", 1, "a/./../../b"},
      {"%ZV_ROOT%/x", 1, "D:/x"},
      {"%ZV_ROOT%", 1, "D:/"},
      {"$ZV_SHARE", 1, "//srv/sh/"},
      {"$ZV_SHARE/x", 1, "//srv/sh/x"},
      {"$ZV_DIR%", 0, ""},
      {"a$ZV_DIR", 1, "a$ZV_DIR"},
      {"%A", 1, "%A"},
      {"%", 1, "%"},
      {"%%", 0, ""},
      {"$", 0, ""},
      {"$ZV_UNSET", 0, ""},
      {"a/b/%ZV_UNSET%/c", 0, "a/b/"},
  };
  for (const NormalizeCase& c : cases) expect_normal(c);
#ifndef _WIN32  // where an empty variable cannot exist
  const Variable empty("ZV_EMPTY", "");
  expect_normal({"a/$ZV_EMPTY/b", 1, "a/b"});
  expect_normal({"$ZV_EMPTY/b", 1, "b"});
  expect_normal({"$ZV_EMPTY", 1, ""});
#endif
}

TEST(Normalize, HomeFolder) {
  const ScratchFolder scratch;
  Home home(scratch.path());
  EXPECT_EQ(normalize("~").path, scratch.path());
  EXPECT_EQ(normalize("~/docs/../x").path, scratch.path("x"));
  EXPECT_EQ(normalize("~/../x").path, "x");
  EXPECT_EQ(normalize("a/~").path, "a/~");
  EXPECT_EQ(normalize("~name").path, "~name");
  home.set(scratch.path("missing"));
  EXPECT_EQ(normalize("~/x").result, 0);
  EXPECT_EQ(normalize("~/x").path, "");
}

TEST(Normalize, DriveRelative) {
  if (!has_drives()) {
    for (const char* const path : {"D:", "D:x", "c:x/y"}) expect_normal({path, 0, ""});
    return;
  }
  const ScratchFolder scratch;
  const WorkingDirectory inside(scratch.make_folder("sub"));
  const std::string sub = scratch.path("sub");
  std::string lower = drive();
  zv_strlwr(lower.data());
  EXPECT_EQ(normalize(drive()).path, sub);
  EXPECT_EQ(normalize(lower + "x\\y\\\\").path, sub + "/x/y");
  EXPECT_EQ(normalize(drive() + "../x").path, scratch.path("x"));
  EXPECT_EQ(normalize(drive() + "./x").path, sub + "/./x");  // this "." has no separator before it
  EXPECT_EQ(normalize(drive() + std::string(ZV_PATH_MAX - sub.size(), 'x')).result, 0);

  const WorkingDirectory at_root(drive() + "/");
  EXPECT_EQ(normalize(drive()).path, drive() + "/");
  EXPECT_EQ(normalize(drive() + "x").path, drive() + "/x");
}

TEST(Normalize, OtherDrives) {
  if (!has_drives()) GTEST_SKIP() << "there are no drives";
  std::string other;
  for (char letter = 'A'; letter <= 'Z'; ++letter) {
    const std::string name = {letter, ':'};
    std::error_code ignored;
    const bool there = std::filesystem::is_directory(name + "/", ignored);
    if (!there) expect_normal({(name + "x").c_str(), 0, ""});
    if (there && name != drive()) other = name;
  }
  if (other.empty()) GTEST_SKIP() << "there is one drive only";
  EXPECT_EQ(normalize(other + "x").path, other + "/x");
  for (const auto& entry : std::filesystem::directory_iterator(other + "/")) {
    if (!entry.is_directory()) continue;
    set_drive_folder(other, entry.path().string().c_str());
    EXPECT_EQ(normalize(other + "x").path, entry.path().generic_string() + "/x");
    set_drive_folder(other, nullptr);
    break;
  }
}

TEST(Normalize, WhatDoesNotFitIsRefused) {
  const std::string text(310, 'x');
  const Variable variable("ZV_LONG", text);
  const Variable longer("ZV_LONGER", text + text);
  EXPECT_EQ(normalize("$ZV_LONG/12345678").path, text + "/12345678");
  const Normal refused = normalize("a/$ZV_LONG/1234567");
  EXPECT_EQ(refused.result, 0);
  EXPECT_EQ(refused.path, "");
  EXPECT_EQ(normalize("$ZV_LONGER").path, (text + text).substr(0, 319));
  EXPECT_EQ(normalize(std::string(319, 'y')).path, std::string(319, 'y'));
  EXPECT_EQ(normalize("/" + std::string(318, 'y')).result, !has_drives());
  EXPECT_EQ(normalize(" //s/" + std::string(314, 'y')).path.size(), 319u);
  EXPECT_EQ(normalize("//s/" + std::string(315, 'y')).result, 0);
}

}  // namespace
