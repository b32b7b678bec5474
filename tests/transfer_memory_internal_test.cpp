// What a copy comes to when memory runs out: the side of the local file fails, and nothing leaks.
#include <gtest/gtest.h>

#include <string>

#include "failing_allocation.h"
#include "fixtures/scripted_server.h"
#include "scratch_folder.h"
#include "zarvo.h"

namespace {

// Copies with each allocation failing in turn; gives how many there are.
int fail_each(const std::string& from, const std::string& to, int expected) {
  int result = 0;
  const int before = scripted::open_handles();
  return fail_each_allocation([&] { result = zv_copy(from.c_str(), to.c_str()); },
                              [&] {
                                EXPECT_EQ(result, expected);
                                EXPECT_EQ(scripted::open_handles(), before);
                              });
}

TEST(OutOfMemory, IsTheLocalSidesFailure) {
  const scripted::Network network;
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "content");
  const std::string other = folder.make_file("other", "kept");
  EXPECT_EQ(fail_each(file, other, -3), 1);

  EXPECT_EQ(folder.content("other"), "content");

  const std::string closed = "127.0.0.1:" + std::to_string(scripted::closed_port()) + "/f";
  EXPECT_EQ(fail_each(file, "http://" + closed, -3), 1);
  EXPECT_EQ(fail_each("http://" + closed, other, -4), 1);
}

TEST(OutOfMemory, WithALogin) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "content");
  for (const bool put : {true, false}) {
    int met = 0;
    for (bool happened = true; happened; met += happened) {
      scripted::Server server([](scripted::Peer&) {});
      const std::string url = server.url("http", "/f", "u:p@");
      scripted::pause(50);  // the server's thread has made its own allocations then
      const FailingAllocation failing(met);
      const int result =
          put ? zv_copy(file.c_str(), url.c_str()) : zv_copy(url.c_str(), file.c_str());
      happened = failing.happened();
      EXPECT_EQ(result, happened == put ? -3 : -4);  // the last run meets a server that just closes
    }
    EXPECT_GE(met, 2);  // the transfer buffer and the credentials
  }
}

}  // namespace
