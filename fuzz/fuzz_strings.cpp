// Edits in place and searches, each against a plain model of it.
#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <cctype>
#include <cstring>
#include <memory>
#include <string>

#include "check.h"
#include "zarvo.h"

namespace {

using Buffer = std::unique_ptr<char[]>;

// Exactly the room that the edit may need.
Buffer room_for(const std::string& text, size_t size) {
  Buffer buffer(new char[size]);
  std::memcpy(buffer.get(), text.c_str(), text.size() + 1);
  return buffer;
}

std::string lower(std::string text) {
  for (char& ch : text) ch = static_cast<char>(std::tolower(static_cast<unsigned char>(ch)));
  return text;
}

std::string replaced(const std::string& text, const std::string& needle, const std::string& repl,
                     bool any_case) {
  const std::string searched = any_case ? lower(text) : text;
  const std::string wanted = any_case ? lower(needle) : needle;
  std::string out;
  size_t from = 0;
  for (size_t at = searched.find(wanted); at != std::string::npos;
       at = searched.find(wanted, from)) {
    out.append(text, from, at - from).append(repl);
    from = at + needle.size();
  }
  return out.append(text, from);
}

void check_replace(const std::string& text, const std::string& needle, const std::string& repl) {
  for (const bool any_case : {false, true}) {
    const std::string expected = needle.empty() ? text : replaced(text, needle, repl, any_case);
    const Buffer s = room_for(text, std::max(text.size(), expected.size()) + 1);
    (any_case ? zv_strireplstr : zv_strreplstr)(s.get(), needle.c_str(), repl.c_str());
    CHECK(expected == s.get());
  }
}

void check_search(const std::string& text, const std::string& needle) {
  const size_t at = needle.empty() ? std::string::npos : lower(text).find(lower(needle));
  const char* const found = zv_stristr(text.c_str(), needle.c_str());
  CHECK(found == (at == std::string::npos ? nullptr : text.c_str() + at));
  CHECK((zv_stricmp(text.c_str(), needle.c_str()) == 0) == (lower(text) == lower(needle)));
}

void check_trim(const std::string& text) {
  const Buffer s = room_for(text, text.size() + 1);
  const size_t length = zv_strtrim(s.get());
  CHECK(length == std::strlen(s.get()));
  if (length == 0) return;
  CHECK(std::isspace(static_cast<unsigned char>(s[0])) == 0);
  CHECK(std::isspace(static_cast<unsigned char>(s[length - 1])) == 0);
  CHECK(text.find(s.get()) != std::string::npos);
}

void check_synch(const std::string& text, const std::string& model) {
  const Buffer s = room_for(text, text.size() + 1);
  const int changed = zv_strsynch(s.get(), model.c_str());
  CHECK(lower(s.get()) == lower(text));
  CHECK((changed != 0) == (text != s.get()));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider provider(data, size);
  const std::string text = provider.ConsumeRandomLengthString(400).c_str();
  const std::string needle = provider.ConsumeRandomLengthString(20).c_str();
  const std::string repl = provider.ConsumeRandomLengthString(20).c_str();
  check_replace(text, needle, repl);
  check_search(text, needle);
  check_trim(text);
  check_synch(text, needle);
  return 0;
}
