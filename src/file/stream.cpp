// Binary C streams with 64-bit offsets: blocks in either byte order, lines in either line end.
#include <cstdio>
#include <cstring>

#include "platform/platform.h"
#include "zarvo.h"

namespace {

// The element count of an array that zv_swapv() takes: the low 32 bits.
int swap_count(size_t count) {
  return static_cast<int>(static_cast<uint32_t>(count));
}

bool write_all(const char* bytes, size_t size, FILE* fp) {
  return std::fwrite(bytes, 1, size, fp) == size;
}

}  // namespace

FILE* zv_fopen(const char* path, const char* mode, int* flag) {
  FILE* const fp = std::fopen(path, mode);
  if (fp == nullptr) return nullptr;
  zv::platform::set_binary(fp);
  if (flag != nullptr) *flag = 0;
  return fp;
}

int zv_fclose(FILE* fp) {
  if (fp != nullptr) std::fclose(fp);
  return 0;
}

size_t zv_fread(void* buf, size_t size, size_t count, FILE* fp, int swap) {
  const size_t read = std::fread(buf, size, count, fp);
  if (swap != 0) zv_swapv(buf, swap_count(read), size);
  return read;
}

size_t zv_fwrite(void* buf, size_t size, size_t count, FILE* fp, int swap) {
  if (swap != 0) zv_swapv(buf, swap_count(count), size);
  const size_t written = std::fwrite(buf, size, count, fp);
  if (swap != 0) zv_swapv(buf, swap_count(count), size);
  return written;
}

int zv_fseek(FILE* fp, int64_t offset, int origin) {
  return zv::platform::seek(fp, offset, origin);
}

int64_t zv_ftell(FILE* fp) {
  return zv::platform::tell(fp);
}

int zv_fskip(FILE* fp) {
  if (fp == nullptr) return -1;
  std::clearerr(fp);
  int ch = 0;
  do {
    ch = std::getc(fp);
  } while (ch != '\n' && ch != EOF);
  return ch == EOF ? -1 : 0;
}

char* zv_fgets(char* buf, int size, FILE* fp, int strip_cr) {
  std::memset(buf, 0, static_cast<size_t>(size));
  char* const line = std::fgets(buf, size, fp);
  if (line == nullptr || strip_cr == 0) return line;
  const size_t length = std::strlen(line);
  if (length >= 2 && std::memcmp(line + length - 2, "\r\n", 2) == 0)
    std::memcpy(line + length - 2, "\n", 2);
  return line;
}

int zv_fputs(const char* s, FILE* fp, int crlf) {
  if (crlf != 0) {
    for (const char* lf = std::strchr(s, '\n'); lf != nullptr; lf = std::strchr(s, '\n')) {
      const size_t before = static_cast<size_t>(lf - s);
      if (!write_all(s, before, fp) || !write_all("\r\n", 2, fp)) return -1;
      s = lf + 1;
    }
  }
  return write_all(s, std::strlen(s), fp) ? 0 : -1;
}
