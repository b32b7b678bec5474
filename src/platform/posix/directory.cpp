// Searches through folders. The handle of a search is its DIR*.
#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "platform/platform.h"

namespace zv::platform {

namespace {

DIR* stream_of(intptr_t search) {
  return reinterpret_cast<DIR*>(search);
}

Kind kind_of(const dirent& found) {
  switch (found.d_type) {
    case DT_UNKNOWN:
      return Kind::none;
    case DT_DIR:
      return Kind::folder;
    case DT_LNK:
      return Kind::link;
    default:
      return Kind::other;
  }
}

intptr_t begin(DIR* stream, Entry& entry) {
  const intptr_t search = reinterpret_cast<intptr_t>(stream);
  if (stream == nullptr) return no_search;
  if (search_next(search, entry)) return search;
  search_close(search);
  return no_search;
}

}  // namespace

intptr_t search_first(const char* directory, Entry& entry) {
  return begin(::opendir(*directory != '\0' ? directory : "."), entry);
}

intptr_t search_below(intptr_t search, const char* name, const char*, Entry& entry) {
  const int descriptor =
      ::openat(::dirfd(stream_of(search)), name, O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC);
  if (descriptor < 0) return no_search;
  DIR* const stream = ::fdopendir(descriptor);
  if (stream == nullptr) ::close(descriptor);
  return begin(stream, entry);
}

bool search_next(intptr_t search, Entry& entry) {
  const dirent* const found = ::readdir(stream_of(search));
  if (found == nullptr) return false;
  entry = {found->d_name, kind_of(*found)};
  return true;
}

void search_close(intptr_t search) {
  ::closedir(stream_of(search));
}

Kind entry_kind(const char* path) {
  struct stat st;
  if (::lstat(path, &st) != 0) return Kind::none;
  if (S_ISDIR(st.st_mode)) return Kind::folder;
  return S_ISLNK(st.st_mode) ? Kind::link : Kind::other;
}

}  // namespace zv::platform
