// The local path that a location text names.
#ifndef ZARVO_TRANSFER_LOCAL_PATH_H
#define ZARVO_TRANSFER_LOCAL_PATH_H

#include "frame/text_buffer.h"

namespace zv {

// Makes a path of a plain text, or of what follows "file://", where `%` and two digits stand for a
// byte and "/D|/f" is "D:/f". Both are in either separator style; where `\` may be part of a name,
// a path that exists as it is written stays so.
void take_local_path(PathBuffer& text, bool is_url);

}  // namespace zv

#endif
