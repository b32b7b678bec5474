// The user and the machine.
#include <errno.h>
#include <pwd.h>
#include <unistd.h>

#include <array>
#include <cstdlib>
#include <span>

#include "frame/owner.h"
#include "platform/platform.h"

namespace zv::platform {

namespace {

// Lets `use` see the user's record, whose texts live no longer than the call. False when there is
// no record or no memory for one, which nearly every record does without.
template <class Use>
bool with_user_record(uid_t user, Use use) {
  constexpr size_t last_size = size_t{1} << 20;
  std::array<char, 1024> first_room;
  HeapPtr<char[]> larger_room;
  std::span<char> room = first_room;
  while (room.data() != nullptr && room.size() <= last_size) {
    struct passwd record;
    struct passwd* found = nullptr;
    const int error = ::getpwuid_r(user, &record, room.data(), room.size(), &found);
    if (error == 0) return found != nullptr && use(*found);
    if (error != ERANGE) return false;
    const size_t size = 2 * room.size();
    larger_room.reset(static_cast<char*>(std::malloc(size)));
    room = {larger_room.get(), size};
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
