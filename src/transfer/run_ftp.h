// The FTP client of a run (RFC 959, RFC 2428, RFC 3659).
#ifndef ZARVO_TRANSFER_RUN_FTP_H
#define ZARVO_TRANSFER_RUN_FTP_H

#include "transfer/landing.h"
#include "transfer/run_location.h"
#include "transfer/run_source.h"

namespace zv {

// Retrieves the source and lands it. False when the run has failed.
[[nodiscard]] bool ftp_retrieve(Run& run, const RunLocation& source, Landing& landing);

// Stores the file at the destination.
[[nodiscard]] bool ftp_store(Run& run, RunSource& file, const RunLocation& destination);

// The port that a 227 or 229 reply names; 0 for none that can be used.
unsigned passive_port(std::string_view reply);
unsigned extended_passive_port(std::string_view reply);

// The bytes that a 150 reply announces, "(1234 bytes)"; -1 for none.
int64_t announced_bytes(std::string_view reply);

}  // namespace zv

#endif
