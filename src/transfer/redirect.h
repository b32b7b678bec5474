// Where a redirect leads (RFC 3986 5.2).
#ifndef ZARVO_TRANSFER_REDIRECT_H
#define ZARVO_TRANSFER_REDIRECT_H

#include <string_view>

#include "transfer/run_location.h"

namespace zv {

// Makes the location text that `reference`, a URL or a part of one, means to whoever got it from
// `base`; without a login. False without memory.
[[nodiscard]] bool resolve_reference(const RunLocation& base, std::string_view reference,
                                     HeapText& out);

}  // namespace zv

#endif
