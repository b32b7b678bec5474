// The path algebra: what comes out is canonical and bounded, and doing it again changes nothing.
#include <fuzzer/FuzzedDataProvider.h>

#include <cctype>
#include <cstring>
#include <memory>
#include <string>

#include "check.h"
#include "zarvo.h"

namespace {

// Lies on the heap, so that a byte written behind it is seen.
using Buffer = std::unique_ptr<char[]>;

Buffer path_buffer(const std::string& text) {
  Buffer buffer(new char[ZV_PATH_MAX]);
  zv_strncpy(buffer.get(), text.c_str(), ZV_PATH_MAX);
  return buffer;
}

bool is_space(char ch) {
  return std::isspace(static_cast<unsigned char>(ch)) != 0;
}

void check_canonical(const char* path) {
  const size_t length = std::strlen(path);
  CHECK(length < ZV_PATH_MAX);
  CHECK(std::strchr(path, '\\') == nullptr);
  const char* const inside = zv_ispath_UNC(path) != 0 ? path + 2 : path;
  CHECK(std::strstr(inside, "//") == nullptr);
  if (length > 0 && path[length - 1] == '/') CHECK(zv_ispath_root(path) == 1);
}

// A component that stood in the middle may read as something else once it stands at the edge: white
// space there is trimmed, and "D:" or "D:x" names a drive's own folder.
bool reads_alike_alone(const char* path) {
  if (*path == '\0') return true;
  if (is_space(path[0]) || is_space(path[std::strlen(path) - 1])) return false;
  return zv_ispath_DOS(path) == 0 || path[2] == '/';
}

void check_normalize(const std::string& text) {
  const Buffer once = path_buffer(text);
  const int ok = zv_normalize_path(once.get());
  if (text.find_first_of("~$%") != std::string::npos) return;  // values are not normalised
  if (ok == 0) {
    CHECK(*once.get() == '\0');
    return;
  }
  check_canonical(once.get());
  if (!reads_alike_alone(once.get())) return;
  const Buffer twice = path_buffer(once.get());
  CHECK(zv_normalize_path(twice.get()) == 1);
  CHECK(std::strcmp(once.get(), twice.get()) == 0);
}

void check_pieces(const std::string& text, size_t size) {
  const Buffer out(new char[size]);
  for (const auto extract : {zv_extract_directory, zv_extract_filename, zv_extract_extension}) {
    const int ok = extract(text.c_str(), out.get(), size);
    CHECK(std::strlen(out.get()) < size);
    CHECK(ok == (*out.get() != '\0'));
  }
  const char* const end = text.c_str() + std::strlen(text.c_str());
  CHECK(zv_dot(text.c_str()) <= end && zv_slash(text.c_str()) <= end);

  const size_t room = std::strlen(text.c_str()) + 3;  // what splitting may add
  const Buffer split(new char[room]);
  zv_strncpy(split.get(), text.c_str(), room);
  zv_split_path(split.get());
  CHECK(zv_strnulllen(split.get()) < room);
}

void check_resolved(const std::string& path, const std::string& base, size_t size) {
  const Buffer out(new char[size]);
  std::memset(out.get(), 'x', size);
  out[size - 1] = '\0';
  zv_absolute(path.c_str(), base.c_str(), out.get(), size);
  CHECK(std::strlen(out.get()) < size);
  if (zv_relative(path.c_str(), base.c_str(), out.get(), size) == 0)
    CHECK(std::strncmp(out.get(), path.c_str(), std::strlen(out.get())) == 0);
  CHECK(std::strlen(out.get()) < size);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider provider(data, size);
  const size_t out_size = provider.ConsumeIntegralInRange<size_t>(1, ZV_PATH_MAX + 10);
  const std::string path = provider.ConsumeRandomLengthString(2 * ZV_PATH_MAX);
  const std::string base = provider.ConsumeRemainingBytesAsString();
  check_normalize(path);
  check_pieces(path, out_size);
  check_resolved(path, base, out_size);
  return 0;
}
