// The road between two network locations: through a temporary file.
#ifndef ZARVO_TRANSFER_RELAY_H
#define ZARVO_TRANSFER_RELAY_H

namespace zv {

// Copies `from` to a temporary file and that to `to`, both by zv_copy(), and removes it whatever
// came of it. `source_path` is the path of `from`, whose file name the temporary file takes. 0, or
// the code of the leg that failed.
int copy_through_temporary(const char* from, const char* source_path, const char* to);

}  // namespace zv

#endif
