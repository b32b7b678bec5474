// A run from its two location texts to its end.
#ifndef ZARVO_TRANSFER_RUN_ROUTES_H
#define ZARVO_TRANSFER_RUN_ROUTES_H

#include <array>

#include "transfer/heap_text.h"
#include "transfer/run.h"

namespace zv {

// What was given for one side in place of what its location says.
struct Login {
  bool is_given = false;
  HeapText user;
  HeapText password;
};

using Logins = std::array<Login, 2>;  // of the source, and of the destination

// False when the run has failed.
bool transfer(Run& run, const Logins& logins, const char* from, const char* to);

}  // namespace zv

#endif
