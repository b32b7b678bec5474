#include "transfer/local.h"

#include <cstdio>

#include "frame/owner.h"
#include "platform/platform.h"
#include "transfer/result.h"

namespace zv {

namespace {

constexpr size_t block_size = 65536;

// What the system copies by itself ends with a look for the source's end.
int copy_contents(FILE* in, FILE* out, char* block) {
  platform::copy_within(in, out);
  size_t got = 0;
  do {
    got = std::fread(block, 1, block_size, in);
    if (got != block_size && std::ferror(in) != 0) return source_failed;
    if (std::fwrite(block, 1, got, out) != got) return destination_failed;
  } while (got == block_size);
  return copied;
}

}  // namespace

int copy_local(const char* source, const char* destination) {
  const HeapPtr<char[]> block(static_cast<char*>(std::malloc(block_size)));
  const StreamPtr in(platform::open_to_read(source));
  if (block == nullptr || in == nullptr) return source_failed;
  platform::OpenFile from;
  if (!platform::look_at(in.get(), from) || from.is_folder) return source_failed;

  StreamPtr out(platform::open_unemptied(destination));
  platform::OpenFile to;
  if (out == nullptr || !platform::look_at(out.get(), to) || to.is_same(from))
    return destination_failed;
  // Some file systems write a file out at its close once it was truncated, even from no bytes.
  if (to.has_content && !platform::empty_file(out.get())) return destination_failed;

  // Blocks are large: a buffer would only cut them in two.
  std::setvbuf(in.get(), nullptr, _IONBF, 0);
  std::setvbuf(out.get(), nullptr, _IONBF, 0);
  const int result = copy_contents(in.get(), out.get(), block.get());
  return result != copied || close_stream(out) ? result : destination_failed;
}

}  // namespace zv
