// Wildcard matching: short names against every kind of pattern, and long texts.
#ifdef _WIN32
#include <windows.h>

#include <shlwapi.h>
#else
#include <apr_fnmatch.h>
#include <fnmatch.h>
#include <glib.h>
#endif

#include <clocale>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <string>
#include <vector>

#include "frame/measure.h"
#include "zarvo.h"

namespace {

const bench::Item item("wildcard");

// The names that a folder of a project may hold.
std::vector<std::string> make_names(const char* accent) {
  const char* const stems[] = {
      "readme",       "a",        "holiday-2024-06-17", "makefile", "CMakeLists",
      "report.final", "IMG_0042", "libzarvo",           "x1",       "archive.tar"};
  const char* const ends[] = {".txt", ".c", ".jpeg", "", ".png", ".h", ".cpp", ".gz"};
  std::vector<std::string> names;
  for (const char* const stem : stems)
    for (const char* const end : ends) names.push_back(std::string(stem) + accent + end);
  return names;
}

template <class Matches>
uint64_t count(const std::vector<std::string>& names, Matches matches) {
  uint64_t found = 0;
  for (const std::string& name : names) found += matches(name.c_str()) ? 1 : 0;
  return found;
}

// GLib knows `*` and `?` alone, and APR takes bytes for characters.
enum Rivals { everybody, without_glib, without_apr, without_both };

// Windows has one call for it: without sets and without case, of bytes, and slow on long texts.
#ifdef _WIN32
void add_rivals(const std::string& what, const std::vector<std::string>& names, const char* pattern,
                Rivals rivals) {
  if (rivals != everybody || names.size() == 1) return;
  item.add(what, "PathMatchSpec", [=] {
    return count(names, [=](const char* name) { return PathMatchSpecA(name, pattern) != 0; });
  });
}
#else
void add_rivals(const std::string& what, const std::vector<std::string>& names, const char* pattern,
                Rivals rivals) {
  item.add(what, "fnmatch", [=] {
    return count(names, [=](const char* name) { return fnmatch(pattern, name, 0) == 0; });
  });
  if (rivals != without_apr && rivals != without_both) {
    item.add(what, "apr_fnmatch", [=] {
      return count(names, [=](const char* name) { return apr_fnmatch(pattern, name, 0) == 0; });
    });
  }
  if (rivals == without_glib || rivals == without_both) return;
  item.add(what, "g_pattern_match_simple", [=] {
    return count(names, [=](const char* name) { return g_pattern_match_simple(pattern, name); });
  });
  GPatternSpec* const compiled = g_pattern_spec_new(pattern);
  item.add(what, "GPatternSpec compiled before", [=] {
    return count(names,
                 [=](const char* name) { return g_pattern_spec_match_string(compiled, name); });
  });
}
#endif

void add(const std::string& what, const std::vector<std::string>& names, const std::string& wanted,
         Rivals rivals = everybody) {
  static std::deque<std::string> patterns;  // as long as they are matched
  const char* const pattern = patterns.emplace_back(wanted).c_str();
  item.add(what, "zarvo", [=] {
    return count(names, [=](const char* name) { return zv_strpat(name, pattern) != 0; });
  });
  add_rivals(what, names, pattern, rivals);
}

void add_strstr(const std::string& what, const std::string& text, const char* needle) {
  item.add(what, "limit strstr", [=] {
    return std::strstr(text.c_str(), needle) != nullptr ? uint64_t{1} : uint64_t{0};
  });
}

}  // namespace

void bench::add_cases() {
  std::setlocale(LC_CTYPE, "C.UTF-8");  // for fnmatch
  const auto names = make_names("");
  add("`*.ext`", names, "*.txt");
  add("`name*`", names, "IMG*");
  add("set", names, "*.[ch]", without_glib);
  add("ranges", names, "IMG_[0-9][0-9][0-9][0-9].[a-z]*", without_glib);
  add("negated set", names, "[^a-m]*", without_glib);
  add("several stars", names, "*a*e*.*p*");
  add("question marks", names, "??*.t?t");
  add("UTF-8", make_names("-\u00e9t\u00e9-\u00fc"), "*-?t?-\u00fc.*", without_apr);

  std::string umlauts;
  while (umlauts.size() < 8000) umlauts += "\u00fcber gr\u00fcne H\u00fcgel; ";
  add("8 KB of UTF-8 with a late match", {umlauts + "Stra\u00dfe-\u00fc.txt"},
      "*[R-T]tra\u00dfe-?.t?t", without_both);

  std::string late;
  while (late.size() < 10000) late += "the quick brown fox; ";
  add("10 KB with a late match", {late + "needle in the hay"}, "*needle*");
  add_strstr("10 KB with a late match", late + "needle in the hay", "needle");
  for (const size_t characters : {10000u, 20000u, 40000u}) {
    std::string accents;
    while (accents.size() < 4 * characters) accents += "\u00e9";
    const std::string pattern = '*' + std::string(characters, '?');
    add("question marks, characters of two bytes @" + std::to_string(characters), {accents},
        pattern, without_apr);
  }
  const std::string letters(10000, 'a');
  add("`*a*a*a*a*b`, 10,000 a's", {letters}, "*a*a*a*a*b");
  item.add("`*a*a*a*a*b`, 10,000 a's", "limit strstr", [=] {
    return std::strstr(letters.c_str(), "b") != nullptr ? uint64_t{1} : uint64_t{0};
  });
}
