// Encryption: the system's own.
#include "platform/encryption.h"

#include "platform/schannel/stream.h"

namespace zv::platform {

const Encryption* encryption() {
  return &schannel;
}

const char* const encryption_missing = "this system has no encryption";

}  // namespace zv::platform
