// A file that takes its place whole: made under a private name, renamed over the file that it
// replaces. By path: the system knows no entry relative to an open folder.
#include <fcntl.h>
#include <io.h>
#include <sys/stat.h>
#include <windows.h>

#include <cstdio>

#include "frame/owner.h"
#include "platform/platform.h"

namespace zv::platform {

namespace {

constexpr DWORD share_all = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;

class File {
 public:
  explicit File(HANDLE handle) : handle_(handle) {}
  ~File() {
    if (!is_open()) return;
    const DWORD error = GetLastError();
    CloseHandle(handle_);
    SetLastError(error);
  }
  File(const File&) = delete;
  File& operator=(const File&) = delete;

  HANDLE get() const { return handle_; }
  bool is_open() const { return handle_ != INVALID_HANDLE_VALUE; }

  // The stream closes the file from then on.
  FILE* stream() {
    if (!is_open()) return nullptr;
    const int descriptor = _open_osfhandle(reinterpret_cast<intptr_t>(handle_), _O_BINARY);
    if (descriptor < 0) return nullptr;
    handle_ = INVALID_HANDLE_VALUE;
    FILE* const opened = _fdopen(descriptor, "wb");
    if (opened == nullptr) _close(descriptor);
    return opened;
  }

 private:
  HANDLE handle_;
};

// What other programs hold for a moment, to look for viruses or to list it, is tried again.
template <class Call>
bool patiently(Call call) {
  constexpr DWORD longer_ms = 25;
  for (DWORD tries = 1; tries <= 10; ++tries) {
    if (call()) return true;
    const DWORD error = GetLastError();
    if (error != ERROR_ACCESS_DENIED && error != ERROR_SHARING_VIOLATION) return false;
    Sleep(tries * longer_ms);
    SetLastError(error);
  }
  return false;
}

const char* name_of(const Place& place) {
  return place.path.c_str() + place.name;
}

void find_name(Place& place) {
  const size_t separator = place.path.view().find_last_of("/\\");
  const size_t drive = place.path[1] == ':' ? 2 : 0;
  place.name = separator == std::string_view::npos ? drive : separator + 1;
}

// "\\.\name", in either separator style: a device or a pipe of that name.
bool is_device_path(std::string_view path) {
  const auto is_separator = [path](size_t place) {
    return path[place] == '/' || path[place] == '\\';
  };
  return path.size() > 3 && is_separator(0) && is_separator(1) && path[2] == '.' && is_separator(3);
}

// Opened for nothing but what it tells about itself.
HANDLE open_to_ask(const Place& place) {
  return CreateFileA(place.path.c_str(), 0, share_all, nullptr, OPEN_EXISTING, 0, nullptr);
}

// Where the link leads, as the system writes paths: "\\?\D:\file" or "\\?\UNC\server\file".
bool follow(Place& place) {
  const File file(
      CreateFileA(place.path.c_str(), 0, share_all, nullptr, OPEN_EXISTING, 0, nullptr));
  PathBuffer text;
  const bool told = file.is_open() && text.fill([&file](char* room, size_t size) {
    const DWORD length =
        GetFinalPathNameByHandleA(file.get(), room, static_cast<DWORD>(size), VOLUME_NAME_DOS);
    if (length >= size) SetLastError(ERROR_FILENAME_EXCED_RANGE);
    return length != 0 && length < size;
  });
  if (!told) return false;
  constexpr std::string_view local = "\\\\?\\";
  constexpr std::string_view remote = "\\\\?\\UNC\\";
  const bool is_remote = text.view().starts_with(remote);
  const size_t front = is_remote                        ? remote.size()
                       : text.view().starts_with(local) ? local.size()
                                                        : 0;
  place.path.clear();
  const bool followed = place.path.append(is_remote ? "\\\\" : "") &&
                        place.path.append({text.c_str() + front, text.size() - front});
  find_name(place);
  return followed;
}

bool private_path(const Place& place, const PrivateName& name, PathBuffer& out) {
  out = place.path;
  out.shorten(place.name);
  return out.append(name.view());
}

bool write_private_name(PrivateName& name) {
  uint64_t number = 0;
  return random_number(number) && name.fill([number](char* room, size_t size) {
    return std::snprintf(room, size, ".zv-%08x%08x.part", static_cast<unsigned>(number >> 32),
                         static_cast<unsigned>(number)) > 0;
  });
}

// A file that may not be written has one attribute here, which its maker may still write through.
DWORD attributes_of(unsigned bits) {
  return (bits & _S_IWRITE) != 0 ? FILE_ATTRIBUTE_NORMAL : FILE_ATTRIBUTE_READONLY;
}

}  // namespace

bool place_open(const char* path, Place& place) {
  place.standing = Standing::nothing;
  if (!place.path.assign_cut(path)) {
    SetLastError(ERROR_FILENAME_EXCED_RANGE);
    return false;
  }
  find_name(place);
  const DWORD attributes = GetFileAttributesA(path);
  const bool exists = attributes != INVALID_FILE_ATTRIBUTES;
  if (exists && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0) {
    place.standing = Standing::folder;
    return true;
  }
  if (is_device_path(place.path.view()) || !names_a_file(name_of(place))) {
    place.standing = Standing::other;
    return true;
  }
  if (!exists) return GetLastError() == ERROR_FILE_NOT_FOUND;
  if (entry_kind(path) == Kind::link && !follow(place)) {
    place.standing = Standing::loose_link;
    return GetLastError() == ERROR_FILE_NOT_FOUND || GetLastError() == ERROR_PATH_NOT_FOUND;
  }
  const StreamPtr file(File(open_to_ask(place)).stream());
  if (file == nullptr || !look_at(file.get(), place.file)) return false;
  place.standing = Standing::file;
  return true;
}

void place_close(Place&) {}

// The folder's part in it shows when the private file is made.
Obstacle place_obstacle(const Place& place) {
  const File asked(open_to_ask(place));
  BY_HANDLE_FILE_INFORMATION found;
  const bool told = asked.is_open() && GetFileInformationByHandle(asked.get(), &found) != 0;
  if (!told || (found.dwFileAttributes & FILE_ATTRIBUTE_READONLY) != 0) {
    SetLastError(ERROR_ACCESS_DENIED);
    return Obstacle::read_only;
  }
  if (found.nNumberOfLinks > 1) return Obstacle::linked;
  const File file(CreateFileA(place.path.c_str(), GENERIC_WRITE, share_all, nullptr, OPEN_EXISTING,
                              0, nullptr));
  const bool refused = !file.is_open() && GetLastError() == ERROR_ACCESS_DENIED;
  return refused ? Obstacle::read_only : Obstacle::none;
}

bool may_make_file(const Place& place) {
  PathBuffer folder = place.path;
  folder.shorten(place.name);
  if (folder.empty() && !folder.append('.')) return false;
  return GetFileAttributesA(folder.c_str()) != INVALID_FILE_ATTRIBUTES;
}

FILE* make_private_file(const Place& place, unsigned bits, PrivateName& name) {
  PathBuffer path;
  if (!write_private_name(name) || !private_path(place, name, path)) return nullptr;
  const bool replaces = place.standing == Standing::file;
  const DWORD attributes = replaces ? FILE_ATTRIBUTE_NORMAL : attributes_of(bits);
  File made(CreateFileA(path.c_str(), GENERIC_WRITE, FILE_SHARE_READ, nullptr, CREATE_NEW,
                        attributes, nullptr));
  if (!made.is_open()) return nullptr;
  FILE* const stream = made.stream();
  if (stream == nullptr) DeleteFileA(path.c_str());
  return stream;
}

void remove_private_file(const Place& place, const PrivateName& name) {
  const DWORD error = GetLastError();
  PathBuffer path;
  if (private_path(place, name, path)) {
    SetFileAttributesA(path.c_str(), FILE_ATTRIBUTE_NORMAL);
    patiently([&path] { return DeleteFileA(path.c_str()) != 0; });
  }
  SetLastError(error);
}

bool take_place(const Place& place, const PrivateName& name, bool keep) {
  PathBuffer path;
  const DWORD flags = keep ? 0 : MOVEFILE_REPLACE_EXISTING;
  return private_path(place, name, path) &&
         patiently([&] { return MoveFileExA(path.c_str(), place.path.c_str(), flags) != 0; });
}

FILE* open_in_place(const Place& place, unsigned bits, bool keep) {
  const bool makes = place.standing == Standing::nothing;
  const DWORD how = !makes ? OPEN_EXISTING : keep ? CREATE_NEW : OPEN_ALWAYS;
  return File(CreateFileA(place.path.c_str(), GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE,
                          nullptr, how, makes ? attributes_of(bits) : FILE_ATTRIBUTE_NORMAL,
                          nullptr))
      .stream();
}

bool flush_file(FILE* stream) {
  auto* const handle = reinterpret_cast<HANDLE>(_get_osfhandle(_fileno(stream)));
  return GetFileType(handle) != FILE_TYPE_DISK || FlushFileBuffers(handle) != 0;
}

bool flush_folder(const Place&) {
  return true;  // a folder has no flush of its own
}

}  // namespace zv::platform
