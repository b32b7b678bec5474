// A path as somebody wrote it, brought into canonical form: the full way, and the fast path that
// does the same for nearly every path.
#ifndef ZARVO_PATH_NORMALIZE_H
#define ZARVO_PATH_NORMALIZE_H

#include "frame/text_buffer.h"
#include "path/components.h"

namespace zv {

// Both take a path without white space at its ends.

// Writes the canonical form, which is never longer than the text, into a buffer of ZV_PATH_MAX
// bytes, in one pass over the text. False, with anything in the buffer, for a path that it leaves
// to the full way: one with a share, with a drive to be looked up, with a name that stands for
// something else, or above its root.
[[nodiscard]] bool normalize_fast(const PathBuffer& text, char* out);

// Uses up the text. False with what is to be left in the caller's buffer.
[[nodiscard]] bool normalize_fully(PathBuffer& text, JoinedPath& out);

}  // namespace zv

#endif
