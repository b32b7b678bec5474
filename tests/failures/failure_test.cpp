// Every call that the library makes for memory or of the system, with each failing in turn in the
// ways it can: the documented result, nothing lost or left open, and what was there before as
// documented.
#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <sstream>

#include "failures/operations.h"
#include "fixtures/private_values.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

using namespace failing;

bool allows(const Failing& failing, size_t failure, int result) {
  if (failing.in_any_order) return std::ranges::count(failing.results, result) != 0;
  return result == failing.results.at(std::min(failure, failing.results.size() - 1));
}

int walk_call(const Operation& operation, const Failing& failing, const std::string& call) {
  SCOPED_TRACE(operation.name);
  size_t failure = 0;
  const int met = walk({call, failing.error}, [&](Attempt& attempt) {
    const int result = operation.run(attempt);
    const bool expected =
        attempt.failed().empty() ? result == operation.good : allows(failing, failure++, result);
    EXPECT_TRUE(expected) << attempt.failed() << " gave " << result;
  });
  EXPECT_GT(met, 0) << call << " was never called";
  return met;
}

// Prints how many points that made: each is an operation and its Nth call.
void walk_all(const char* what, const std::vector<Operation>& operations) {
  int allocations = 0;
  int others = 0;
  for (const Operation& operation : operations) {
    for (const Failing& failing : operation.failures) {
      int& points = failing.calls == all_memory ? allocations : others;
#ifdef _WIN32  // where the library calls the system through its import table
      if (failing.calls != all_memory) continue;
#endif
      std::istringstream calls(failing.calls);
      for (std::string call; calls >> call;) points += walk_call(operation, failing, call);
    }
  }
  std::printf("%s: %d failing allocations, %d other calls\n", what, allocations, others);
}

// On Windows a lock itself takes memory when it is first used. Later tests find it made.
TEST(Failures, TheFirstLock) {
  for (const bool is_map : {true, false}) {
    Attempt attempt({all_memory, ENOMEM}, 0);
    EXPECT_EQ(attempt([is_map] {
                return is_map ? zv_pathmap("/a/f", "/b/f") : zv_putenv_private("A", "v", 0);
              }),
              0);
    EXPECT_FALSE(attempt.failed().empty());
  }
  char path[ZV_PATH_MAX] = "/a/f";
  EXPECT_EQ(zv_pathmap_locate(path), 0);
  EXPECT_EQ(private_values("A"), "none");
  zv_pathmap_clear();
  zv_putenv_private(nullptr, nullptr, 0);
}

#ifndef _WIN32
// Here the opening would refuse a link; Windows, which Wine knows no links for, would follow it.
TEST(Failures, NothingTriesToOpenALinkBelowAScan) {
  const ScratchFolder folder;
  folder.make_file("outside/kept");
  const std::string top = folder.make_folder("top");
  std::filesystem::create_symlink("../outside", folder.path("top/link"));
  Attempt attempt({"openat", EIO}, 0);
  char** list = nullptr;
  EXPECT_EQ(attempt([&] { return zv_dir_scan(top.c_str(), &list, nullptr, nullptr, 1, 1); }), 1);
  EXPECT_EQ(attempt([&] { return zv_rmpath(top.c_str()); }), 1);
  EXPECT_EQ(attempt.failed(), "");
  zv_strlist_free(list, -1);
}
#endif

TEST(Failures, OfMemoryPluginsAndTheHost) {
  walk_all("memory, plugins and the host", memory_operations());
}

TEST(Failures, OfFiles) {
  walk_all("files", file_operations());
}

TEST(Failures, OfTheNetwork) {
  const scripted::Network network;
  walk_all("the network", network_operations());
}

}  // namespace
