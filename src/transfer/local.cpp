#include "transfer/local.h"

#include <cstdio>

#include "frame/owner.h"
#include "platform/platform.h"
#include "transfer/result.h"

namespace zv {

namespace {

constexpr size_t block_size = 65536;

// Fills the block as far as the source goes. False on a read error, never at the end of the file.
bool read_block(FILE* file, char* block, size_t& got) {
  got = std::fread(block, 1, block_size, file);
  return got == block_size || std::ferror(file) == 0;
}

}  // namespace

int copy_local(const char* source, const char* destination) {
  const HeapPtr<char[]> block(static_cast<char*>(std::malloc(block_size)));
  const StreamPtr in(std::fopen(source, "rb"));
  size_t got = 0;
  // The first read tells a directory before the destination is touched.
  if (block == nullptr || in == nullptr || !read_block(in.get(), block.get(), got))
    return source_failed;

  StreamPtr out(platform::open_unemptied(destination));
  if (out == nullptr || platform::same_file(in.get(), out.get()) ||
      !platform::empty_file(out.get()))
    return destination_failed;

  while (got != 0) {
    if (std::fwrite(block.get(), 1, got, out.get()) != got) return destination_failed;
    if (std::feof(in.get()) != 0) break;
    if (!read_block(in.get(), block.get(), got)) return source_failed;
  }
  return close_stream(out) ? copied : destination_failed;
}

}  // namespace zv
