// Texts without case, trimmed, changed in case, replaced in: 64 bytes and 64 KiB.
#ifndef _WIN32
#include <glib.h>
#endif
#include <strings.h>

#include <algorithm>
#include <bit>
#include <cctype>
#include <cstring>
#include <string>
#include <vector>

#include "frame/measure.h"
#include "zarvo.h"

namespace {

const bench::Item item("texts");

// What strcasecmp() is called there.
#ifdef _WIN32
const char* const system_compare = "_stricmp";
#else
const char* const system_compare = "strcasecmp";
#endif

std::string prose(size_t size) {
  const std::string line = "The quick brown fox jumps over the lazy dog; Pack My Box, 12 times. ";
  std::string text;
  while (text.size() < size) text += line;
  text.resize(size);
  return text;
}

// Short texts come by the hundred, so that the clock is not what is measured.
size_t how_many(size_t size) {
  return size < 1000 ? 100 : 1;
}

std::string sized(const char* what, size_t size) {
  return std::string(what) + (size < 1000 ? ", 64 bytes" : ", 64 KiB");
}

bool same_letter(char a, char b) {
  return std::tolower(static_cast<unsigned char>(a)) == std::tolower(static_cast<unsigned char>(b));
}

// Texts to be edited in place, each with room to grow.
class Texts {
 public:
  explicit Texts(const std::string& text)
      : room_(2 * text.size() + 64), copies_(how_many(text.size())) {
    block_.resize(room_ * copies_);
    for (size_t i = 0; i < copies_; ++i)
      std::memcpy(&block_[i * room_], text.c_str(), text.size() + 1);
  }

  template <class Edit>
  void edit(Edit edit_one) {
    for (size_t i = 0; i < copies_; ++i) edit_one(&block_[i * room_]);
  }

  std::string result() const { return block_.data(); }

 private:
  size_t room_;
  size_t copies_;
  std::vector<char> block_;
};

size_t hash(const std::string& text) {
  return std::hash<std::string>()(text);
}

template <class Edit>
void add_edit(const std::string& what, const char* who, const std::string& text, Edit edit) {
  item.add_prepared(
      what, who, [=] { return Texts(text); }, [=](Texts& texts) { texts.edit(edit); },
      [](const Texts& texts) { return hash(texts.result()); });
}

// The same for texts of the C++ library.
template <class Edit>
void add_string_edit(const std::string& what, const char* who, const std::string& text, Edit edit) {
  item.add_prepared(
      what, who, [=] { return std::vector<std::string>(how_many(text.size()), text); },
      [=](std::vector<std::string>& texts) { std::for_each(texts.begin(), texts.end(), edit); },
      [](const std::vector<std::string>& texts) { return hash(texts[0]); });
}

#ifndef _WIN32
// GString frees nothing by itself.
class GTexts {
 public:
  explicit GTexts(const std::string& text) {
    for (size_t i = 0; i < how_many(text.size()); ++i) texts_.push_back(g_string_new(text.c_str()));
  }
  GTexts(GTexts&& other) noexcept = default;
  GTexts& operator=(GTexts&&) = delete;
  ~GTexts() {
    for (GString* const text : texts_) g_string_free(text, 1);
  }

  const std::vector<GString*>& all() const { return texts_; }

 private:
  std::vector<GString*> texts_;
};
#endif

void add_search(const std::string& what, const std::string& text, const std::string& needle) {
  item.add(what, "zarvo", [=] { return zv_stristr(text.c_str(), needle.c_str()) - text.c_str(); });
  item.add(what, "std::search", [=] {
    return std::search(text.begin(), text.end(), needle.begin(), needle.end(), same_letter) -
           text.begin();
  });
#ifdef _WIN32
  // All that its C runtime has.
  item.add(what, "_strlwr and strstr", [=] {
    std::string lower = text;
    _strlwr(lower.data());
    return std::strstr(lower.c_str(), needle.c_str()) - lower.c_str();
  });
#else
  item.add(what, "strcasestr",
           [=] { return strcasestr(text.c_str(), needle.c_str()) - text.c_str(); });
  item.add(what, "g_ascii_strdown and strstr", [=] {
    char* const lower = g_ascii_strdown(text.c_str(), -1);
    const auto place = std::strstr(lower, needle.c_str()) - lower;
    g_free(lower);
    return place;
  });
#endif
}

void add_letter(size_t size) {
  const std::string text = std::string(size - 1, '.') + 'Q';
  const std::string what = sized("search for a letter without case", size);
  item.add(what, "zarvo", [=] { return zv_strichr(text.c_str(), 'q') - text.c_str(); });
  item.add(what, "strpbrk", [=] { return std::strpbrk(text.c_str(), "qQ") - text.c_str(); });
}

// 0110 1001...: each half is the other one's opposite, which sums and polynomials of the bytes take
// for the same.
std::string thue_morse(size_t size) {
  std::string text(size, 'a');
  for (size_t i = 0; i < size; ++i) text[i] = std::popcount(i) % 2 == 0 ? 'a' : 'b';
  return text;
}

void add_compare(size_t size) {
  const std::string a = prose(size);
  std::string b = a;
  std::transform(b.begin(), b.end(), b.begin(), [](unsigned char ch) { return std::toupper(ch); });
  const std::string what = sized("compare without case", size);
  item.add(what, "zarvo", [=] { return zv_stricmp(a.c_str(), b.c_str()) == 0; });
  item.add(what, system_compare, [=] { return strcasecmp(a.c_str(), b.c_str()) == 0; });
#ifndef _WIN32
  item.add(what, "g_ascii_strcasecmp",
           [=] { return g_ascii_strcasecmp(a.c_str(), b.c_str()) == 0; });
#endif
  item.add(what, "std::equal",
           [=] { return std::equal(a.begin(), a.end(), b.begin(), b.end(), same_letter); });
}

void add_trim(size_t size) {
  const std::string text = "   \t " + prose(size - 11) + ".\n   \r\n";
  const std::string what = sized("trim", size);
  add_edit(what, "zarvo", text, zv_strtrim);
#ifndef _WIN32
  add_edit(what, "g_strstrip", text, [](char* s) { g_strstrip(s); });
#endif
  add_string_edit(what, "std::find_if_not and erase", text, [](std::string& s) {
    const auto is_space = [](unsigned char ch) { return std::isspace(ch) != 0; };
    s.erase(std::find_if_not(s.rbegin(), s.rend(), is_space).base(), s.end());
    s.erase(s.begin(), std::find_if_not(s.begin(), s.end(), is_space));
  });
}

void add_case(size_t size) {
  const std::string text = prose(size);
  const std::string what = sized("upper case", size);
  add_edit(what, "zarvo", text, zv_strupr);
  const std::string result = [&text] {
    std::string copy = text;
    zv_strupr(copy.data());
    return copy;
  }();
  add_edit(what, "limit memcpy", text,
           [=](char* s) { std::memcpy(s, result.c_str(), result.size()); });
#ifdef _WIN32
  add_edit(what, "_strupr", text, [](char* s) { _strupr(s); });
#else
  add_edit(what, "g_ascii_strup", text, [](char* s) {
    char* const upper = g_ascii_strup(s, -1);
    std::memcpy(s, upper, std::strlen(upper));
    g_free(upper);
  });
#endif
  add_string_edit(what, "std::transform", text, [](std::string& s) {
    std::transform(s.begin(), s.end(), s.begin(),
                   [](unsigned char ch) { return std::toupper(ch); });
  });
}

void replace_by_find(std::string& s, const std::string& needle, const std::string& repl) {
  std::string made;
  size_t start = 0;
  for (size_t place = s.find(needle); place != std::string::npos; place = s.find(needle, start)) {
    made.append(s, start, place - start).append(repl);
    start = place + needle.size();
  }
  s = made.append(s, start);
}

void add_replace(const char* name, size_t size, const std::string& needle,
                 const std::string& repl) {
  const std::string text = prose(size);
  const std::string what = sized(name, size);
  add_edit(what, "zarvo", text, [=](char* s) { zv_strreplstr(s, needle.c_str(), repl.c_str()); });
  add_string_edit(what, "std::string built anew", text,
                  [=](std::string& s) { replace_by_find(s, needle, repl); });
#ifndef _WIN32
  item.add_prepared(
      what, "g_string_replace", [=] { return GTexts(text); },
      [=](GTexts& texts) {
        for (GString* const one : texts.all())
          g_string_replace(one, needle.c_str(), repl.c_str(), 0);
      },
      [](const GTexts& texts) { return hash(texts.all()[0]->str); });
#endif
}

}  // namespace

void bench::add_cases() {
  for (const size_t size : {size_t{64}, size_t{64} << 10}) {
    add_search(sized("search without case", size), prose(size - 6) + "nEEdle", "needle");
    add_letter(size);
    add_compare(size);
    add_trim(size);
    add_case(size);
    add_replace("replace all, longer", size, "o", "[o]");
    add_replace("replace all, shorter", size, "quick", "q");
    add_replace("replace all, same length", size, "fox", "cat");
  }
  const std::string letters(64 << 10, 'a');
  const std::string needle = std::string(15, 'a') + 'b' + std::string(48, 'a');
  add_search("search without case, a needle nearly everywhere", letters + needle, needle);
  for (const size_t half : {size_t{1} << 18, size_t{1} << 20}) {
    const std::string text = thue_morse(2 * half);
    const std::string what = "search without case, Thue-Morse @" + std::to_string(2 * half);
    const std::string sought = text.substr(half, half);
    item.add(what, "zarvo",
             [=] { return zv_stristr(text.c_str(), sought.c_str()) - text.c_str(); });
#ifndef _WIN32
    item.add(what, "strcasestr",
             [=] { return strcasestr(text.c_str(), sought.c_str()) - text.c_str(); });
#endif
  }
}
