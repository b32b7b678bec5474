// A local file that takes its place whole.
#include "transfer/landing.h"

#include <cerrno>

#include "transfer/result.h"

namespace zv {

namespace {

std::string_view words_for(platform::Obstacle obstacle) {
  switch (obstacle) {
    case platform::Obstacle::read_only:
      return "it may not be written, nor with ZV_TRANSFER_IN_PLACE";
    case platform::Obstacle::linked:
      return "it has other hard links; ZV_TRANSFER_IN_PLACE writes over it";
    case platform::Obstacle::owner:
      return "its owner or group cannot be kept; ZV_TRANSFER_IN_PLACE writes over it";
    case platform::Obstacle::access_list:
      return "its access list cannot be kept; ZV_TRANSFER_IN_PLACE writes over it";
    case platform::Obstacle::folder:
      return "its folder does not let it be replaced; ZV_TRANSFER_IN_PLACE writes over it";
    default:
      return "";
  }
}

}  // namespace

Landing::~Landing() {
  file_.reset();
  if (!name_.empty()) platform::remove_private_file(place_, name_);
  platform::place_close(place_);
}

// Why the last call of the platform failed.
int Landing::fail(int cause, std::string_view step) {
  return run_.fail_system(destination_failed, cause, platform::last_error(), {step, " ", path_});
}

int Landing::refuse(std::string_view why) {
  return run_.fail(destination_failed, ZV_CAUSE_LANDING, 0, {"replace ", path_, ": ", why});
}

int Landing::refuse_late(int error) {
  return run_.fail_system(destination_failed, ZV_CAUSE_LANDING, error,
                          {"replace ", path_, " (ZV_TRANSFER_IN_PLACE writes over it)"});
}

int Landing::refuse_same() {
  return run_.fail(destination_failed, ZV_CAUSE_SAME_FILE, 0,
                   {"write ", path_, ": it is the source itself"});
}

int Landing::check(const char* path, const platform::OpenFile& source) {
  path_ = path;
  source_ = source;
  if (!platform::place_open(path, place_)) {
    const bool too_long = platform::last_error() == ENAMETOOLONG;
    return fail(too_long ? ZV_CAUSE_LOCATION : ZV_CAUSE_LOCAL, "write");
  }
  in_place_ = run_.options().in_place || place_.standing == platform::Standing::other;
  return check_place(source);
}

int Landing::check_place(const platform::OpenFile& source) {
  using platform::Standing;
  const Standing standing = place_.standing;
  if (run_.options().keep && standing != Standing::nothing)
    return run_.fail_system(destination_failed, ZV_CAUSE_EXISTS, EEXIST, {"write ", path_});
  if (standing == Standing::folder)
    return run_.fail_system(destination_failed, ZV_CAUSE_LOCAL, EISDIR, {"write ", path_});
  if (standing == Standing::loose_link)
    return run_.fail(destination_failed, ZV_CAUSE_LANDING, 0,
                     {"write ", path_, ": a link that leads nowhere"});
  if (standing != Standing::nothing && place_.file.is_same(source)) return refuse_same();
  if (!in_place_ && place_.name + platform::private_name_length > PathBuffer::capacity)
    return run_.fail_system(destination_failed, ZV_CAUSE_LOCATION, ENAMETOOLONG, {"write ", path_});
  if (standing == Standing::file) return check_replacement();
  if (standing == Standing::nothing && !platform::may_make_file(place_))
    return fail(ZV_CAUSE_LOCAL, "make");
  return copied;
}

int Landing::check_replacement() {
  const platform::Obstacle obstacle = platform::place_obstacle(place_);
  if (obstacle == platform::Obstacle::none) return copied;
  if (!in_place_) return refuse(words_for(obstacle));
  return obstacle == platform::Obstacle::read_only ? fail(ZV_CAUSE_LOCAL, "write") : copied;
}

int Landing::open(unsigned bits) {
  const int result = in_place_ ? open_in_place(bits) : open_whole(bits);
  // Blocks are large: a buffer would only cut them in two.
  if (result == copied) std::setvbuf(file_.get(), nullptr, _IONBF, 0);
  return result;
}

int Landing::open_whole(unsigned bits) {
  file_.reset(platform::make_private_file(place_, bits, name_));
  if (file_ != nullptr) return copied;
  const int error = platform::last_error();
  name_.clear();
  if (!stands_file())
    return run_.fail_system(destination_failed, ZV_CAUSE_LOCAL, error, {"make ", path_});
  return refuse_late(error);
}

// What is written over is compared before it is emptied.
int Landing::open_in_place(unsigned bits) {
  file_.reset(platform::open_in_place(place_, bits, run_.options().keep));
  if (file_ == nullptr) {
    const bool exists = run_.options().keep && platform::last_error() == EEXIST;
    return fail(exists ? ZV_CAUSE_EXISTS : ZV_CAUSE_LOCAL, "write");
  }
  platform::OpenFile opened;
  if (!platform::look_at(file_.get(), opened)) return fail(ZV_CAUSE_LOCAL, "write");
  if (opened.is_same(source_)) return refuse_same();
  if (opened.has_content() && !platform::empty_file(file_.get()))
    return fail(ZV_CAUSE_LOCAL, "write");
  return copied;
}

// A signal interrupts a write to a pipe or a terminal.
int Landing::write(std::string_view bytes) {
  for (;;) {
    bytes.remove_prefix(std::fwrite(bytes.data(), 1, bytes.size(), file_.get()));
    if (bytes.empty()) return copied;
    const int error = errno;
    if (error != EINTR)
      return run_.fail_system(destination_failed, ZV_CAUSE_LOCAL, error, {"write ", path_});
    if (!run_.may_go_on(destination_failed)) return run_.failure().code;
    std::clearerr(file_.get());
  }
}

// A power cut must not leave an empty file where one with content was.
int Landing::commit() {
  const bool sync = run_.options().sync;
  const bool replaces_content = !in_place_ && stands_file() && place_.file.has_content();
  if ((sync || replaces_content) && !platform::flush_file(file_.get()))
    return fail(ZV_CAUSE_LOCAL, "flush");
  if (!run_.may_go_on(destination_failed)) return run_.failure().code;
  if (!close_stream(file_))
    return run_.fail_system(destination_failed, ZV_CAUSE_LOCAL, errno, {"close ", path_});
  if (!in_place_ && !platform::take_place(place_, name_, run_.options().keep)) {
    const int error = platform::last_error();
    if (run_.options().keep && error == EEXIST)
      return run_.fail_system(destination_failed, ZV_CAUSE_EXISTS, error, {"write ", path_});
    return refuse_late(error);
  }
  name_.clear();
  if (!sync || platform::flush_folder(place_)) return copied;
  return fail(ZV_CAUSE_LOCAL, "flush the folder of");
}

}  // namespace zv
