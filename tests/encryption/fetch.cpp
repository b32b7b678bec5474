// fetch FROM TO CERTIFICATES [SILENCE [CANCEL]]: what two runs of one handle come to, a line each:
// the cause and the reason. "" are the system's certificates; times are in ms, and the watch
// cancels a run after CANCEL. A run that ends 2 s after it should says so.
#include <zarvo.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>

using Clock = std::chrono::steady_clock;

int main(int argc, char** argv) {
  using namespace std::chrono_literals;
  zv_transfer_t* const transfer = zv_transfer_create();
  if (argc < 4 || (argv[3][0] != '\0' && zv_transfer_trust(transfer, argv[3]) == 0)) return 2;
  const int silence = argc > 4 ? std::atoi(argv[4]) : 20000;
  const int cancel = argc > 5 ? std::atoi(argv[5]) : 60000;
  zv_transfer_set(transfer, ZV_TRANSFER_SILENCE, silence);
  for (int i = 0; i < 2; ++i) {
    Clock::time_point end = Clock::now() + cancel * 1ms;
    const auto is_past = [](void* when, int64_t, int64_t) {
      return Clock::now() > *static_cast<Clock::time_point*>(when) ? 1 : 0;
    };
    zv_transfer_watch(transfer, is_past, &end);
    const Clock::time_point latest = Clock::now() + std::min(silence, cancel) * 1ms + 2s;
    zv_transfer_run(transfer, argv[1], argv[2]);
    char reason[400];
    zv_transfer_reason(transfer, reason, sizeof reason);
    std::printf("%d %s%s\n", zv_transfer_cause(transfer, nullptr), reason,
                Clock::now() > latest ? " LATE" : "");
  }
  return zv_transfer_destroy(transfer);
}
