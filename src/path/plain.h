// The short way to a canonical path, for what nearly every path is.
#ifndef ZARVO_PATH_PLAIN_H
#define ZARVO_PATH_PLAIN_H

#include "frame/text_buffer.h"

namespace zv {

// Writes the canonical form, which is never longer than the text, into a buffer of ZV_PATH_MAX
// bytes, in one pass over the text. False, with anything in the buffer, for a path that it leaves
// to the long way: one with a share, with a drive to be looked up, with a name that stands for
// something else, or above its root.
[[nodiscard]] bool normalize_plain(const PathBuffer& text, char* out);

}  // namespace zv

#endif
