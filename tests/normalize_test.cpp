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

// The normal form; "refused" where there is none and nothing is left of the path either.
std::string normalize(const std::string& path) {
  char buffer[ZV_PATH_MAX];
  zv_strncpy(buffer, path.c_str(), sizeof buffer);
  const int result = zv_normalize_path(buffer);
  if (result == 1) return buffer;
  return *buffer == '\0' ? "refused" : std::string("refused at ") + buffer;
}

struct NormalizeCase {
  std::string path;
  const char* normal;  // '@' in front is the current drive
};

void expect_normal(const NormalizeCase& c) {
  const std::string expected = *c.normal == '@' ? drive() + (c.normal + 1) : c.normal;
  EXPECT_EQ(normalize(c.path), expected) << c.path;
}

TEST(Normalize, Text) {
  const NormalizeCase cases[] = {
      {"", ""},
      {" \t\r\n ", ""},
      {"  a b\n", "a b"},
      {"D:\\a\\.\\b\\..\\d\\", "D:/a/d"},
      {"/x//y/", "@/x/y"},
      {"///", "@/"},
      {"/.", "@/"},
      {"D:/", "D:/"},
      {"D://.//", "D:/"},
      {".", "."},
      {"./", "."},
      {"./a", "./a"},
      {".//./a", "./a"},
      {"a/././/.", "a"},
      {"a/..", ""},
      {"./..", ".."},
      {"./../a/..", ".."},
      {"../a", "../a"},
      {"a/../../b", "../b"},
      {"a/b/../d/../../e", "e"},
      {"...", "..."},
      {".a/..b/c.", ".a/..b/c."},
      {"/..", "refused"},
      {"D:/a/../..", "refused"},
      {"//srv/sh/a/../..", "refused"},
      {"\\\\srv\\sh\\x", "//srv/sh/x"},
      {"//srv/sh", "//srv/sh/"},
      {"//srv/sh//a/./b", "//srv/sh/a/b"},
      {"//srv/./", "/"},  // the share is gone, and with it the UNC form
      {"//srv//sh", "@/srv/sh"},
      {"///srv/sh", "@/srv/sh"},
      {"//srv", "@/srv"},
      {"1:x", "refused"},
      {"/:x", "refused"},
      {"a/D:", "a/D:"},
      {"a/../D:", "D:/"},
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
      {"%ZV_DIR%/log", "D:/v/w/log"},
      {"$ZV_DIR", "D:/v/w"},
      {"x/$ZV_DIR/y", "x/D:/v/w/y"},
      {"%ZV_DIR%/../x", "x"},
      {"a/$ZV_DOTS/b", "a/./../../b"},
      {"../../$ZV_DIR", "../../D:/v/w"},
      {"%ZV_ROOT%/x", "D:/x"},
      {"%ZV_ROOT%", "D:/"},
      {"$ZV_SHARE", "//srv/sh/"},
      {"$ZV_SHARE/x", "//srv/sh/x"},
      {"$ZV_DIR%", "refused"},
      {"a$ZV_DIR", "a$ZV_DIR"},
      {"%A", "%A"},
      {"%", "%"},
      {"%%", "refused"},
      {"$", "refused"},
      {"$ZV_UNSET", "refused"},
      {"a/b/%ZV_UNSET%/c", "refused at a/b/"},
  };
  for (const NormalizeCase& c : cases) expect_normal(c);
#ifndef _WIN32  // where an empty variable cannot exist
  const Variable empty("ZV_EMPTY", "");
  expect_normal({"a/$ZV_EMPTY/b", "a/b"});
  expect_normal({"$ZV_EMPTY/b", "b"});
  expect_normal({"$ZV_EMPTY", ""});
#endif
}

TEST(Normalize, HomeFolder) {
  const ScratchFolder scratch;
  Home home(scratch.path());
  EXPECT_EQ(normalize("~"), scratch.path());
  EXPECT_EQ(normalize("~/docs/../x"), scratch.path("x"));
  EXPECT_EQ(normalize("~/../x"), "x");
  EXPECT_EQ(normalize("a/~"), "a/~");
  EXPECT_EQ(normalize("~name"), "~name");
  home.set(scratch.path("missing"));
  EXPECT_EQ(normalize("~/x"), "refused");
}

TEST(Normalize, DriveRelative) {
  if (!has_drives()) {
    for (const char* const path : {"D:", "D:x", "c:x/y"}) expect_normal({path, "refused"});
    return;
  }
  const ScratchFolder scratch;
  const WorkingDirectory inside(scratch.make_folder("sub"));
  const std::string sub = scratch.path("sub");
  std::string lower = drive();
  zv_strlwr(lower.data());
  EXPECT_EQ(normalize(drive()), sub);
  EXPECT_EQ(normalize(lower + "x\\y\\\\"), sub + "/x/y");
  EXPECT_EQ(normalize(drive() + "../x"), scratch.path("x"));
  EXPECT_EQ(normalize(drive() + "./x"), sub + "/./x");  // this "." has no separator before it
  EXPECT_EQ(normalize(drive() + std::string(ZV_PATH_MAX - sub.size(), 'x')), "refused");

  const WorkingDirectory at_root(drive() + "/");
  EXPECT_EQ(normalize(drive()), drive() + "/");
  EXPECT_EQ(normalize(drive() + "x"), drive() + "/x");
}

TEST(Normalize, OtherDrives) {
  if (!has_drives()) GTEST_SKIP() << "there are no drives";
  std::string other;
  for (char letter = 'A'; letter <= 'Z'; ++letter) {
    const std::string name = {letter, ':'};
    std::error_code ignored;
    const bool there = std::filesystem::is_directory(name + "/", ignored);
    if (!there) expect_normal({name + "x", "refused"});
    if (there && name != drive()) other = name;
  }
  if (other.empty()) GTEST_SKIP() << "there is one drive only";
  EXPECT_EQ(normalize(other + "x"), other + "/x");
  for (const auto& entry : std::filesystem::directory_iterator(other + "/")) {
    if (!entry.is_directory()) continue;
    set_drive_folder(other, entry.path().string().c_str());
    EXPECT_EQ(normalize(other + "x"), entry.path().generic_string() + "/x");
    set_drive_folder(other, nullptr);
    break;
  }
}

TEST(Normalize, WhatDoesNotFitIsRefused) {
  const std::string text(310, 'x');
  const Variable variable("ZV_LONG", text);
  const Variable longer("ZV_LONGER", text + text);
  EXPECT_EQ(normalize("$ZV_LONG/12345678"), text + "/12345678");
  EXPECT_EQ(normalize("a/$ZV_LONG/1234567"), "refused");
  EXPECT_EQ(normalize("$ZV_LONGER"), (text + text).substr(0, 319));
  EXPECT_EQ(normalize(std::string(319, 'y')), std::string(319, 'y'));
  const std::string rooted = "/" + std::string(318, 'y');
  EXPECT_EQ(normalize(rooted), has_drives() ? "refused" : rooted);
  EXPECT_EQ(normalize(" //s/" + std::string(314, 'y')).size(), 319u);
  EXPECT_EQ(normalize("//s/" + std::string(315, 'y')), "refused");
}

}  // namespace
