// The mail client of a run (RFC 5321).
#ifndef ZARVO_TRANSFER_RUN_SMTP_H
#define ZARVO_TRANSFER_RUN_SMTP_H

#include "transfer/run_location.h"
#include "transfer/run_source.h"

namespace zv {

// Mails the file, whose path is `local`, to the address that the destination's path is. False when
// the run has failed.
[[nodiscard]] bool smtp_send(Run& run, RunSource& file, const char* local,
                             const RunLocation& destination);

}  // namespace zv

#endif
