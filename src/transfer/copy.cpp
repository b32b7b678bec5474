// The one transfer operation: picks the road between two locations.
#include "transfer/ftp.h"
#include "transfer/http.h"
#include "transfer/local.h"
#include "transfer/location.h"
#include "transfer/relay.h"
#include "transfer/result.h"
#include "transfer/smtp.h"

namespace {

using zv::location_t;

int download(const location_t& source, const char* local) {
  const char* const user = source.user.c_str();
  const char* const password = source.password.c_str();
  const char* const path = source.path.c_str();
  switch (source.kind) {
    case zv::LOC_FTP:
      return zv::ftp_download(source.addr, source.port, user, password, path, local);
    case zv::LOC_HTTP:
      return zv::http_get(source.addr, source.port, user, password, path, local);
    default:
      return zv::source_failed;
  }
}

int upload(const char* local, const location_t& destination) {
  const char* const user = destination.user.c_str();
  const char* const password = destination.password.c_str();
  const char* const path = destination.path.c_str();
  switch (destination.kind) {
    case zv::LOC_FTP:
      return zv::ftp_upload(destination.addr, destination.port, user, password, local, path);
    case zv::LOC_HTTP:
      return zv::http_put(destination.addr, destination.port, user, password, local, path);
    case zv::LOC_SMTP:  // the recipient is the path without its leading slash
      return zv::smtp_send_file(destination.addr, destination.port, user, password, local,
                                path + 1);
    default:
      return zv::destination_failed;
  }
}

}  // namespace

int zv_copy(const char* from, const char* to) {
  location_t source;
  zv::parse_location(from, source);
  if (source.kind == zv::LOC_NONE || source.kind == zv::LOC_SMTP) return zv::source_failed;

  location_t destination;
  zv::parse_location(to, destination);
  if (destination.kind == zv::LOC_NONE) return zv::destination_failed;

  const char* const source_path = source.path.c_str();
  const char* const destination_path = destination.path.c_str();
  const bool from_local = source.kind == zv::LOC_FILE;
  const bool to_local = destination.kind == zv::LOC_FILE;
  if (from_local && to_local) return zv::copy_local(source_path, destination_path);
  if (from_local) return upload(source_path, destination);
  if (to_local) return download(source, destination_path);
  return zv::copy_through_temporary(from, source_path, to);
}
