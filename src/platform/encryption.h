// What stands between a transfer and the encryption of its connection: one table of functions. On
// Windows they are the library's own, over the system's Schannel; on Linux they lie in a library of
// their own, over OpenSSL, which is loaded when a location first needs it.
#ifndef ZARVO_PLATFORM_ENCRYPTION_H
#define ZARVO_PLATFORM_ENCRYPTION_H

#include <cstddef>
#include <cstdint>

namespace zv::platform {

// How a step on an encrypted stream ended. No step waits: one that has to is called again with the
// same arguments once the socket is ready. Writing may have to read, and reading to write.
enum class EncryptionStep : int {
  done,
  wants_to_read,
  wants_to_write,
  ended,   // the peer has announced that it sends no more (close_notify)
  cut,     // the connection is closed, or was reset, without such a word
  failed,  // reason() tells why; the stream is of no more use
};

struct EncryptionContext;  // what streams share: the certificates to trust, sessions to use again
struct EncryptedStream;    // one connection's encryption

// Every function may be called from any thread; a context and its streams belong to one thread at a
// time. TLS 1.2 or later; the server's certificate is checked always, its revocation never.
struct Encryption {
  uint32_t version;  // encryption_version; another one is another table

  // `certificates` are those to trust in place of the system's: DER, one after another, copied.
  // With a `size` of 0 it is the system's. nullptr without memory, or where they cannot be used.
  EncryptionContext* (*context_open)(const unsigned char* certificates, size_t size);
  void (*context_close)(EncryptionContext* context);  // after its streams

  // A client's stream over a connected socket that does not block, which stays the caller's. `host`
  // is the name or address that the certificate must hold, an IPv6 address without brackets. A
  // session of `like` is used again where the server agrees (an FTP data connection has to, RFC
  // 4217); with nullptr, that of the context's last stream to the same host. nullptr without
  // memory.
  EncryptedStream* (*open)(EncryptionContext* context, intptr_t socket, const char* host,
                           const EncryptedStream* like);
  void (*close)(EncryptedStream* stream);  // sends nothing

  EncryptionStep (*handshake)(
      EncryptedStream* stream);  // done once; nothing is read or written before
  // `count` is at least 1 when done. A read that has to wait has given all that the socket had.
  EncryptionStep (*read)(EncryptedStream* stream, char* room, size_t size, size_t* count);
  EncryptionStep (*write)(EncryptedStream* stream, const char* data, size_t size, size_t* count);
  EncryptionStep (*finish)(EncryptedStream* stream);  // announces our own end (close_notify)

  // Why a step failed, for a person: "certificate of localhost: expired on 2026-01-01". It may hold
  // what the server sent. Valid until the stream is closed.
  const char* (*reason)(const EncryptedStream* stream);
};

constexpr uint32_t encryption_version = 1;

// The table, kept once it is there; nullptr where it cannot be had, whose reason for a person is
// encryption_missing.
const Encryption* encryption();
extern const char* const encryption_missing;

}  // namespace zv::platform

#endif
