// A location of a run, taken apart. Its grammar is wider than that of a copy in one call: texts of
// 8 KiB, escapes in the login, IPv6, and a refusal of every scheme that is not spoken.
#ifndef ZARVO_TRANSFER_RUN_LOCATION_H
#define ZARVO_TRANSFER_RUN_LOCATION_H

#include "frame/text_buffer.h"
#include "transfer/heap_text.h"
#include "transfer/location.h"
#include "transfer/run.h"

namespace zv {

using HostName = TextBuffer<256>;

struct RunLocation {
  LocationKind kind = LOC_NONE;
  bool is_encrypted = false;  // https, ftps, smtps
  unsigned port = 0;
  HostName host;        // a name or an address, of IPv6 without its brackets
  bool is_six = false;  // an IPv6 address
  HeapText user;
  HeapText password;
  HeapText path;     // of a server: from its "/" on, as written for HTTP, else without escapes
  PathBuffer local;  // of a local file

  bool is_network() const { return kind != LOC_FILE; }
};

// False for a text that is not usable: the run has failed then, on the side `code`.
[[nodiscard]] bool parse_run_location(Run& run, int code, const char* text, RunLocation& location);

// "host:21"; an IPv6 address in brackets.
using HostAndPort = TextBuffer<HostName::capacity + 16>;
HostAndPort host_and_port(const RunLocation& location);

std::string_view scheme_of(const RunLocation& location);
unsigned default_port(const RunLocation& location);

// Whether two locations have the same scheme, host and port.
bool is_same_server(const RunLocation& a, const RunLocation& b);

}  // namespace zv

#endif
