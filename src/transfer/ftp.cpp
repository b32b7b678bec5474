// The FTP dialogue of zv_copy().
#include "transfer/ftp.h"

#include "transfer/body.h"
#include "transfer/connection.h"
#include "transfer/dialogue.h"
#include "transfer/number.h"
#include "transfer/reply.h"

namespace zv {

namespace {

std::string_view or_default(const PathBuffer& text, std::string_view standard) {
  return text.empty() ? standard : text.view();
}

// A server may do without the password, or without the user.
bool log_in(const Dialogue& server, const Location& location) {
  int code = server.read_reply();
  if (code == 220) code = server.send_command({"USER ", or_default(location.user, "anonymous")});
  if (code == 331)
    code = server.send_command({"PASS ", or_default(location.password, "zarvo@zarvo.test")});
  return code == 230;
}

// The data connection goes wherever the reply says.
bool open_data(Connection& connection, const Dialogue& server) {
  platform::Address address;
  unsigned port = 0;
  return server.send_command({"TYPE I"}) == 200 && server.send_command({"PASV"}) == 227 &&
         connection.data.open() && parse_pasv(server.reply(), address, port) &&
         platform::socket_connect(connection.data.get(), address, port);
}

bool begin(Connection& connection, const Dialogue& server, const Location& location) {
  return log_in(server, location) && open_data(connection, server);
}

// The server takes the closed data connection for the end of a stored file.
bool finish(Connection& connection, const Dialogue& server) {
  connection.data.close();
  return server.read_reply() == 226 && server.send_command({"QUIT"}) == 221;
}

// The bytes that a 150 reply announces, "(1234 bytes)"; 0 for none.
int64_t announced_size(std::string_view reply) {
  const size_t bracket = reply.find('(');
  if (bracket == std::string_view::npos) return 0;
  reply.remove_prefix(bracket + 1);
  int64_t size = 0;
  return take_number(reply, size) ? size : 0;
}

int retrieve(Connection& connection, const Location& source) {
  const Dialogue server(connection);
  if (!begin(connection, server, source) ||
      server.send_command({"RETR ", source.path.view()}) != 150)
    return source_failed;
  const int64_t size = announced_size(server.reply());
  if (size <= 0) return source_failed;
  const int result =
      recv_to_file(connection.data.get(), connection.file.get(), connection.buffer.block(), size);
  return result != copied || finish(connection, server) ? result : source_failed;
}

int store(Connection& connection, const Location& destination) {
  const Dialogue server(connection);
  if (!begin(connection, server, destination) ||
      server.send_command({"STOR ", destination.path.view()}) != 150)
    return destination_failed;
  const int result = send_from_file(connection.data.get(), connection.file.get(),
                                    connection.buffer.block(), connection.size);
  return result != copied || finish(connection, server) ? result : destination_failed;
}

}  // namespace

int ftp_download(const Location& source, const char* local) {
  return download_over(source, local,
                       [&](Connection& connection) { return retrieve(connection, source); });
}

int ftp_upload(const char* local, const Location& destination) {
  return upload_over(local, destination,
                     [&](Connection& connection) { return store(connection, destination); });
}

}  // namespace zv
