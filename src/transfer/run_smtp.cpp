// The mail dialogue of a run.
#include "transfer/run_smtp.h"

#include <algorithm>

#include "transfer/base64.h"
#include "transfer/commands.h"
#include "transfer/result.h"
#include "transfer/run_message.h"

namespace zv {

namespace {

// The first digit of a reply tells what is to be done (RFC 5321 4.2.1).

// RFC 5321 4.5.3.2: what a server may take for a command, and for a whole message.
constexpr int64_t command_ms = 300000;
constexpr int64_t message_ms = 600000;

class Client {
 public:
  explicit Client(Run& run) : run_(run), wire_(run, destination_failed) {}

  bool send(RunSource& file, const RunLocation& destination, const RunMessage& message);

 private:
  int command(Words words, std::string_view shown = {}) {
    return server_.send(words, shown, command_ms);
  }
  bool fail_memory() { return wire_.fail(ZV_CAUSE_MEMORY, 0, {"out of memory"}); }
  bool accept(int code, int cause = ZV_CAUSE_REFUSED);
  bool begin(const RunLocation& destination, const RunMessage& message);
  bool greet(std::string_view name, bool& knows_logins);
  bool log_in(const RunLocation& destination);
  bool log_in_plain(const RunLocation& destination);
  bool send_envelope(const RunMessage& message);
  bool send_file(RunSource& file);
  bool send_text(std::string_view text);
  bool finish();

  Run& run_;
  Wire wire_;
  Commands server_{wire_};
};

bool Client::accept(int code, int cause) {
  return code / 100 == 2 || (code != 0 && server_.refuse(cause));
}

bool Client::begin(const RunLocation& destination, const RunMessage& message) {
  if (!wire_.connect(destination)) return false;
  wire_.expect_reply(command_ms);
  if (!accept(server_.read_reply())) return false;

  // A machine without a full name gives the address that it has for the server.
  TextBuffer<300> name;
  bool named =
      message.host.view().find('.') != std::string_view::npos && name.assign(message.host.view());
  platform::HostAddress address;
  if (!named && platform::local_address(wire_.socket(), address))
    named = name.append(address.is_six ? "[IPv6:" : "[") &&
            name.append(platform::address_text(address).view()) && name.append(']');
  bool knows_logins = false;
  if (!greet(named ? name.view() : "localhost", knows_logins)) return false;
  return destination.user.empty() || !knows_logins || log_in(destination);
}

// A server that knows no EHLO knows no login.
bool Client::greet(std::string_view name, bool& knows_logins) {
  const int code = command({"EHLO ", name});
  knows_logins = code / 100 == 2;
  return code / 100 == 5 ? accept(command({"HELO ", name})) : accept(code);
}

bool Client::log_in(const RunLocation& destination) {
  int code = command({"AUTH LOGIN"});
  if (code / 100 == 5) return log_in_plain(destination);
  for (const HeapText* const secret : {&destination.user, &destination.password}) {
    if (code / 100 != 3) break;
    const HeapPtr<char> text = base64_text(secret->view());
    if (text == nullptr) return fail_memory();
    code = command({text.get()}, "AUTH LOGIN");
  }
  return accept(code, ZV_CAUSE_LOGIN);
}

bool Client::log_in_plain(const RunLocation& destination) {
  int code = command({"AUTH PLAIN"});
  if (code / 100 == 3) {
    constexpr std::string_view nul("\0", 1);
    HeapText login;
    const bool joined =
        login.assign({nul, destination.user.view(), nul, destination.password.view()});
    const HeapPtr<char> text = joined ? base64_text(login.view()) : nullptr;
    if (text == nullptr) return fail_memory();
    code = command({text.get()}, "AUTH PLAIN");
  }
  return accept(code, ZV_CAUSE_LOGIN);
}

bool Client::send_envelope(const RunMessage& message) {
  if (!accept(command({"MAIL FROM:<", message.sender.view(), ">"})) ||
      !accept(command({"RCPT TO:<", message.recipient.view(), ">"})))
    return false;
  const int code = command({"DATA"});
  return code / 100 == 3 || (code != 0 && server_.refuse());
}

// What the server says before it has all is why it takes no more.
bool Client::send_text(std::string_view text) {
  while (!text.empty()) {
    const Sent sent = wire_.send_some(text, &wire_);
    if (sent == Sent::failed) return false;
    if (sent == Sent::some) continue;
    wire_.expect_reply(command_ms);
    return server_.read_reply() != 0 && server_.refuse();
  }
  return true;
}

// Fills the room from the file's blocks; `rest` is what the last one still has.
bool fill(RunSource& file, std::string_view& rest, std::span<char> room, size_t& size) {
  size = 0;
  while (size < room.size()) {
    if (rest.empty() && !file.read(rest)) return false;
    if (rest.empty()) break;
    const size_t piece = std::min(room.size() - size, rest.size());
    std::copy_n(rest.data(), piece, room.data() + size);
    rest.remove_prefix(piece);
    size += piece;
  }
  return true;
}

HeapPtr<char[]> new_block(size_t size) {
  return HeapPtr<char[]>(static_cast<char*>(std::malloc(size)));
}

// In pieces of whole lines; a file of no bytes is an empty one.
bool Client::send_file(RunSource& file) {
  constexpr size_t lines = 1024;
  constexpr size_t piece = lines * base64_line_bytes;
  const HeapPtr<char[]> bytes = new_block(piece);
  const HeapPtr<char[]> text = new_block(lines * base64_line_length + 1);
  if (bytes == nullptr || text == nullptr) return fail_memory();
  std::string_view rest;
  size_t size = 0;
  for (bool first = true; first || size == piece; first = false) {
    if (!fill(file, rest, {bytes.get(), piece}, size)) return false;
    if (size == 0 && !first) break;
    const size_t length = base64_lines({bytes.get(), size}, text.get());
    if (!send_text({text.get(), length})) return false;
    run_.advance(static_cast<int64_t>(size));
  }
  return true;
}

// Once the last line may have left, only the server knows what became of the mail.
bool Client::finish() {
  int code = 0;
  if (send_text(RunMessage::tail)) {
    run_.end_body();
    wire_.expect_last_reply(wire_, message_ms);
    code = server_.read_reply();
    if (code != 0 && !accept(code)) return false;
  }
  if (code != 0) wire_.send_farewell("QUIT\r\n");
  const int cause = run_.failure().cause;
  const bool refused = cause == ZV_CAUSE_REFUSED || cause == ZV_CAUSE_REFUSED_NOW;
  if (code == 0 && !refused) run_.explain({"; the mail may have been delivered"});
  return code != 0;
}

bool Client::send(RunSource& file, const RunLocation& destination, const RunMessage& message) {
  if (!begin(destination, message) || !send_envelope(message)) return false;
  wire_.begin_step({"send the message"});
  wire_.begin_body(command_ms);
  run_.begin_body(file.size());
  return send_text(message.head.view()) && send_file(file) && finish();
}

}  // namespace

bool smtp_send(Run& run, RunSource& file, const char* local, const RunLocation& destination) {
  std::string_view recipient = destination.path.view();
  if (recipient.starts_with('/')) recipient.remove_prefix(1);
  RunMessage message;
  return write_run_message(run, local, destination.user.view(), recipient, message) &&
         Client(run).send(file, destination, message);
}

}  // namespace zv
