// Picks the client for a network location.
#include "transfer/routes.h"

#include "transfer/ftp.h"
#include "transfer/http.h"
#include "transfer/result.h"
#include "transfer/smtp.h"

namespace zv {

int download(const Location& source, const char* local) {
  switch (source.kind) {
    case LOC_FTP:
      return ftp_download(source, local);
    case LOC_HTTP:
      return http_get(source, local);
    default:
      return source_failed;
  }
}

int upload(const char* local, const Location& destination) {
  switch (destination.kind) {
    case LOC_FTP:
      return ftp_upload(local, destination);
    case LOC_HTTP:
      return http_put(local, destination);
    case LOC_SMTP:
      return smtp_send_file(local, destination);
    default:
      return destination_failed;
  }
}

}  // namespace zv
