// The road between two network locations: through a temporary file.
#ifndef ZARVO_TRANSFER_RELAY_H
#define ZARVO_TRANSFER_RELAY_H

#include "transfer/location.h"

namespace zv {

// Downloads into a temporary file, which takes the name of the source's, uploads that, and removes
// it whatever came of it. 0, or the code of the leg that failed.
int relay(const Location& source, const Location& destination);

}  // namespace zv

#endif
