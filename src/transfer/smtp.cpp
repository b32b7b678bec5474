// The mail dialogue of zv_copy().
#include "transfer/smtp.h"

#include "transfer/base64.h"
#include "transfer/body.h"
#include "transfer/connection.h"
#include "transfer/dialogue.h"
#include "transfer/mail_message.h"

namespace zv {

namespace {

// Answers a server's challenge; a value that memory ran out for is the local side's failure.
int answer(const Dialogue& server, const HeapPtr<char>& value, int accepted) {
  if (value == nullptr) return source_failed;
  return server.send_command({value.get()}) == accepted ? copied : destination_failed;
}

int log_in(const Dialogue& server, const Location& location) {
  if (server.send_command({"AUTH LOGIN"}) == 334) {
    const int result = answer(server, base64_text(location.user.view()), 334);
    return result == copied ? answer(server, base64_text(location.password.view()), 235) : result;
  }
  if (server.send_command({"AUTH PLAIN"}) != 334) return destination_failed;
  return answer(server, plain_credentials(location.user.c_str(), location.password.c_str()), 235);
}

// A server that knows no EHLO knows no login.
int begin(const Dialogue& server, const MailMessage& message, const Location& location) {
  const std::string_view host = message.host.view();
  if (server.read_reply() != 220) return destination_failed;
  if (server.send_command({"EHLO ", host}) == 250)
    return location.user.empty() ? copied : log_in(server, location);
  return server.send_command({"HELO ", host}) == 250 ? copied : destination_failed;
}

bool send_envelope(const Dialogue& server, const MailMessage& message, const char* recipient) {
  if (server.send_command({"MAIL FROM:", message.sender.view()}) != 250) return false;
  const int code = server.send_command({"RCPT TO:", recipient});
  return (code == 250 || code == 251) && server.send_command({"DATA"}) == 354;
}

int send_message(const Connection& connection, const MailMessage& message) {
  const platform::Socket socket = connection.control.get();
  if (!send_all(socket, message.head.view())) return destination_failed;
  const int result =
      send_base64_file(socket, connection.file.get(), connection.buffer.block(), connection.size);
  if (result != copied) return result;
  return send_all(socket, message.tail.view()) ? copied : destination_failed;
}

bool finish(const Dialogue& server) {
  return server.read_reply() == 250 && server.send_command({"QUIT"}) == 221;
}

int send(const Connection& connection, const Location& destination, const char* recipient,
         const MailMessage& message) {
  const Dialogue server(connection);
  int result = begin(server, message, destination);
  if (result == copied && !send_envelope(server, message, recipient)) result = destination_failed;
  if (result == copied) result = send_message(connection, message);
  if (result == copied && !finish(server)) result = destination_failed;
  return result;
}

}  // namespace

int smtp_send_file(const char* local, const Location& destination) {
  // The message names the local machine, which the network layer tells.
  const NetworkGuard network;
  if (!network.started()) return destination_failed;
  const char* const recipient = destination.path.c_str() + 1;
  MailMessage message;
  if (!write_message(destination.user.c_str(), local, recipient, message)) return source_failed;
  return upload_over(local, destination, [&](const Connection& connection) {
    return send(connection, destination, recipient, message);
  });
}

}  // namespace zv
