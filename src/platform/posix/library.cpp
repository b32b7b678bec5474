// Dynamic libraries: dlopen() and its kin.
#include <dlfcn.h>
#include <fcntl.h>
#include <link.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cstring>

#include "platform/platform.h"

namespace zv::platform {

namespace {

using Header = ElfW(Ehdr);
using Segment = ElfW(Phdr);
using Section = ElfW(Shdr);
using Dynamic = ElfW(Dyn);
using Offset = ElfW(Off);

// A library's file, looked at before the loader gets it.
class LibraryFile {
 public:
  // A pipe must not make the opening wait.
  explicit LibraryFile(const char* path)
      : descriptor_(::open(path, O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC)) {}
  ~LibraryFile() {
    if (descriptor_ >= 0) ::close(descriptor_);
  }
  LibraryFile(const LibraryFile&) = delete;
  LibraryFile& operator=(const LibraryFile&) = delete;

  // dlopen() believes what it maps: a library that was only copied half, or whose end is still
  // zeros, would end the process. It would also wait for ever on a pipe.
  bool is_whole() {
    struct stat st;
    Header header;
    if (::fstat(descriptor_, &st) != 0 || !S_ISREG(st.st_mode)) return false;
    front_size_ = ::pread(descriptor_, front_.data(), front_.size(), 0);
    if (front_size_ < 0 || !read(header, 0) || header.e_phentsize != sizeof(Segment)) return false;
    for (size_t i = 0; i < header.e_phnum; ++i) {
      Segment segment;
      if (!read(segment, header.e_phoff + i * sizeof segment) ||
          !is_filled(segment, static_cast<Offset>(st.st_size)))
        return false;
    }
    return has_its_end(header);
  }

 private:
  template <class Record>
  bool read(Record& record, Offset offset) const {
    constexpr auto size = static_cast<ssize_t>(sizeof record);
    if (offset < front_.size() && static_cast<ssize_t>(offset) + size <= front_size_) {
      std::memcpy(&record, front_.data() + offset, sizeof record);
      return true;
    }
    return ::pread(descriptor_, &record, sizeof record, static_cast<off_t>(offset)) == size;
  }

  bool is_filled(const Segment& segment, Offset size) const {
    Dynamic first;
    switch (segment.p_type) {
      case PT_LOAD:
        return segment.p_offset <= size && segment.p_filesz <= size - segment.p_offset;
      case PT_DYNAMIC:
        return read(first, segment.p_offset) && first.d_tag != DT_NULL;
      default:
        return true;
    }
  }

  // Linkers write the table of sections last, and only its first record is empty.
  bool has_its_end(const Header& header) const {
    Section last;
    if (header.e_shoff == 0 || header.e_shnum == 0) return true;
    return header.e_shentsize == sizeof last &&
           read(last, header.e_shoff + (header.e_shnum - 1U) * sizeof last) &&
           last.sh_type != SHT_NULL;
  }

  int descriptor_;
  std::array<char, 1024> front_;  // nearly always holds everything that is read
  ssize_t front_size_ = 0;
};

}  // namespace

void* load_library(const char* path) {
  // The empty path would name the program itself.
  if (*path == '\0') return nullptr;
  PathBuffer room;
  const char* const native = native_path(path, room);
  if (native == nullptr) return nullptr;
  // Where the loader searches for a bare name is its own affair.
  if (std::strchr(native, '/') != nullptr && !LibraryFile(native).is_whole()) return nullptr;
  return dlopen(native, RTLD_NOW | RTLD_LOCAL);
}

void* library_symbol(void* library, const char* name) {
  return dlsym(library, name);
}

void unload_library(void* library) {
  dlclose(library);
}

}  // namespace zv::platform
