// Splitting a path into its pieces, and joining pieces to a path.
#include "path/components.h"

#include <algorithm>

#include "path/form.h"
#include "strings/find.h"

namespace zv {

namespace {

// The components after a root, as far as none is empty: an empty piece ends the list.
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

std::string_view Pieces::text() const {
  if (below_.empty()) return root_;
  const char* const start = root_.empty() ? below_.data() : root_.data();
  return {start, below_.data() + below_.size()};
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
  below_ = text();
  below_.remove_prefix(2);
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
  return path.append(component) && end_with_slash(path);
}

bool join(JoinedPath& path, const Pieces& pieces) {
  return pieces.empty() || join(path, pieces.text());
}

bool finish(JoinedPath& path) {
  return trim_slash(path) && path.size() <= PathBuffer::capacity;
}

}  // namespace zv
