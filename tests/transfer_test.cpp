// Copies between local files, by zv_copy() and by a handle; what is refused before any server is
// asked; a handle's options, its limits and cancels.
#include <algorithm>
#include <cerrno>
#include <chrono>

#include "fixtures/dialogues.h"
#include "handle.h"
#include "scratch_folder.h"

namespace {

namespace fs = std::filesystem;
using namespace scripted;

int run(const std::string& from, const std::string& to) {
  return outcome_of(new_handle(), from, to).code;
}

constexpr int (*ways[])(const std::string& from, const std::string& to) = {copy, run};

// Every size at which a copy goes on in another way.
TEST(CopyLocal, EverySize) {
  const ScratchFolder folder;
  for (const size_t size : {0u, 1u, 65535u, 65536u, 65537u, 20u << 20}) {
    std::string content(size, 'x');
    for (size_t i = 0; i < size; ++i) content[i] = static_cast<char>(i * 7 + i / 256);
    for (const auto way : ways) {
      const std::string from = folder.make_file("from", content);
      folder.make_file("to", "what was there before");
      EXPECT_EQ(way(from, folder.path("to")), 0);
      EXPECT_TRUE(folder.content("to") == content) << size;
      EXPECT_EQ(way("file://" + from, "FILE://" + folder.path("new")), 0);
      EXPECT_TRUE(folder.content("new") == content) << size;
      fs::remove(folder.path("new"));
    }
  }
}

TEST(CopyLocal, NamesInEveryForm) {
  const ScratchFolder folder;
  std::string from = folder.make_file("a b.txt", "x");
  EXPECT_EQ(copy("file://" + folder.path("a%20b.txt"), folder.path("c%20d")), 0);
  EXPECT_TRUE(folder.exists("c%20d"));
  std::replace(from.begin(), from.end(), '/', '\\');
  EXPECT_EQ(copy(from, folder.path("e")), 0);
  EXPECT_EQ(folder.content("e"), "x");
#ifdef _WIN32
  EXPECT_EQ(copy(from, folder.path("nul")), 0);
#else  // a name that is there as it is written
  folder.make_file("a\\b", "y");
  folder.make_folder("f");
  for (const std::string& form : {folder.path("a\\b"), "file://" + folder.path("a\\b")}) {
    EXPECT_EQ(copy(form, folder.path("f\\g")), 0);
    EXPECT_EQ(folder.content("f/g"), "y");
  }
  EXPECT_EQ(copy(from, "/dev/null"), 0);
#endif
}

// What fails leaves nothing open, and changes no file; only zv_copy() makes one before it calls a
// server.
TEST(Copy, Refusals) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "content");
  const std::string closed = "http://127.0.0.1:" + std::to_string(closed_port()) + "/f";
  folder.make_folder("folder");
  const auto place = [&](const std::string& text) {
    if (text == "closed") return closed;
    return text.empty() || text.find(":") != text.npos ? text : folder.path(text);
  };
  const int handles = open_handles();
  const auto check = [&](int result, std::initializer_list<std::string> pairs) {
    for (const std::string& pair : pairs) {
      for (const auto way : ways) {
        SCOPED_TRACE(pair);
        const size_t arrow = pair.find('>');
        EXPECT_EQ(way(place(pair.substr(0, arrow)), place(pair.substr(arrow + 1))), result);
        EXPECT_EQ(folder.content("file"), "content");
        EXPECT_EQ(fs::remove(folder.path("new")), way == copy && pair == "closed>new");
      }
    }
  };
  check(-3,
        {"missing>new", "missing>folder", "folder>new", "folder>file", "file://>file", ">file", ">",
         "http://host>file", "http://host>http://host", "http://no-such-host.invalid/f>new",
         "smtp://127.0.0.1/x>file", "closed>new", "missing>closed", "folder>closed"});
  fs::create_hard_link(file, folder.path("link"));
  check(-4, {"file>folder", "file>missing/new", "file>file", "file>folder/../file", "file>link",
             "link>file", "file>file://", "file>", "file>http://host",
             "file>http://no-such-host.invalid/f", "file>closed", "closed>missing/new"});
  EXPECT_EQ(open_handles(), handles);
  EXPECT_EQ(zv_copy(nullptr, file.c_str()), -3);
  EXPECT_EQ(zv_copy(file.c_str(), nullptr), -4);
  fs::permissions(file, fs::perms::owner_read);
  if (!std::ofstream(file, std::ios::app)) {
    EXPECT_EQ(copy(folder.make_file("other"), file), -4);
  }
  fs::permissions(file, fs::perms::all);
}

TEST(Handle, LocationsThatAreRefused) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "hello");
  const std::string closed = "127.0.0.1:" + std::to_string(closed_port());
  const HandlePtr handle = new_handle();
  const auto check = [&](int cause, const std::string& reason,
                         std::initializer_list<std::string> locations, int number = 0) {
    for (const std::string& location : locations) {
      SCOPED_TRACE(location.substr(0, 40));
      expect_end(outcome_of(handle, file, location), {-4, cause, number, reason});
      const std::string as_source = location.starts_with("smtp") ? "a mail is no source" : reason;
      expect_end(outcome_of(handle, location, folder.path("new")), {-3, cause, number, as_source});
      EXPECT_FALSE(folder.exists("new"));
    }
  };
  check(ZV_CAUSE_LOCATION, "no location", {""});
  check(ZV_CAUSE_LOCATION, ":// is not spoken", {"gopher://h/x", "a+b-1.c://h/x"});
  check(ZV_CAUSE_LOCATION, "no path", {"http://h", "file://"});
  check(ZV_CAUSE_LOCATION, "no usable host",
        {"http:///x", "ftp://a b/x", "ftp://::1/x", "ftp://[::1]x/f"});
  check(ZV_CAUSE_LOCATION, "no usable port", {"ftp://h:0/x", "ftp://h:65536/x"});
  check(ZV_CAUSE_LOCATION, "no usable port", {"ftp://h:+21/x", "ftp://h:21x/x"});
  check(ZV_CAUSE_LOCATION, "no IPv6 address", {"ftp://[::g]/x", "ftp://[127.0.0.1]/x"});
  check(ZV_CAUSE_LOCATION, "a %00", {"ftp://h/a%00b", "file://a%00b"});
  check(ZV_CAUSE_LOCATION, "a line end", {"ftp://h/a%0Db", "ftp://h/a\nb", "ftp://u%0a@h/f"});
  check(ZV_CAUSE_LOCATION, "a user with a colon", {"http://a%3Ab@h/f"});
  check(ZV_CAUSE_LOCATION, "not an address", {"smtp://" + closed + "/", "smtp://h/r%20x"});
  check(ZV_CAUSE_LOCATION, "not an address",
        {"smtp://h/<r", "smtp://h/r>", "smtp://h/r\xc3\xa4@x"});
  check(ZV_CAUSE_LOCATION, "not an address", {"smtp://h/" + std::string(255, 'r')});
  check(ZV_CAUSE_LOCATION, "not an address: r????~", {"smtp://h/r%1b%c2%9b%7f~"});
  check(ZV_CAUSE_LOCATION, "the sender has no usable address", {"smtp://u x@d@h/r"});
  check(ZV_CAUSE_LOOKUP, "look up ", {"http://no-such-host.invalid/f", "http://127.1/f"});
  check(ZV_CAUSE_LOOKUP, "look up ", {"http://127.0.0.256/f", "http://0x7f000001/f"});
  check(ZV_CAUSE_CONNECT, closed + ": Connection refused", {"ftp://" + closed + "/f"},
        ECONNREFUSED);
}

TEST(Handle, OptionsAndTheirRanges) {
  const int64_t most_of[] = {-2, INT32_MAX, INT32_MAX, INT64_MAX, INT64_MAX, 1, 1, 1, -2};
  const HandlePtr handle = new_handle();
  for (int option = 0; option < 9; ++option)
    for (const int64_t value : {-2LL, -1LL, 0LL, 1LL, 2LL, 2147483647LL, 2147483648LL})
      EXPECT_EQ(zv_transfer_set(handle.get(), option, value),
                value > -2 && value <= most_of[option])
          << option << " " << value;

  EXPECT_EQ(zv_transfer_login(handle.get(), 2, "u", "p"), 0);
  EXPECT_EQ(zv_transfer_login(handle.get(), 0, "u\n", "p"), 0);
  EXPECT_EQ(zv_transfer_login(handle.get(), 1, "u", "p\r"), 0);
  EXPECT_EQ(zv_transfer_login(handle.get(), 1, "u", nullptr), 1);
  EXPECT_EQ(zv_transfer_login(handle.get(), 1, nullptr, nullptr), 1);
  EXPECT_EQ(zv_transfer_destroy(nullptr), 0);
}

// Nothing is changed while a handle runs, and its progress can be seen.
TEST(Handle, WhileItRuns) {
  const ScratchFolder folder;
  const HandlePtr owner = new_handle();
  zv_transfer_t* const handle = owner.get();
  int64_t done = -2;
  int64_t total = -2;
  int seen = 0;
  const auto look = [&] {
    EXPECT_EQ(zv_transfer_run(handle, "a", "b"), -1);
    EXPECT_EQ(zv_transfer_set(handle, ZV_TRANSFER_SIZE, 1), 0);
    EXPECT_EQ(zv_transfer_login(handle, 0, "u", "p"), 0);
    EXPECT_EQ(zv_transfer_watch(handle, nullptr, nullptr), 0);
    EXPECT_EQ(zv_transfer_reset(handle), 0);
    seen = zv_transfer_progress(handle, &done, nullptr);
    EXPECT_EQ(done, 0);
  };
  DialogueServer server(ftp({{"RETR /f\r\n", "150 opening\r\n"}, {data_out, "hello", "", look}}));
  EXPECT_EQ(outcome_of(owner, server.url("ftp", "/f"), folder.path("got")).reason, "");
  EXPECT_EQ(server.stored(), "");
  EXPECT_EQ(seen, 1);
  EXPECT_EQ(zv_transfer_progress(handle, nullptr, nullptr), 0);
  EXPECT_EQ(zv_transfer_progress(handle, &done, &total), 0);
  EXPECT_TRUE(done == 5 && total == 5) << done << " " << total;
}

TEST(Handle, BodiesMustMove) {
  const auto cause_with = [](int silence, int speed) {
    const auto pause = [] { std::this_thread::sleep_for(std::chrono::milliseconds(200)); };
    Steps steps = {{"GET", "HTTP/1.1 200 OK\r\nContent-Length: 5\r\n\r\n"}};
    for (const char* const letter : {"h", "e", "l", "l", "o"})
      steps.push_back({unasked, letter, "", pause});
    DialogueServer server(steps);
    const ScratchFolder folder;
    const HandlePtr handle =
        new_handle({{ZV_TRANSFER_SILENCE, silence}, {ZV_TRANSFER_SPEED, speed}});
    return outcome_of(handle, server.url("http", "/f"), folder.path("got")).cause;
  };
  EXPECT_EQ(cause_with(1000, 0), ZV_CAUSE_NONE);
  EXPECT_EQ(cause_with(500, 1000), ZV_CAUSE_SPEED);
  EXPECT_EQ(cause_with(100, -1), ZV_CAUSE_SILENCE);
  EXPECT_EQ(cause_with(0, 1000), ZV_CAUSE_NONE);
}

// By another thread, and by the watch.
void check_cancel(const Dialogue& dialogue, size_t step, bool by_watch) {
  SCOPED_TRACE(dialogue.name + std::to_string(step));
  const ScratchFolder folder;
  folder.make_file("file", "hello");
  const HandlePtr handle = new_handle();
  std::atomic<int> stop = 0;
  const auto watch = [](void* context, int64_t, int64_t) {
    return static_cast<std::atomic<int>*>(context)->load();
  };
  zv_transfer_watch(handle.get(), watch, &stop);
  Steps steps = dialogue.steps;
  steps[step].before = [&] { stop = by_watch || zv_transfer_cancel(handle.get()) == 0; };
  DialogueServer server(steps, Fault::silent, step);
  const Route route(dialogue, server, folder);
  const auto begin = std::chrono::steady_clock::now();
  const Outcome end = outcome_of(handle, route.from, route.to);
  EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(5));
  EXPECT_EQ(end.cause, ZV_CAUSE_CANCELLED) << end.reason;
  // An upload may just read its file.
  EXPECT_TRUE(end.code == dialogue.network_failed() || (!dialogue.download && end.code == -3));
  EXPECT_TRUE(end.reason.starts_with("cancelled"));
  EXPECT_FALSE(folder.exists("got"));
  // It stays until it is forgotten.
  EXPECT_EQ(outcome_of(handle, folder.path("file"), folder.path("new")).code, -3);
  EXPECT_EQ(zv_transfer_reset(handle.get()), 1);
  EXPECT_EQ(zv_transfer_cause(handle.get(), nullptr), ZV_CAUSE_NONE);
}

TEST(Handle, CancelledAtEachStep) {
  for (const Dialogue& dialogue : dialogues(true)) {
    for (size_t step = 0; step < dialogue.steps.size(); ++step) {
      const auto& [heard, said, survived, before, handled] = dialogue.steps[step];
      if (handled.find('0') != handled.npos || survived == never_said) continue;
      check_cancel(dialogue, step, false);
      // After a whole body the last reply may be there before the watch is asked.
      if (heard != data_in && heard != mail_end) check_cancel(dialogue, step, true);
    }
  }
}

}  // namespace
