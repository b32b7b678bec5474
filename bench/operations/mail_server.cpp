#include "mail_server.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>
#include <vector>

namespace bench {

namespace {

bool say(int client, std::string_view line) {
  return send(client, line.data(), line.size(), MSG_NOSIGNAL) == static_cast<ssize_t>(line.size());
}

// Reads on until the text ends with `end`; keeps no more of it than tells.
bool hear(int client, std::string_view end, std::string& tail) {
  static std::vector<char> room(size_t{1} << 20);
  for (tail.clear(); !tail.ends_with(end);) {
    const ssize_t got = recv(client, room.data(), room.size(), 0);
    if (got <= 0) return false;
    const std::string_view piece(room.data(), static_cast<size_t>(got));
    tail += piece.substr(piece.size() - std::min<size_t>(piece.size(), 1024));
    if (tail.size() > 2048) tail.erase(0, tail.size() - 1024);
  }
  return true;
}

void serve(int client) {
  std::string line;
  bool good = say(client, "220 ready\r\n");
  while (good && hear(client, "\r\n", line)) {
    if (line.starts_with("DATA")) {
      good = say(client, "354 go on\r\n") && hear(client, "\r\n.\r\n", line) &&
             say(client, "250 taken\r\n");
    } else if (line.starts_with("QUIT")) {
      say(client, "221 bye\r\n");
      good = false;
    } else {
      good = say(client, "250 fine\r\n");
    }
  }
  close(client);
}

}  // namespace

MailServer::MailServer() {
  const int listener = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
  sockaddr_in address = {};
  address.sin_family = AF_INET;
  address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  socklen_t size = sizeof address;
  auto* const place = reinterpret_cast<sockaddr*>(&address);
  if (bind(listener, place, size) != 0 || listen(listener, 16) != 0 ||
      getsockname(listener, place, &size) != 0) {
    std::perror("mail server");
    std::exit(1);
  }
  port_ = ntohs(address.sin_port);
  process_ = fork();
  if (process_ == 0) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    for (;;) serve(accept4(listener, nullptr, nullptr, SOCK_CLOEXEC));
  }
  close(listener);
}

MailServer::~MailServer() {
  kill(process_, SIGKILL);
  waitpid(process_, nullptr, 0);
}

}  // namespace bench
