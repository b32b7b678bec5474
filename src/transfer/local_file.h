// The local file at one end of a transfer, opened for whole blocks.
#ifndef ZARVO_TRANSFER_LOCAL_FILE_H
#define ZARVO_TRANSFER_LOCAL_FILE_H

#include <cstdint>

#include "frame/owner.h"

namespace zv {

// The source of an upload: its size, and the file opened for reading. A directory is refused.
bool open_source(const char* path, StreamPtr& file, int64_t& size);

// The destination of a download, made or emptied.
bool open_destination(const char* path, StreamPtr& file);

}  // namespace zv

#endif
