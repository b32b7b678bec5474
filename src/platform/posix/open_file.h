// What a status record tells of a file.
#ifndef ZARVO_PLATFORM_POSIX_OPEN_FILE_H
#define ZARVO_PLATFORM_POSIX_OPEN_FILE_H

#include <sys/stat.h>

#include "platform/platform.h"

namespace zv::platform {

inline constexpr mode_t permission_bits = S_IRWXU | S_IRWXG | S_IRWXO;

inline OpenFile open_file(const struct stat& st) {
  const bool is_file = S_ISREG(st.st_mode);
  return {.is_folder = S_ISDIR(st.st_mode),
          .is_file = is_file,
          .size = is_file ? st.st_size : 0,
          .bits = st.st_mode & permission_bits,
          .has_identity = true,
          .device = st.st_dev,
          .number = st.st_ino};
}

}  // namespace zv::platform

#endif
