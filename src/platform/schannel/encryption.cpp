// The table of platform/encryption.h over the system's Schannel.
#include <cstdlib>
#include <new>

#include "platform/schannel/stream.h"

namespace zv::platform {

EncryptionContext::EncryptionContext() {
  SecInvalidateHandle(&credentials);
}

EncryptionContext::~EncryptionContext() {
  if (SecIsValidHandle(&credentials)) FreeCredentialsHandle(&credentials);
  if (engine != nullptr) CertFreeCertificateChainEngine(engine);
  if (trusted != nullptr) CertCloseStore(trusted, 0);
}

namespace {

// ---- contexts
// ------------------------------------------------------------------------------------

// The certificate is looked at here and not by the system's own rules, which know of no trust file.
constexpr DWORD credential_flags =
    SCH_CRED_MANUAL_CRED_VALIDATION | SCH_CRED_NO_DEFAULT_CREDS | SCH_USE_STRONG_CRYPTO;

bool acquire(EncryptionContext& context, void* wanted) {
  char package[] = UNISP_NAME_A;
  return AcquireCredentialsHandleA(nullptr, package, SECPKG_CRED_OUTBOUND, nullptr, wanted, nullptr,
                                   nullptr, &context.credentials, nullptr) == SEC_E_OK;
}

bool acquire_credentials(EncryptionContext& context) {
  TLS_PARAMETERS versions = {};
  versions.grbitDisabledProtocols =
      SP_PROT_SSL2_CLIENT | SP_PROT_SSL3_CLIENT | SP_PROT_TLS1_0_CLIENT | SP_PROT_TLS1_1_CLIENT;
  SCH_CREDENTIALS wanted = {};
  wanted.dwVersion = SCH_CREDENTIALS_VERSION;
  wanted.dwFlags = credential_flags;
  wanted.cTlsParameters = 1;
  wanted.pTlsParameters = &versions;
  if (acquire(context, &wanted)) return true;
  // A system that does not know TLS 1.3 does not know the record either.
  SCHANNEL_CRED older = {};
  older.dwVersion = SCHANNEL_CRED_VERSION;
  older.dwFlags = credential_flags;
  older.grbitEnabledProtocols = SP_PROT_TLS1_2_CLIENT;
  return acquire(context, &older);
}

template <class T>
void release(T* object) {
  object->~T();
  std::free(object);
}

EncryptionContext* context_open(const unsigned char* certificates, size_t size) {
  void* const room = std::malloc(sizeof(EncryptionContext));
  if (room == nullptr) return nullptr;
  auto* const context = new (room) EncryptionContext();
  if (acquire_credentials(*context) && trust(*context, certificates, size)) return context;
  release(context);
  return nullptr;
}

// ---- streams
// -------------------------------------------------------------------------------------

// Longer than any record, so that several arrive in one call of the system.
constexpr size_t room_to_receive = 256 * size_t{1024};
constexpr size_t room_to_send = 32 * size_t{1024};

// The system finds a session to use again by itself, by the credentials and the host's name.
EncryptedStream* open(EncryptionContext* context, intptr_t socket, const char* host,
                      const EncryptedStream*) {
  void* const room = std::malloc(sizeof(EncryptedStream));
  if (room == nullptr) return nullptr;
  auto* const stream = new (room) EncryptedStream(*context, socket);
  const bool good = stream->host.assign(host) && !stream->host.empty() &&
                    stream->arrived.allocate(room_to_receive) &&
                    stream->leaving.allocate(room_to_send);
  if (good && stream->host.back() == '.') stream->host.shorten(stream->host.size() - 1);
  if (good) return stream;
  release(stream);
  return nullptr;
}

EncryptionStep begin(EncryptedStream& stream) {
  SecPkgContext_ConnectionInfo info = {};
  SECURITY_STATUS status =
      QueryContextAttributesA(&stream.security, SECPKG_ATTR_CONNECTION_INFO, &info);
  if (status == SEC_E_OK)
    status = QueryContextAttributesA(&stream.security, SECPKG_ATTR_STREAM_SIZES, &stream.sizes);
  if (status != SEC_E_OK) return fail(stream, status);
  stream.tls_1_3 = (info.dwProtocol & SP_PROT_TLS1_3_CLIENT) != 0;
  if (!stream.tls_1_3 && (info.dwProtocol & SP_PROT_TLS1_2_CLIENT) == 0)
    return fail(stream, old_version);
  const size_t largest =
      size_t{stream.sizes.cbHeader} + stream.sizes.cbMaximumMessage + stream.sizes.cbTrailer;
  if (largest > room_to_send) return fail(stream, "a message is too long");
  return judge_certificate(stream);
}

EncryptionStep handshake(EncryptedStream* stream) {
  if (stream->state != EncryptionStep::done) return stream->state;
  while (!stream->agreed) {
    EncryptionStep step = flush(*stream);
    if (step == EncryptionStep::done && stream->negotiating && stream->needs_more)
      step = fill(*stream);
    if (step != EncryptionStep::done) return step;
    step = negotiate(*stream);
    if (stream->state != EncryptionStep::done) return stream->state;
    stream->agreed = step == EncryptionStep::done;
  }
  const EncryptionStep step = flush(*stream);
  return step == EncryptionStep::done ? begin(*stream) : step;
}

// Decrypts the next record where it stands. A record may hold no bytes.
SECURITY_STATUS decrypt(EncryptedStream& stream) {
  Bytes& arrived = stream.arrived;
  const bool alert = *arrived.front() == record_alert;
  SecBuffer parts[4] = {
      {static_cast<unsigned long>(arrived.size()), SECBUFFER_DATA, arrived.front()}, {}, {}, {}};
  SecBufferDesc message = {SECBUFFER_VERSION, 4, parts};
  const SECURITY_STATUS status = DecryptMessage(&stream.security, &message, 0, nullptr);
  if (status == SEC_E_INCOMPLETE_MESSAGE) return status;
  size_t extra = 0;
  for (const SecBuffer& part : parts) {
    if (part.BufferType == SECBUFFER_EXTRA) extra = part.cbBuffer;
    if (part.BufferType != SECBUFFER_DATA || status != SEC_E_OK) continue;
    stream.plain = static_cast<const char*>(part.pvBuffer);
    stream.plain_size = part.cbBuffer;
  }
  arrived.keep_last(extra);
  stream.needs_more = extra == 0;
  // Wine has no other word for it.
  const bool announces_end = status == SEC_E_OK && alert && stream.plain_size == 0;
  return announces_end ? SEC_I_CONTEXT_EXPIRED : status;
}

// A message of TLS 1.3 that is no data, such as a session for later or new keys; in TLS 1.2 it is
// the wish for a second handshake.
EncryptionStep answer_message(EncryptedStream& stream) {
  if (!stream.tls_1_3) return fail(stream, second_handshake);
  negotiate(stream);
  return stream.state == EncryptionStep::done ? flush(stream) : stream.state;
}

EncryptionStep decrypt_next(EncryptedStream& stream) {
  if (stream.needs_more) {
    const EncryptionStep step = fill(stream);
    if (step != EncryptionStep::done) return step;
  }
  switch (const SECURITY_STATUS status = decrypt(stream)) {
    case SEC_E_OK:
      return EncryptionStep::done;
    case SEC_E_INCOMPLETE_MESSAGE:
      stream.needs_more = true;
      return EncryptionStep::done;
    case SEC_I_CONTEXT_EXPIRED:
      return stream.state = EncryptionStep::ended;
    case SEC_I_RENEGOTIATE:
      return answer_message(stream);
    default:
      return fail(stream, status);
  }
}

EncryptionStep read(EncryptedStream* stream, char* room, size_t size, size_t* count) {
  *count = 0;
  EncryptionStep step = stream->state;
  while (step == EncryptionStep::done && *count < size) {
    if (stream->plain_size == 0) {
      step = decrypt_next(*stream);
      continue;
    }
    const size_t next = std::min(stream->plain_size, size - *count);
    std::memcpy(room + *count, stream->plain, next);
    stream->plain += next;
    stream->plain_size -= next;
    *count += next;
  }
  const bool good = *count > 0 && step != EncryptionStep::failed;
  return good ? EncryptionStep::done : step;
}

// One record, whose parts lie one after another.
SECURITY_STATUS encrypt(EncryptedStream& stream, const char* data, size_t size) {
  const SecPkgContext_StreamSizes& sizes = stream.sizes;
  char* const room = stream.leaving.back();
  std::memcpy(room + sizes.cbHeader, data, size);
  SecBuffer parts[4] = {{sizes.cbHeader, SECBUFFER_STREAM_HEADER, room},
                        {static_cast<unsigned long>(size), SECBUFFER_DATA, room + sizes.cbHeader},
                        {sizes.cbTrailer, SECBUFFER_STREAM_TRAILER, room + sizes.cbHeader + size},
                        {0, SECBUFFER_EMPTY, nullptr}};
  SecBufferDesc message = {SECBUFFER_VERSION, 4, parts};
  const SECURITY_STATUS status = EncryptMessage(&stream.security, 0, &message, 0);
  if (status == SEC_E_OK)
    stream.leaving.add(size_t{parts[0].cbBuffer} + parts[1].cbBuffer + parts[2].cbBuffer);
  return status;
}

EncryptionStep write(EncryptedStream* stream, const char* data, size_t size, size_t* count) {
  if (stream->state != EncryptionStep::done) return stream->state;
  if (stream->leaving_plain == 0) {
    const EncryptionStep before = flush(*stream);  // what reading has left
    if (before != EncryptionStep::done) return before;
    const size_t next = std::min<size_t>(size, stream->sizes.cbMaximumMessage);
    const SECURITY_STATUS status = encrypt(*stream, data, next);
    if (status != SEC_E_OK) return fail(*stream, status);
    stream->leaving_plain = next;
  }
  const EncryptionStep step = flush(*stream);
  if (step != EncryptionStep::done) return step;
  *count = stream->leaving_plain;
  stream->leaving_plain = 0;
  return EncryptionStep::done;
}

EncryptionStep finish(EncryptedStream* stream) {
  if (!stream->agreed) return EncryptionStep::failed;
  if (stream->state == EncryptionStep::ended) stream->state = EncryptionStep::done;
  if (stream->state != EncryptionStep::done) return stream->state;
  if (!stream->finishing) {
    DWORD command = SCHANNEL_SHUTDOWN;
    SecBuffer parts = {sizeof command, SECBUFFER_TOKEN, &command};
    SecBufferDesc message = {SECBUFFER_VERSION, 1, &parts};
    const SECURITY_STATUS status = ApplyControlToken(&stream->security, &message);
    if (status != SEC_E_OK) return fail(*stream, status);
    stream->finishing = true;
    negotiate(*stream);
  }
  return stream->state == EncryptionStep::done ? flush(*stream) : stream->state;
}

const char* reason(const EncryptedStream* stream) {
  return stream->reason.c_str();
}

}  // namespace

const Encryption schannel = {
    .version = encryption_version,
    .context_open = context_open,
    .context_close = release<EncryptionContext>,
    .open = open,
    .close = release<EncryptedStream>,
    .handshake = handshake,
    .read = read,
    .write = write,
    .finish = finish,
    .reason = reason,
};

}  // namespace zv::platform
