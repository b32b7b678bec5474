// Searches through one folder, owned.
#ifndef ZARVO_FILE_SEARCH_H
#define ZARVO_FILE_SEARCH_H

#include "platform/platform.h"

namespace zv {

// Starts a search through a folder that a caller names, "" for the current one; no_search where
// its path leaves no room for a separator and a name.
intptr_t search_named_folder(const char* dir, platform::Entry& entry);

// A search that stands on an entry as long as it is open.
class Search {
 public:
  explicit Search(const char* dir) : handle_(search_named_folder(dir, entry_)) {}
  // Through the folder on which `parent` stands; `path` is its full path.
  Search(const Search& parent, const char* path)
      : handle_(platform::search_below(parent.handle_, parent.entry_.name, path, entry_)) {}
  ~Search() {
    if (open()) platform::search_close(handle_);
  }
  Search(const Search&) = delete;
  Search& operator=(const Search&) = delete;

  bool open() const { return handle_ != platform::no_search; }
  const platform::Entry& entry() const { return entry_; }
  bool next() { return platform::search_next(handle_, entry_); }

  // Whether the entry is hidden. Where no attributes are kept, that is found out once; a folder or
  // a link may lead to where they are.
  bool hidden(const char* path) {
    if (entry_.hidden != platform::Hidden::unknown) return entry_.hidden == platform::Hidden::yes;
    if (none_hidden_ && entry_.kind == platform::Kind::other) return false;
    const platform::Hidden hidden = platform::entry_hidden(handle_, entry_.name, path);
    none_hidden_ = hidden == platform::Hidden::never;
    return hidden == platform::Hidden::yes;
  }

 private:
  platform::Entry entry_ = {};
  intptr_t handle_;
  bool none_hidden_ = false;
};

}  // namespace zv

#endif
