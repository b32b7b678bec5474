// Why a call of the platform failed.
#include <cerrno>

#include "platform/platform.h"

namespace zv::platform {

int last_error() {
  return errno;
}

}  // namespace zv::platform
