// The ready-made filter, for a scan that knows more of its entries than their names.
#ifndef ZARVO_FILE_SELECT_H
#define ZARVO_FILE_SELECT_H

#include "platform/platform.h"
#include "zarvo.h"

namespace zv {

// zv_dir_select() for a name that is not empty. An entry whose kind is known needs no status call.
bool selects(const dirsel_t& sel, const char* dir, const char* name, platform::EntryKind kind);

}  // namespace zv

#endif
