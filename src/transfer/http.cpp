#include "transfer/http.h"

#include <cinttypes>
#include <cstdio>

#include "transfer/base64.h"
#include "transfer/connection.h"
#include "transfer/line.h"
#include "transfer/pump.h"
#include "transfer/reply.h"

namespace zv {

namespace {

// The header line that a user name asks for, or no line. False when memory ran out.
bool build_authorization(const char* user, const char* password, LineBuffer& line) {
  line.clear();
  if (*user == '\0') return true;
  const HeapPtr<char> credentials = basic_credentials(user, password);
  return credentials != nullptr &&
         build_line(line, {"Authorization: Basic ", credentials.get(), "\r\n"});
}

bool build_content_length(int64_t size, LineBuffer& line) {
  return line.fill([size](char* room, size_t room_size) {
    return std::snprintf(room, room_size, "Content-Length: %" PRId64 "\r\n", size) > 0;
  });
}

// Builds and sends the request's header; gives `copied` or the code of what failed.
int send_request(const Connection& connection, std::string_view method, const char* path,
                 const LineBuffer& authorization, const LineBuffer& content_length) {
  LineBuffer request;
  if (!build_line(request, {method, " ", path, " HTTP/1.0\r\n", authorization.view(),
                            content_length.view(), "\r\n"}))
    return connection.local_failed();
  return send_all(connection.control.get(), request.view()) ? copied : connection.network_failed();
}

bool is_success(const HttpHeader& header) {
  return header.status >= 200 && header.status <= 299;
}

// Reads the response to a GET, its body into the local file.
int receive_body(const Connection& connection) {
  const platform::Socket socket = connection.control.get();
  const HttpHeader header = read_http_header(socket, connection.buffer.room());
  if (!is_success(header) || header.content_length <= 0) return source_failed;

  return recv_to_file(socket, connection.file.get(), connection.buffer.block(),
                      header.content_length, static_cast<size_t>(header.body_bytes));
}

}  // namespace

int http_get(const platform::Address& addr, unsigned port, const char* user, const char* password,
             const char* remote, const char* local) {
  Connection connection(Direction::download);
  if (!connection.network.started()) return source_failed;
  if (!open_destination(local, connection.file)) return destination_failed;

  LineBuffer authorization;
  int result = connection.open(addr, port);
  if (result == copied && !build_authorization(user, password, authorization))
    result = destination_failed;
  if (result == copied)
    result = send_request(connection, "GET", remote, authorization, LineBuffer());
  if (result == copied) result = receive_body(connection);
  if (result == copied && !close_stream(connection.file)) result = destination_failed;
  return result;
}

int http_put(const platform::Address& addr, unsigned port, const char* user, const char* password,
             const char* local, const char* remote) {
  Connection connection(Direction::upload);
  if (!connection.network.started()) return destination_failed;
  int64_t size = 0;
  if (!open_source(local, connection.file, size)) return source_failed;

  LineBuffer authorization;
  LineBuffer content_length;
  int result = connection.open(addr, port);
  if (result == copied && !(build_authorization(user, password, authorization) &&
                            build_content_length(size, content_length)))
    result = source_failed;
  if (result == copied)
    result = send_request(connection, "PUT", remote, authorization, content_length);
  const platform::Socket socket = connection.control.get();
  if (result == copied)
    result = send_from_file(socket, connection.file.get(), connection.buffer.block(), size);
  if (result == copied && !is_success(read_http_header(socket, connection.buffer.room())))
    result = destination_failed;
  return result;
}

}  // namespace zv
