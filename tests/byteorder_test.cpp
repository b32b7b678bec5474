// Byte order: single values and arrays.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <limits>
#include <string>
#include <vector>

#include "zarvo.h"

namespace {

template <class Value>
std::string bytes_of(Value value) {
  std::string bytes(sizeof value, '\0');
  std::memcpy(bytes.data(), &value, sizeof value);
  return bytes;
}

template <class Value>
void expect_reversed(Value (*swap)(Value), Value value) {
  std::string expected = bytes_of(value);
  std::reverse(expected.begin(), expected.end());
  EXPECT_EQ(bytes_of(swap(value)), expected);
  EXPECT_EQ(bytes_of(swap(swap(value))), bytes_of(value));
}

TEST(ByteOrder, SingleValues) {
  expect_reversed<int16_t>(zv_swap_int16, 0x0102);
  expect_reversed<int16_t>(zv_swap_int16, -2);
  expect_reversed<uint16_t>(zv_swap_uint16, 0xFE01);
  expect_reversed<int32_t>(zv_swap_int32, -0x01020304);
  expect_reversed<uint32_t>(zv_swap_uint32, 0x11223344);
  expect_reversed<int64_t>(zv_swap_int64, -0x0102030405060708);
  expect_reversed<uint64_t>(zv_swap_uint64, 0x8877665544332211);
  expect_reversed<float>(zv_swap_float, 1.5f);
  expect_reversed<float>(zv_swap_float, std::numeric_limits<float>::quiet_NaN());
  expect_reversed<double>(zv_swap_double, -0.1);
  expect_reversed<double>(zv_swap_double, std::numeric_limits<double>::denorm_min());
}

// Each count meets another mixture of wide, narrow and single steps; each offset another alignment.
TEST(ByteOrder, ArraysOfEveryCountAndAlignment) {
  constexpr size_t fence = 16;
  for (const size_t size : {2u, 4u, 8u})
    for (size_t count = 0; count < 200; ++count)
      for (const size_t offset : {0u, 1u, 8u}) {
        std::string data(offset + count * size + fence, '\0');
        for (size_t i = 0; i < data.size(); ++i) data[i] = static_cast<char>(i * 7 + i / 256);
        std::string expected = data;
        for (size_t i = 0; i < count; ++i) {
          const auto element = expected.begin() + static_cast<std::ptrdiff_t>(offset + i * size);
          std::reverse(element, element + static_cast<std::ptrdiff_t>(size));
        }
        zv_swapv(data.data() + offset, static_cast<int>(count), size);
        ASSERT_EQ(data, expected) << size << ' ' << count << ' ' << offset;
      }
}

TEST(ByteOrder, TypedArraysSwapAsTheirSizesDo) {
  std::vector<uint64_t> values(100);
  for (size_t i = 0; i < values.size(); ++i) values[i] = i * 0x0123456789ABCDEF;
  for (const size_t size : {2u, 4u, 8u}) {
    std::vector<uint64_t> typed = values;
    std::vector<uint64_t> sized = values;
    const int count = static_cast<int>(800 / size);
    if (size == 2) zv_swapv_16(reinterpret_cast<uint16_t*>(typed.data()), count);
    if (size == 4) zv_swapv_32(reinterpret_cast<uint32_t*>(typed.data()), count);
    if (size == 8) zv_swapv_64(typed.data(), count);
    zv_swapv(sized.data(), count, size);
    EXPECT_EQ(typed, sized) << size;
    EXPECT_NE(typed, values) << size;
  }
}

TEST(ByteOrder, OtherSizesAndCountsTouchNothing) {
  const std::string before(64, 'a');
  std::string data = before;
  data[1] = 'b';
  const std::string kept = data;
  for (const size_t size : {0u, 1u, 3u, 16u}) zv_swapv(data.data(), 2, size);
  for (const int count : {0, -1, std::numeric_limits<int>::min()}) zv_swapv(data.data(), count, 2);
  EXPECT_EQ(data, kept);
}

}  // namespace
