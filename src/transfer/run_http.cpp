// The HTTP exchanges of a run.
#include "transfer/run_http.h"

#include <cinttypes>
#include <cstdio>
#include <utility>

#include "transfer/base64.h"
#include "transfer/http_answer.h"
#include "transfer/redirect.h"
#include "transfer/result.h"
#include "transfer/run_body.h"

namespace zv {

namespace {

bool out_of_memory(Wire& server) {
  return server.fail(ZV_CAUSE_MEMORY, 0, {"out of memory"});
}

// A request target: the path as it was written, but for the bytes that none may hold.
bool build_target(std::string_view path, HeapText& target) {
  constexpr std::string_view never = " \"<>[]\\^`{|}";
  constexpr std::string_view digits = "0123456789ABCDEF";
  const HeapPtr<char[]> room(static_cast<char*>(std::malloc(3 * path.size() + 1)));
  if (room == nullptr) return false;
  size_t size = 0;
  for (const char ch : path) {
    const auto byte = static_cast<unsigned char>(ch);
    const bool fits = byte > ' ' && byte < 0x7F && never.find(ch) == std::string_view::npos;
    if (!fits) room[size++] = '%';
    if (!fits) room[size++] = digits[byte >> 4];
    room[size++] = fits ? ch : digits[byte & 15];
  }
  return target.assign({room.get(), size});
}

// The header line of a login, or none. A user without a password is sent as "user:" (RFC 7617).
bool build_authorization(Run& run, const RunLocation& login, HeapText& line) {
  if (login.user.empty()) return line.assign("");
  HeapText plain;
  if (!plain.assign({login.user.view(), ":", login.password.view()})) return false;
  const HeapPtr<char> text = base64_text(plain.view());
  return text != nullptr && run.keep_secret(text.get()) &&
         line.assign({"Authorization: Basic ", text.get(), "\r\n"});
}

// The default port is not named.
HostAndPort host_line(const RunLocation& server) {
  HostAndPort text = host_and_port(server);
  if (server.port == default_port(server))
    text.shorten(server.host.size() + (server.is_six ? 2 : 0));
  return text;
}

// Sends the head of a request; `login` is whose user and password go along.
bool send_request(Wire& server, std::string_view method, const RunLocation& at,
                  const RunLocation& login, std::string_view length) {
  HeapText target;
  HeapText authorization;
  HeapText request;
  if (!build_target(at.path.view(), target) ||
      !build_authorization(server.run(), login, authorization) ||
      !request.assign({method, " ", target.view(), " HTTP/1.1\r\nHost: ", host_line(at).view(),
                       "\r\nUser-Agent: zarvo/", zarvo_version(),
                       "\r\nAccept-Encoding: identity\r\n", authorization.view(), length,
                       "Connection: close\r\n\r\n"}))
    return out_of_memory(server);
  server.begin_step({method, " ", at.path.view()});
  server.expect_reply();
  return server.send(request.view());
}

// Fails the run by the status of an answer.
bool refuse(Wire& server, const HttpAnswer& answer) {
  const int status = answer.status;
  const bool for_now =
      status == 408 || status == 429 || (status >= 500 && status != 501 && status != 505);
  int cause = for_now ? ZV_CAUSE_REFUSED_NOW : ZV_CAUSE_REFUSED;
  if (status == 401) cause = ZV_CAUSE_LOGIN;
  return server.fail(cause, status, {server.run().shown(answer.words.view())});
}

bool is_redirect(const HttpAnswer& answer) {
  const int status = answer.status;
  const bool leads = (status >= 301 && status <= 303) || status == 307 || status == 308;
  return leads && !answer.location.empty();
}

bool receive_chunks(Wire& server, RunBody& body) {
  for (;;) {
    std::string_view line;
    int64_t size = 0;
    if (!server.read_line(line)) return false;
    if (take_chunk_size(line, size) != Taken::good)
      return server.fail(ZV_CAUSE_PROTOCOL, 0, {"a chunk without a usable size"});
    if (size == 0) return skip_trailer(server);
    if (!body.receive(server, size) || !server.read_line(line)) return false;
    if (!line.empty()) return server.fail(ZV_CAUSE_PROTOCOL, 0, {"a chunk longer than its size"});
  }
}

// Chunks win over a length; without either the closed connection is the end.
bool receive_body(Run& run, Wire& server, const HttpAnswer& answer, Landing& landing) {
  const int64_t size = answer.is_chunked ? HttpAnswer::unknown : answer.length;
  if (!run.allows(size) || landing.open() != copied) return false;
  RunBody body(run, landing);
  server.begin_body();
  if (!body.begin(size)) return false;
  const bool good = answer.is_chunked             ? receive_chunks(server, body)
                    : size == HttpAnswer::unknown ? body.receive_until_end(server)
                                                  : body.receive(server, size);
  if (!good) return false;
  run.end_body();
  return landing.commit() == copied;
}

// Where the answer leads. What is not followed, such as the way out of encryption, is a refusal.
bool follow(Wire& server, const RunLocation& at, const HttpAnswer& answer, RunLocation& next) {
  HeapText text;
  Signals signals;
  Run trial(Options(), Watch(), signals);
  if (!resolve_reference(at, answer.location.view(), text)) return out_of_memory(server);
  const bool usable = parse_run_location(trial, source_failed, text.c_str(), next);
  const bool stays_encrypted = next.is_encrypted || !at.is_encrypted;
  return (usable && next.kind == LOC_HTTP && stays_encrypted) || refuse(server, answer);
}

// What comes before the body has left: one that only tells of progress is passed over, a good one
// is judged at the end, and any other is why the server takes no more.
bool take_early_answer(Wire& server, HttpAnswer& answer) {
  server.expect_reply();
  if (!read_head(server, answer)) return false;
  if (answer.status >= 300) return refuse(server, answer);
  if (answer.status < 200) answer.status = 0;
  server.begin_body();
  return true;
}

// The server takes no more of the body; it may have said why.
bool refuse_cut(Wire& server, HttpAnswer& answer) {
  server.expect_reply();
  if (answer.status == 0 && !read_answer(server, answer)) return false;
  if (!answer.is_success()) return refuse(server, answer);
  return server.fail(ZV_CAUSE_CLOSED, 0, {"the connection was closed too early"});
}

// A PUT's body, as long as was told.
bool send_file(Run& run, Wire& server, RunSource& file, HttpAnswer& answer) {
  int64_t left = file.size();
  while (left > 0) {
    std::string_view bytes;
    if (!file.read(bytes)) return false;
    if (static_cast<int64_t>(bytes.size()) > left)
      bytes = {bytes.data(), static_cast<size_t>(left)};
    if (bytes.empty()) return file.fail("it became shorter");
    while (!bytes.empty()) {
      const size_t before = bytes.size();
      const Sent sent = server.send_some(bytes, answer.status == 0 ? &server : nullptr);
      if (sent == Sent::failed) return false;
      if (sent == Sent::answered && !take_early_answer(server, answer)) return false;
      if (sent == Sent::cut) return refuse_cut(server, answer);
      left -= static_cast<int64_t>(before - bytes.size());
      run.advance(static_cast<int64_t>(before - bytes.size()));
    }
  }
  return true;
}

}  // namespace

bool http_fetch(Run& run, const RunLocation& source, Landing& landing) {
  constexpr int most_redirects = 5;
  const RunLocation nobody;
  RunLocation rooms[2];
  const RunLocation* at = &source;
  for (int hops = 0;; ++hops) {
    Wire server(run, source_failed);
    HttpAnswer answer;
    const RunLocation& login = is_same_server(source, *at) ? source : nobody;
    if (!server.connect(*at) || !send_request(server, "GET", *at, login, "") ||
        !read_answer(server, answer))
      return false;
    if (answer.status == 200 || answer.status == 203)
      return receive_body(run, server, answer, landing);
    if (!is_redirect(answer)) return refuse(server, answer);
    if (hops == most_redirects)
      return server.fail(ZV_CAUSE_REFUSED, answer.status, {"more than five redirects"});
    RunLocation& next = rooms[hops % 2];
    if (!follow(server, *at, answer, next)) return false;
    at = &next;
  }
}

bool http_store(Run& run, RunSource& file, const RunLocation& destination) {
  Wire server(run, destination_failed);
  HttpAnswer answer;
  TextBuffer<64> length;
  (void)length.fill([&file](char* room, size_t size) {
    return std::snprintf(room, size, "Content-Length: %" PRId64 "\r\n", file.size()) > 0;
  });
  if (file.size() == RunSource::unknown) return file.fail("its length is not known");
  if (!server.connect(destination) ||
      !send_request(server, "PUT", destination, destination, length.view()))
    return false;
  run.begin_body(file.size());
  server.begin_body();
  bool good = send_file(run, server, file, answer);
  if (good) {
    run.end_body();
    server.expect_last_reply(server);
    good = (answer.status != 0 || read_answer(server, answer)) &&
           (answer.is_success() || refuse(server, answer));
  }
  if (!good) run.explain({"; the destination may hold a part"});
  return good;
}

}  // namespace zv
