// The copy between two local files.
#ifndef ZARVO_TRANSFER_LOCAL_H
#define ZARVO_TRANSFER_LOCAL_H

namespace zv {

// 0, -3 or -4. Two names of one file give -4 and leave it as it is.
int copy_local(const char* source, const char* destination);

}  // namespace zv

#endif
