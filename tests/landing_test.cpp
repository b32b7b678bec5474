// What a run does on the local disk: a destination takes its place whole, keeps what it passes on,
// or is refused; whatever fails, the old file stays and nothing else does.
#include <cerrno>

#include "handle.h"
#include "scratch_folder.h"

#ifndef _WIN32
#include <fcntl.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>
#endif

namespace {

namespace fs = std::filesystem;

constexpr Option plain = {ZV_TRANSFER_IN_PLACE, 0};
constexpr Option in_place = {ZV_TRANSFER_IN_PLACE, 1};
constexpr Option keep = {ZV_TRANSFER_KEEP, 1};
constexpr Option sync_it = {ZV_TRANSFER_SYNC, 1};

Outcome local(int code, int number) {
  return {code, ZV_CAUSE_LOCAL, number};
}

Outcome refused(const char* reason) {
  return {-4, ZV_CAUSE_LANDING, 0, reason};
}

const Outcome landed = {};
const Outcome exists = {-4, ZV_CAUSE_EXISTS, EEXIST};
const Outcome same_file = {-4, ZV_CAUSE_SAME_FILE};
const Outcome disk_full = {-4, ZV_CAUSE_DISK_FULL, ENOSPC};
const Outcome too_large = {-3, ZV_CAUSE_TOO_LARGE};

int copy(const Option& option, const std::string& from, const std::string& to) {
  return outcome_of(new_handle({option}), from, to).code;
}

struct Landing : testing::Test {
  const ScratchFolder folder;
  const std::string new_file = folder.make_file("new", "content");

  // From a file, "new" as a rule. What succeeds leaves its content, what fails what was there.
  void check(const Option& option, const Outcome& end, std::initializer_list<std::string> places,
             const std::string& from = "new") const {
    for (const std::string& name : places) {
      SCOPED_TRACE(from + " to " + name);
      const std::string to = folder.path(name);
      std::error_code none;
      const std::string before = fs::is_regular_file(to, none) ? folder.content(name) : "";
      const bool existed = folder.exists(name);
      expect_end(outcome_of(new_handle({option}), folder.path(from), to), end);
      EXPECT_TRUE(end.code == 0 || folder.exists(name) == existed);
      if (fs::is_regular_file(to, none) && std::ifstream(to)) {
        EXPECT_EQ(folder.content(name), end.code == 0 ? folder.content(from) : before);
      }
      for (const auto& entry : fs::recursive_directory_iterator(folder.path()))
        EXPECT_FALSE(entry.path().filename().string().starts_with(".zv-"));
    }
  }
};

TEST_F(Landing, WhatIsThere) {
  for (const char* const name : {"old", "linked", "folder/old"})
    folder.make_file(name, "what was there before");
  folder.make_file("empty");
  fs::create_hard_link(folder.path("linked"), folder.path("other name"));
  fs::create_hard_link(new_file, folder.path("new too"));
  std::string longest = "folder/";
  while (folder.path(longest).size() < 317) longest += "./";
  longest += "x";
  check(plain, landed, {"made", "folder/made"});
  check(plain, landed, {"made"}, "empty");
  check(sync_it, landed, {"old", "folder/synced"});
  check(in_place, landed, {"made in place"});
  check(keep, landed, {"kept"});
  check(keep, exists, {"kept", "linked"});
  check(plain, local(-4, EISDIR), {"folder"});
  check(in_place, local(-4, EISDIR), {"folder/"});
  check(plain, local(-4, ENOENT), {"missing/x"});
  check(plain, {-4, ZV_CAUSE_LOCATION, ENAMETOOLONG}, {longest});
  check(plain, same_file, {"new", "new too"});
  check(in_place, same_file, {"new", "new too"});
  check(plain, refused("ZV_TRANSFER_IN_PLACE"), {"linked"});
  check(in_place, landed, {"linked"});
  check(plain, local(-3, ENOENT), {"x", "old"}, "missing");
  check(plain, local(-3, EISDIR), {"x", "old"}, "folder");
  check({ZV_TRANSFER_SIZE, 6}, too_large, {"x", "old"});
  check({ZV_TRANSFER_SIZE, 7}, landed, {"old"});
  check({ZV_TRANSFER_SIZE, 0}, landed, {"old"}, "empty");
  EXPECT_EQ(folder.content("other name"), "content");
  for (const Outcome& end : {landed, exists})
    expect_end(outcome_of(new_handle({in_place, keep}), new_file, folder.path("both")), end);
}

// Between two pieces, and after the last one: nothing has landed until it has its name.
TEST_F(Landing, Cancelled) {
  folder.make_file("new", std::string(size_t{20} << 20, 'x'));
  const std::string to = folder.make_file("to", "old");
  const auto watch = [](void* stop, int64_t done, int64_t) {
    return done < *static_cast<int64_t*>(stop) ? 0 : 1;
  };
  for (int64_t stop : {int64_t{0}, int64_t{20} << 20}) {
    const HandlePtr handle = new_handle();
    zv_transfer_watch(handle.get(), watch, &stop);
    expect_end(outcome_of(handle, new_file, to),
               {stop == 0 ? -3 : -4, ZV_CAUSE_CANCELLED, 0, "cancelled"});
    EXPECT_EQ(folder.content("to"), "old");
    EXPECT_EQ(std::distance(fs::directory_iterator(folder.path()), {}), 2);
  }
}

#ifdef _WIN32

TEST_F(Landing, ReadOnlyFiles) {
  folder.make_file("old", "what was there before");
  fs::permissions(folder.path("old"), fs::perms::owner_read);
  check(plain, refused("ZV_TRANSFER_IN_PLACE"), {"old"});
  check(in_place, local(-4, EACCES), {"old"});
  check(plain, landed, {"made"}, "old");
  check(plain, local(-4, ENOENT), {"made/x", "bad|name"});
  EXPECT_EQ(copy(plain, new_file, folder.path("nul")), 0);
  for (const char* const name : {"old", "made"}) {
    EXPECT_EQ(fs::status(folder.path(name)).permissions() & fs::perms::owner_write,
              fs::perms::none);
    fs::permissions(folder.path(name), fs::perms::all);
  }
}

#else

TEST_F(Landing, LinksAndDevices) {
  folder.make_file("folder/file", "what was there before");
  const int open_file = ::open(folder.make_file("open").c_str(), O_RDWR | O_CLOEXEC);
  const auto link = [this](const char* name, const std::string& target) {
    fs::create_symlink(target, folder.path(name));
  };
  link("link", "folder/file");
  link("link to a link", folder.path("link"));
  link("loose", "nowhere");
  link("circle", "circle");
  link("to folder", "folder");
  link("full", "/dev/full");
  link("null", "/dev/null");
  link("made up", "/proc/version");
  link("open too", "/dev/fd/" + std::to_string(open_file));
  check(plain, landed, {"link to a link", "to folder/made", "null", "open too"});
  check(in_place, landed, {"link"});
  check(sync_it, landed, {"null"});
  check(keep, exists, {"link", "loose", "null"});
  check(plain, local(-4, EISDIR), {"to folder"});
  check(plain, refused("leads nowhere"), {"loose"});
  check(plain, local(-4, ELOOP), {"circle"});
  check(plain, local(-4, ENOTDIR), {"new/x"});
  check(plain, same_file, {"null"}, "null");
  check(plain, same_file, {"open too"}, "open");
  check(plain, disk_full, {"full"});
  check(plain, landed, {"copied"}, "made up");
  check(plain, landed, {"empty"}, "null");
  EXPECT_TRUE(fs::is_symlink(folder.path("link to a link")) && fs::is_symlink(folder.path("link")));
  EXPECT_TRUE(folder.content("copied").starts_with("Linux"));
  EXPECT_EQ(folder.content("open"), "content");
  ::close(open_file);
}

// What a pipe holds passes as it comes, and no limit waits for more of it.
TEST_F(Landing, Pipes) {
  const std::string pipe = folder.path("pipe");
  const std::string to = folder.path("to");
  ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
  int open_pipe = ::open(pipe.c_str(), O_RDWR | O_NONBLOCK | O_CLOEXEC);
  EXPECT_EQ(::write(open_pipe, "onetwo", 6), 6);
  EXPECT_EQ(outcome_of(new_handle({{ZV_TRANSFER_TIME, 50}}), pipe, to).cause, ZV_CAUSE_TIME);
  EXPECT_EQ(::write(open_pipe, "onetwo", 6), 6);
  const HandlePtr handle = new_handle({{ZV_TRANSFER_TIME, 10000}});
  const auto end = [](void* file, int64_t done, int64_t) {
    if (done >= 6) *static_cast<int*>(file) = ::close(*static_cast<int*>(file)) - 1;
    return 0;
  };
  zv_transfer_watch(handle.get(), end, &open_pipe);
  EXPECT_EQ(outcome_of(handle, pipe, to).code, 0);
  ::close(open_pipe);  // where the run failed before
  EXPECT_EQ(copy({ZV_TRANSFER_SIZE, 5}, "/dev/zero", to), -3);
  EXPECT_EQ(folder.content("to"), "onetwo");
  open_pipe = ::open(pipe.c_str(), O_RDWR | O_NONBLOCK | O_CLOEXEC);
  EXPECT_EQ(copy(plain, to, pipe), 0);
  char got[8] = "";
  EXPECT_EQ(::read(open_pipe, got, sizeof got), 6);
  ::close(open_pipe);
}

// An access list that lets one more user read, as the system keeps it.
constexpr char access_list[] = "system.posix_acl_access";
const std::string one_more_user(
    "\2\0\0\0\1\0\6\0\xff\xff\xff\xff\2\0\4\0\x39\x30\0\0\4\0\0\0\xff\xff\xff\xff"
    "\x10\0\4\0\xff\xff\xff\xff\x20\0\0\0\xff\xff\xff\xff",
    44);

std::string access_list_of(const std::string& path) {
  char list[200];
  const ssize_t size = ::getxattr(path.c_str(), access_list, list, sizeof list);
  return {list, size < 0 ? 0 : static_cast<size_t>(size)};
}

bool set_list(const std::string& path, const char* name) {
  return ::setxattr(path.c_str(), name, one_more_user.data(), one_more_user.size(), 0) == 0;
}

struct stat status_of(const std::string& path) {
  struct stat st = {};
  ::stat(path.c_str(), &st);
  st.st_mode &= 07777;
  return st;
}

TEST_F(Landing, Rights) {
  const std::string old = folder.make_file("old", "old");
  const std::string made = folder.path("made");
  const mode_t mask = ::umask(027);
  ::chmod(new_file.c_str(), 06775);
  EXPECT_TRUE(::geteuid() != 0 || ::chown(old.c_str(), 12345, 54321) == 0);
  ::chmod(old.c_str(), 07604);
  const bool has_lists = set_list(old, access_list);
  const struct stat before = status_of(old);
  for (const Option& option : {plain, sync_it}) {
    EXPECT_EQ(copy(option, new_file, old), 0);
    const struct stat after = status_of(old);
    EXPECT_EQ(after.st_mode, before.st_mode & 0777);
    EXPECT_TRUE(after.st_uid == before.st_uid && after.st_gid == before.st_gid);
    EXPECT_TRUE(!has_lists || access_list_of(old) == one_more_user);
  }
  for (const Option& option : {plain, in_place}) {
    EXPECT_EQ(copy(option, new_file, made), 0);
    EXPECT_EQ(status_of(made).st_mode, 0750u);
    fs::remove(made);
  }
  // A folder's default list is for new files, and not for one that has its rights already.
  if (has_lists && set_list(folder.path(), "system.posix_acl_default")) {
    EXPECT_EQ(::removexattr(old.c_str(), access_list), 0);
    ::chmod(old.c_str(), 0640);
    EXPECT_EQ(copy(plain, new_file, old), 0);
    EXPECT_EQ(access_list_of(old), "");
    EXPECT_EQ(status_of(old).st_mode, 0640u);
    EXPECT_EQ(copy(plain, new_file, made), 0);
    EXPECT_NE(access_list_of(made), "");
  }
  ::umask(mask);
}

// Files of root, replaced by somebody else.
TEST_F(Landing, RightsThatAreMissing) {
  if (::geteuid() != 0) GTEST_SKIP() << "needs root, who can be somebody else for a while";
  constexpr uid_t somebody = 12345;
  const auto make = [this](const std::string& name, mode_t bits, uid_t owner) {
    const std::string path =
        folder.exists(name) ? folder.path(name) : folder.make_file(name, "old");
    EXPECT_TRUE(::chown(path.c_str(), owner, owner) == 0 && ::chmod(path.c_str(), bits) == 0);
  };
  make("new", 0444, 0);
  make("open/root's", 0666, 0);
  make("open/read-only", 0444, somebody);
  make("open/write-only", 0222, somebody);
  make("closed/mine", 0644, somebody);
  make("sticky/root's", 0666, 0);
  make("open", 0777, 0);
  make("closed", 0755, 0);
  make("sticky", 01777, 0);
  make("", 0755, 0);
  // A file that is a disk of its own has its name for ever.
  const std::string fixed = folder.make_file("fixed", "old");
  const bool is_fixed =
      ::mount(folder.make_file("disk", "old").c_str(), fixed.c_str(), "", MS_BIND, "") == 0;
  if (is_fixed) check(plain, refused("folder"), {"fixed"});
  check(in_place, landed, {"fixed"});
  ASSERT_TRUE(::setegid(somebody) == 0 && ::seteuid(somebody) == 0);
  check(plain, landed, {"open/made", "open/write-only"});
  check(plain, refused("owner"), {"open/root's", "sticky/root's"});
  check(plain, refused("may not be written"), {"open/read-only"});
  check(plain, refused("folder"), {"closed/mine"});
  check(in_place, landed, {"open/root's", "closed/mine"});
  check(in_place, local(-4, EACCES), {"open/read-only"});
  check(plain, local(-4, EACCES), {"closed/made"});
  ASSERT_TRUE(::seteuid(0) == 0 && ::setegid(0) == 0);
  ::umount(fixed.c_str());
}

#endif

}  // namespace
