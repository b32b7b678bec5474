// The HTTP client of a run (RFC 9110, RFC 9112).
#ifndef ZARVO_TRANSFER_RUN_HTTP_H
#define ZARVO_TRANSFER_RUN_HTTP_H

#include "transfer/landing.h"
#include "transfer/run_location.h"
#include "transfer/run_source.h"

namespace zv {

// Fetches the source, along its redirects, and lands it. False when the run has failed.
[[nodiscard]] bool http_fetch(Run& run, const RunLocation& source, Landing& landing);

// Stores the file at the destination.
[[nodiscard]] bool http_store(Run& run, RunSource& file, const RunLocation& destination);

}  // namespace zv

#endif
