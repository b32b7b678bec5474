// The key of the process's hash tables.
#include "strings/hash.h"

#include <atomic>
#include <ctime>

#include "platform/platform.h"

namespace zv {

uint64_t hash_key() {
  static std::atomic<uint64_t> kept = 0;
  uint64_t key = kept.load(std::memory_order_relaxed);
  if (key != 0) return key;
  // Where there are no random numbers yet, every process is still laid out differently.
  if (!platform::random_number(key))
    key = reinterpret_cast<uintptr_t>(&kept) * static_cast<uint64_t>(std::time(nullptr));
  key |= 1;
  uint64_t first = 0;
  return kept.compare_exchange_strong(first, key) ? key : first;
}

}  // namespace zv
