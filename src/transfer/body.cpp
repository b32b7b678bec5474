// Moves a body between a socket and a file, block by block.
#include "transfer/body.h"

#include <algorithm>

#include "transfer/base64.h"
#include "transfer/line.h"
#include "transfer/result.h"

namespace zv {

namespace {

// The next piece of a count, at most `size`.
size_t piece_of(int64_t count, size_t size) {
  return static_cast<size_t>(std::clamp<int64_t>(count, 0, static_cast<int64_t>(size)));
}

// Receives after the bytes that the block has until it holds the count, or enough to be worth a
// write: to wait for more would keep what comes slowly out of the file. False when the peer closed
// or the connection failed.
bool fill_block(platform::Socket socket, std::span<char> block, int64_t count, size_t& have) {
  constexpr size_t worth_a_write = 65536;
  const size_t enough = std::min(block.size(), worth_a_write);
  while (have < enough && static_cast<int64_t>(have) < count) {
    const std::span<char> room = block.last(block.size() - have);
    const int64_t received = platform::socket_receive(socket, room.data(), room.size());
    if (received <= 0) return false;
    have += static_cast<size_t>(received);
  }
  return true;
}

bool peer_closes(platform::Socket socket) {
  char byte;
  return platform::socket_receive(socket, &byte, 1) == 0;
}

}  // namespace

int recv_to_file(platform::Socket socket, FILE* file, std::span<char> block, int64_t count,
                 size_t have) {
  const bool all_there = static_cast<int64_t>(have) >= count;
  bool open = true;
  do {
    open = fill_block(socket, block, count, have);
    if (std::fwrite(block.data(), 1, have, file) != have) return destination_failed;
    count -= static_cast<int64_t>(have);
    have = 0;
  } while (open && count > 0);

  const bool exact = count == 0 && (!all_there || peer_closes(socket));
  return exact ? copied : source_failed;
}

int send_from_file(platform::Socket socket, FILE* file, std::span<char> block, int64_t count) {
  while (count > 0) {
    const size_t size = piece_of(count, block.size());
    if (std::fread(block.data(), 1, size, file) != size) return source_failed;
    if (!send_all(socket, {block.data(), size})) return destination_failed;
    count -= static_cast<int64_t>(size);
  }
  return copied;
}

int send_base64_file(platform::Socket socket, FILE* file, std::span<char> block, int64_t count) {
  // As many lines leave in one send as the block holds beside the bytes they are made of.
  const size_t lines = block.size() / (base64_line_length + base64_line_bytes);
  const std::span<char> bytes = block.last(lines * base64_line_bytes);
  do {
    const size_t wanted = piece_of(count, bytes.size());
    const size_t got = std::fread(bytes.data(), 1, wanted, file);
    const bool complete = got == wanted;
    // The whole lines before a read that came short still leave.
    const size_t size = complete ? got : got - got % base64_line_bytes;
    if (complete || size != 0) {
      const size_t length = base64_lines(bytes.first(size), block.data());
      if (!send_all(socket, {block.data(), length})) return destination_failed;
    }
    if (!complete) return source_failed;
    count -= static_cast<int64_t>(size);
  } while (count > 0);
  return copied;
}

}  // namespace zv
