// What cannot be seen through the header: that a fast way does what the plain one does, that
// streams stay with their process, and what other file systems and peers may do.
#include <gtest/gtest.h>

#include <array>
#include <memory>
#include <random>
#include <set>
#include <string>

#include "environment.h"
#include "frame/owner.h"
#include "path/normalize.h"
#include "platform/platform.h"
#include "plugin/candidates.h"
#include "scratch_folder.h"
#include "string_list.h"
#include "strings/find.h"
#include "strings/hash.h"
#include "strings/two_way.h"
#include "transfer/number.h"

#ifdef _WIN32
#include <io.h>
#else
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>

// Stands in for the system's own, and keeps back what some file systems do not tell.
static bool without_kinds = false;

extern "C" dirent* readdir(DIR* stream) {
  static const auto next = reinterpret_cast<dirent* (*)(DIR*)>(dlsym(RTLD_NEXT, "readdir"));
  dirent* const found = next(stream);
  if (found != nullptr && without_kinds) found->d_type = DT_UNKNOWN;
  return found;
}
#endif

namespace {

std::mt19937 random_number(11);

// Case as different locales have it: none above ASCII, some there, and ASCII letters of their own.
zv::ByteMap any_case() {
  constexpr std::pair<size_t, int> changes[] = {{0xC9, 0xE9}, {'I', 0xFD}, {0xDD, 'i'}, {'[', 'a'}};
  zv::ByteMap map = zv::ascii_lower;
  for (const auto& [from, to] : changes)
    if (random_number() % 3 == 0) map[from] = to;
  return map;
}

std::string some_text(size_t length) {
  constexpr char bytes[] = "aAbBiI[{@`\xC9\xE9\xDD\xFD";
  const size_t kinds = 2 + random_number() % (sizeof bytes - 2);  // few make near misses
  std::string made;
  while (made.size() < length) made += bytes[random_number() % kinds];
  return made;
}

TEST(Search, InBlocksAsPlaceByPlace) {
  int found = 0;
  constexpr int cases = 40000;
  for (int i = 0; i < cases; ++i) {
    // Some needles nearly fit nearly everywhere, which the search notices only after a while.
    const bool hostile = i % 400 == 0;
    const std::string needle =
        hostile ? std::string(40, 'a') + some_text(random_number() % 40) + std::string(60, 'a')
                : some_text(1 + random_number() % (i % 3 == 0 ? 30 : 5));
    std::string text = some_text(random_number() % (i % 2 == 0 ? 40 : 200));
    if (hostile)
      text += std::string(3000 + random_number() % 99, 'a') + needle.substr(i % 800 == 0) + text;
    const zv::ByteMap lower = any_case();
    const auto folded = [&](std::string s) {
      for (char& ch : s) ch = static_cast<char>(lower[static_cast<unsigned char>(ch)]);
      return s;
    };
    // Exactly its bytes, so that a sanitizer sees a step beyond them.
    const std::unique_ptr<char[]> bytes(new char[text.size()]);
    text.copy(bytes.get(), text.size());
    const std::string_view view(bytes.get(), text.size());
    const auto position = [&](const char* place) {
      return place != nullptr ? static_cast<size_t>(place - bytes.get()) : text.npos;
    };
    const size_t expected = folded(text).find(folded(needle));
    ASSERT_EQ(position(zv::find_letter(view, "aB"[i % 2])),
              text.find_first_of(i % 2 ? "bB" : "aA"));
    ASSERT_EQ(position(zv::find(view, needle)), text.find(needle)) << text << " " << needle;
    ASSERT_EQ(position(zv::find_without_case(view, needle, lower.data())), expected)
        << text << " " << needle;
    found += expected != text.npos;
    if (needle.size() > view.size()) continue;
    const auto fold = [&lower](char ch) { return lower[static_cast<unsigned char>(ch)]; };
    ASSERT_EQ(position(zv::find_two_way(view, needle, fold)), expected) << text << " " << needle;
  }
  EXPECT_NEAR(found, cases / 2, cases * 2 / 5);
}

// Where only the start of a hash depends on its key, flipped bits of one word undo those of another
// whatever the key is.
TEST(Hash, TextsOfOneHashCannotBeChosen) {
  constexpr uint64_t flips[] = {1ULL << 63, 1ULL << 63 | 1ULL << 31};
  std::set<uint64_t> hashes;
  for (unsigned chosen = 0; chosen < 1024; ++chosen) {
    uint64_t words[20] = {};
    for (unsigned i = 0; i < 20; ++i) words[i] = (chosen >> i / 2 & 1) * flips[i % 2];
    const std::string_view text(reinterpret_cast<const char*>(words), sizeof words);
    hashes.insert(zv::hash_of(text, zv::hash_key(), [](uint64_t word) { return word; }));
  }
  EXPECT_EQ(hashes.size(), 1024u);
}

TEST(Normalize, FastAsFully) {
  const std::string letters = "a./\\:~";
  int fast = 0;
  for (int number = 0; number < 7 * 7 * 7 * 7 * 7 * 7 * 7; ++number) {
    std::string path;
    for (int rest = number; rest % 7 != 0; rest /= 7)
      path += letters[static_cast<size_t>(rest % 7) - 1];
    zv::PathBuffer text;
    char out[ZV_PATH_MAX];
    if (!text.assign(path) || !zv::normalize_fast(text, out)) continue;
    ++fast;
    zv::JoinedPath full;
    ASSERT_TRUE(zv::normalize_fully(text, full)) << path;
    ASSERT_EQ(full.view(), out) << path;
  }
  EXPECT_GT(fast, 10000);
}

// The rule as it is said: name by name, and from the start after each one that is taken out.
std::string dropped_one_by_one(List& names) {
  for (int i = 0; names.list[i] != nullptr; ++i) {
    std::string variant = names.list[i];
    variant.insert(variant.rfind('.'), 1, 'd');
    const int found = zv_strlist_iidx(names.list, -1, variant.c_str());
    if (found == -1) continue;
    zv_free(zv_strlist_remove(names.list, -1, found));
    i = -1;
  }
  return names.text();
}

TEST(Candidates, OfAFolderAsNameByName) {
  for (int round = 0; round < 3000; ++round) {
    std::string names;
    for (size_t n = random_number() % 12; n > 0; --n) {
      names += "aA"[random_number() % 2];
      for (size_t i = random_number() % 4; i > 0; --i) names += "ddD.b"[random_number() % 5];
      names += ".dll;";
    }
    List list(names), model(names);
    const int n = zv::drop_variants(list.list, zv_strlist_len(list.list));
    ASSERT_EQ(list.text(), dropped_one_by_one(model)) << names;
    ASSERT_EQ(n, zv_strlist_len(model.list));
  }
}

#ifdef __x86_64__
// The compiler asks the processor too.
TEST(ByteOrder, WideWhereTheProcessorIs) {
  EXPECT_EQ(zv::platform::has_wide_vectors(), __builtin_cpu_supports("avx2") != 0);
}
#endif

TEST(Number, HasOneSignAtMost) {
  const std::pair<std::string_view, int> cases[] = {{" +5", 5}, {"-5x", -5}, {"+-5", 0},
                                                    {"-+5", 0}, {"++5", 0},  {"--5", 0}};
  for (auto [text, expected] : cases) {
    int number = 9;
    EXPECT_EQ(zv::take_number(text, number), expected != 0);
    EXPECT_EQ(number, expected) << text;
  }
}

TEST(Stream, IsNotInherited) {
  const ScratchFolder scratch;
  const std::string path = scratch.path("file");
  for (const auto open :
       {zv::platform::open_to_write, zv::platform::open_unemptied, zv::platform::open_to_read}) {
    const zv::StreamPtr stream(open(path.c_str()));
    ASSERT_NE(stream, nullptr);
#ifdef _WIN32
    DWORD flags = HANDLE_FLAG_INHERIT;
    GetHandleInformation(reinterpret_cast<HANDLE>(_get_osfhandle(_fileno(stream.get()))), &flags);
    EXPECT_EQ(flags & HANDLE_FLAG_INHERIT, 0u);
#else
    EXPECT_EQ(fcntl(fileno(stream.get()), F_GETFD), FD_CLOEXEC);
#endif
  }
}

#ifndef _WIN32
TEST(Folder, OfEntriesWhoseKindIsNotTold) {
  const ScratchFolder scratch;
  scratch.make_file("top/d/e/f");
  std::filesystem::create_directory_symlink("/", scratch.path("top/link"));
  const std::string top = scratch.path("top");
  const dirsel_t folders = {"*", nullptr, nullptr, 1, 0};
  without_kinds = true;
  List all, selected;
  zv_strlist_free(std::exchange(all.list, nullptr), -1);
  zv_strlist_free(std::exchange(selected.list, nullptr), -1);
  EXPECT_EQ(zv_dir_scan(top.c_str(), &all.list, nullptr, nullptr, 1, 1), 4);
  EXPECT_EQ(zv_dir_scan(top.c_str(), &selected.list, reinterpret_cast<dir_filter_t>(zv_dir_select),
                        const_cast<dirsel_t*>(&folders), 0, 0),
            2);
  EXPECT_EQ(zv_rmpath(top.c_str()), 1);
  without_kinds = false;
}
#endif

}  // namespace
