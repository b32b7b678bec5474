// A mail server that takes every mail and throws it away, as fast as it comes.
#ifndef ZARVO_BENCH_MAIL_SERVER_H
#define ZARVO_BENCH_MAIL_SERVER_H

#include <sys/types.h>

namespace bench {

// Runs as a process of its own, so that its work counts for neither client.
class MailServer {
 public:
  MailServer();
  ~MailServer();
  MailServer(const MailServer&) = delete;
  MailServer& operator=(const MailServer&) = delete;

  int port() const { return port_; }

 private:
  int port_ = 0;
  pid_t process_ = -1;
};

}  // namespace bench

#endif
