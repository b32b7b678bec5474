// Byte order of whole arrays, beside a loop that is compiled for AVX2 alone and one pass over the
// memory.
#include <cstdlib>
#include <string>
#include <vector>

#include "calls/byteorder_loops.h"
#include "frame/measure.h"
#include "zarvo.h"

namespace {

const bench::Item item("byteorder");

void swap_array(uint16_t* data, int count) {
  zv_swapv_16(data, count);
}

void swap_array(uint32_t* data, int count) {
  zv_swapv_32(data, count);
}

void swap_array(uint64_t* data, int count) {
  zv_swapv_64(data, count);
}

std::string shown(size_t bytes) {
  return bytes < (1 << 20) ? std::to_string(bytes >> 10) + " KiB"
                           : std::to_string(bytes >> 20) + " MiB";
}

// All share one array: whether two lie alike in memory is no matter of speed.
template <class Element>
void add(uint64_t* memory, size_t bytes) {
  auto* const data = reinterpret_cast<Element*>(memory);
  const size_t count = bytes / sizeof(Element);
  const std::string what = std::to_string(8 * sizeof(Element)) + " bits, " + shown(bytes);
  item.add(what, "zarvo", [=] { swap_array(data, static_cast<int>(count)); });
  item.add(what, "limit AVX2 loop", [=] { bench::reverse_each(data, count); });
  if (bytes >= (1 << 20))
    item.add(what, "limit one pass", [=] { bench::pass_over(memory, bytes / sizeof *memory); });
}

}  // namespace

void bench::add_cases() {
  static std::vector<uint64_t> memory((size_t{256} << 20) / sizeof(uint64_t), 0x0123456789abcdef);
  for (const size_t bytes :
       {size_t{1} << 10, size_t{64} << 10, size_t{1} << 20, size_t{256} << 20}) {
    add<uint16_t>(memory.data(), bytes);
    add<uint32_t>(memory.data(), bytes);
    add<uint64_t>(memory.data(), bytes);
  }
}
