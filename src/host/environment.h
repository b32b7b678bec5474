// The private environment as the library itself reads it.
#ifndef ZARVO_HOST_ENVIRONMENT_H
#define ZARVO_HOST_ENVIRONMENT_H

#include "frame/owner.h"

namespace zv {

// Tells what zv_getenv_private() does not: false when memory ran out. `values` is nullptr then, and
// for a variable that is not there.
[[nodiscard]] bool get_private(const char* name, HeapPtr<char>& values);

}  // namespace zv

#endif
