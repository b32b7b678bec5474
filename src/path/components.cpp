// Splitting a path into its pieces, and joining pieces to a path.
#include "path/components.h"

#include <algorithm>

#include "path/form.h"

namespace zv {

Components::Components(std::string_view path) : text_(path.data()) {
  path = {path.data(), std::min(path.size(), PathBuffer::capacity)};
  if (!is_root(path)) path = without_slashes(path);
  const size_t share = share_size(path);
  const size_t root = root_size(path);
  has_root_ = root != 0;
  if (has_root_) add(0, share != 0 ? share : root);

  // An empty piece ends the list.
  for (size_t start = root; start < path.size() && path[start] != '/';) {
    const size_t end = std::min(path.find('/', start), path.size());
    add(start, end - start);
    start = end + 1;
  }
}

void Components::split_share() {
  constexpr size_t slashes = 2;
  const std::string_view root = front();
  const size_t server_end = root.find('/', slashes);
  pieces_[first_] = {static_cast<uint16_t>(server_end + 1),
                     static_cast<uint16_t>(root.size() - server_end - 1)};
  pieces_[--first_] = {slashes, static_cast<uint16_t>(server_end - slashes)};
  has_root_ = false;
}

void Components::drop_dot_pairs() {
  const size_t start = first_ + (has_root_ ? 1 : 0);
  size_t kept = start;
  for (size_t i = start; i < end_; ++i) {
    if (view(pieces_[i]) == "..") {
      while (kept != start && view(pieces_[kept - 1]) == ".") --kept;
      if (kept != start && view(pieces_[kept - 1]) != "..") {
        --kept;
        continue;
      }
    }
    pieces_[kept++] = pieces_[i];
  }
  end_ = kept;
}

bool join(JoinedPath& path, std::string_view component) {
  if (!path.append(component)) return false;
  return path.empty() || path.back() == '/' || path.append('/');
}

bool join(JoinedPath& path, const Components& components) {
  for (size_t i = 0; i < components.size(); ++i)
    if (!join(path, components[i])) return false;
  return true;
}

bool finish(JoinedPath& path) {
  return trim_slash(path) && path.size() <= PathBuffer::capacity;
}

}  // namespace zv
