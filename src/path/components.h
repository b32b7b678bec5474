// A path as its pieces, without heap: pieces are places in the text that was split.
#ifndef ZARVO_PATH_COMPONENTS_H
#define ZARVO_PATH_COMPONENTS_H

#include <cstddef>
#include <string_view>

#include "frame/text_buffer.h"
#include "frame/text_view.h"

namespace zv {

// The pieces that zv_split_path() makes, of at most 319 characters of a path: the root first, then
// the components. The text must outlive them.
class Pieces {
 public:
  explicit Pieces(std::string_view path);

  bool empty() const { return root_.empty() && below_.empty(); }
  // A share stands without the separator after it.
  std::string_view root() const { return root_; }
  // All of it: a root and its components stand together in the text that was split.
  std::string_view text() const;
  // The components, with a separator between two.
  std::string_view below() const { return below_; }
  // The root, or where there is none the first component.
  std::string_view front() const { return root_.empty() ? first_component() : root_; }

  // Whether it begins with this component. Cheaper than to look for the first one's end.
  bool begins_with(std::string_view component) const {
    return root_.empty() && has_front(below_, component) &&
           (below_.size() == component.size() || below_[component.size()] == '/');
  }

  void drop_first();
  void drop_last();

  // Makes the root of a UNC path its first two components.
  void split_share();

 private:
  std::string_view first_component() const;

  std::string_view root_;
  std::string_view below_;
};

// The same as a list.
class Components {
 public:
  explicit Components(std::string_view path);

  bool has_root() const { return has_root_; }
  size_t size() const { return size_; }
  std::string_view operator[](size_t i) const { return pieces_[i]; }

  // Cancels each ".." against the component before it, as far as there is one after the root, and
  // drops each "." that a ".." follows.
  void drop_dot_pairs();

 private:
  // One character and one separator a component.
  static constexpr size_t most_pieces = ZV_PATH_MAX / 2;

  size_t size_ = 0;
  bool has_root_ = false;
  std::string_view pieces_[most_pieces];
};

// A path while it is joined, with room for the separators that are trimmed from its end: the one
// after the last component, and that of a root in its place.
using JoinedPath = TextBuffer<ZV_PATH_MAX + 2>;

// Appends a component and the separator after it. False when they do not fit.
[[nodiscard]] bool join(JoinedPath& path, std::string_view component);
[[nodiscard]] bool join(JoinedPath& path, const Pieces& pieces);

// Ends a joined path. False when it is longer than a path may be.
[[nodiscard]] bool finish(JoinedPath& path);

}  // namespace zv

#endif
