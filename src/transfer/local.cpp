// The copy between two local files: the described one, and the one of a run.
#include "transfer/local.h"

#include <algorithm>
#include <cstdio>

#include "frame/owner.h"
#include "platform/platform.h"
#include "transfer/landing.h"
#include "transfer/result.h"
#include "transfer/run.h"
#include "transfer/run_source.h"

namespace zv {

namespace {

constexpr size_t block_size = 65536;

int copy_contents(FILE* in, FILE* out, char* block) {
  constexpr size_t at_once = 1 << 30;
  while (platform::copy_within(in, out, at_once) == at_once) {
  }
  // What is left is nothing, or what the system does not move by itself.
  size_t got = 0;
  do {
    got = std::fread(block, 1, block_size, in);
    if (got != block_size && std::ferror(in) != 0) return source_failed;
    if (std::fwrite(block, 1, got, out) != got) return destination_failed;
  } while (got == block_size);
  return copied;
}

// ---- The copy of a run ----

// What the system moves by itself: as much as it will, and no more than may be.
bool move_pieces(Run& run, const RunSource& source, const Landing& landing, int64_t& done) {
  constexpr int64_t piece = 8 << 20;
  const int64_t limit = run.options().size;
  size_t moved = 0;
  do {
    if (!run.may_go_on(source_failed)) return false;
    const int64_t most = limit == Options::unset ? piece : std::min(piece, limit - done);
    moved = platform::copy_within(source.file(), landing.file(), static_cast<size_t>(most));
    done += static_cast<int64_t>(moved);
    run.advance(static_cast<int64_t>(moved));
  } while (moved != 0);
  return true;
}

int copy_body(Run& run, RunSource& source, Landing& landing) {
  int64_t done = 0;
  if (source.is().is_file && !move_pieces(run, source, landing, done)) return run.failure().code;
  for (std::string_view bytes;;) {
    if (!source.read(bytes)) return run.failure().code;
    if (bytes.empty()) return copied;
    done += static_cast<int64_t>(bytes.size());
    if (!run.allows(done)) return run.failure().code;
    const int written = landing.write(bytes);
    if (written != copied) return written;
    run.advance(static_cast<int64_t>(bytes.size()));
  }
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
  if (to.has_content() && !platform::empty_file(out.get())) return destination_failed;

  // Blocks are large: a buffer would only cut them in two.
  std::setvbuf(in.get(), nullptr, _IONBF, 0);
  std::setvbuf(out.get(), nullptr, _IONBF, 0);
  const int result = copy_contents(in.get(), out.get(), block.get());
  return result != copied || close_stream(out) ? result : destination_failed;
}

// A file that shows no size may still hold something, as those do that the system makes up.
int copy_local(Run& run, const char* from, const char* to) {
  RunSource source(run, block_size);
  Landing landing(run);
  if (!source.open(from) || !run.allows(source.is().size)) return run.failure().code;
  int result = landing.check(to, source.is());
  if (result == copied) result = landing.open(source.is().bits);
  if (result != copied) return result;
  run.begin_body(source.is().has_content() ? source.size() : RunSource::unknown);
  result = copy_body(run, source, landing);
  if (result != copied) return result;
  run.end_body();
  return landing.commit();
}

}  // namespace zv
