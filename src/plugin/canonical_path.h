// The one form of a path that plugins are looked for under.
#ifndef ZARVO_PLUGIN_CANONICAL_PATH_H
#define ZARVO_PLUGIN_CANONICAL_PATH_H

#include "frame/text_buffer.h"

namespace zv {

// `path` normalised and made absolute; false where that cannot be, or does not fit.
bool canonical_path(const char* path, PathBuffer& out);

}  // namespace zv

#endif
