// zv copy: one file from a location to another.
#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <fstream>
#include <iostream>
#include <memory>
#include <optional>
#include <thread>

#include "commands.h"
#include "interrupt.h"
#include "location_text.h"
#include "progress.h"
#include "system.h"
#include "zarvo.h"

namespace tool {
namespace {

struct Destroy {
  void operator()(zv_transfer_t* transfer) const { zv_transfer_destroy(transfer); }
};

using TransferPtr = std::unique_ptr<zv_transfer_t, Destroy>;

std::string reason(const zv_transfer_t* transfer) {
  std::string text(size_t{1} << 15, '\0');  // nothing in it is that long
  text.resize(zv_transfer_reason(transfer, text.data(), text.size()));
  return text;
}

// The first line of a file, or of standard input for "-"; says why there is none.
std::optional<std::string> read_password(const std::string& file) {
  std::ifstream opened;
  if (file != "-") opened.open(file, std::ios::binary);
  std::istream& stream = file == "-" ? std::cin : opened;
  std::string line;
  if (!std::getline(stream, line) && !stream.eof()) {
    complain("cannot read the password from " + file, errno);
    return std::nullopt;
  }
  if (line.ends_with('\r')) line.pop_back();
  return line;
}

// Gives an exit code.
int log_in(zv_transfer_t* transfer, const CopyOptions& options) {
  if (options.user.empty()) return done;
  const int side = is_network(options.to) ? 1 : 0;
  if (is_network(options.from) == (side == 1)) {
    complain("--user needs one server, and one only, that the login is for");
    return wrong_usage;
  }
  std::optional<std::string> password = "";
  if (!options.password_file.empty()) password = read_password(options.password_file);
  if (!password) return no;
  if (zv_transfer_login(transfer, side, options.user.c_str(), password->c_str()) != 0) return done;
  complain("a user and a password are one line each");
  return wrong_usage;
}

// Gives an exit code.
int trust(zv_transfer_t* transfer, const std::string& ca) {
  if (ca.empty() || zv_transfer_trust(transfer, ca.c_str()) != 0) return done;
  complain("no certificates in " + ca);
  return no;
}

void set_limits(zv_transfer_t* transfer, const CopyOptions& options) {
  const auto milliseconds = [](double seconds) { return static_cast<int64_t>(seconds * 1000); };
  if (options.timeout)
    zv_transfer_set(transfer, ZV_TRANSFER_SILENCE, milliseconds(*options.timeout));
  if (options.max_time)
    zv_transfer_set(transfer, ZV_TRANSFER_TIME, milliseconds(*options.max_time));
  zv_transfer_set(transfer, ZV_TRANSFER_KEEP, options.no_clobber ? 1 : 0);
  zv_transfer_set(transfer, ZV_TRANSFER_IN_PLACE, options.in_place ? 1 : 0);
  zv_transfer_set(transfer, ZV_TRANSFER_SYNC, options.sync ? 1 : 0);
}

// Whether the same again may go well and does no harm: a mail whose message has begun to leave may
// have been delivered.
bool is_worth_another_try(const zv_transfer_t* transfer, int result, const std::string& to) {
  int64_t total = -1;
  zv_transfer_progress(transfer, nullptr, &total);
  if (is_mail(to) && result == ZV_COPY_DESTINATION_FAILED && total >= 0) return false;
  switch (zv_transfer_cause(transfer, nullptr)) {
    case ZV_CAUSE_LOOKUP:
    case ZV_CAUSE_CONNECT:
    case ZV_CAUSE_SILENCE:
    case ZV_CAUSE_CLOSED:
    case ZV_CAUSE_REFUSED_NOW:
      return true;
    default:
      return false;
  }
}

// Ends early when a signal came.
void pause(std::chrono::milliseconds length) {
  constexpr std::chrono::milliseconds step(50);
  for (; length.count() > 0 && Interrupt::caught() == 0; length -= step)
    std::this_thread::sleep_for(std::min(step, length));
}

int run(zv_transfer_t* transfer, const CopyOptions& options, const std::string& to) {
  using std::chrono::milliseconds;
  int result = zv_transfer_run(transfer, options.from.c_str(), to.c_str());
  milliseconds before_next(200);
  for (int i = 0; i < options.retries && is_worth_another_try(transfer, result, to); ++i) {
    pause(before_next);
    before_next = std::min(before_next * 2, milliseconds(10000));
    result = zv_transfer_run(transfer, options.from.c_str(), to.c_str());
  }
  return result;
}

}  // namespace

int copy(const CopyOptions& options) {
  const TransferPtr transfer(zv_transfer_create());
  if (transfer == nullptr) throw std::bad_alloc();
  if (const int exit_code = log_in(transfer.get(), options); exit_code != done) return exit_code;
  if (const int exit_code = trust(transfer.get(), options.ca); exit_code != done) return exit_code;
  set_limits(transfer.get(), options);
  const std::string to = destination(options.from, options.to);

  const Interrupt interrupt(transfer.get());
  std::optional<Progress> progress;
  if (!options.quiet && is_terminal(stderr)) progress.emplace(transfer.get());
  const int result = run(transfer.get(), options, to);
  progress.reset();
  if (result == 0) return done;
  const bool is_source = result == ZV_COPY_SOURCE_FAILED;
  complain(without_logins(is_source ? "cannot get " + options.from : "cannot put " + to) + ": " +
           reason(transfer.get()));
  if (Interrupt::caught() != 0) return 128 + Interrupt::caught();
  return is_source ? source_failed : destination_failed;
}

}  // namespace tool
