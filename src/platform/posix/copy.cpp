// File contents that the system moves by itself.
#include <unistd.h>

#include "platform/platform.h"

namespace zv::platform {

bool copy_within(FILE* from, FILE* to) {
  constexpr size_t at_once = 1 << 30;
  off_t in = ::ftello(from);
  off_t out = ::ftello(to);
  if (in < 0 || out < 0) return true;
  if (::fflush(to) != 0) return false;

  const off_t begin = in;
  while (::copy_file_range(::fileno(from), &in, ::fileno(to), &out, at_once, 0) > 0) {
  }
  return in == begin || (::fseeko(from, in, SEEK_SET) == 0 && ::fseeko(to, out, SEEK_SET) == 0);
}

}  // namespace zv::platform
