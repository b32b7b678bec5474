// Making what a path names: a chain of folders, an empty file in them.
#include "frame/owner.h"
#include "path/components.h"
#include "path/form.h"
#include "platform/platform.h"
#include "strings/search.h"
#include "zarvo.h"

namespace platform = zv::platform;

namespace {

// The caller's path with '/' alone. False for one that is too long: a cut path would name something
// else to make.
bool take_path(const char* path, zv::PathBuffer& out) {
  if (!out.assign_cut(path)) return false;
  out.replace('\\', '/');
  return true;
}

bool exists(const char* path) {
  struct _stat64 st;
  return platform::status(path, &st) == 0;
}

// The path of the first `count` pieces, a root with its separator.
bool take_first(const zv::Components& pieces, size_t count, zv::PathBuffer& out) {
  const std::string_view last = pieces[count - 1];
  return out.assign({pieces[0].data(), last.data() + last.size()}) && zv::trim_slash(out);
}

// Where another process was quicker, its folder serves as well.
bool make_folder(const char* path) {
  return platform::make_directory(path) == 0 || exists(path);
}

// One call tells it of most paths, before they are taken apart. Not of one with "..", which a
// platform may read in the text alone: it tells nothing about what stands before that.
bool is_made(const zv::PathBuffer& path) {
  return zv::find(path.view(), "..") == nullptr && exists(path.c_str());
}

bool make_folders(const zv::Components& pieces) {
  zv::PathBuffer prefix;
  // What exists tells that everything in front of it does, so the search for it starts at the end.
  size_t made = 0;
  while (made < pieces.size() && pieces[made] != "..") ++made;
  for (; made > 0; --made) {
    if (!take_first(pieces, made, prefix)) return false;
    if (exists(prefix.c_str())) break;
  }
  for (; made < pieces.size(); ++made)
    if (!take_first(pieces, made + 1, prefix) || !make_folder(prefix.c_str())) return false;
  return true;
}

}  // namespace

int zv_mkpath(const char* path) {
  zv::PathBuffer text;
  if (!take_path(path, text)) return 0;
  return is_made(text) || make_folders(zv::Components(text.view()));
}

int zv_mkfile(const char* path) {
  zv::PathBuffer file;
  zv::PathBuffer folder;
  if (!take_path(path, file)) return 0;
  const bool has_folder = folder.fill([&file](char* room, size_t size) {
    return zv_extract_directory(file.c_str(), room, size) != 0;
  });
  if (has_folder && zv_mkpath(folder.c_str()) == 0) return 0;
  return zv::StreamPtr(platform::open_to_write(file.c_str())) != nullptr;
}
