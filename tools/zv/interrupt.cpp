// Ctrl-C and its like while a transfer runs: the first cancels, the second ends the program.
#include "interrupt.h"

#include <atomic>
#include <csignal>

namespace tool {
namespace {

constexpr int signals[] = {
    SIGINT,
    SIGTERM,
#ifdef SIGHUP
    SIGHUP,
#endif
};

std::atomic<zv_transfer_t*> running = nullptr;
volatile std::sig_atomic_t signal_caught = 0;

void restore() {
  for (const int number : signals) std::signal(number, SIG_DFL);
}

extern "C" void cancel(int number) {
  restore();
  signal_caught = number;
  if (zv_transfer_t* const transfer = running) zv_transfer_cancel(transfer);
}

}  // namespace

// What was ignored stays so, as nohup wants it.
Interrupt::Interrupt(zv_transfer_t* transfer) {
  running = transfer;
  for (const int number : signals)
    if (std::signal(number, cancel) == SIG_IGN) std::signal(number, SIG_IGN);
}

Interrupt::~Interrupt() {
  restore();
  running = nullptr;
}

int Interrupt::caught() {
  return signal_caught;
}

}  // namespace tool
