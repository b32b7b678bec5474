// Fetches a file within limits, shows how far it is, and tries again after a failure of the moment.
// What was there before stays until all of the new file is.
#include <chrono>
#include <cstdio>
#include <thread>

#include <zarvo.hpp>

namespace {

// Called a few times a second, and once more at the end. A reason may follow on the same line.
constexpr auto show_progress = [](std::int64_t done, std::int64_t total) {
  const double share = total > 0 ? static_cast<double>(done) / static_cast<double>(total) : 0;
  if (share > 0) std::fprintf(stderr, "\r%3.0f %% %s", 100 * share, done == total ? "\n" : "");
  return true;  // go on; false would cancel
};

// Whether the same may go well in a moment.
bool is_of_the_moment(int cause) {
  switch (cause) {
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

}  // namespace

int main(int argc, char** argv) {
  if (argc != 3) {
    std::fprintf(stderr, "usage: retry LOCATION FILE\n");
    return 2;
  }
  zarvo::Transfer transfer;
  if (!transfer) return 1;
  zv_transfer_set(transfer.get(), ZV_TRANSFER_SILENCE, 10000);   // milliseconds
  zv_transfer_set(transfer.get(), ZV_TRANSFER_SIZE, 100000000);  // bytes
  transfer.watch(show_progress);

  std::chrono::milliseconds pause(200);
  for (int more = 2; transfer.run(argv[1], argv[2]) != zarvo::Copied::whole; --more, pause *= 2) {
    std::fprintf(stderr, "retry: %s\n", transfer.reason().c_str());
    if (more == 0 || !is_of_the_moment(zv_transfer_cause(transfer.get(), nullptr))) return 1;
    std::this_thread::sleep_for(pause);
  }
  return 0;
}
