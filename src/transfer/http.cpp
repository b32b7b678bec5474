// The HTTP exchange of zv_copy().
#include "transfer/http.h"

#include <cinttypes>
#include <cstdio>

#include "transfer/base64.h"
#include "transfer/body.h"
#include "transfer/connection.h"
#include "transfer/line.h"
#include "transfer/reply.h"

namespace zv {

namespace {

// The header line that a user name asks for, or no line. False when memory ran out.
bool build_authorization(const Location& location, LineBuffer& line) {
  line.clear();
  if (location.user.empty()) return true;
  const HeapPtr<char> credentials =
      basic_credentials(location.user.c_str(), location.password.c_str());
  return credentials != nullptr &&
         build_line(line, {"Authorization: Basic ", credentials.get(), "\r\n"});
}

bool build_content_length(int64_t size, LineBuffer& line) {
  return line.fill([size](char* room, size_t room_size) {
    return std::snprintf(room, room_size, "Content-Length: %" PRId64 "\r\n", size) > 0;
  });
}

// Builds and sends the request's header; gives `copied` or the code of what failed.
int send_request(const Connection& connection, std::string_view method, const Location& location,
                 const LineBuffer& content_length) {
  LineBuffer authorization;
  LineBuffer request;
  if (!build_authorization(location, authorization) ||
      !build_line(request, {method, " ", location.path.view(), " HTTP/1.0\r\n",
                            authorization.view(), content_length.view(), "\r\n"}))
    return connection.local_failed();
  return send_all(connection.control.get(), request.view()) ? copied : connection.network_failed();
}

HttpHeader read_header(const Connection& connection) {
  return read_http_header(connection.control.get(), connection.buffer.room());
}

bool is_success(const HttpHeader& header) {
  return header.status >= 200 && header.status <= 299;
}

int get(const Connection& connection, const Location& source) {
  const int result = send_request(connection, "GET", source, LineBuffer());
  if (result != copied) return result;

  const HttpHeader header = read_header(connection);
  if (!is_success(header) || header.content_length <= 0) return source_failed;
  return recv_to_file(connection.control.get(), connection.file.get(), connection.buffer.block(),
                      header.content_length, static_cast<size_t>(header.body_bytes));
}

int put(const Connection& connection, const Location& destination) {
  LineBuffer content_length;
  if (!build_content_length(connection.size, content_length)) return source_failed;
  int result = send_request(connection, "PUT", destination, content_length);
  if (result == copied)
    result = send_from_file(connection.control.get(), connection.file.get(),
                            connection.buffer.block(), connection.size);
  if (result != copied) return result;
  return is_success(read_header(connection)) ? copied : destination_failed;
}

}  // namespace

int http_get(const Location& source, const char* local) {
  return download_over(source, local,
                       [&](const Connection& connection) { return get(connection, source); });
}

int http_put(const char* local, const Location& destination) {
  return upload_over(local, destination,
                     [&](const Connection& connection) { return put(connection, destination); });
}

}  // namespace zv
