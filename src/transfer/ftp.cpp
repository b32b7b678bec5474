#include "transfer/ftp.h"

#include "transfer/connection.h"
#include "transfer/dialogue.h"
#include "transfer/number.h"
#include "transfer/pump.h"
#include "transfer/reply.h"

namespace zv {

namespace {

const char* or_default(const char* text, const char* standard) {
  return *text != '\0' ? text : standard;
}

// A server may do without the password, or without the user.
bool log_in(const Dialogue& server, const char* user, const char* password) {
  int code = server.hear();
  if (code == 220) code = server.ask({"USER ", or_default(user, "anonymous")});
  if (code == 331) code = server.ask({"PASS ", or_default(password, "zarvo@zarvo.test")});
  return code == 230;
}

// The data connection goes wherever the reply says.
bool open_data(Connection& connection, const Dialogue& server) {
  platform::Address address;
  unsigned port = 0;
  return server.ask({"TYPE I"}) == 200 && server.ask({"PASV"}) == 227 && connection.data.open() &&
         parse_pasv(server.reply(), address, port) &&
         platform::socket_connect(connection.data.get(), address, port);
}

bool begin(Connection& connection, const Dialogue& server, const char* user, const char* password) {
  return log_in(server, user, password) && open_data(connection, server);
}

// The server takes the closed data connection for the end of a stored file.
bool finish(Connection& connection, const Dialogue& server) {
  connection.data.close();
  return server.hear() == 226 && server.ask({"QUIT"}) == 221;
}

// The bytes that a 150 reply announces, "(1234 bytes)"; 0 for none.
int64_t announced_size(std::string_view reply) {
  const size_t bracket = reply.find('(');
  if (bracket == std::string_view::npos) return 0;
  reply.remove_prefix(bracket + 1);
  int64_t size = 0;
  return take_number(reply, size) ? size : 0;
}

int retrieve(Connection& connection, const Dialogue& server, const char* remote) {
  if (server.ask({"RETR ", remote}) != 150) return source_failed;
  const int64_t size = announced_size(server.reply());
  if (size <= 0) return source_failed;
  return recv_to_file(connection.data.get(), connection.file.get(), connection.buffer.block(),
                      size);
}

int store(Connection& connection, const Dialogue& server, int64_t size, const char* remote) {
  if (server.ask({"STOR ", remote}) != 150) return destination_failed;
  return send_from_file(connection.data.get(), connection.file.get(), connection.buffer.block(),
                        size);
}

}  // namespace

int ftp_download(const platform::Address& addr, unsigned port, const char* user,
                 const char* password, const char* remote, const char* local) {
  Connection connection(Direction::download);
  if (!connection.network.started()) return source_failed;
  if (!open_destination(local, connection.file)) return destination_failed;

  const Dialogue server(connection);
  int result = connection.open(addr, port);
  if (result == copied && !begin(connection, server, user, password)) result = source_failed;
  if (result == copied) result = retrieve(connection, server, remote);
  if (result == copied && !finish(connection, server)) result = source_failed;
  if (result == copied && !close_stream(connection.file)) result = destination_failed;
  return result;
}

int ftp_upload(const platform::Address& addr, unsigned port, const char* user, const char* password,
               const char* local, const char* remote) {
  Connection connection(Direction::upload);
  if (!connection.network.started()) return destination_failed;
  int64_t size = 0;
  if (!open_source(local, connection.file, size)) return source_failed;

  const Dialogue server(connection);
  int result = connection.open(addr, port);
  if (result == copied && !begin(connection, server, user, password)) result = destination_failed;
  if (result == copied) result = store(connection, server, size, remote);
  if (result == copied && !finish(connection, server)) result = destination_failed;
  return result;
}

}  // namespace zv
