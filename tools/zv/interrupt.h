// Ctrl-C and its like while a transfer runs.
#ifndef ZV_TOOL_INTERRUPT_H
#define ZV_TOOL_INTERRUPT_H

#include "zarvo.h"

namespace tool {

// While it lives, the first signal to end cancels the transfer, and a second ends the program.
class Interrupt {
 public:
  explicit Interrupt(zv_transfer_t* transfer);
  ~Interrupt();
  Interrupt(const Interrupt&) = delete;
  Interrupt& operator=(const Interrupt&) = delete;

  // The signal that came; 0 for none.
  static int caught();
};

}  // namespace tool

#endif
