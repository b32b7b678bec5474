// A file that takes its place whole: made under a private name, given the rights of the file that
// it replaces, renamed over it. All of it relative to the place's folder, which is held open.
#include <errno.h>
#include <fcntl.h>
#include <linux/capability.h>
#include <linux/magic.h>
#include <stdio.h>
#include <sys/syscall.h>
#include <sys/vfs.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <algorithm>

#include "frame/owner.h"
#include "platform/platform.h"
#include "platform/posix/open_file.h"

namespace zv::platform {

namespace {

constexpr int no_file = -1;

class File {
 public:
  explicit File(int descriptor) : descriptor_(descriptor) {}
  ~File() {
    if (descriptor_ == no_file) return;
    const int error = errno;
    ::close(descriptor_);
    errno = error;
  }
  File(const File&) = delete;
  File& operator=(const File&) = delete;

  int get() const { return descriptor_; }
  bool is_open() const { return descriptor_ != no_file; }

  // The stream closes the file from then on.
  FILE* stream() {
    FILE* const opened = is_open() ? ::fdopen(descriptor_, "wb") : nullptr;
    if (opened != nullptr) descriptor_ = no_file;
    return opened;
  }

 private:
  int descriptor_;
};

int folder_of(const Place& place) {
  return static_cast<int>(place.folder);
}

const char* name_of(const Place& place) {
  return place.path.c_str() + place.name;
}

// ---- What stands at a place ----

bool open_folder(Place& place) {
  place_close(place);
  const size_t slash = place.path.view().rfind('/');
  place.name = slash == std::string_view::npos ? 0 : slash + 1;
  PathBuffer folder = place.path;
  folder.shorten(place.name);
  place.folder = ::open(folder.empty() ? "." : folder.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC);
  return place.folder != no_folder;
}

// Its entries lead to what processes have open, whatever their texts say.
bool is_process_folder(int folder) {
  struct statfs st;
  return ::fstatfs(folder, &st) == 0 && st.f_type == PROC_SUPER_MAGIC;
}

// The system is asked to follow the link first: it knows whose links are not to be trusted.
bool may_follow(const Place& place) {
  return File(::openat(folder_of(place), name_of(place), O_PATH | O_CLOEXEC)).is_open();
}

// Puts the link's text in place of its name.
bool follow(Place& place) {
  PathBuffer text;
  ssize_t length = 0;
  const bool read = text.fill([&](char* room, size_t size) {
    length = ::readlinkat(folder_of(place), name_of(place), room, size);
    if (length < 0 || static_cast<size_t>(length) == size) return false;
    room[length] = '\0';
    return true;
  });
  if (length < 0) return false;
  place.path.shorten(text[0] == '/' ? 0 : place.name);
  const bool fits = read && place.path.append(text.view());
  if (!fits) errno = ENAMETOOLONG;
  return fits;
}

void stands(Place& place, const struct stat& st) {
  place.standing = S_ISREG(st.st_mode)   ? Standing::file
                   : S_ISDIR(st.st_mode) ? Standing::folder
                                         : Standing::other;
  place.file = open_file(st);
}

// ---- What a file passes on ----

constexpr char access_list_name[] = "system.posix_acl_access";

struct AccessList {
  std::array<char, 8192> bytes;
  ssize_t size = 0;  // 0: there is none
};

bool means_no_list(int error) {
  return error == ENODATA || error == ENOTSUP || error == ENOSYS;
}

bool read_access_list(int file, AccessList& list) {
  list.size = ::fgetxattr(file, access_list_name, list.bytes.data(), list.bytes.size());
  if (list.size >= 0) return true;
  list.size = 0;
  return means_no_list(errno);
}

// A new file may have one from its folder, which is not to stay.
bool write_access_list(int file, const AccessList& list) {
  if (list.size != 0)
    return ::fsetxattr(file, access_list_name, list.bytes.data(), static_cast<size_t>(list.size),
                       0) == 0;
  return ::fremovexattr(file, access_list_name) == 0 || means_no_list(errno);
}

// The file at the place, opened for what it tells about itself.
int open_standing(const Place& place) {
  constexpr int flags = O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC;
  const int readable = ::openat(folder_of(place), name_of(place), O_RDONLY | flags, 0);
  return readable != no_file || errno != EACCES
             ? readable
             : ::openat(folder_of(place), name_of(place), O_WRONLY | flags, 0);
}

// The owner comes first, so that no bit is ever meant for another. Set-user, set-group and sticky
// bits stay away.
bool pass_on(int from, int to) {
  struct stat old;
  struct stat made;
  AccessList list;
  if (::fstat(from, &old) != 0 || ::fstat(to, &made) != 0 || !read_access_list(from, list))
    return false;
  const bool owned = old.st_uid == made.st_uid && old.st_gid == made.st_gid;
  return (owned || ::fchown(to, old.st_uid, old.st_gid) == 0) && write_access_list(to, list) &&
         ::fchmod(to, old.st_mode & permission_bits) == 0;
}

// ---- What the process may ----

bool holds(unsigned capability) {
  __user_cap_header_struct header = {_LINUX_CAPABILITY_VERSION_3, 0};
  __user_cap_data_struct data[_LINUX_CAPABILITY_U32S_3] = {};
  return ::syscall(SYS_capget, &header, data) == 0 &&
         (data[capability / 32].effective >> capability % 32 & 1) != 0;
}

bool is_member(gid_t group) {
  if (group == ::getegid()) return true;
  const int count = ::getgroups(0, nullptr);
  if (count <= 0) return false;
  const HeapPtr<gid_t[]> groups(
      static_cast<gid_t*>(std::malloc(static_cast<size_t>(count) * sizeof(gid_t))));
  if (groups == nullptr) return false;
  const int got = ::getgroups(count, groups.get());
  return got > 0 && std::find(groups.get(), groups.get() + got, group) != groups.get() + got;
}

// Whether a new file of the folder can be given the owner and the group.
bool may_give_to(const struct statx& file, const struct statx& folder) {
  const bool own = file.stx_uid == ::geteuid() || (holds(CAP_CHOWN) && holds(CAP_FOWNER));
  const bool inherited = (folder.stx_mode & S_ISGID) != 0 && folder.stx_gid == file.stx_gid;
  return own && (inherited || is_member(file.stx_gid) || holds(CAP_CHOWN));
}

// Marked as never to be replaced, or the place where another file system begins.
bool is_fixed(const struct statx& st) {
  constexpr uint64_t fixed = STATX_ATTR_IMMUTABLE | STATX_ATTR_APPEND | STATX_ATTR_MOUNT_ROOT;
  return (st.stx_attributes & fixed) != 0;
}

// In a folder with the sticky bit only the owner of the file or of the folder may replace it.
bool may_replace(const struct statx& file, const struct statx& folder) {
  const bool sticky = (folder.stx_mode & S_ISVTX) != 0;
  const uid_t user = ::geteuid();
  const bool free = !sticky || file.stx_uid == user || folder.stx_uid == user || holds(CAP_FOWNER);
  constexpr uint64_t fixed = STATX_ATTR_IMMUTABLE | STATX_ATTR_APPEND;
  return free && !is_fixed(file) && (folder.stx_attributes & fixed) == 0;
}

// ---- Names ----

bool write_private_name(PrivateName& name) {
  uint64_t number = 0;
  return random_number(number) && name.fill([number](char* room, size_t size) {
    return std::snprintf(room, size, ".zv-%016llx.part", static_cast<unsigned long long>(number)) >
           0;
  });
}

// For file systems that cannot rename without replacing: a second name, or an empty file that holds
// the name for the other.
bool take_free_name(int folder, const char* from, const char* to) {
  if (::linkat(folder, from, folder, to, 0) == 0) {
    ::unlinkat(folder, from, 0);
    return true;
  }
  if (errno == EEXIST) return false;
  constexpr int flags = O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC;
  if (!File(::openat(folder, to, flags, S_IRUSR | S_IWUSR)).is_open()) return false;
  if (::renameat(folder, from, folder, to) == 0) return true;
  const int error = errno;
  ::unlinkat(folder, to, 0);
  errno = error;
  return false;
}

}  // namespace

bool place_open(const char* path, Place& place) {
  constexpr int most_links = 40;  // as the system has it
  place.standing = Standing::nothing;
  if (!place.path.assign_cut(path)) {
    errno = ENAMETOOLONG;
    return false;
  }
  for (int links = 0; links <= most_links; ++links) {
    if (!open_folder(place)) return false;
    if (is_process_folder(folder_of(place))) {
      place.standing = Standing::other;
      return true;
    }
    struct stat st = {};
    const char* const name = *name_of(place) != '\0' ? name_of(place) : ".";
    if (::fstatat(folder_of(place), name, &st, AT_SYMLINK_NOFOLLOW) != 0) return errno == ENOENT;
    if (!S_ISLNK(st.st_mode)) {
      stands(place, st);
      return true;
    }
    if (!may_follow(place)) {
      place.standing = Standing::loose_link;
      return errno == ENOENT;
    }
    if (!follow(place)) return false;
  }
  errno = ELOOP;
  return false;
}

void place_close(Place& place) {
  if (place.folder != no_folder) ::close(folder_of(place));
  place.folder = no_folder;
}

Obstacle place_obstacle(const Place& place) {
  struct statx file;
  struct statx folder;
  const int descriptor = folder_of(place);
  const bool seen =
      ::statx(descriptor, name_of(place), AT_SYMLINK_NOFOLLOW, STATX_BASIC_STATS, &file) == 0 &&
      ::statx(descriptor, ".", 0, STATX_BASIC_STATS, &folder) == 0;
  if (!seen || ::faccessat(descriptor, name_of(place), W_OK, AT_EACCESS) != 0)
    return Obstacle::read_only;
  if (file.stx_nlink > 1) return Obstacle::linked;
  if (!may_give_to(file, folder)) return Obstacle::owner;
  const File standing(open_standing(place));
  AccessList list;
  if (!standing.is_open() || !read_access_list(standing.get(), list)) return Obstacle::access_list;
  return may_make_file(place) && may_replace(file, folder) ? Obstacle::none : Obstacle::folder;
}

bool may_make_file(const Place& place) {
  return ::faccessat(folder_of(place), ".", W_OK | X_OK, AT_EACCESS) == 0;
}

FILE* make_private_file(const Place& place, unsigned bits, PrivateName& name) {
  const bool replaces = place.standing == Standing::file;
  const File standing(replaces ? open_standing(place) : no_file);
  if ((replaces && !standing.is_open()) || !write_private_name(name)) return nullptr;
  constexpr int flags = O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC;
  const mode_t mode = replaces ? S_IRUSR | S_IWUSR : bits & permission_bits;
  File made(::openat(folder_of(place), name.c_str(), flags, mode));
  if (!made.is_open()) return nullptr;
  const bool passed = !replaces || pass_on(standing.get(), made.get());
  FILE* const stream = passed ? made.stream() : nullptr;
  if (stream == nullptr) remove_private_file(place, name);
  return stream;
}

void remove_private_file(const Place& place, const PrivateName& name) {
  const int error = errno;
  ::unlinkat(folder_of(place), name.c_str(), 0);
  errno = error;
}

bool take_place(const Place& place, const PrivateName& name, bool keep) {
  const int folder = folder_of(place);
  if (!keep) return ::renameat(folder, name.c_str(), folder, name_of(place)) == 0;
  if (::renameat2(folder, name.c_str(), folder, name_of(place), RENAME_NOREPLACE) == 0) return true;
  const bool unknown = errno == EINVAL || errno == ENOSYS;
  return unknown && take_free_name(folder, name.c_str(), name_of(place));
}

FILE* open_in_place(const Place& place, unsigned bits, bool keep) {
  int flags = O_WRONLY | O_NOCTTY | O_CLOEXEC;
  if (place.standing == Standing::nothing) flags |= keep ? O_CREAT | O_EXCL : O_CREAT;
  return File(::openat(folder_of(place), name_of(place), flags, bits & permission_bits)).stream();
}

// What is no file of a disk has nothing to flush.
bool flush_file(FILE* stream) {
  return ::fsync(::fileno(stream)) == 0 || errno == EINVAL || errno == ENOTSUP;
}

bool flush_folder(const Place& place) {
  const File folder(::openat(folder_of(place), ".", O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  return folder.is_open() && (::fsync(folder.get()) == 0 || errno == EINVAL || errno == ENOTSUP);
}

}  // namespace zv::platform
