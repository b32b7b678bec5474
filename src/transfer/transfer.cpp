// The public functions of a transfer's handle.
#include <limits>
#include <new>

#include "transfer/line.h"
#include "transfer/run_routes.h"
#include "zarvo.h"

struct zv_transfer_t {
  zv::Options options;
  zv::Watch watch;
  zv::Logins logins;
  zv::Trust trust;
  zv::Signals signals;
  zv::Failure last;  // the run that ended last
};

namespace {

constexpr int64_t longest_time = std::numeric_limits<int32_t>::max();
constexpr int64_t most_bytes = std::numeric_limits<int64_t>::max();

bool set_number(int64_t value, int64_t most, int64_t standard, int64_t& option) {
  if (value < -1 || value > most) return false;
  option = value == -1 ? standard : value;
  return true;
}

bool set_flag(int64_t value, bool& option) {
  if (value < -1 || value > 1) return false;
  option = value == 1;
  return true;
}

bool set_option(zv::Options& options, int option, int64_t value) {
  const zv::Options standard;
  switch (option) {
    case ZV_TRANSFER_SILENCE:
      return set_number(value, longest_time, standard.silence, options.silence);
    case ZV_TRANSFER_TIME:
      return set_number(value, longest_time, standard.time, options.time);
    case ZV_TRANSFER_SPEED:
      return set_number(value, most_bytes, standard.speed, options.speed);
    case ZV_TRANSFER_SIZE:
      return set_number(value, most_bytes, standard.size, options.size);
    case ZV_TRANSFER_IN_PLACE:
      return set_flag(value, options.in_place);
    case ZV_TRANSFER_KEEP:
      return set_flag(value, options.keep);
    case ZV_TRANSFER_SYNC:
      return set_flag(value, options.sync);
    default:
      return false;
  }
}

void forget(zv::Failure& last) {
  last.code = last.number = 0;
  last.cause = ZV_CAUSE_NONE;
  last.reason.clear();
}

}  // namespace

zv_transfer_t* zv_transfer_create(void) {
  void* const room = std::malloc(sizeof(zv_transfer_t));
  return room != nullptr ? new (room) zv_transfer_t : nullptr;
}

int zv_transfer_destroy(zv_transfer_t* transfer) {
  if (transfer != nullptr) transfer->~zv_transfer_t();
  std::free(transfer);
  return 0;
}

int zv_transfer_set(zv_transfer_t* transfer, int option, int64_t value) {
  return !transfer->signals.running && set_option(transfer->options, option, value) ? 1 : 0;
}

int zv_transfer_login(zv_transfer_t* transfer, int side, const char* user, const char* password) {
  if (transfer->signals.running || (side != 0 && side != 1)) return 0;
  zv::Login& login = transfer->logins[static_cast<size_t>(side)];
  const char* const secret = password != nullptr && user != nullptr ? password : "";
  if (user != nullptr && (zv::holds_line_end(user) || zv::holds_line_end(secret))) return 0;
  zv::HeapText copy;
  if (!copy.assign(secret) || !login.user.assign(user != nullptr ? user : "")) return 0;
  login.password.swap(copy);
  login.is_given = user != nullptr;
  return 1;
}

int zv_transfer_trust(zv_transfer_t* transfer, const char* pem_file) {
  if (transfer->signals.running) return 0;
  if (pem_file != nullptr) return transfer->trust.read(pem_file) ? 1 : 0;
  transfer->trust.forget();
  return 1;
}

int zv_transfer_watch(zv_transfer_t* transfer, transfer_watch_t watch, void* context) {
  if (transfer->signals.running) return 0;
  transfer->watch = {watch, context};
  return 1;
}

int zv_transfer_run(zv_transfer_t* transfer, const char* from, const char* to) {
  if (transfer->signals.running.exchange(true)) return -1;
  transfer->signals.done = 0;
  transfer->signals.total = -1;
  zv::Run run(transfer->options, transfer->watch, transfer->signals, &transfer->trust);
  zv::transfer(run, transfer->logins, from, to);
  transfer->last = run.failure();
  transfer->signals.running = false;
  return transfer->last.code;
}

int zv_transfer_progress(const zv_transfer_t* transfer, int64_t* done, int64_t* total) {
  const int running = transfer->signals.running ? 1 : 0;
  if (done != nullptr) *done = transfer->signals.done;
  if (total != nullptr) *total = transfer->signals.total;
  return running;
}

int zv_transfer_cancel(zv_transfer_t* transfer) {
  transfer->signals.cancelled = true;
  return 1;
}

int zv_transfer_reset(zv_transfer_t* transfer) {
  if (transfer->signals.running) return 0;
  transfer->signals.cancelled = false;
  forget(transfer->last);
  return 1;
}

int zv_transfer_cause(const zv_transfer_t* transfer, int* number) {
  if (number != nullptr) *number = transfer->last.number;
  return transfer->last.cause;
}

size_t zv_transfer_reason(const zv_transfer_t* transfer, char* buf, size_t size) {
  return zv_strncpy(buf, transfer->last.reason.c_str(), size);
}
