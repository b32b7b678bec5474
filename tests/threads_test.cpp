// Everything that a process has once, used on many threads at a time, and twenty copies at once.
// The thread sanitizer runs it too.
#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <cstring>
#include <filesystem>
#include <string>
#include <thread>
#include <vector>

#include "environment.h"
#include "fixtures/dialogues.h"
#include "fixtures/plugins/plugin_folder.h"
#include "fixtures/private_values.h"
#include "zarvo.h"

namespace {

// Runs `work(number)` on as many threads, which begin together.
template <class Work>
void on_threads(int count, Work work) {
  std::atomic<int> missing = count;
  std::vector<std::thread> threads;
  for (int i = 0; i < count; ++i)
    threads.emplace_back([&, i] {
      for (--missing; missing > 0;) std::this_thread::yield();
      work(i);
    });
  for (std::thread& thread : threads) thread.join();
}

// Each thread sees its own variable as it left it, and the shared one whole.
TEST(Threads, PrivateEnvironment) {
  on_threads(8, [](int thread) {
    const std::string own = "own" + std::to_string(thread);
    for (int round = 0; round < 300; ++round) {
      const std::string value = std::to_string(round);
      zv_putenv_private(own.c_str(), value.c_str(), 0);
      zv_putenv_private("SHARED", own.c_str(), round % 50);
      zv_putenv_private((own + value).c_str(), "made", 0);
      if (round > 10) zv_putenv_private((own + std::to_string(round - 10)).c_str(), nullptr, 0);
      zv_putenv_private(own.c_str(), "last", 1);
      ASSERT_EQ(private_values(own), value + "|last|");
      const std::string shared = private_values("shared");
      ASSERT_EQ(shared.substr(0, 3), "own");
      ASSERT_EQ(shared.size() % 5, 0u);
    }
  });
  zv_putenv_private(nullptr, nullptr, 0);
}

// Clearing, adding and looking go on at once; what is found is always one of the targets.
TEST(Threads, PathMapAndSearchPath) {
  const ScratchFolder folder;
  const std::string targets[] = {folder.make_file("one/f"), folder.make_file("two/f")};
  const std::string old = folder.path("old/f");
  const Variable path("PATH", folder.path("none") + ";" + folder.path("one"));
  on_threads(8, [&](int thread) {
    for (int round = 0; round < 100; ++round) {
      zv_pathmap(old.c_str(), targets[(thread + round) % 2].c_str());
      zv_pathmap((old + std::to_string(round) + "/x").c_str(), old.c_str());
      std::array<char, ZV_PATH_MAX> found;
      zv_strncpy(found.data(), old.c_str(), found.size());
      if (zv_pathmap_locate(found.data()) == 1) {
        ASSERT_TRUE(found.data() == targets[0] || found.data() == targets[1]) << found.data();
      }
      if (round % 10 == thread) zv_pathmap_clear();
      char** folders = nullptr;
      ASSERT_EQ(zv_pathlist(&folders), 2);
      zv_strlist_free(folders, 2);
      zv_strncpy(found.data(), "f", found.size());
      ASSERT_EQ(zv_path_locate(found.data()), 1);
      ASSERT_EQ(found.data(), targets[0]);
    }
  });
  zv_pathmap_clear();
}

std::string host_answers() {
  std::array<char, ZV_PATH_MAX> room;
  std::string all;
  const auto add = [&](size_t length) { all += std::string(room.data(), length) + '|'; };
  add(zv_username(room.data(), room.size()));
  add(zv_hostname(room.data(), room.size()));
  add(zv_homedir(room.data(), room.size()));
  add(zv_tempdir(room.data(), room.size()));
  add(zv_getcwd(room.data(), room.size()) != 0 ? std::strlen(room.data()) : 0);
  return all;
}

TEST(Threads, HostQueries) {
  const std::string answers = host_answers();
  on_threads(8, [&answers](int) {
    for (int round = 0; round < 20; ++round) ASSERT_EQ(host_answers(), answers);
  });
}

// One plugin, found, loaded, used and let go by everybody.
TEST(Threads, Plugins) {
  const PluginFolder folder;
  folder.add("accept", "img_a.dll");
  folder.add("silent", "img_b.dll");
  zv_putenv_private("img", folder.path().c_str(), 0);
  testing::internal::CaptureStderr();
  on_threads(8, [](int thread) {
    for (int round = 0; round < 20; ++round) {
      zv_plugin_t** plugins = nullptr;
      ASSERT_EQ(zv_plugin_enumerate(&plugins, "img", 1, 5, thread % 2), 1);
      ASSERT_EQ(zv_plugin_load(plugins[0]), 1);
      ASSERT_EQ(*static_cast<int*>(plugins[0]->plugin->api_entry), 42);
      zv_plugin_unload(plugins[0]);
      zv_plugin_destroy(plugins[0]);
      zv_free(plugins);
    }
  });
  testing::internal::GetCapturedStderr();
  zv_putenv_private(nullptr, nullptr, 0);
}

bool copies_locally(const ScratchFolder& folder) {
  return zv_copy(folder.path("file").c_str(), folder.path("got").c_str()) == 0 &&
         folder.content("got") == "hello";
}

bool copies_between_servers() {
  const std::string found = "HTTP/1.0 200 ok\r\nContent-Length: 5\r\n\r\nhello";
  scripted::DialogueServer source({{"GET /f", found}});
  scripted::DialogueServer destination({{"PUT /g", ""}, {scripted::body, found}});
  const std::string to = destination.url("http", "/g");
  return zv_copy(source.url("http", "/f").c_str(), to.c_str()) == 0 &&
         destination.stored() == "hello";
}

bool copies_along(const scripted::Dialogue& dialogue, const ScratchFolder& folder) {
  scripted::DialogueServer server(dialogue.steps);
  const scripted::Route route(dialogue, server, folder);
  return zv_copy(route.from.c_str(), route.to.c_str()) == 0 && arrived(dialogue, server, folder);
}

// Of every kind two, and nothing is left behind.
TEST(Threads, TwentyCopies) {
  const int handles = scripted::open_handles();
  const std::vector<scripted::Dialogue>& dialogues = scripted::dialogues();
  const std::array<ScratchFolder, 20> folders;
  const ScratchFolder temporary;
  const Variable variable("TMP", temporary.path());
  on_threads(static_cast<int>(folders.size()), [&](int thread) {
    const auto kind = static_cast<size_t>(thread) % (dialogues.size() + 2);
    const ScratchFolder& folder = folders[static_cast<size_t>(thread)];
    folder.make_file("file", "hello");
    if (kind < dialogues.size()) {
      EXPECT_TRUE(copies_along(dialogues[kind], folder)) << dialogues[kind].name;
    } else if (kind == dialogues.size()) {
      EXPECT_TRUE(copies_locally(folder));
    } else {
      EXPECT_TRUE(copies_between_servers());
    }
  });
  EXPECT_EQ(scripted::open_handles(), handles);
  EXPECT_TRUE(std::filesystem::is_empty(temporary.path()));
}

}  // namespace
