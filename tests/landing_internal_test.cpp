// What a run does on the local disk: a destination takes its place whole, keeps what it passes on,
// or is refused with a cause and a reason; whatever fails, the old file stays and nothing else
// does.
#include <gtest/gtest.h>

#include <cerrno>
#include <filesystem>
#include <fstream>
#include <string>

#include "scratch_folder.h"
#include "transfer/local.h"
#include "transfer/run.h"

#ifndef _WIN32
#include <fcntl.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <thread>
#endif

namespace {

namespace fs = std::filesystem;

struct Outcome {
  int code, cause, number;
  std::string reason;
};

zv::Options with(bool zv::Options::*option) {
  zv::Options options;
  options.*option = true;
  return options;
}

zv::Options sized(int64_t size) {
  zv::Options options;
  options.size = size;
  return options;
}

const zv::Options plain;
const zv::Options in_place = with(&zv::Options::in_place);
const zv::Options keep = with(&zv::Options::keep);
const zv::Options sync = with(&zv::Options::sync);

Outcome copy(const zv::Options& options, const std::string& from, const std::string& to,
             zv::Watch watch = {}) {
  zv::Signals signals;
  zv::Run run(options, watch, signals);
  const int code = zv::copy_local(run, from.c_str(), to.c_str());
  EXPECT_EQ(code, run.failure().code);
  EXPECT_TRUE(code != 0 || signals.total == signals.done);
  return {code, run.failure().cause, run.failure().number, run.failure().reason.c_str()};
}

bool holds_private_file(const ScratchFolder& folder) {
  for (const auto& entry : fs::recursive_directory_iterator(folder.path()))
    if (entry.path().filename().string().starts_with(".zv-")) return true;
  return false;
}

// "" of what is no file, or may not be read.
std::string content_of(const std::string& path) {
  std::error_code none;
  std::ifstream file(fs::is_regular_file(path, none) ? path : "", std::ios::binary);
  return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

struct Case {
  std::string to;
  zv::Options options;
  int code = 0;
  int cause = ZV_CAUSE_NONE;
  int number = 0;
  std::string reason = "";   // a part of it
  std::string from = "new";  // which holds "content"
};

// What succeeds leaves the source's content, what fails what was there.
void run_cases(const ScratchFolder& folder, std::initializer_list<Case> cases) {
  for (const Case& c : cases) {
    SCOPED_TRACE(c.from + " to " + c.to);
    const std::string to = folder.path(c.to);
    const std::string before = content_of(to);
    const bool existed = folder.exists(c.to);
    const Outcome outcome = copy(c.options, folder.path(c.from), to);
    EXPECT_EQ(outcome.code, c.code);
    EXPECT_EQ(outcome.cause, c.cause) << outcome.reason;
    EXPECT_EQ(outcome.number, c.number);
    EXPECT_NE(outcome.reason.find(c.reason), std::string::npos) << outcome.reason;
    EXPECT_EQ(outcome.reason.empty(), c.code == 0);
    EXPECT_TRUE(c.code == 0 || folder.exists(c.to) == existed);
    const std::string expected = c.code == 0 ? content_of(folder.path(c.from)) : before;
    std::error_code none;
    EXPECT_TRUE(!fs::is_regular_file(to, none) || !std::ifstream(to) || content_of(to) == expected);
    EXPECT_FALSE(holds_private_file(folder));
  }
}

TEST(Landing, WhatIsThere) {
  const ScratchFolder folder;
  folder.make_file("new", "content");
  folder.make_file("empty");
  folder.make_file("old", "what was there before");
  folder.make_file("linked", "under two names");
  folder.make_folder("folder");
  fs::create_hard_link(folder.path("linked"), folder.path("other name"));
  fs::create_hard_link(folder.path("new"), folder.path("new too"));
  std::string longest = "folder/";
  while (folder.path(longest).size() < 317) longest += "./";
  longest += "x";
  const std::string in_the_way = "ZV_TRANSFER_IN_PLACE";
  run_cases(folder, {{"made", plain},
                     {"made", plain, 0, 0, 0, "", "empty"},
                     {"old", sync},
                     {"made in place", in_place},
                     {"folder/synced", sync},
                     {"kept", keep},
                     {"old", keep, -4, ZV_CAUSE_EXISTS, EEXIST, "File exists"},
                     {"made in place and kept", {.in_place = true, .keep = true}},
                     {"folder", plain, -4, ZV_CAUSE_LOCAL, EISDIR, "Is a directory"},
                     {"folder/", in_place, -4, ZV_CAUSE_LOCAL, EISDIR},
                     {"missing/x", plain, -4, ZV_CAUSE_LOCAL, ENOENT, "No such file or directory"},
                     {longest, plain, -4, ZV_CAUSE_LOCATION, ENAMETOOLONG},
                     {"new", plain, -4, ZV_CAUSE_SAME_FILE, 0, "source"},
                     {"new too", in_place, -4, ZV_CAUSE_SAME_FILE},
                     {"linked", plain, -4, ZV_CAUSE_LANDING, 0, in_the_way},
                     {"linked", in_place},
                     {"x", plain, -3, ZV_CAUSE_LOCAL, ENOENT, "No such file", "missing"},
                     {"x", plain, -3, ZV_CAUSE_LOCAL, EISDIR, "Is a directory", "folder"},
                     {"old", sized(6), -3, ZV_CAUSE_TOO_LARGE},
                     {"old", sized(7)},
                     {"old", sized(0), 0, 0, 0, "", "empty"}});
  EXPECT_EQ(folder.content("other name"), "content");
}

// Every size at which the copy goes on in another way.
TEST(Landing, CopiesEverySize) {
  const ScratchFolder folder;
  for (const size_t size : {size_t{0}, size_t{1}, size_t{65536}, size_t{65537}, size_t{20} << 20}) {
    std::string content(size, 'x');
    for (size_t i = 0; i < size; ++i) content[i] = static_cast<char>(i * 7 + i / 256);
    const std::string from = folder.make_file("from", content);
    EXPECT_EQ(copy(plain, from, folder.path("to")).code, 0);
    EXPECT_TRUE(folder.content("to") == content);
  }
}

// Between two pieces, and after the last one: nothing has landed until it has its name.
TEST(Landing, Cancelled) {
  const ScratchFolder folder;
  const std::string from = folder.make_file("from", std::string(size_t{20} << 20, 'x'));
  folder.make_file("to", "old");
  struct Stop {
    int64_t at;
    static int watch(void* stop, int64_t done, int64_t) {
      return done >= static_cast<Stop*>(stop)->at;
    }
  };
  for (const int64_t at : {int64_t{0}, int64_t{20} << 20}) {
    Stop stop = {at};
    const Outcome outcome = copy(plain, from, folder.path("to"), {Stop::watch, &stop});
    EXPECT_EQ(outcome.cause, ZV_CAUSE_CANCELLED);
    EXPECT_EQ(outcome.code, at == 0 ? -3 : -4);
    EXPECT_EQ(outcome.reason, "cancelled");
    EXPECT_EQ(folder.content("to"), "old");
    EXPECT_FALSE(holds_private_file(folder));
  }
}

#ifdef _WIN32

TEST(Landing, ReadOnlyFiles) {
  const ScratchFolder folder;
  folder.make_file("new", "content");
  folder.make_file("old", "what was there before");
  fs::permissions(folder.path("old"), fs::perms::owner_read);
  run_cases(folder, {{"old", plain, -4, ZV_CAUSE_LANDING, 0, "ZV_TRANSFER_IN_PLACE"},
                     {"old", in_place, -4, ZV_CAUSE_LOCAL, EACCES},
                     {"made", plain, 0, 0, 0, "", "old"},
                     {"made/x", plain, -4, ZV_CAUSE_LOCAL, ENOENT},
                     {"bad|name", plain, -4, ZV_CAUSE_LOCAL, ENOENT}});
  EXPECT_EQ(copy(plain, folder.path("new"), folder.path("nul")).code, 0);
  EXPECT_EQ(fs::status(folder.path("made")).permissions() & fs::perms::owner_write,
            fs::perms::none);
  for (const char* const name : {"old", "made"}) fs::permissions(folder.path(name), fs::perms::all);
}

#else

TEST(Landing, LinksAndDevices) {
  const ScratchFolder folder;
  folder.make_file("new", "content");
  folder.make_file("folder/file", "what was there before");
  fs::create_symlink("folder/file", folder.path("link"));
  fs::create_symlink(folder.path("link"), folder.path("link to a link"));
  fs::create_symlink("nowhere", folder.path("loose"));
  fs::create_symlink("circle", folder.path("circle"));
  fs::create_symlink("folder", folder.path("link to a folder"));
  fs::create_symlink("/dev/full", folder.path("full"));
  fs::create_symlink("/dev/null", folder.path("null"));
  fs::create_symlink("/proc/version", folder.path("made up"));
  const int open_file = ::open(folder.make_file("open").c_str(), O_RDWR | O_CLOEXEC);
  fs::create_symlink("/dev/fd/" + std::to_string(open_file), folder.path("open too"));
  run_cases(folder, {{"link to a link", plain},
                     {"link", in_place},
                     {"link", keep, -4, ZV_CAUSE_EXISTS, EEXIST},
                     {"link to a folder/made", plain},
                     {"link to a folder", plain, -4, ZV_CAUSE_LOCAL, EISDIR},
                     {"loose", plain, -4, ZV_CAUSE_LANDING, 0, "leads nowhere"},
                     {"loose", keep, -4, ZV_CAUSE_EXISTS, EEXIST},
                     {"circle", plain, -4, ZV_CAUSE_LOCAL, ELOOP},
                     {"new/x", plain, -4, ZV_CAUSE_LOCAL, ENOTDIR},
                     {"null", plain},
                     {"null", sync},
                     {"null", keep, -4, ZV_CAUSE_EXISTS, EEXIST},
                     {"null", plain, -4, ZV_CAUSE_SAME_FILE, 0, "", "null"},
                     {"full", plain, -4, ZV_CAUSE_DISK_FULL, ENOSPC, "No space left on device"},
                     {"copied", plain, 0, 0, 0, "", "made up"},
                     {"empty", plain, 0, 0, 0, "", "null"},
                     {"open too", plain},
                     {"open too", plain, -4, ZV_CAUSE_SAME_FILE, 0, "", "open"}});
  EXPECT_TRUE(fs::is_symlink(folder.path("link to a link")));
  EXPECT_TRUE(fs::is_symlink(folder.path("link")));
  EXPECT_TRUE(folder.content("copied").starts_with("Linux"));
  struct stat st = {};
  EXPECT_TRUE(::fstat(open_file, &st) == 0 && st.st_size == 7);
  ::close(open_file);
}

// What a pipe holds passes as it comes, and no limit waits for more of it.
TEST(Landing, Pipes) {
  const ScratchFolder folder;
  const std::string pipe = folder.path("pipe");
  ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
  std::thread writer([&pipe] {
    std::ofstream out(pipe);
    out << "one" << std::flush << "two";
  });
  EXPECT_EQ(copy(plain, pipe, folder.path("to")).code, 0);
  writer.join();
  EXPECT_EQ(folder.content("to"), "onetwo");

  const int idle = ::open(pipe.c_str(), O_RDWR | O_CLOEXEC);
  zv::Options options;
  options.time = 50;
  EXPECT_EQ(copy(options, pipe, folder.path("to")).cause, ZV_CAUSE_TIME);
  EXPECT_EQ(copy(sized(5), "/dev/zero", folder.path("to")).cause, ZV_CAUSE_TOO_LARGE);
  EXPECT_EQ(folder.content("to"), "onetwo");
  EXPECT_EQ(copy(plain, folder.path("to"), pipe).code, 0);
  char got[8] = "";
  EXPECT_EQ(::read(idle, got, sizeof got), 6);
  ::close(idle);
}

constexpr char access_list[] = "system.posix_acl_access";

// An access list that lets one more user read, as the system keeps it.
const std::string one_more_user = [] {
  std::string list("\2\0\0\0", 4);
  const auto add = [&list](char tag, char rights, const std::string& id) {
    list += std::string{tag, '\0', rights, '\0'} + id;
  };
  const std::string none(4, '\xff');
  add(0x01, 6, none);
  add(0x02, 4, std::string("\x39\x30\0\0", 4));
  add(0x04, 0, none);
  add(0x10, 4, none);
  add(0x20, 0, none);
  return list;
}();

std::string access_list_of(const std::string& path) {
  char list[200];
  const ssize_t size = ::getxattr(path.c_str(), access_list, list, sizeof list);
  return size < 0 ? "" : std::string(list, static_cast<size_t>(size));
}

bool is_root() {
  return ::geteuid() == 0;
}

TEST(Landing, Rights) {
  const ScratchFolder folder;
  const std::string from = folder.make_file("from", "content");
  const std::string old = folder.make_file("old", "old");
  const auto bits = [&folder](const std::string& name) {
    struct stat st = {};
    ::stat(folder.path(name).c_str(), &st);
    return st.st_mode & 07777;
  };
  const mode_t mask = ::umask(027);
  ::chmod(from.c_str(), 06775);
  EXPECT_TRUE(!is_root() || ::chown(old.c_str(), 12345, 54321) == 0);
  ::chmod(old.c_str(), 07604);
  const bool has_lists =
      ::setxattr(old.c_str(), access_list, one_more_user.data(), one_more_user.size(), 0) == 0;
  const mode_t kept = bits("old") & 0777;
  for (const zv::Options& options : {plain, sync}) {
    EXPECT_EQ(copy(options, from, old).code, 0);
    EXPECT_EQ(bits("old"), kept);
    struct stat st = {};
    EXPECT_EQ(::stat(old.c_str(), &st), 0);
    EXPECT_EQ(st.st_uid, is_root() ? 12345 : ::geteuid());
    EXPECT_TRUE(!is_root() || st.st_gid == 54321);
    EXPECT_TRUE(!has_lists || access_list_of(old) == one_more_user);
  }
  for (const zv::Options& options : {plain, in_place}) {
    EXPECT_EQ(copy(options, from, folder.path("new")).code, 0);
    EXPECT_EQ(bits("new"), 0750u);
    fs::remove(folder.path("new"));
  }
  // A folder's default list is for new files, and not for one that has its rights already.
  if (has_lists && ::setxattr(folder.path().c_str(), "system.posix_acl_default",
                              one_more_user.data(), one_more_user.size(), 0) == 0) {
    EXPECT_EQ(::removexattr(old.c_str(), access_list), 0);
    ::chmod(old.c_str(), 0640);
    EXPECT_EQ(copy(plain, from, old).code, 0);
    EXPECT_EQ(access_list_of(old), "");
    EXPECT_EQ(bits("old"), 0640u);
    EXPECT_EQ(copy(plain, from, folder.path("new")).code, 0);
    EXPECT_NE(access_list_of(folder.path("new")), "");
  }
  ::umask(mask);
}

// Files of root, replaced by somebody else.
TEST(Landing, RightsThatAreMissing) {
  if (!is_root()) GTEST_SKIP() << "needs root, who can be somebody else for a while";
  constexpr uid_t somebody = 12345;
  const ScratchFolder folder;
  const auto make = [&folder](const std::string& name, mode_t bits, uid_t owner) {
    const std::string path = folder.make_file(name, "what was there before");
    EXPECT_EQ(::chown(path.c_str(), owner, owner), 0);
    EXPECT_EQ(::chmod(path.c_str(), bits), 0);
  };
  const auto make_folder = [&folder](const std::string& name, mode_t bits) {
    EXPECT_EQ(::chmod(folder.make_folder(name).c_str(), bits), 0);
  };
  make_folder("open", 0777);
  make_folder("closed", 0755);
  make_folder("sticky", 01777);
  make("new", 0444, 0);
  make("open/root's", 0666, 0);
  make("open/read-only", 0444, somebody);
  make("open/write-only", 0222, somebody);
  make("closed/mine", 0644, somebody);
  make("sticky/root's", 0666, 0);
  ::chmod(folder.path().c_str(), 0755);
  const auto refused = [](const std::string& to, const std::string& reason) {
    return Case{to, plain, -4, ZV_CAUSE_LANDING, 0, reason};
  };
  ASSERT_EQ(::setegid(somebody) == 0 && ::seteuid(somebody) == 0, true);
  run_cases(folder, {{"open/made", plain},
                     {"open/write-only", plain},
                     refused("open/root's", "owner"),
                     {"open/root's", in_place},
                     refused("open/read-only", "may not be written"),
                     {"open/read-only", in_place, -4, ZV_CAUSE_LOCAL, EACCES},
                     {"closed/made", plain, -4, ZV_CAUSE_LOCAL, EACCES, "Permission denied"},
                     refused("closed/mine", "folder"),
                     {"closed/mine", in_place},
                     refused("sticky/root's", "owner")});
  ASSERT_EQ(::seteuid(0) == 0 && ::setegid(0) == 0, true);
}

TEST(Landing, FullDisk) {
  const ScratchFolder folder;
  const std::string disk = folder.make_folder("disk");
  if (::mount("tmpfs", disk.c_str(), "tmpfs", 0, "size=64k") != 0)
    GTEST_SKIP() << "needs root, to make a small disk";
  folder.make_file("large", std::string(100000, 'x'));
  folder.make_file("disk/old", std::string(30000, 'o'));
  run_cases(folder,
            {{"disk/old", plain, -4, ZV_CAUSE_DISK_FULL, ENOSPC, "No space left", "large"},
             {"disk/new", plain, -4, ZV_CAUSE_DISK_FULL, ENOSPC, "No space left", "large"}});
  // A file that is a disk of its own has its name for ever.
  folder.make_file("fixed", "old");
  folder.make_file("new", "content");
  if (::mount(folder.path("new").c_str(), folder.path("fixed").c_str(), "", MS_BIND, "") == 0) {
    folder.make_file("newer", "newer");
    run_cases(folder, {{"fixed", plain, -4, ZV_CAUSE_LANDING, 0, "folder", "newer"},
                       {"fixed", in_place, 0, 0, 0, "", "newer"}});
    ::umount(folder.path("fixed").c_str());
  }
  ::umount(disk.c_str());
}

#endif

}  // namespace
