// Location texts, taken apart: where a copy reads from or writes to.
#ifndef ZARVO_TRANSFER_LOCATION_H
#define ZARVO_TRANSFER_LOCATION_H

#include "frame/text_buffer.h"
#include "platform/platform.h"

namespace zv {

enum LocationKind { LOC_NONE, LOC_FILE, LOC_FTP, LOC_HTTP, LOC_SMTP };

struct Location {
  LocationKind kind = LOC_NONE;
  platform::Address addr = {};
  unsigned port = 0;  // in host order
  PathBuffer user;
  PathBuffer password;
  PathBuffer path;  // begins with "/" for a network kind
};

// Takes a location text apart; host names are looked up. Gives the kind, which stands in the
// location too; LOC_NONE, for a text that is not usable, leaves the rest of it undefined. No text
// of a network kind holds CR or LF, so none can add a line to a dialogue.
LocationKind parse_location(const char* text, Location& location);

}  // namespace zv

#endif
