// Splitting a path into its pieces, and joining pieces to a path.
#include "path/components.h"

#include <algorithm>

#include "path/form.h"
#include "strings/search.h"

namespace zv {

namespace {

// The components behind a root, as far as none is empty: an empty piece ends the list.
std::string_view up_to_empty_piece(std::string_view path) {
  if (path.starts_with('/')) return {};
  const char* const end = find(path, "//");
  return end != nullptr ? std::string_view(path.data(), end) : path;
}

}  // namespace

Pieces::Pieces(std::string_view path) {
  path = {path.data(), std::min(path.size(), PathBuffer::capacity)};
  if (!is_root(path)) path = without_slashes(path);
  const size_t share = share_size(path);
  const size_t root = root_size(path);
  root_ = {path.data(), share != 0 ? share : root};
  below_ = up_to_empty_piece({path.data() + root, path.size() - root});
}

std::string_view Pieces::first_component() const {
  return {below_.data(), std::min(below_.find('/'), below_.size())};
}

void Pieces::drop_first() {
  if (!root_.empty()) {
    root_ = {};
    return;
  }
  const size_t size = first_component().size();
  below_.remove_prefix(std::min(size + 1, below_.size()));
}

void Pieces::drop_last() {
  if (below_.empty()) {
    root_ = {};
    return;
  }
  const size_t slash = below_.rfind('/');
  below_ = {below_.data(), slash != std::string_view::npos ? slash : 0};
}

void Pieces::split_share() {
  const char* const end =
      below_.empty() ? root_.data() + root_.size() : below_.data() + below_.size();
  below_ = {root_.data() + 2, end};
  root_ = {};
}

Components::Components(std::string_view path) {
  Pieces pieces(path);
  has_root_ = !pieces.root().empty();
  for (; !pieces.empty(); pieces.drop_first()) pieces_[size_++] = pieces.front();
}

void Components::drop_dot_pairs() {
  const size_t start = has_root_ ? 1 : 0;
  size_t kept = start;
  for (size_t i = start; i < size_; ++i) {
    if (pieces_[i] == "..") {
      while (kept != start && pieces_[kept - 1] == ".") --kept;
      if (kept != start && pieces_[kept - 1] != "..") {
        --kept;
        continue;
      }
    }
    pieces_[kept++] = pieces_[i];
  }
  size_ = kept;
}

bool join(JoinedPath& path, std::string_view component) {
  if (!path.append(component)) return false;
  return path.empty() || path.back() == '/' || path.append('/');
}

bool join(JoinedPath& path, const Pieces& pieces) {
  if (!pieces.root().empty() && !join(path, pieces.root())) return false;
  return pieces.below().empty() || join(path, pieces.below());
}

bool finish(JoinedPath& path) {
  return trim_slash(path) && path.size() <= PathBuffer::capacity;
}

}  // namespace zv
