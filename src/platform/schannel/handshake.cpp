// The messages of the handshake, and the bytes between a stream and its socket.
#include "platform/schannel/stream.h"

#include <cstdio>

namespace zv::platform {

namespace {

constexpr unsigned long wanted_security =
    ISC_REQ_CONFIDENTIALITY | ISC_REQ_SEQUENCE_DETECT | ISC_REQ_REPLAY_DETECT | ISC_REQ_STREAM |
    ISC_REQ_ALLOCATE_MEMORY | ISC_REQ_EXTENDED_ERROR | ISC_REQ_USE_SUPPLIED_CREDS;

// What the system wants sent, which it made itself.
struct Answer {
  Answer() = default;
  ~Answer() {
    if (token.pvBuffer != nullptr) FreeContextBuffer(token.pvBuffer);
  }
  Answer(const Answer&) = delete;
  Answer& operator=(const Answer&) = delete;

  SecBuffer token = {0, SECBUFFER_TOKEN, nullptr};
};

bool put(Bytes& leaving, const Answer& answer) {
  const size_t size = answer.token.pvBuffer != nullptr ? answer.token.cbBuffer : 0;
  if (leaving.size() == 0) leaving.clear();
  if (size > leaving.space()) return false;
  if (size > 0) std::memcpy(leaving.back(), answer.token.pvBuffer, size);
  leaving.add(size);
  return true;
}

// Whether a server that cannot be spoken with speaks an older version only: it says so in an alert,
// or it has chosen one.
bool is_old(const Bytes& arrived) {
  enum : unsigned char { server_hello = 2, protocol_version = 70 };
  const auto byte = [&](size_t i) {
    return i < arrived.size() ? static_cast<unsigned char>(arrived.front()[i]) : 0U;
  };
  return (byte(0) == record_alert && byte(6) == protocol_version) ||
         (byte(0) == record_handshake && byte(5) == server_hello && byte(10) < 3);
}

// A handshake that does not come about; the alert that says so goes out as far as it can.
EncryptionStep refuse(EncryptedStream& stream, SECURITY_STATUS status) {
  flush(stream);
  return !stream.agreed && is_old(stream.arrived) ? fail(stream, old_version)
                                                  : fail(stream, status);
}

}  // namespace

EncryptionStep fail(EncryptedStream& stream, std::string_view fault) {
  if (stream.reason.empty()) tell_conversation(stream.reason, stream.host, fault);
  return stream.state = EncryptionStep::failed;
}

EncryptionStep fail(EncryptedStream& stream, SECURITY_STATUS status) {
  TextBuffer<32> fault;
  const auto write = [&](char* room, size_t size) {
    return std::snprintf(room, size, "error 0x%08lX", static_cast<unsigned long>(status)) > 0;
  };
  (void)fault.fill(write);
  return fail(stream, fault.view());
}

EncryptionStep flush(EncryptedStream& stream) {
  Bytes& leaving = stream.leaving;
  while (leaving.size() > 0) {
    const int sent = send(stream.socket, leaving.front(), static_cast<int>(leaving.size()), 0);
    if (sent < 0 && WSAGetLastError() == WSAEWOULDBLOCK) return EncryptionStep::wants_to_write;
    if (sent < 0) return stream.state = EncryptionStep::cut;
    leaving.take(static_cast<size_t>(sent));
  }
  leaving.clear();
  return EncryptionStep::done;
}

EncryptionStep fill(EncryptedStream& stream) {
  Bytes& arrived = stream.arrived;
  constexpr size_t record = 20 * size_t{1024};  // the longest
  if (arrived.space() < record) arrived.move_to_start();
  if (arrived.space() == 0) return fail(stream, "a message is too long");
  const int count = recv(stream.socket, arrived.back(), static_cast<int>(arrived.space()), 0);
  if (count < 0 && WSAGetLastError() == WSAEWOULDBLOCK) return EncryptionStep::wants_to_read;
  if (count <= 0) return stream.state = EncryptionStep::cut;
  const char kind = *arrived.back();
  if (!stream.heard && kind != record_alert && kind != record_handshake)
    return fail(stream, not_encrypted);
  arrived.add(static_cast<size_t>(count));
  stream.heard = true;
  stream.needs_more = false;
  return EncryptionStep::done;
}

EncryptionStep negotiate(EncryptedStream& stream) {
  Bytes& arrived = stream.arrived;
  SecBuffer in[] = {{static_cast<unsigned long>(arrived.size()), SECBUFFER_TOKEN, arrived.front()},
                    {0, SECBUFFER_EMPTY, nullptr}};
  SecBufferDesc input = {SECBUFFER_VERSION, 2, in};
  Answer answer;
  SecBufferDesc output = {SECBUFFER_VERSION, 1, &answer.token};
  unsigned long got = 0;
  const bool begins = !stream.negotiating;
  const bool listens = !begins && !stream.finishing;
  const SECURITY_STATUS status = InitializeSecurityContextA(
      &stream.context.credentials, begins ? nullptr : &stream.security,
      const_cast<char*>(stream.host.c_str()), wanted_security, 0, 0, listens ? &input : nullptr, 0,
      begins ? &stream.security : nullptr, &output, &got, nullptr);
  if (status == SEC_E_INCOMPLETE_MESSAGE) {
    stream.needs_more = true;
    return EncryptionStep::wants_to_read;
  }
  if (!put(stream.leaving, answer)) return fail(stream, "a message is too long");
  if (FAILED(status)) return refuse(stream, status);
  stream.negotiating = true;
  // The server asks who we are: the same message again says that we do not tell.
  if (status == SEC_I_INCOMPLETE_CREDENTIALS) return EncryptionStep::wants_to_read;
  if (listens) arrived.keep_last(in[1].BufferType == SECBUFFER_EXTRA ? in[1].cbBuffer : 0);
  stream.needs_more = arrived.size() == 0;
  return status == SEC_I_CONTINUE_NEEDED ? EncryptionStep::wants_to_read : EncryptionStep::done;
}

}  // namespace zv::platform
