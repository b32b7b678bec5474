#include "transfer/smtp.h"

#include "transfer/base64.h"
#include "transfer/connection.h"
#include "transfer/dialogue.h"
#include "transfer/letter.h"
#include "transfer/pump.h"

namespace zv {

namespace {

HeapPtr<char> encoded(std::string_view text) {
  const auto* const bytes = reinterpret_cast<const unsigned char*>(text.data());
  return HeapPtr<char>(base64_encode(bytes, text.size(), nullptr));
}

// Answers a server's challenge; a value that memory ran out for is the local side's failure.
int answer(const Dialogue& server, const HeapPtr<char>& value, int accepted) {
  if (value == nullptr) return source_failed;
  return server.ask({value.get()}) == accepted ? copied : destination_failed;
}

int log_in(const Dialogue& server, const char* user, const char* password) {
  if (server.ask({"AUTH LOGIN"}) == 334) {
    const int result = answer(server, encoded(user), 334);
    return result == copied ? answer(server, encoded(password), 235) : result;
  }
  if (server.ask({"AUTH PLAIN"}) != 334) return destination_failed;
  return answer(server, plain_credentials(user, password), 235);
}

// A server that knows no EHLO knows no login.
int begin(const Dialogue& server, const Letter& letter, const char* user, const char* password) {
  const std::string_view host = letter.host.view();
  if (server.hear() != 220) return destination_failed;
  if (server.ask({"EHLO ", host}) == 250)
    return *user != '\0' ? log_in(server, user, password) : copied;
  return server.ask({"HELO ", host}) == 250 ? copied : destination_failed;
}

bool send_envelope(const Dialogue& server, const Letter& letter, const char* recipient) {
  if (server.ask({"MAIL FROM:", letter.sender.view()}) != 250) return false;
  const int code = server.ask({"RCPT TO:", recipient});
  return (code == 250 || code == 251) && server.ask({"DATA"}) == 354;
}

int send_message(const Connection& connection, const Letter& letter, int64_t size) {
  const platform::Socket socket = connection.control.get();
  if (!send_all(socket, letter.head.view())) return destination_failed;
  const int result =
      send_base64_file(socket, connection.file.get(), connection.buffer.block(), size);
  if (result != copied) return result;
  return send_all(socket, letter.tail.view()) ? copied : destination_failed;
}

bool finish(const Dialogue& server) {
  return server.hear() == 250 && server.ask({"QUIT"}) == 221;
}

}  // namespace

int smtp_send_file(const platform::Address& addr, unsigned port, const char* user,
                   const char* password, const char* local, const char* recipient) {
  Connection connection(Direction::upload);
  if (!connection.network.started()) return destination_failed;
  Letter letter;
  int64_t size = 0;
  if (!write_letter(user, local, recipient, letter)) return source_failed;
  if (!open_source(local, connection.file, size)) return source_failed;

  const Dialogue server(connection);
  int result = connection.open(addr, port);
  if (result == copied) result = begin(server, letter, user, password);
  if (result == copied && !send_envelope(server, letter, recipient)) result = destination_failed;
  if (result == copied) result = send_message(connection, letter, size);
  if (result == copied && !finish(server)) result = destination_failed;
  return result;
}

}  // namespace zv
