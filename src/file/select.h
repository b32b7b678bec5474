// The ready-made filter, for a scan that knows more of its entries than their names.
#ifndef ZARVO_FILE_SELECT_H
#define ZARVO_FILE_SELECT_H

#include "file/search.h"
#include "platform/platform.h"
#include "zarvo.h"

namespace zv {

// zv_dir_select() for a name that is not empty: an entry on which a search stands, or one that a
// caller names, without a search.
bool selects(const dirsel_t& sel, const char* dir, const platform::Entry& entry, Search* search);

}  // namespace zv

#endif
