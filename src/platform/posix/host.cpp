// The user and the machine.
#include <errno.h>
#include <pwd.h>
#include <unistd.h>

#include <cstdlib>

#include "frame/owner.h"
#include "platform/platform.h"

namespace zv::platform {

namespace {

// Lets `use` see the user's record, whose texts live no longer than the call. False when there is
// no record or no memory for one.
template <class Use>
bool with_user_record(uid_t user, Use use) {
  constexpr size_t first_size = 1024;
  constexpr size_t last_size = size_t{1} << 20;
  for (size_t size = first_size; size <= last_size; size *= 2) {
    const HeapPtr<char[]> room(static_cast<char*>(std::malloc(size)));
    if (room == nullptr) return false;
    struct passwd record;
    struct passwd* found = nullptr;
    const int error = ::getpwuid_r(user, &record, room.get(), size, &found);
    if (error == 0) return found != nullptr && use(*found);
    if (error != ERANGE) return false;
  }
  return false;
}

}  // namespace

bool user_name(TextBuffer<257>& out) {
  return with_user_record(::geteuid(),
                          [&out](const struct passwd& user) { return out.assign(user.pw_name); });
}

// A longer name is refused, as the other platform does it.
bool host_name(TextBuffer<16>& out) {
  return out.fill([](char* room, size_t size) { return ::gethostname(room, size) == 0; });
}

bool home_folder(PathBuffer& out) {
  const char* const home = std::getenv("HOME");
  if (home != nullptr && *home != '\0') return out.assign(home);
  return with_user_record(::getuid(),
                          [&out](const struct passwd& user) { return out.assign(user.pw_dir); });
}

}  // namespace zv::platform
