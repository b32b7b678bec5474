// The FTP dialogue of a run.
#include "transfer/run_ftp.h"

#include <array>

#include "frame/text_view.h"
#include "transfer/commands.h"
#include "transfer/decimal.h"
#include "transfer/result.h"
#include "transfer/run_body.h"

namespace zv {

namespace {

constexpr int64_t unknown = -1;

std::string_view or_default(const HeapText& text, std::string_view standard) {
  return text.empty() ? standard : text.view();
}

// One client: its control connection, and the data connection to the same machine.
class Client {
 public:
  Client(Run& run, int code) : run_(run), control_(run, code), data_(run, code) {}

  bool retrieve(const RunLocation& source, Landing& landing);
  bool store(RunSource& file, const RunLocation& destination);

 private:
  bool begin(const RunLocation& location);
  bool log_in(const RunLocation& location);
  bool protect_data();
  bool ask_size(std::string_view path, int64_t& size);
  bool open_data();
  bool start(std::string_view command, const RunLocation& location);
  bool send_file(RunSource& file);
  bool refuse_early();
  bool finish();

  Run& run_;
  Wire control_;
  Wire data_;
  Commands server_{control_};
};

bool Client::begin(const RunLocation& location) {
  if (!control_.connect(location) || !log_in(location)) return false;
  if (location.is_encrypted && !protect_data()) return false;
  const int code = server_.send({"TYPE I"});
  return code / 100 == 2 || (code != 0 && server_.refuse());
}

// A server may do without the password, or without the user.
bool Client::log_in(const RunLocation& location) {
  control_.expect_reply();
  int code = server_.read_reply();
  while (code == 120) code = server_.read_reply();
  if (code != 220 && code != 230) return code != 0 && server_.refuse();
  if (code == 220) code = server_.send({"USER ", or_default(location.user, "anonymous")});
  if (code == 331)
    code = server_.send({"PASS ", or_default(location.password, "zarvo@zarvo.test")}, "PASS");
  if (code == 230 || code == 202) return true;
  if (code == 332) return control_.fail(ZV_CAUSE_LOGIN, code, {"332 an account is asked for"});
  return code != 0 && server_.refuse(ZV_CAUSE_LOGIN);
}

// What moves must be as private as the login was (RFC 4217).
bool Client::protect_data() {
  for (const char* const command : {"PBSZ 0", "PROT P"}) {
    const int code = server_.send({command});
    if (code == 0) return false;
    if (code != 200) return control_.fail(ZV_CAUSE_ENCRYPTION, 0, {run_.shown(server_.reply())});
  }
  return true;
}

// A server may refuse to tell.
bool Client::ask_size(std::string_view path, int64_t& size) {
  const int code = server_.send({"SIZE ", path});
  std::string_view text = server_.reply();
  if (code == 213) {
    text.remove_prefix(std::min<size_t>(text.size(), 4));
    if (!read_decimal(text, size)) return control_.fail(ZV_CAUSE_PROTOCOL, 0, {"no size"});
  }
  return code != 0 && run_.allows(size);
}

// The data connection goes to the machine that the control connection leads to, whatever a reply
// names: only the port is the server's to choose.
bool Client::open_data() {
  platform::HostAddress address;
  if (!platform::peer_address(control_.socket(), address))
    return control_.fail(ZV_CAUSE_CLOSED, 0, {"the connection was closed"});
  const int wanted = address.is_six ? 229 : 227;
  const int code = server_.send({address.is_six ? "EPSV" : "PASV"});
  if (code != wanted) return code != 0 && server_.refuse();
  const unsigned port =
      address.is_six ? extended_passive_port(server_.reply()) : passive_port(server_.reply());
  if (port == 0) return control_.fail(ZV_CAUSE_PROTOCOL, code, {run_.shown(server_.reply())});
  data_.begin_step({"connect for data"});
  return data_.connect(address, port);
}

// The server agrees to the transfer.
bool Client::start(std::string_view command, const RunLocation& location) {
  const std::string_view path = location.path.view();
  const int code = server_.send({command, path});
  if (code != 150 && code != 125) return code != 0 && server_.refuse();
  if (location.is_encrypted && !data_.encrypt(location, &control_)) return false;
  data_.begin_step({command, path});
  data_.begin_body();
  return true;
}

// The last reply decides; the one to QUIT does not.
bool Client::finish() {
  const int code = server_.read_reply();
  if (code != 226 && code != 250) return code != 0 && server_.refuse();
  control_.send_farewell("QUIT\r\n");
  return true;
}

bool Client::retrieve(const RunLocation& source, Landing& landing) {
  const std::string_view path = source.path.view();
  int64_t size = unknown;
  if (!begin(source) || !ask_size(path, size) || !open_data() || !start("RETR ", source))
    return false;
  if (size == unknown) size = announced_bytes(server_.reply());
  if (!run_.allows(size) || landing.open() != copied) return false;

  RunBody body(run_, landing);
  if (!body.begin(size) || !body.receive_until_end(data_)) return false;
  data_.close();
  run_.end_body();
  control_.expect_reply();
  return finish() && landing.commit() == copied;
}

// What the server says before it has all is why it takes no more.
bool Client::refuse_early() {
  control_.expect_reply();
  const int code = server_.read_reply();
  return code != 0 && server_.refuse();
}

bool Client::send_file(RunSource& file) {
  for (;;) {
    std::string_view bytes;
    if (!file.read(bytes)) return false;
    if (bytes.empty()) return true;
    while (!bytes.empty()) {
      const size_t before = bytes.size();
      const Sent sent = data_.send_some(bytes, &control_);
      if (sent == Sent::failed) return false;
      if (sent != Sent::some) return refuse_early();
      run_.advance(static_cast<int64_t>(before - bytes.size()));
    }
  }
}

bool Client::store(RunSource& file, const RunLocation& destination) {
  if (!begin(destination) || !open_data() || !start("STOR ", destination)) return false;
  run_.begin_body(file.size());
  bool good = send_file(file);
  if (good) {
    run_.end_body();
    good = data_.end();
  }
  if (good) {
    control_.expect_last_reply(data_);
    good = finish();
  }
  if (good) return true;
  // A close would be the end of the file to the server, which would keep what it has as a success.
  data_.reset();
  run_.explain({"; the destination may hold a part"});
  return false;
}

}  // namespace

bool ftp_retrieve(Run& run, const RunLocation& source, Landing& landing) {
  return Client(run, source_failed).retrieve(source, landing);
}

bool ftp_store(Run& run, RunSource& file, const RunLocation& destination) {
  return Client(run, destination_failed).store(file, destination);
}

// Read from its first digit, as RFC 1123 4.1.2.6 has it.
unsigned passive_port(std::string_view reply) {
  constexpr std::string_view digits = "0123456789";
  reply.remove_prefix(std::min<size_t>(reply.size(), 3));
  std::array<int64_t, 6> numbers = {};
  reply.remove_prefix(std::min(reply.find_first_of(digits), reply.size()));
  for (size_t i = 0; i < numbers.size(); ++i) {
    if (i != 0 && !reply.starts_with(',')) return 0;
    if (i != 0) reply.remove_prefix(1);
    if (!take_decimal(reply, numbers[i]) || numbers[i] > 255) return 0;
  }
  return static_cast<unsigned>(numbers[4] * 256 + numbers[5]);
}

// "229 text (|||port|)", with any sign in the place of "|" (RFC 2428).
unsigned extended_passive_port(std::string_view reply) {
  const size_t open = reply.find('(');
  if (open == std::string_view::npos || reply.size() - open < 7) return 0;
  reply.remove_prefix(open + 1);
  const char sign = reply[0];
  if (reply[1] != sign || reply[2] != sign) return 0;
  reply.remove_prefix(3);
  int64_t port = 0;
  if (!take_decimal(reply, port) || !reply.starts_with(sign) || port > 65535) return 0;
  return static_cast<unsigned>(port);
}

// The last bracket counts: the file's name may hold others.
int64_t announced_bytes(std::string_view reply) {
  const size_t bracket = reply.rfind('(');
  if (bracket == std::string_view::npos) return unknown;
  reply.remove_prefix(bracket + 1);
  int64_t size = 0;
  return take_decimal(reply, size) && has_front(reply, " byte") ? size : unknown;
}

}  // namespace zv
