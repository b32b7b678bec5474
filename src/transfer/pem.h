// The certificates of a PEM file (RFC 7468).
#ifndef ZARVO_TRANSFER_PEM_H
#define ZARVO_TRANSFER_PEM_H

#include <cstddef>
#include <string_view>

namespace zv {

// Writes what the blocks "CERTIFICATE" of a text hold, one after another, to the room, which has as
// many bytes as the text; other blocks and what stands between them are passed over. Gives the
// number of bytes; 0 for no certificate, and for a block that is not whole.
size_t decode_certificates(std::string_view text, unsigned char* room);

}  // namespace zv

#endif
