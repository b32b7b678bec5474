// libzarvo_tls.so.1: the table of platform/encryption.h over OpenSSL 3.
#include <openssl/err.h>
#include <openssl/x509v3.h>

#include <cstdlib>
#include <new>

#include "platform/openssl/stream.h"

namespace zv::platform {

namespace {

// ---- contexts
// ------------------------------------------------------------------------------------

bool trust(SSL_CTX* settings, const unsigned char* certificates, size_t size) {
  if (size == 0) return SSL_CTX_set_default_verify_paths(settings) == 1;
  X509_STORE* const store = SSL_CTX_get_cert_store(settings);
  const unsigned char* const end = certificates + size;
  while (certificates != end) {
    const OpensslPtr<X509> next(
        d2i_X509(nullptr, &certificates, static_cast<long>(end - certificates)));
    if (next == nullptr || X509_STORE_add_cert(store, next.get()) != 1) return false;
  }
  // What a person names to be trusted need not be a root.
  return X509_STORE_set_flags(store, X509_V_FLAG_PARTIAL_CHAIN) == 1;
}

int keep_session(SSL* ssl, SSL_SESSION* session) {
  const EncryptedStream& stream = stream_of(ssl);
  stream.context.session.reset(session);
  stream.context.session_host = stream.host;
  return 1;  // it is ours now
}

// OpenSSL refuses a second handshake by itself, with a warning, and would go on.
void watch_negotiation(const SSL* ssl, int where, int alert) {
  if (where == SSL_CB_WRITE_ALERT && (alert & 0xFF) == SSL_AD_NO_RENEGOTIATION)
    stream_of(ssl).negotiates = true;
}

bool configure(SSL_CTX* settings) {
  constexpr size_t records = 16;  // that one call of the system may bring
  SSL_CTX_set_verify(settings, SSL_VERIFY_PEER, judge_certificate);
  SSL_CTX_set_options(settings, SSL_OP_NO_RENEGOTIATION);
  SSL_CTX_set_mode(settings, SSL_MODE_ENABLE_PARTIAL_WRITE | SSL_MODE_ACCEPT_MOVING_WRITE_BUFFER);
  SSL_CTX_set_read_ahead(settings, 1);
  SSL_CTX_set_default_read_buffer_len(settings, records * SSL3_RT_MAX_PACKET_SIZE);
  SSL_CTX_set_session_cache_mode(settings, SSL_SESS_CACHE_CLIENT | SSL_SESS_CACHE_NO_INTERNAL);
  SSL_CTX_sess_set_new_cb(settings, keep_session);
  SSL_CTX_set_info_callback(settings, watch_negotiation);
  return SSL_CTX_set_min_proto_version(settings, TLS1_2_VERSION) == 1;
}

void context_close(EncryptionContext* context) {
  context->~EncryptionContext();
  std::free(context);
}

EncryptionContext* context_open(const unsigned char* certificates, size_t size) {
  void* const room = std::malloc(sizeof(EncryptionContext));
  if (room == nullptr) return nullptr;
  auto* const context = new (room) EncryptionContext();
  context->transport = make_transport();
  context->settings.reset(SSL_CTX_new(TLS_client_method()));
  if (context->transport != nullptr && context->settings != nullptr &&
      configure(context->settings.get()) && trust(context->settings.get(), certificates, size))
    return context;
  context_close(context);
  return nullptr;
}

// ---- streams
// -------------------------------------------------------------------------------------

void close(EncryptedStream* stream) {
  stream->~EncryptedStream();
  std::free(stream);
}

// An address must stand in the certificate as an address; a name is also told to the server.
bool expect_host(SSL* ssl, const char* host) {
  if (X509_VERIFY_PARAM_set1_ip_asc(SSL_get0_param(ssl), host) == 1) return true;
  SSL_set_hostflags(ssl,
                    X509_CHECK_FLAG_NEVER_CHECK_SUBJECT | X509_CHECK_FLAG_NO_PARTIAL_WILDCARDS);
  return SSL_set1_host(ssl, host) == 1 && SSL_set_tlsext_host_name(ssl, host) == 1;
}

// The session that the stream may use again: one with the same host, whose certificate was good.
bool use_session(SSL* ssl, const EncryptionContext& context, const HostName& host,
                 const EncryptedStream* like) {
  SSL_SESSION* session = nullptr;
  if (like != nullptr && like->host.view() == host.view())
    session = SSL_get_session(like->ssl.get());
  if (like == nullptr && context.session_host.view() == host.view())
    session = context.session.get();
  if (session == nullptr || SSL_SESSION_is_resumable(session) != 1) return true;
  return SSL_set_session(ssl, session) == 1;
}

bool attach(EncryptedStream& stream, const char* host, const EncryptedStream* like) {
  if (!stream.host.assign(host) || stream.host.empty()) return false;
  if (stream.host.back() == '.') stream.host.shorten(stream.host.size() - 1);
  stream.ssl.reset(SSL_new(stream.context.settings.get()));
  BIO* const bio = BIO_new(stream.context.transport.get());
  SSL* const ssl = stream.ssl.get();
  if (ssl == nullptr || bio == nullptr) {
    BIO_free(bio);
    return false;
  }
  BIO_set_data(bio, &stream);
  SSL_set_bio(ssl, bio, bio);
  SSL_set_connect_state(ssl);
  return SSL_set_app_data(ssl, &stream) == 1 && expect_host(ssl, stream.host.c_str()) &&
         use_session(ssl, stream.context, stream.host, like);
}

EncryptedStream* open(EncryptionContext* context, intptr_t socket, const char* host,
                      const EncryptedStream* like) {
  void* const room = std::malloc(sizeof(EncryptedStream));
  if (room == nullptr) return nullptr;
  auto* const stream = new (room) EncryptedStream{*context, static_cast<int>(socket)};
  ERR_clear_error();
  if (attach(*stream, host, like)) return stream;
  close(stream);
  return nullptr;
}

EncryptionStep fail(EncryptedStream& stream) {
  tell_failure(stream);
  return stream.state = EncryptionStep::failed;
}

// What a call that did not succeed came to. An end is final.
EncryptionStep outcome(EncryptedStream& stream, int result) {
  if (stream.negotiates) {
    tell_conversation(stream.reason, stream.host, second_handshake);
    return fail(stream);
  }
  switch (SSL_get_error(stream.ssl.get(), result)) {
    case SSL_ERROR_WANT_READ:
      return EncryptionStep::wants_to_read;
    case SSL_ERROR_WANT_WRITE:
      return EncryptionStep::wants_to_write;
    case SSL_ERROR_ZERO_RETURN:
      return stream.state = EncryptionStep::ended;
    case SSL_ERROR_SYSCALL:
      return stream.state = EncryptionStep::cut;
    default:
      return fail(stream);
  }
}

// One call of OpenSSL, which leaves its errors to the thread.
template <class Call>
EncryptionStep step(EncryptedStream& stream, Call call) {
  if (stream.state != EncryptionStep::done) return stream.state;
  ERR_clear_error();
  const int result = call(stream.ssl.get());
  return result > 0 && !stream.negotiates ? EncryptionStep::done : outcome(stream, result);
}

EncryptionStep handshake(EncryptedStream* stream) {
  return step(*stream, SSL_do_handshake);
}

// OpenSSL gives one record at a time.
EncryptionStep read(EncryptedStream* stream, char* room, size_t size, size_t* count) {
  EncryptionStep last = EncryptionStep::done;
  *count = 0;
  while (last == EncryptionStep::done && *count < size) {
    size_t more = 0;
    last = step(*stream,
                [&](SSL* ssl) { return SSL_read_ex(ssl, room + *count, size - *count, &more); });
    *count += more;
  }
  const bool good = *count > 0 && last != EncryptionStep::failed;
  return good ? EncryptionStep::done : last;
}

EncryptionStep write(EncryptedStream* stream, const char* data, size_t size, size_t* count) {
  return step(*stream, [&](SSL* ssl) { return SSL_write_ex(ssl, data, size, count); });
}

EncryptionStep finish(EncryptedStream* stream) {
  if (stream->state == EncryptionStep::ended) stream->state = EncryptionStep::done;
  // 0 is sent, but not yet answered.
  return step(*stream, [](SSL* ssl) {
    const int result = SSL_shutdown(ssl);
    return result == 0 ? 1 : result;
  });
}

const char* reason(const EncryptedStream* stream) {
  return stream->reason.c_str();
}

}  // namespace

}  // namespace zv::platform

// The one name that the library exports.
extern "C" {
__attribute__((visibility("default"))) extern const zv::platform::Encryption zarvo_encryption;
}

const zv::platform::Encryption zarvo_encryption = {
    .version = zv::platform::encryption_version,
    .context_open = zv::platform::context_open,
    .context_close = zv::platform::context_close,
    .open = zv::platform::open,
    .close = zv::platform::close,
    .handshake = zv::platform::handshake,
    .read = zv::platform::read,
    .write = zv::platform::write,
    .finish = zv::platform::finish,
    .reason = zv::platform::reason,
};
