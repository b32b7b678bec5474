// Ten thousand names matched against a hundred plugins with four patterns each.
#ifndef _WIN32
#include <glib.h>
#endif

#include <cctype>
#include <string>
#include <vector>

#include "frame/measure.h"
#include "zarvo.h"

namespace {

const bench::Item item("formats");

constexpr int plugin_count = 100;
constexpr int pattern_count = 4;

struct Plugins {
  std::vector<std::string> entries;
  std::vector<std::vector<char*>> formats;
  std::vector<zv_plugin_t> records;
  std::vector<zv_plugin_t*> pointers;
#ifndef _WIN32
  std::vector<GPatternSpec*> compiled;  // pattern_count for each plugin
#endif
};

void add_entry(Plugins& plugins, const std::vector<std::string>& patterns) {
  std::string entry = "A format|";
  for (const std::string& pattern : patterns) {
    entry += pattern + '|';
#ifndef _WIN32
    const std::string whole = pattern[0] == '.' ? '*' + pattern : pattern;
    plugins.compiled.push_back(g_pattern_spec_new(whole.c_str()));
#endif
  }
  plugins.entries.push_back(entry);
}

// Points into itself, once it holds every entry.
void make_records(Plugins& plugins) {
  for (std::string& entry : plugins.entries) plugins.formats.push_back({entry.data(), nullptr});
  for (std::vector<char*>& formats : plugins.formats) {
    plugins.records.emplace_back();
    plugins.records.back().formats = formats.data();
  }
  for (zv_plugin_t& record : plugins.records) plugins.pointers.push_back(&record);
  plugins.pointers.push_back(nullptr);
}

// Extensions, as nearly every plugin names them, or those and names with wildcards.
void fill(Plugins& plugins, bool wildcards) {
  for (int i = 0; i < plugin_count; ++i) {
    const std::string number = std::to_string(i);
    if (wildcards)
      add_entry(plugins, {".e" + number, "*.f" + number + "*", "img" + number + "_*.x",
                          "?*" + number + ".dat"});
    else
      add_entry(plugins, {".e" + number, ".f" + number, ".g" + number, ".h" + number});
  }
  make_records(plugins);
}

std::vector<std::string> make_names() {
  std::vector<std::string> names;
  for (int i = 0; i < 10000; ++i) {
    const char letter = "EFGHx"[i % 5];
    names.push_back("pictures/2024/Holiday_" + std::to_string(i) + '.' + letter +
                    std::to_string(i * 7 % 120));
  }
  return names;
}

#ifndef _WIN32
// What a program with GLib would do: the patterns compiled once, the name in lower case.
uint64_t first_by_compiled(const Plugins& plugins, const std::string& path) {
  char* const base = g_path_get_basename(path.c_str());
  char* const name = g_ascii_strdown(base, -1);
  const size_t length = std::string_view(name).size();
  size_t i = 0;
  while (i < plugins.compiled.size() &&
         !g_pattern_spec_match(plugins.compiled[i], length, name, nullptr))
    ++i;
  g_free(name);
  g_free(base);
  return i / pattern_count;
}
#endif

void add(const char* what, bool wildcards) {
  auto* const plugins = new Plugins;
  fill(*plugins, wildcards);
  const std::vector<std::string> names = make_names();
  item.add(what, "zarvo", [=] {
    uint64_t sum = 0;
    for (const std::string& name : names) {
      const zv_plugin_t* const found =
          zv_plugin_get_entry_by_fmt(plugins->pointers.data(), name.c_str());
      sum +=
          found != nullptr ? static_cast<uint64_t>(found - plugins->records.data()) : plugin_count;
    }
    return sum;
  });
#ifndef _WIN32
  item.add(what, "GPatternSpec compiled before", [=] {
    uint64_t sum = 0;
    for (const std::string& name : names) sum += first_by_compiled(*plugins, name);
    return sum;
  });
#endif
}

}  // namespace

void bench::add_cases() {
  add("10,000 names, 100 plugins with four extensions", false);
  add("10,000 names, 100 plugins with wildcards", true);
}
