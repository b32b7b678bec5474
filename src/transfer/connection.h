// What every client of zv_copy() begins and ends with: the local file, the buffer, the control
// connection.
#ifndef ZARVO_TRANSFER_CONNECTION_H
#define ZARVO_TRANSFER_CONNECTION_H

#include <span>

#include "frame/owner.h"
#include "transfer/local_file.h"
#include "transfer/location.h"
#include "transfer/network.h"
#include "transfer/result.h"

namespace zv {

// Room for one block of data, or for one reply and the NUL after it.
class TransferBuffer {
 public:
  bool allocate(size_t block_size);
  std::span<char> block() const { return {bytes_.get(), block_size_}; }
  std::span<char> room() const { return {bytes_.get(), block_size_ + 1}; }

 private:
  HeapPtr<char[]> bytes_;
  size_t block_size_ = 0;
};

// What a client holds while it runs. The members are released from the last to the first: the local
// file, the buffer, the data socket, the control socket, the network layer.
struct Connection {
  explicit Connection(Direction way) : direction(way) {}

  // Makes the control socket and the buffer, which follows the socket's own buffer for that
  // direction, and connects. Gives `copied`, or the code of the side that failed.
  int open(const Location& location);

  int network_failed() const { return zv::network_failed(direction); }
  int local_failed() const { return zv::local_failed(direction); }

  const Direction direction;
  NetworkGuard network;  // a client gives network_failed() at once unless it started
  SocketOwner control;
  SocketOwner data;
  TransferBuffer buffer;
  StreamPtr file;
  int64_t size = 0;  // of an upload's file
};

// A download from its opening to its end: the destination is made or emptied before the server is
// called, and counts once it is closed. `talk(connection)` is the dialogue between.
template <class Talk>
int download_over(const Location& source, const char* local, Talk talk) {
  Connection connection(Direction::download);
  if (!connection.network.started()) return source_failed;
  if (!open_destination(local, connection.file)) return destination_failed;
  int result = connection.open(source);
  if (result == copied) result = talk(connection);
  if (result == copied && !close_stream(connection.file)) result = destination_failed;
  return result;
}

// An upload likewise.
template <class Talk>
int upload_over(const char* local, const Location& destination, Talk talk) {
  Connection connection(Direction::upload);
  if (!connection.network.started()) return destination_failed;
  if (!open_source(local, connection.file, connection.size)) return source_failed;
  const int result = connection.open(destination);
  return result == copied ? talk(connection) : result;
}

}  // namespace zv

#endif
