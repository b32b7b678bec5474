// A context and a stream of the table in platform/encryption.h, as Schannel has them.
#ifndef ZARVO_PLATFORM_SCHANNEL_STREAM_H
#define ZARVO_PLATFORM_SCHANNEL_STREAM_H

#include <winsock2.h>

#define SECURITY_WIN32
#define SCHANNEL_USE_BLACKLISTS  // the system's name for what knows of TLS 1.3
#include <winternl.h>

#include <schannel.h>
#include <security.h>

#include <algorithm>
#include <cstring>

#include "frame/owner.h"
#include "platform/encryption.h"
#include "platform/encryption_reason.h"

namespace zv::platform {

// The first byte of a record, RFC 5246 6.2.1.
constexpr char record_alert = 21;
constexpr char record_handshake = 22;

struct EncryptionContext {
  EncryptionContext();
  ~EncryptionContext();
  EncryptionContext(const EncryptionContext&) = delete;
  EncryptionContext& operator=(const EncryptionContext&) = delete;

  CredHandle credentials;        // the system keeps sessions with them
  HCERTSTORE trusted = nullptr;  // nullptr: the system's
  HCERTCHAINENGINE engine = nullptr;
};

// Bytes between the socket and the stream, in room that is made once.
class Bytes {
 public:
  bool allocate(size_t size) {
    room_.reset(static_cast<char*>(std::malloc(size)));
    capacity_ = room_ != nullptr ? size : 0;
    return room_ != nullptr;
  }
  size_t capacity() const { return capacity_; }
  char* front() const { return room_.get() + front_; }
  size_t size() const { return end_ - front_; }
  char* back() const { return room_.get() + end_; }
  size_t space() const { return capacity_ - end_; }

  void take(size_t count) { front_ += count; }
  void add(size_t count) { end_ += count; }
  void clear() { front_ = end_ = 0; }
  // Leaves only the last `count` bytes.
  void keep_last(size_t count) { front_ = end_ - std::min(count, size()); }
  void move_to_start() {
    std::memmove(room_.get(), front(), size());
    end_ -= front_;
    front_ = 0;
  }

 private:
  HeapPtr<char[]> room_;
  size_t capacity_ = 0, front_ = 0, end_ = 0;
};

struct EncryptedStream {
  EncryptedStream(EncryptionContext& shared, intptr_t handle)
      : context(shared), socket(static_cast<SOCKET>(handle)) {}
  ~EncryptedStream() {
    if (negotiating) DeleteSecurityContext(&security);
  }
  EncryptedStream(const EncryptedStream&) = delete;
  EncryptedStream& operator=(const EncryptedStream&) = delete;

  EncryptionContext& context;
  const SOCKET socket;
  HostName host;
  CtxtHandle security = {};
  bool heard = false;        // something has arrived
  bool negotiating = false;  // `security` is there
  bool agreed = false;       // the handshake is done
  bool needs_more = true;    // what has arrived is no whole message
  bool tls_1_3 = false;
  SecPkgContext_StreamSizes sizes = {};
  Bytes arrived;                // from the socket, not yet decrypted
  const char* plain = nullptr;  // decrypted in place, before what has arrived
  size_t plain_size = 0;
  Bytes leaving;                                // encrypted, not yet sent
  size_t leaving_plain = 0;                     // how many bytes of the caller's that stands for
  bool finishing = false;                       // the end is announced
  EncryptionStep state = EncryptionStep::done;  // how it ended, once it has
  Reason reason;
};

EncryptionStep fail(EncryptedStream& stream, std::string_view fault);
EncryptionStep fail(EncryptedStream& stream, SECURITY_STATUS status);

extern const Encryption schannel;

// ---- handshake.cpp
// -------------------------------------------------------------------------------

// What has arrived, to the system's negotiation, and its answer into what is leaving; with nothing
// arrived where the stream begins or announces its end. Done when nothing more is expected.
EncryptionStep negotiate(EncryptedStream& stream);

// Sends what is leaving; receives what there is room for, at least a byte when done.
EncryptionStep flush(EncryptedStream& stream);
EncryptionStep fill(EncryptedStream& stream);

// ---- certificate.cpp
// -----------------------------------------------------------------------------

// The certificates to trust in place of the system's; see platform/encryption.h.
bool trust(EncryptionContext& context, const unsigned char* certificates, size_t size);

// Done when the server's certificate is one to trust and holds the host's name or address.
EncryptionStep judge_certificate(EncryptedStream& stream);

}  // namespace zv::platform

#endif
