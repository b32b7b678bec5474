// Runs tests again and again, each time with another call below the library failing. What a test
// expects does not count here: a crash, a block or a handle that is lost, and a hang do.
// `zarvo_torture PART` runs the tests whose name holds that part, and shows what each expected;
// `zarvo_torture 1/8` runs each eighth one, from the first on.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <thread>

#include "failures/failing_calls.h"
#include "fixtures/peer.h"
#include "zarvo.h"

namespace {

using namespace failing;
using std::chrono::steady_clock;

// A test with more calls has as many of them fail, evenly spread; fewer where it takes its time,
// and none where it mostly waits.
constexpr int most_points = 60;
constexpr int hang_s = 100;
constexpr std::chrono::milliseconds patience(250);

std::array<char, 300> point;  // what is being tried
std::atomic<int> points = 0;
int faults = 0;

[[noreturn]] void die(const char* how) {
  std::fprintf(stderr, "%s: %s\n", how, point.data());
  std::_Exit(1);
}

void watch() {
  for (int seen = -1, idle = 0;; std::this_thread::sleep_for(std::chrono::seconds(1))) {
    idle = points == seen ? idle + 1 : 0;
    seen = points;
    if (idle >= hang_s) die("hang");
  }
}

// What a test that ended early leaves in the tables of the process.
void clear_tables() {
  zv_putenv_private(nullptr, nullptr, 0);
  zv_pathmap_clear();
}

void run_with(Attempt& attempt, const testing::TestInfo& test) {
  std::snprintf(point.data(), point.size(), "%s.%s, %s call %d, error %d", test.test_suite_name(),
                test.name(), attempt.call.data(), attempt.left, attempt.error);
  ++points;
  clear_tables();
  const int blocks = blocks_in_use();
  const int handles = scripted::open_handles();
  attempt([] { return RUN_ALL_TESTS(); });
  clear_tables();
  const int kept = blocks_in_use() - blocks;
  const int open = scripted::open_handles() - handles;
  // A test that gave up leaves it all behind.
  if (test.result()->HasFatalFailure() || (kept == 0 && open == 0)) return;
  std::fprintf(stderr, "%d blocks and %d handles lost: %s, %s\n", kept, open, point.data(),
               std::string(attempt.failed).c_str());
  ++faults;
}

// False where the test takes too long for it.
bool torture(const testing::TestInfo& test, std::string_view call, int error) {
  const auto begin = steady_clock::now();
  Attempt none(call, error, 1 << 30);
  run_with(none, test);
  const auto taken = steady_clock::now() - begin;
  if (taken > 5 * patience) {
    std::printf("%s.%s takes too long for it\n", test.test_suite_name(), test.name());
    return false;
  }
  const int step = 1 + none.met / std::clamp(static_cast<int>(patience / taken), 3, most_points);
  bool failed = true;
  for (int skipped = 0; failed && steady_clock::now() - begin < 10 * patience; skipped += step) {
    Attempt attempt(call, error, skipped);
    run_with(attempt, test);
    failed = !attempt.failed.empty();
  }
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  testing::InitGoogleTest(&argc, argv);
  testing::TestEventListeners& listeners = testing::UnitTest::GetInstance()->listeners();
  std::string wanted = argc > 1 ? argv[1] : "";
  int turn = 1, turns = 1;
  if (std::sscanf(wanted.c_str(), "%d/%d", &turn, &turns) == 2) wanted.clear();
  if (wanted.empty()) delete listeners.Release(listeners.default_result_printer());
  delete listeners.Release(listeners.default_xml_generator());
  for (const int sign : {SIGSEGV, SIGABRT, SIGFPE}) std::signal(sign, [](int) { die("crash"); });
  std::thread(watch).detach();

  zv_dll_open(ZARVO_LIBRARY, 1);  // the plugins find it then
  const testing::UnitTest& all = *testing::UnitTest::GetInstance();
  for (int i = 0; i < all.total_test_suite_count(); ++i) {
    const testing::TestSuite& suite = *all.GetTestSuite(i);
    for (int j = 0; j < suite.total_test_count(); ++j) {
      const testing::TestInfo& test = *suite.GetTestInfo(j);
      const std::string name = std::string(suite.name()) + "." + test.name();
      if (name.find(wanted) == name.npos || turn++ % turns != 1 % turns) continue;
      GTEST_FLAG_SET(filter, name);
      if (!torture(test, all_memory, ENOMEM)) continue;
#ifndef _WIN32
      torture(test, all_calls, EIO);
      torture(test, all_calls, EINTR);
#endif
    }
  }
  std::printf("%d points, %d faults\n", points.load(), faults);
  return faults == 0 ? 0 : 1;
}
