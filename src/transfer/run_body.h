// The body of a download within a run: from a connection to where it lands.
#ifndef ZARVO_TRANSFER_RUN_BODY_H
#define ZARVO_TRANSFER_RUN_BODY_H

#include "transfer/connection.h"
#include "transfer/landing.h"
#include "transfer/wire.h"

namespace zv {

// False, of any function, says that the run has failed.
class RunBody {
 public:
  RunBody(Run& run, Landing& landing) : run_(run), landing_(landing) {}

  // `size` is what was told of all of it; -1 for nothing.
  [[nodiscard]] bool begin(int64_t size);

  // Receives so many bytes.
  [[nodiscard]] bool receive(Wire& wire, int64_t count);

  // Receives to the end of the connection; of a body of known size nothing may lack, or follow.
  [[nodiscard]] bool receive_until_end(Wire& wire);

 private:
  int64_t take(Wire& wire, int64_t most);

  Run& run_;
  Landing& landing_;
  TransferBuffer buffer_;
  int64_t size_ = -1;
  int64_t done_ = 0;
};

}  // namespace zv

#endif
