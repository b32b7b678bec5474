#include "transfer/local.h"

#include <cstdio>

#include "frame/owner.h"
#include "platform/platform.h"
#include "transfer/result.h"

namespace zv {

namespace {

constexpr size_t block_size = 65536;
constexpr size_t stream_size = 4096;

// Fills the block as far as the source goes. False on a read error, never at the end of the file.
bool read_block(FILE* file, char* block, size_t& got) {
  got = std::fread(block, 1, block_size, file);
  return got == block_size || std::ferror(file) == 0;
}

// Writes what the block has of the source, and all that follows.
int copy_contents(FILE* in, FILE* out, char* block, size_t got) {
  if (std::fwrite(block, 1, got, out) != got) return destination_failed;
  if (got == block_size && !platform::copy_within(in, out)) return destination_failed;
  while (got == block_size) {
    if (!read_block(in, block, got)) return source_failed;
    if (std::fwrite(block, 1, got, out) != got) return destination_failed;
  }
  return copied;
}

}  // namespace

int copy_local(const char* source, const char* destination) {
  const HeapPtr<char[]> room(static_cast<char*>(std::malloc(block_size + 2 * stream_size)));
  const StreamPtr in(std::fopen(source, "rb"));
  if (room == nullptr || in == nullptr) return source_failed;
  // A stream that is given its buffer need not ask the system how large to make one.
  char* const block = room.get();
  std::setvbuf(in.get(), block + block_size, _IOFBF, stream_size);
  // The first read tells a directory before the destination is touched.
  size_t got = 0;
  if (!read_block(in.get(), block, got)) return source_failed;

  StreamPtr out(platform::open_unemptied(destination));
  if (out == nullptr || !platform::different_files(in.get(), out.get()) ||
      !platform::empty_file(out.get()))
    return destination_failed;
  std::setvbuf(out.get(), block + block_size + stream_size, _IOFBF, stream_size);

  const int result = copy_contents(in.get(), out.get(), block, got);
  return result != copied || close_stream(out) ? result : destination_failed;
}

}  // namespace zv
