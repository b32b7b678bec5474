// Format entries as a plugin may write them, well formed or not.
#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "check.h"
#include "zarvo.h"

namespace {

void check_default(const std::string& entry) {
  const char* pattern = nullptr;
  const size_t length = zv_fmt_default(entry.c_str(), &pattern);
  const size_t first = entry.find('|');
  if (first == std::string::npos) {
    CHECK(length == 0 && pattern == nullptr);
    return;
  }
  CHECK(pattern == entry.c_str() + first + 1);
  CHECK(length == std::min(entry.find('|', first + 1), entry.size()) - first - 1);
}

void check_force(const std::string& entry, const std::string& name) {
  const size_t size = name.size() + entry.size() + 1;
  const std::unique_ptr<char[]> buffer(new char[size]);
  zv_strncpy(buffer.get(), name.c_str(), size);
  const char* const result = zv_fmt_force(entry.c_str(), buffer.get());
  CHECK(std::strncmp(buffer.get(), name.c_str(), name.size()) == 0);
  const bool in_entry = result >= entry.c_str() && result <= entry.c_str() + entry.size();
  CHECK(result == nullptr || result == buffer.get() || in_entry);
}

void check_composite(const std::vector<std::string>& entries) {
  char** list = nullptr;
  CHECK(zv_strlist(&list, nullptr, 0) == 0);
  for (const std::string& entry : entries) zv_strlist_insert(&list, -1, -1, entry.c_str());
  const int before = zv_strlist_len(list);
  const int added = zv_fmt_composite(&list, -1, nullptr);
  CHECK(zv_strlist_len(list) == before + added);
  if (added == 1) CHECK(std::strncmp(list[before], "All recognized formats|", 23) == 0);
  zv_strlist_free(list, -1);
}

// Only an entry with a closed pattern after its description can match.
void check_match(const std::string& entry, const std::string& path) {
  std::string text = entry;
  char* formats[] = {text.data(), nullptr};
  zv_plugin_t record = {};
  record.formats = formats;
  zv_plugin_t* plugins[] = {&record, nullptr};
  const int matched = zv_plugin_match_fmt(&record, path.c_str());
  if (std::count(entry.begin(), entry.end(), '|') < 2) CHECK(matched == 0);
  const zv_plugin_t* const found = zv_plugin_get_entry_by_fmt(plugins, path.c_str());
  CHECK((found == &record) == (matched == 1));
  CHECK(text == entry);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider provider(data, size);
  const std::string path = provider.ConsumeRandomLengthString(400).c_str();
  std::vector<std::string> entries;
  while (provider.remaining_bytes() > 0 && entries.size() < 20)
    entries.emplace_back(provider.ConsumeRandomLengthString(400).c_str());
  for (const std::string& entry : entries) {
    check_default(entry);
    check_force(entry, path);
    check_match(entry, path);
  }
  check_composite(entries);
  return 0;
}
