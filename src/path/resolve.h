// A path seen from a folder, and back. Purely textual: neither looks at the disk.
#ifndef ZARVO_PATH_RESOLVE_H
#define ZARVO_PATH_RESOLVE_H

#include "path/components.h"

namespace zv {

// Both use up their pieces.

// Resolves a path against a folder; an empty result where the path climbs above the folder's root.
// False when the result does not fit.
[[nodiscard]] bool resolve(Pieces& path, Pieces& base, JoinedPath& out);

// Expresses a path relative to a folder. False when they share no beginning, when one of them is
// empty or when the result does not fit.
[[nodiscard]] bool relate(Pieces& path, Pieces& base, JoinedPath& out);

}  // namespace zv

#endif
