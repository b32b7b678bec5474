// The copy between two local files.
#ifndef ZARVO_TRANSFER_LOCAL_H
#define ZARVO_TRANSFER_LOCAL_H

namespace zv {

class Run;

// 0, -3 or -4. Two names of one file give -4 and leave it as it is.
int copy_local(const char* source, const char* destination);

// The same in a run, within its limits; the destination is landed whole.
int copy_local(Run& run, const char* from, const char* to);

}  // namespace zv

#endif
