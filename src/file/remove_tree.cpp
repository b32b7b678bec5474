// The removal of a tree: listed whole, then removed from the last entry to the first, so that
// content goes before its folder. Each entry is removed relative to its folder, which is held open.
#include <algorithm>

#include "file/scan.h"
#include "frame/text_view.h"
#include "path/form.h"
#include "path/pieces.h"
#include "platform/platform.h"
#include "strlist/list_owner.h"
#include "zarvo.h"

namespace platform = zv::platform;

namespace {

// The open folders on the way from the top of a tree to the entry at hand.
class FolderChain {
 public:
  explicit FolderChain(const zv::PathBuffer& top) {
    const intptr_t folder = platform::folder_open(top.c_str());
    if (folder == platform::no_folder || !path_.append(top.view())) return;
    if (zv::end_with_slash(path_)) push(folder);
  }
  ~FolderChain() {
    while (open()) pop();
  }
  FolderChain(const FolderChain&) = delete;
  FolderChain& operator=(const FolderChain&) = delete;

  bool open() const { return depth_ > 0; }

  platform::Removal remove(std::string_view entry) {
    // What a folder that cannot be opened holds counts as gone: its own removal will tell.
    if (!reach({entry.data(), entry.rfind('/') + 1})) return platform::Removal::gone;
    return platform::remove_below(innermost().folder, entry.data() + path_.size(), entry.data());
  }

 private:
  struct Level {
    intptr_t folder;
    size_t path_size;  // the separator at its end included
  };

  const Level& innermost() const { return levels_[depth_ - 1]; }

  void push(intptr_t folder) { levels_[depth_++] = {folder, path_.size()}; }

  void pop() {
    platform::folder_close(innermost().folder);
    --depth_;
    if (open()) path_.shorten(innermost().path_size);
  }

  bool lies_within(std::string_view path) const {
    const std::string_view start = path_.view();
    return path.size() >= start.size() && std::equal(start.begin(), start.end(), path.begin());
  }

  // Makes `folder`, a path with a separator at its end, the innermost one.
  bool reach(std::string_view folder) {
    while (depth_ > 1 && !lies_within(folder)) pop();
    while (path_.size() < folder.size())
      if (!descend({folder.data(), folder.find('/', path_.size()) + 1})) return false;
    return true;
  }

  bool descend(std::string_view folder) {
    zv::PathBuffer path;
    if (!path.assign({folder.data(), folder.size() - 1})) return false;
    const char* const name = path.c_str() + path_.size();
    const intptr_t below = platform::folder_open_below(innermost().folder, name, path.c_str());
    if (below == platform::no_folder) return false;
    if (path_.assign(folder)) push(below);
    return true;
  }

  size_t depth_ = 0;
  Level levels_[ZV_PATH_MAX / 2];  // a name and a separator each
  // Of the innermost folder, and the separator for which the longest path leaves no room.
  zv::TextBuffer<ZV_PATH_MAX + 1> path_;
};

// A root or a drive is never removed, nor what "." or ".." stands for: of a path that ends in one,
// nothing would be left to remove it from.
bool may_be_removed(const zv::PathBuffer& path) {
  std::string_view text = path.view();
  if (zv::is_root(text)) return false;
  if (zv::is_dos(text)) text.remove_prefix(2);
  const std::string_view name = zv::last_component(text);
  return !name.empty() && !zv::is_dot_or_dots(name);
}

bool remove_content(const zv::PathBuffer& top) {
  FolderChain folders(top);
  zv::ListOwner entries;
  if (!folders.open() || !zv::scan(top.c_str(), {.recursive = true}, entries)) return false;
  for (int i = entries.count() - 1; i >= 0; --i)
    if (folders.remove(entries[i]) == platform::Removal::failed) return false;
  return true;
}

}  // namespace

// A path that was cut would name another tree, and a separator at the end would lead through a
// link. Only what was found to be a folder in the caller's own text is removed: `X:` is one in
// another place than `X:/`.
int zv_rmpath(const char* path) {
  zv::PathBuffer top;
  if (!platform::slashed_path(path, top) || !zv::trim_slash(top)) return 0;
  if (!may_be_removed(top) || platform::lies_at(top.c_str()) != platform::Kind::folder) return 0;
  return remove_content(top) && platform::remove_folder(top.c_str());
}
