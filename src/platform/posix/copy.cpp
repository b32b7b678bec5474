// File contents that the system moves by itself.
#include <unistd.h>

#include "platform/platform.h"

namespace zv::platform {

size_t copy_within(FILE* from, FILE* to, size_t most) {
  const ssize_t copied = ::copy_file_range(::fileno(from), nullptr, ::fileno(to), nullptr, most, 0);
  return copied > 0 ? static_cast<size_t>(copied) : 0;
}

}  // namespace zv::platform
