// Makes a connection of a run: look-up, addresses in turn, encryption.
#include <algorithm>
#include <array>
#include <cerrno>

#include "transfer/wire.h"

namespace zv {

namespace {

// Nothing but four numbers of 0 to 255 with dots between is an IPv4 address.
bool read_address_four(std::string_view text, platform::HostAddress& out) {
  out = {};
  for (size_t i = 0; i < 4; ++i) {
    unsigned number = 0;
    size_t digits = 0;
    for (; digits < 3 && !text.empty() && text[0] >= '0' && text[0] <= '9'; ++digits) {
      number = number * 10 + static_cast<unsigned>(text[0] - '0');
      text.remove_prefix(1);
    }
    if (digits == 0 || number > 255) return false;
    out.bytes[i] = static_cast<unsigned char>(number);
    if (i < 3 && !text.starts_with('.')) return false;
    if (i < 3) text.remove_prefix(1);
  }
  return text.empty();
}

size_t addresses_of(const RunLocation& server, std::span<platform::HostAddress> room) {
  if (server.is_six) return platform::read_address_six(server.host.c_str(), room[0]) ? 1 : 0;
  if (read_address_four(server.host.view(), room[0])) return 1;
  return platform::look_up_name(server.host.c_str(), room);
}

}  // namespace

bool Wire::connect(const RunLocation& server) {
  if (server.is_encrypted && !run_.trust()->prepare(run_, code_)) return false;
  std::array<platform::HostAddress, 32> addresses;
  begin_step({"look up ", server.host.view()});
  if (!run_.may_go_on(code_)) return false;
  const size_t count = addresses_of(server, addresses);
  if (!run_.may_go_on(code_)) return false;
  if (count == 0) return fail(ZV_CAUSE_LOOKUP, 0, {"no such host"});

  begin_step({"connect to ", host_and_port(server).view()});
  int error = 0;
  for (size_t i = 0; i < count; ++i) {
    if (connect_to(addresses[i], server.port, error)) {
      if (server.is_encrypted && !encrypt(server)) return false;
      begin_step({"connect to ", host_and_port(server).view()});
      return true;
    }
    if (run_.failed()) return false;
  }
  return fail_connect(error);
}

bool Wire::connect(const platform::HostAddress& address, unsigned port) {
  int error = 0;
  if (connect_to(address, port, error)) return true;
  if (run_.failed()) return false;
  return fail_connect(error);
}

bool Wire::fail_connect(int error) {
  if (error == 0) return fail(ZV_CAUSE_SILENCE, 0, {"no reply within ", duration(silence_).view()});
  run_.fail_system(code_, ZV_CAUSE_CONNECT, error, {step_.view()});
  return false;
}

// One address; `error` is 0 when it did not answer in time.
bool Wire::connect_to(const platform::HostAddress& address, unsigned port, int& error) {
  close();
  if (input_ == nullptr) input_.reset(static_cast<char*>(std::malloc(input_size)));
  if (input_ == nullptr) return fail(ZV_CAUSE_MEMORY, ENOMEM, {"out of memory"});
  begin_ = end_ = 0;
  is_cut_ = false;

  expect_reply();
  socket_ = platform::socket_begin(address, port);
  error = platform::last_error();
  std::array<platform::Waiting, 1> waiting = {{{.socket = socket_, .to_write = true}}};
  while (socket_ != platform::no_socket && !waiting[0].can_write) {
    if (!run_.may_go_on(code_)) return false;
    const int64_t left = silence_ - (platform::monotonic_ms() - since_);
    error = 0;
    if (silence_ != 0 && left <= 0) break;
    const int64_t most = silence_ != 0 ? std::min(left, longest_wait_ms) : longest_wait_ms;
    if (!platform::wait_for_sockets(waiting, static_cast<int>(most))) {
      error = platform::last_error();
      break;
    }
  }
  if (waiting[0].can_write) error = platform::connect_error(socket_);
  if (waiting[0].can_write && error == 0) return true;
  close();
  return false;
}

bool Wire::encrypt(const RunLocation& server, const Wire* like) {
  begin_step({"encryption with ", server.host.view()});
  stream_ = encryption().open(run_.trust()->context(), socket_, server.host.c_str(),
                              like != nullptr ? like->stream_ : nullptr);
  if (stream_ == nullptr) return fail(ZV_CAUSE_MEMORY, ENOMEM, {"out of memory"});
  expect_reply();
  for (;;) {
    const Step step = encryption().handshake(stream_);
    if (step == Step::done) return true;
    if (!has_to_wait(step)) return fail_end(step);
    if (!wait(step)) return false;
  }
}

}  // namespace zv
