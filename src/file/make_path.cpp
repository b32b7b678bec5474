// Making what a path names: a chain of folders, an empty file in them.
#include <cerrno>

#include "frame/owner.h"
#include "path/components.h"
#include "path/form.h"
#include "path/pieces.h"
#include "platform/platform.h"
#include "strings/find.h"
#include "zarvo.h"

namespace platform = zv::platform;

namespace {

using platform::Kind;
using platform::lies_at;

// The path of the first `count` pieces, a root with its separator.
bool take_first(const zv::Components& pieces, size_t count, zv::PathBuffer& out) {
  const std::string_view last = pieces[count - 1];
  return out.assign({pieces[0].data(), last.data() + last.size()}) && zv::trim_slash(out);
}

// Whether the folder is there afterwards: where another process was quicker, its folder serves as
// well. The cause of a failure, ENOENT where the folder above is missing, is not lost to that look.
bool make_folder(const char* path) {
  if (platform::make_directory(path) == 0) return true;
  const int cause = errno;
  if (cause != ENOENT && lies_at(path) != Kind::none) return true;
  errno = cause;
  return false;
}

// One call tells it of most paths, before they are taken apart. Not of one with "..", which a
// platform may read in the text alone: it tells nothing about what stands before that.
bool is_made(const zv::PathBuffer& path) {
  return zv::find(path.view(), "..") == nullptr && lies_at(path.c_str()) != Kind::none;
}

// From the end to what can be made, since everything in front of that is there, and on from it. A
// path is looked at no other way: one call makes a folder or tells what is missing.
bool make_folders(const zv::Components& pieces) {
  zv::PathBuffer prefix;
  size_t made = 0;
  while (made < pieces.size() && pieces[made] != "..") ++made;
  for (; made > 0; --made) {
    if (!take_first(pieces, made, prefix)) return false;
    if (make_folder(prefix.c_str())) break;
    if (errno != ENOENT) return false;
  }
  for (; made < pieces.size(); ++made)
    if (!take_first(pieces, made + 1, prefix) || !make_folder(prefix.c_str())) return false;
  return true;
}

}  // namespace

// A path that is too long is refused: a cut one would name something else to make.

int zv_mkpath(const char* path) {
  zv::PathBuffer text;
  if (!platform::slashed_path(path, text)) return 0;
  return is_made(text) || make_folders(zv::Components(text.view()));
}

int zv_mkfile(const char* path) {
  zv::PathBuffer file;
  zv::PathBuffer folder;
  if (!platform::slashed_path(path, file)) return 0;
  zv::folder_of(file.c_str(), folder);
  if (!folder.empty() && zv_mkpath(folder.c_str()) == 0) return 0;
  return zv::StreamPtr(platform::open_to_write(file.c_str())) != nullptr;
}
