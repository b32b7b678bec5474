// What a copy comes to: every failure is charged to one of its two sides.
#ifndef ZARVO_TRANSFER_RESULT_H
#define ZARVO_TRANSFER_RESULT_H

#include "zarvo.h"

namespace zv {

constexpr int copied = 0;
constexpr int source_failed = ZV_COPY_SOURCE_FAILED;
constexpr int destination_failed = ZV_COPY_DESTINATION_FAILED;

// Which way a client moves the file: a download's source is the network, an upload's the local
// file (the mail sender's too).
enum class Direction { download, upload };

constexpr int network_failed(Direction direction) {
  return direction == Direction::download ? source_failed : destination_failed;
}

// The local file, and the local machine's memory and names.
constexpr int local_failed(Direction direction) {
  return direction == Direction::download ? destination_failed : source_failed;
}

}  // namespace zv

#endif
