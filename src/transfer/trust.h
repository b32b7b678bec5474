// What a handle trusts: the system's certificates, or those of a file, and what its encrypted
// connections share.
#ifndef ZARVO_TRANSFER_TRUST_H
#define ZARVO_TRANSFER_TRUST_H

#include <cstddef>

#include "frame/owner.h"
#include "platform/encryption.h"

namespace zv {

class Run;

class Trust {
 public:
  Trust() = default;
  ~Trust() { close(); }
  Trust(const Trust&) = delete;
  Trust& operator=(const Trust&) = delete;

  // The certificates of a PEM file from now on. False, and the trust as it was, for a file that
  // cannot be read or holds none.
  [[nodiscard]] bool read(const char* path);
  void forget();  // the system's again

  // Makes ready for encrypted connections, once. False when the run has failed, on the side `code`.
  [[nodiscard]] bool prepare(Run& run, int code);

  // After prepare().
  const platform::Encryption& encryption() const { return *encryption_; }
  platform::EncryptionContext* context() const { return context_; }

 private:
  void close();

  HeapPtr<unsigned char[]> certificates_;
  size_t size_ = 0;
  const platform::Encryption* encryption_ = nullptr;
  platform::EncryptionContext* context_ = nullptr;
};

}  // namespace zv

#endif
