// A path as the list of its pieces, without heap: pieces are places in the text that was split.
#ifndef ZARVO_PATH_COMPONENTS_H
#define ZARVO_PATH_COMPONENTS_H

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "frame/text_buffer.h"

namespace zv {

// The pieces that zv_split_path() makes, of at most 319 characters of a path: the root first, which
// for a share stands without the separator behind it, then the components. The text must outlive
// the list.
class Components {
 public:
  explicit Components(std::string_view path);

  bool empty() const { return first_ == end_; }
  bool has_root() const { return has_root_; }
  size_t size() const { return end_ - first_; }
  std::string_view operator[](size_t i) const { return view(pieces_[first_ + i]); }
  std::string_view front() const { return (*this)[0]; }

  void drop_first() { ++first_; }
  void drop_last() { --end_; }

  // Replaces the root of a UNC path by its server and its share.
  void split_share();

  // Cancels each ".." against the component before it, as far as there is one behind the root, and
  // drops each "." that a ".." follows.
  void drop_dot_pairs();

 private:
  struct Piece {
    uint16_t start;
    uint16_t size;
  };

  std::string_view view(Piece piece) const { return {text_ + piece.start, piece.size}; }
  void add(size_t start, size_t size) {
    pieces_[end_++] = {static_cast<uint16_t>(start), static_cast<uint16_t>(size)};
  }

  // One character and one separator a component; one place more in front for a share.
  static constexpr size_t most_pieces = ZV_PATH_MAX / 2;

  const char* text_;
  size_t first_ = 1;
  size_t end_ = 1;
  bool has_root_ = false;
  Piece pieces_[most_pieces + 1];
};

// A path while it is joined, with room for the separators that are trimmed from its end: the one
// behind the last component, and that of a root in its place.
using JoinedPath = TextBuffer<ZV_PATH_MAX + 2>;

// Appends a component and the separator behind it. False when they do not fit.
[[nodiscard]] bool join(JoinedPath& path, std::string_view component);
[[nodiscard]] bool join(JoinedPath& path, const Components& components);

// Ends a joined path. False when it is longer than a path may be.
[[nodiscard]] bool finish(JoinedPath& path);

}  // namespace zv

#endif
