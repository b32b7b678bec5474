// The scan: one pass over each folder, with the path of the entry at hand built by appending to one
// buffer. The kind of an entry comes from its search, so that no entry costs a call of its own.
#include "file/scan.h"

#include "file/search.h"
#include "file/select.h"
#include "frame/text_view.h"

namespace zv {

namespace {

using platform::Kind;

class Scan {
 public:
  Scan(const ScanOptions& options, ListOwner& list)
      : options_(options), full_path_(options.full_path || options.recursive), list_(list) {}

  bool run(const char* dir) {
    Search search(dir);
    if (!search.open()) return true;
    path_.assign_cut(dir);
    return folder(dir, search);
  }

 private:
  // All entries of the folder whose path stands in path_.
  bool folder(const char* dir, Search& search) {
    const bool has_room = end_with_slash(path_);
    const size_t prefix = path_.size();
    do {
      const char* const name = search.entry().name;
      if (is_dot_or_dots(name)) continue;
      path_.shorten(prefix);
      if (full_path_ && !(has_room && path_.append(name))) return false;
      if (wanted(dir, search) && !list_.append(full_path_ ? path_.view() : name)) return false;
      if (options_.recursive && !descend(search)) return false;
    } while (search.next());
    return true;
  }

  bool wanted(const char* dir, Search& search) const {
    const platform::Entry& entry = search.entry();
    if (options_.filter != nullptr) return options_.filter(dir, entry.name, options_.user) != 0;
    return options_.selection == nullptr || selects(*options_.selection, dir, entry, &search);
  }

  bool descend(const Search& parent) {
    Kind kind = parent.entry().kind;
    if (kind == Kind::none) kind = platform::entry_kind(path_.c_str());
    if (kind != Kind::folder) return kind != Kind::none;

    const size_t outer = folder_.size();
    folder_ = path_;
    Search search(parent, folder_.c_str());
    const bool scanned = !search.open() || folder(folder_.c_str(), search);
    folder_.shorten(outer);
    return scanned;
  }

  const ScanOptions& options_;
  const bool full_path_;
  ListOwner& list_;
  PathBuffer path_;    // of the entry at hand
  PathBuffer folder_;  // the folder being scanned, as filters get it; empty at the top
};

}  // namespace

bool scan(const char* dir, const ScanOptions& options, ListOwner& list) {
  return Scan(options, list).run(dir);
}

}  // namespace zv

int zv_dir_scan(const char* dir, char*** list, dir_filter_t filter, void* user, int full_path,
                int recursive) {
  *list = nullptr;
  zv::ListOwner found;
  if (!found.reserve(0)) return -1;
  zv::ScanOptions options = {.full_path = full_path != 0, .recursive = recursive != 0};
  if (filter == reinterpret_cast<dir_filter_t>(zv_dir_select)) {
    options.selection = static_cast<const dirsel_t*>(user);
  } else {
    options.filter = filter;
    options.user = user;
  }
  // Nothing stored yet reads as an empty folder, whatever stopped the scan.
  if (!zv::scan(dir, options, found) && found.count() > 0) return -1;
  const int count = found.count();
  *list = found.release();
  return count;
}
