// Reads the certificates that a handle trusts.
#include "transfer/trust.h"

#include <cerrno>
#include <utility>

#include "transfer/local_path.h"
#include "transfer/pem.h"
#include "transfer/run.h"

namespace zv {

namespace {

constexpr size_t largest_file = 16 * size_t{1024} * 1024;

// A whole text file, not longer than the largest; nullptr when it cannot be had.
HeapPtr<char[]> read_file(const char* path, size_t& size) {
  PathBuffer local;
  if (!local.assign(path)) return nullptr;
  take_local_path(local, false);
  const StreamPtr file(platform::open_to_read(local.c_str()));
  if (file == nullptr || platform::seek(file.get(), 0, SEEK_END) != 0) return nullptr;
  const int64_t told = platform::tell(file.get());
  if (told <= 0 || told > static_cast<int64_t>(largest_file)) return nullptr;
  if (platform::seek(file.get(), 0, SEEK_SET) != 0) return nullptr;
  size = static_cast<size_t>(told);
  HeapPtr<char[]> text(static_cast<char*>(std::malloc(size)));
  if (text != nullptr && std::fread(text.get(), 1, size, file.get()) != size) text.reset();
  return text;
}

}  // namespace

bool Trust::read(const char* path) {
  size_t length = 0;
  const HeapPtr<char[]> text = read_file(path, length);
  if (text == nullptr) return false;
  HeapPtr<unsigned char[]> room(static_cast<unsigned char*>(std::malloc(length)));
  const size_t size = room != nullptr ? decode_certificates({text.get(), length}, room.get()) : 0;
  if (size == 0) return false;
  close();
  certificates_ = std::move(room);
  size_ = size;
  return true;
}

void Trust::forget() {
  close();
  certificates_.reset();
  size_ = 0;
}

bool Trust::prepare(Run& run, int code) {
  if (context_ != nullptr) return true;
  encryption_ = platform::encryption();
  if (encryption_ == nullptr) {
    run.fail(code, ZV_CAUSE_ENCRYPTION, 0, {platform::encryption_missing});
    return false;
  }
  context_ = encryption_->context_open(certificates_.get(), size_);
  if (context_ == nullptr)
    run.fail(code, ZV_CAUSE_ENCRYPTION, 0,
             {size_ != 0 ? "the certificates to trust cannot be used"
                         : "the system's certificates cannot be used"});
  return context_ != nullptr;
}

void Trust::close() {
  if (context_ != nullptr) encryption_->context_close(context_);
  context_ = nullptr;
}

}  // namespace zv
