// The socket that an encrypted stream reads and writes. OpenSSL's own sockets raise SIGPIPE.
#include <openssl/bio.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <climits>

#include "platform/openssl/stream.h"

namespace zv::platform {

namespace {

EncryptedStream& stream_of(BIO* bio) {
  return *static_cast<EncryptedStream*>(BIO_get_data(bio));
}

bool has_to_wait() {
  return errno == EAGAIN || errno == EWOULDBLOCK;
}

template <class Call>
ssize_t uninterrupted(Call call) {
  ssize_t result = call();
  while (result == -1 && errno == EINTR) result = call();
  return result;
}

int send_bytes(BIO* bio, const char* data, size_t size, size_t* sent) {
  BIO_clear_retry_flags(bio);
  const ssize_t result =
      uninterrupted([&] { return send(stream_of(bio).socket, data, size, MSG_NOSIGNAL); });
  if (result == -1 && has_to_wait()) BIO_set_retry_write(bio);
  *sent = static_cast<size_t>(std::max<ssize_t>(result, 0));
  return result > 0;
}

int receive_bytes(BIO* bio, char* room, size_t size, size_t* received) {
  BIO_clear_retry_flags(bio);
  EncryptedStream& stream = stream_of(bio);
  const ssize_t result = uninterrupted([&] { return recv(stream.socket, room, size, 0); });
  if (result == -1 && has_to_wait()) BIO_set_retry_read(bio);
  *received = static_cast<size_t>(std::max<ssize_t>(result, 0));
  if (result > 0 && !stream.heard) {
    stream.heard = true;
    stream.is_tls = room[0] == SSL3_RT_HANDSHAKE || room[0] == SSL3_RT_ALERT;
  }
  return result > 0;
}

// Nothing lies between the stream and its socket that could be flushed.
long control(BIO*, int command, long, void*) {
  return command == BIO_CTRL_FLUSH ? 1 : 0;
}

int prepare(BIO* bio) {
  BIO_set_init(bio, 1);
  return 1;
}

}  // namespace

OpensslPtr<BIO_METHOD> make_transport() {
  OpensslPtr<BIO_METHOD> method(BIO_meth_new(BIO_TYPE_SOURCE_SINK, "zarvo socket"));
  const bool complete = method != nullptr && BIO_meth_set_create(method.get(), prepare) == 1 &&
                        BIO_meth_set_write_ex(method.get(), send_bytes) == 1 &&
                        BIO_meth_set_read_ex(method.get(), receive_bytes) == 1 &&
                        BIO_meth_set_ctrl(method.get(), control) == 1;
  if (!complete) method.reset();
  return method;
}

}  // namespace zv::platform
