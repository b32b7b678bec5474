// A context and a stream of the table in platform/encryption.h, as OpenSSL has them.
#ifndef ZARVO_PLATFORM_OPENSSL_STREAM_H
#define ZARVO_PLATFORM_OPENSSL_STREAM_H

#include <openssl/ssl.h>
#include <openssl/x509v3.h>

#include <memory>

#include "platform/encryption.h"
#include "platform/encryption_reason.h"

namespace zv::platform {

struct FreeOpenssl {
  void operator()(SSL_CTX* settings) const { SSL_CTX_free(settings); }
  void operator()(SSL* stream) const { SSL_free(stream); }
  void operator()(SSL_SESSION* session) const { SSL_SESSION_free(session); }
  void operator()(BIO_METHOD* method) const { BIO_meth_free(method); }
  void operator()(X509* certificate) const { X509_free(certificate); }
  void operator()(GENERAL_NAMES* names) const { GENERAL_NAMES_free(names); }
};

template <class T>
using OpensslPtr = std::unique_ptr<T, FreeOpenssl>;

struct EncryptionContext {
  OpensslPtr<BIO_METHOD> transport;
  OpensslPtr<SSL_CTX> settings;
  OpensslPtr<SSL_SESSION> session;  // the last one, with the host that it belongs to
  HostName session_host;
};

struct EncryptedStream {
  EncryptionContext& context;
  const int socket;
  HostName host = {};
  OpensslPtr<SSL> ssl = nullptr;
  EncryptionStep state = EncryptionStep::done;  // how it ended, once it has
  bool is_tls = true;       // as far as the first byte that the server sent tells
  bool heard = false;       // that byte
  bool negotiates = false;  // the server wants a second handshake
  Reason reason = {};
};

inline EncryptedStream& stream_of(const SSL* ssl) {
  return *static_cast<EncryptedStream*>(SSL_get_app_data(ssl));
}

// ---- transport.cpp: the socket
// -------------------------------------------------------------------

OpensslPtr<BIO_METHOD> make_transport();

// ---- reason.cpp: what went wrong
// -----------------------------------------------------------------

// OpenSSL's look at each certificate of the chain: keeps the reason of the first that it refuses.
int judge_certificate(int accepted, X509_STORE_CTX* chain);

// The reason of a failed step that has none yet, from OpenSSL's errors of this thread.
void tell_failure(EncryptedStream& stream);

}  // namespace zv::platform

#endif
