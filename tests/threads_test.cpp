// Everything that a process has once, used on many threads at a time, and twenty copies at once.
// The thread sanitizer runs it too.
#include <gtest/gtest.h>
#include <pthread.h>

#include <atomic>
#include <filesystem>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "environment.h"
#include "fixtures/dialogues.h"
#include "fixtures/plugins/plugin_folder.h"
#include "string_list.h"

namespace {

// Runs `work(number)` on as many threads, which begin together. Their stacks are as small as those
// of servers with thousands of them, but where a sanitizer's frames are larger.
void on_threads(int count, const std::function<void(int)>& work) {
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
  constexpr size_t size = size_t{1} << 20;
#else
  constexpr size_t size = size_t{64} << 10;
#endif
  std::atomic<int> missing = count;
  std::vector<std::function<void()>> runs;
  for (int i = 0; i < count; ++i)
    runs.emplace_back([&missing, &work, i] {
      for (--missing; missing > 0;) std::this_thread::yield();
      work(i);
    });
  const auto call = [](void* run) -> void* {
    (*static_cast<std::function<void()>*>(run))();
    return nullptr;
  };
  pthread_attr_t attributes;
  pthread_attr_init(&attributes);
  ASSERT_EQ(pthread_attr_setstacksize(&attributes, size), 0);
  std::vector<pthread_t> threads(runs.size());
  for (size_t i = 0; i < runs.size(); ++i)
    ASSERT_EQ(pthread_create(&threads[i], &attributes, call, &runs[i]), 0);
  for (const pthread_t thread : threads) pthread_join(thread, nullptr);
  pthread_attr_destroy(&attributes);
}

// Each thread sees its own variable as it left it, and the shared one whole.
void use_environment(const std::string& own, int round) {
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

// One plugin, found, loaded, used and let go by everybody.
void use_plugin(int keep) {
  zv_plugin_t** plugins = nullptr;
  ASSERT_EQ(zv_plugin_enumerate(&plugins, "img", 1, 5, keep), 1);
  ASSERT_EQ(zv_plugin_load(plugins[0]), 1);
  ASSERT_EQ(*static_cast<int*>(plugins[0]->plugin->api_entry), 42);
  zv_plugin_unload(plugins[0]);
  zv_plugin_destroy(plugins[0]);
  zv_free(plugins);
}

std::string host_answers() {
  std::string all;
  char room[ZV_PATH_MAX] = "";
  for (const auto query : {zv_username, zv_hostname, zv_homedir, zv_tempdir})
    all.append(room, query(room, sizeof room)).append("|");
  return zv_getcwd(room, sizeof room) == 1 ? all + room : all;
}

// A deep tree made, scanned and removed: what calls itself.
void use_tree(const std::string& top) {
  std::string deepest = top;
  while (deepest.size() < 240) deepest += "/x";  // Windows takes no more than 247 for a folder
  ASSERT_EQ(zv_mkpath(deepest.c_str()), 1);
  char** list = nullptr;
  ASSERT_EQ(zv_dir_scan(top.c_str(), &list, nullptr, nullptr, 1, 1),
            static_cast<int>(deepest.size() - top.size()) / 2);
  zv_strlist_free(list, -1);
  ASSERT_EQ(zv_rmpath(top.c_str()), 1);
}

// Clearing, adding and looking go on at once; what is found is always one of the targets.
TEST(Threads, TablesAndQueries) {
  const PluginFolder folder;
  folder.add("accept", "img_a.dll");
  folder.add("silent", "img_b.dll");
  zv_putenv_private("img", folder.path().c_str(), 0);
  const std::string targets[] = {folder.make_file("one/f"), folder.make_file("two/f")};
  const std::string old = folder.path("old/f");
  const Variable path("PATH", folder.path("none") + ";" + folder.path("one"));
  const std::string answers = host_answers();
  testing::internal::CaptureStderr();
  on_threads(8, [&](int thread) {
    use_tree(folder.path("deep" + std::to_string(thread)));
    for (int round = 0; round < 100; ++round) {
      use_environment("own" + std::to_string(thread), round);
      if (round % 5 == 0) use_plugin(thread % 2);
      ASSERT_EQ(host_answers(), answers);

      zv_pathmap(old.c_str(), targets[(thread + round) % 2].c_str());
      zv_pathmap((old + std::to_string(round) + "/x").c_str(), old.c_str());
      char found[ZV_PATH_MAX];
      zv_strncpy(found, old.c_str(), sizeof found);
      const std::string seen = zv_pathmap_locate(found) == 1 ? found : targets[0];
      ASSERT_TRUE(seen == targets[0] || seen == targets[1]) << seen;
      if (round % 10 == thread) zv_pathmap_clear();
      zv_strncpy(found, "f", sizeof found);
      ASSERT_EQ(zv_path_locate(found), 1);
      ASSERT_EQ(found, targets[0]);
    }
  });
  testing::internal::GetCapturedStderr();
  zv_putenv_private(nullptr, nullptr, 0);
  zv_pathmap_clear();
}

bool copies_along(const scripted::Dialogue& dialogue) {
  const ScratchFolder folder;
  folder.make_file("file", "hello");
  scripted::DialogueServer server(dialogue.steps);
  const scripted::Route route(dialogue, server, folder);
  return zv_copy(route.from.c_str(), route.to.c_str()) == 0 && arrived(dialogue, server, folder);
}

// Of every kind of transfer two or more, and nothing is left.
TEST(Threads, TwentyCopies) {
  const int handles = scripted::open_handles();
  const std::vector<scripted::Dialogue>& dialogues = scripted::dialogues();
  const ScratchFolder temporary, copies;
  const std::string file = copies.make_file("file", "hello");
  const Variable variable("TMP", temporary.path());
  on_threads(20, [&](int thread) {
    const auto kind = static_cast<size_t>(thread) % (dialogues.size() + 2);
    const std::string copy = std::to_string(thread);
    if (kind < dialogues.size()) {
      EXPECT_TRUE(copies_along(dialogues[kind])) << dialogues[kind].name;
    } else if (kind == dialogues.size()) {
      EXPECT_EQ(zv_copy(file.c_str(), copies.path(copy).c_str()), 0);
      EXPECT_EQ(copies.content(copy), "hello");
    } else {
      const std::string found = "HTTP/1.0 200 ok\r\nContent-Length: 5\r\n\r\nhello";
      scripted::DialogueServer source({{"GET /f", found}});
      scripted::DialogueServer destination({{"PUT /g", ""}, {scripted::body, found}});
      const std::string from = source.url("http", "/f"), to = destination.url("http", "/g");
      EXPECT_EQ(zv_copy(from.c_str(), to.c_str()), 0);
      EXPECT_EQ(destination.stored(), "hello");
    }
  });
  EXPECT_EQ(scripted::open_handles(), handles);
  EXPECT_TRUE(std::filesystem::is_empty(temporary.path()));
}

}  // namespace
