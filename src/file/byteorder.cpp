// Byte order, reversed unconditionally: single values, and arrays in place.
#include <algorithm>
#include <bit>
#include <cstring>

#include "platform/platform.h"
#include "zarvo.h"

// One loop is compiled twice: for every machine, and with the wide vectors that most x86 machines
// have, which make it four times as fast. Which one runs is asked at the call, so that loading the
// library costs nothing.
#if defined(__x86_64__)
#define ZV_WIDE_VECTORS __attribute__((target("avx2")))
#else
#define ZV_WIDE_VECTORS
#endif

namespace {

uint16_t reversed(uint16_t value) {
  return __builtin_bswap16(value);
}

uint32_t reversed(uint32_t value) {
  return __builtin_bswap32(value);
}

uint64_t reversed(uint64_t value) {
  return __builtin_bswap64(value);
}

// Reads and writes each element as bytes: the caller's data may lie at any address and hold any
// type.
template <class Element>
__attribute__((always_inline)) inline void reverse_each(unsigned char* data, size_t count) {
  for (size_t i = 0; i < count; ++i) {
    Element element;
    std::memcpy(&element, data + i * sizeof element, sizeof element);
    element = reversed(element);
    std::memcpy(data + i * sizeof element, &element, sizeof element);
  }
}

template <class Element>
ZV_WIDE_VECTORS void reverse_wide(unsigned char* data, size_t count) {
  reverse_each<Element>(data, count);
}

template <class Element>
void reverse_array(void* data, int count) {
  constexpr size_t worth_asking = 256;  // bytes
  auto* const bytes = static_cast<unsigned char*>(data);
  const size_t elements = static_cast<size_t>(std::max(count, 0));
  if (elements * sizeof(Element) >= worth_asking && zv::platform::has_wide_vectors())
    reverse_wide<Element>(bytes, elements);
  else
    reverse_each<Element>(bytes, elements);
}

template <class Bits, class Value>
Value reversed_as(Value value) {
  return std::bit_cast<Value>(reversed(std::bit_cast<Bits>(value)));
}

}  // namespace

int16_t zv_swap_int16(int16_t value) {
  return reversed_as<uint16_t>(value);
}

uint16_t zv_swap_uint16(uint16_t value) {
  return reversed(value);
}

int32_t zv_swap_int32(int32_t value) {
  return reversed_as<uint32_t>(value);
}

uint32_t zv_swap_uint32(uint32_t value) {
  return reversed(value);
}

int64_t zv_swap_int64(int64_t value) {
  return reversed_as<uint64_t>(value);
}

uint64_t zv_swap_uint64(uint64_t value) {
  return reversed(value);
}

float zv_swap_float(float value) {
  return reversed_as<uint32_t>(value);
}

double zv_swap_double(double value) {
  return reversed_as<uint64_t>(value);
}

void zv_swapv_16(uint16_t* data, int count) {
  reverse_array<uint16_t>(data, count);
}

void zv_swapv_32(uint32_t* data, int count) {
  reverse_array<uint32_t>(data, count);
}

void zv_swapv_64(uint64_t* data, int count) {
  reverse_array<uint64_t>(data, count);
}

void zv_swapv(void* data, int count, size_t size) {
  switch (size) {
    case sizeof(uint16_t):
      return reverse_array<uint16_t>(data, count);
    case sizeof(uint32_t):
      return reverse_array<uint32_t>(data, count);
    case sizeof(uint64_t):
      return reverse_array<uint64_t>(data, count);
    default:
      return;
  }
}
