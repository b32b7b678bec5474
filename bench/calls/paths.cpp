// The path algebra over a thousand paths, and the path map as it grows.
#ifndef _WIN32
#include <apr_file_info.h>
#include <apr_pools.h>
#include <glib.h>
#endif

#include <cstring>
#include <filesystem>
#include <string>
#include <vector>

#include "frame/measure.h"
#include "zarvo.h"

namespace {

namespace fs = std::filesystem;

const bench::Item item("paths");
const char* const base = "/home/user/projects/zarvo";

using Paths = std::vector<std::string>;

// Absolute or relative paths as users and programs write them: a few of them untidy.
Paths make_paths(bool absolute) {
  const char* const folders[] = {"usr/share", "home/user/pictures/2024", "a", "projects/x/src/y",
                                 "var/lib/./dpkg//info"};
  const char* const middles[] = {"", "beach/", "beach/../hills/", "./"};
  const char* const names[] = {"readme.txt", "IMG_0042.jpeg", "archive.tar.gz", "Makefile",
                               ".profile"};
  Paths paths;
  for (int round = 0; round < 10; ++round)
    for (const char* const folder : folders)
      for (const char* const middle : middles)
        for (const char* const name : names)
          paths.push_back(std::string(absolute ? "/" : "") + folder + std::to_string(round) + '/' +
                          middle + name);
  return paths;
}

Paths tidied(const Paths& untidy) {
  Paths paths;
  for (const std::string& path : untidy)
    paths.push_back(fs::path(path).lexically_normal().generic_string());
  return paths;
}

// How many characters the results have together: no path may be left out, nor its result.
template <class Size>
uint64_t sum(const Paths& paths, Size size) {
  uint64_t total = 0;
  for (const std::string& path : paths) total += size(path);
  return total;
}

#ifndef _WIN32
class Pool {
 public:
  explicit Pool(apr_pool_t* parent) { apr_pool_create(&pool_, parent); }
  ~Pool() { apr_pool_destroy(pool_); }
  Pool(const Pool&) = delete;
  Pool& operator=(const Pool&) = delete;
  apr_pool_t* get() const { return pool_; }

 private:
  apr_pool_t* pool_ = nullptr;
};

size_t merged_size(const char* root, const std::string& path, const Pool& pool) {
  char* merged = nullptr;
  apr_filepath_merge(&merged, root, path.c_str(), 0, pool.get());
  return std::strlen(merged);
}

// APR's pool is emptied after each thousand.
uint64_t merged_sizes(const Paths& paths, const char* root) {
  static const Pool parent(nullptr);
  const Pool pool(parent.get());
  return sum(paths, [&](const std::string& path) { return merged_size(root, path, pool); });
}

size_t canonical_size(const std::string& path, const char* folder) {
  char* const canonical = g_canonicalize_filename(path.c_str(), folder);
  const size_t size = std::strlen(canonical);
  g_free(canonical);
  return size;
}
#endif

void add_normalize(const Paths& paths) {
  const char* const what = "normalise";
  item.add(what, "zarvo", [=] {
    return sum(paths, [](const std::string& path) {
      char text[ZV_PATH_MAX];
      std::memcpy(text, path.c_str(), path.size() + 1);
      zv_normalize_path(text);
      return std::strlen(text);
    });
  });
#ifdef _WIN32
  item.add(what, "_fullpath", [=] {
    return sum(paths, [](const std::string& path) {
      char text[ZV_PATH_MAX];
      return std::strlen(_fullpath(text, path.c_str(), sizeof text));
    });
  });
#else
  item.add(what, "apr_filepath_merge", [=] { return merged_sizes(paths, "/"); });
  item.add(what, "g_canonicalize_filename", [=] {
    return sum(paths, [](const std::string& path) { return canonical_size(path, "/"); });
  });
  item.add(what, "std::filesystem", [=] {
    return sum(paths, [](const std::string& path) {
      return fs::path(path).lexically_normal().native().size();
    });
  });
#endif
}

// Only what is clean before can be compared: we make it absolute, and the others clean it too.
void add_absolute(const Paths& untidy) {
  const Paths paths = tidied(untidy);
  const char* const what = "absolute";
  item.add(what, "zarvo", [=] {
    return sum(paths, [](const std::string& path) {
      char text[ZV_PATH_MAX];
      zv_absolute(path.c_str(), base, text, sizeof text);
      return std::strlen(text);
    });
  });
#ifndef _WIN32
  item.add(what, "apr_filepath_merge", [=] { return merged_sizes(paths, base); });
  item.add(what, "g_canonicalize_filename", [=] {
    return sum(paths, [](const std::string& path) { return canonical_size(path, base); });
  });
#endif
  item.add(what, "std::filesystem", [=] {
    const fs::path folder(base);
    return sum(paths, [&](const std::string& path) {
      return (folder / path).lexically_normal().native().size();
    });
  });
}

void add_relative(const Paths& untidy) {
  const Paths paths = tidied(untidy);
  item.add("relative", "zarvo", [=] {
    return sum(paths, [](const std::string& path) {
      char text[ZV_PATH_MAX];
      zv_relative(path.c_str(), base, text, sizeof text);
      return std::strlen(text);
    });
  });
  item.add("relative", "std::filesystem", [=] {
    const fs::path folder(base);
    return sum(paths, [&](const std::string& path) {
      return fs::path(path).lexically_relative(folder).native().size();
    });
  });
}

// Splits relative paths, whose pieces everybody counts alike.
void add_split(const Paths& untidy) {
  const Paths paths = tidied(untidy);
  item.add("split", "zarvo", [=] {
    return sum(paths, [](const std::string& path) {
      char text[ZV_PATH_MAX + 2];
      std::memcpy(text, path.c_str(), path.size() + 1);
      zv_split_path(text);
      size_t pieces = 0;
      for (const char* piece = text; *piece != '\0'; piece += std::strlen(piece) + 1) ++pieces;
      return pieces;
    });
  });
  item.add("split", "std::filesystem", [=] {
    return sum(paths, [](const std::string& path) {
      const fs::path whole(path);
      return static_cast<size_t>(std::distance(whole.begin(), whole.end()));
    });
  });
#ifndef _WIN32
  item.add("split", "g_strsplit", [=] {
    return sum(paths, [](const std::string& path) {
      char** const pieces = g_strsplit(path.c_str(), "/", -1);
      const size_t count = g_strv_length(pieces);
      g_strfreev(pieces);
      return count;
    });
  });
#endif
}

void add_pieces(const Paths& untidy) {
  const Paths paths = tidied(untidy);
  const char* const what = "directory, name and extension";
  item.add(what, "zarvo", [=] {
    return sum(paths, [](const std::string& path) {
      char folder[ZV_PATH_MAX];
      char name[ZV_PATH_MAX];
      char extension[ZV_PATH_MAX];
      zv_extract_directory(path.c_str(), folder, sizeof folder);
      zv_extract_filename(path.c_str(), name, sizeof name);
      zv_extract_extension(path.c_str(), extension, sizeof extension);
      return std::strlen(folder) + std::strlen(name) + std::strlen(extension);
    });
  });
  item.add(what, "std::filesystem", [=] {
    return sum(paths, [](const std::string& text) {
      const fs::path path(text);
      return path.parent_path().native().size() + path.filename().native().size() +
             path.extension().native().size();
    });
  });
#ifdef _WIN32
  item.add(what, "_splitpath", [=] {
    return sum(paths, [](const std::string& path) {
      char folder[ZV_PATH_MAX];
      char name[ZV_PATH_MAX];
      char extension[ZV_PATH_MAX];
      _splitpath(path.c_str(), nullptr, folder, name, extension);
      // The others count the extension in the name too, see none in ".profile", and give the folder
      // without the last separator.
      const size_t times = *name != '\0' ? 2 : 1;
      return std::strlen(folder) - 1 + std::strlen(name) + times * std::strlen(extension);
    });
  });
#else
  item.add(what, "GLib", [=] {
    return sum(paths, [](const std::string& path) {
      char* const folder = g_path_get_dirname(path.c_str());
      char* const name = g_path_get_basename(path.c_str());
      const char* const dot = std::strrchr(name, '.');
      const size_t extension = dot != nullptr && dot != name ? std::strlen(dot) : 0;
      const size_t size = std::strlen(folder) + std::strlen(name) + extension;
      g_free(folder);
      g_free(name);
      return size;
    });
  });
#endif
}

struct ClearMap {
  ~ClearMap() { zv_pathmap_clear(); }
};

void add_map(int folders) {
  const std::string size = " @" + std::to_string(folders);
  Paths from;
  for (int i = 0; i < folders; ++i) from.push_back("/old/folder" + std::to_string(i) + "/x");
  item.add("path map, all entries made" + size, "zarvo", [=] {
    const ClearMap clear;
    uint64_t made = 0;
    for (const std::string& path : from) made += zv_pathmap(path.c_str(), "/new/place/x") != 0;
    return made;
  });
}

// No entry leads to the path, so each is tried.
void take_map(int folders) {
  zv_pathmap_clear();
  for (int i = 0; i < folders; ++i)
    zv_pathmap(("/old/folder" + std::to_string(i) + "/x").c_str(), "/new/place/x");
}

template <int folders>
void add_locate() {
  item.add("path map, a path not found @" + std::to_string(folders), "zarvo",
           [] {
             char path[ZV_PATH_MAX] = "/old/folder/below/name";
             return zv_pathmap_locate(path);
           })
      ->Setup([](const benchmark::State&) { take_map(folders); });
}

}  // namespace

void bench::add_cases() {
#ifndef _WIN32
  apr_initialize();
#endif
  const Paths absolute = make_paths(true);
  const Paths relative = make_paths(false);
  add_normalize(absolute);
  add_absolute(relative);
  add_relative(absolute);
  add_split(relative);
  add_pieces(absolute);
  for (const int folders : {10, 100, 1000}) add_map(folders);
  add_locate<10>();
  add_locate<100>();
  add_locate<1000>();
}
