// Byte order: single values and arrays.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <limits>
#include <string>

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
}

TEST(ByteOrder, SingleValues) {
  expect_reversed<int16_t>(zv_swap_int16, -0x0102);
  expect_reversed<uint16_t>(zv_swap_uint16, 0xFE01);
  expect_reversed<int32_t>(zv_swap_int32, -0x01020304);
  expect_reversed<uint32_t>(zv_swap_uint32, 0xF1223344);
  expect_reversed<int64_t>(zv_swap_int64, -0x0102030405060708);
  expect_reversed<uint64_t>(zv_swap_uint64, 0x8877665544332211);
  expect_reversed<float>(zv_swap_float, 1.5f);
  expect_reversed<float>(zv_swap_float, std::numeric_limits<float>::quiet_NaN());
  expect_reversed<double>(zv_swap_double, -0.1);
}

// Each count meets another mixture of wide, narrow and single steps; each offset another alignment.
TEST(ByteOrder, ArraysOfEveryCountAndAlignment) {
  constexpr size_t fence = 16;
  for (const size_t size : {2u, 4u, 8u})
    for (int count = -1; count < 200; ++count)
      for (const size_t offset : {0u, 1u, 8u}) {
        const auto elements = static_cast<size_t>(std::max(count, 0));
        std::string data(offset + elements * size + fence, '\0');
        for (size_t i = 0; i < data.size(); ++i) data[i] = static_cast<char>(i * 7 + i / 256);
        std::string expected = data;
        for (size_t i = 0; i < elements; ++i) {
          char* const element = expected.data() + offset + i * size;
          std::reverse(element, element + size);
        }
        std::string typed = data;
        zv_swapv(data.data() + offset, count, size);
        ASSERT_EQ(data, expected) << size << ' ' << count << ' ' << offset;
        if (offset == 1) continue;  // no array of such values lies there
        void* const values = typed.data() + offset;
        if (size == 2) zv_swapv_16(static_cast<uint16_t*>(values), count);
        if (size == 4) zv_swapv_32(static_cast<uint32_t*>(values), count);
        if (size == 8) zv_swapv_64(static_cast<uint64_t*>(values), count);
        ASSERT_EQ(typed, expected) << size << ' ' << count << ' ' << offset;
      }
}

TEST(ByteOrder, OtherSizesTouchNothing) {
  const std::string before = "0123456789abcdef0123456789abcdef";
  std::string data = before;
  for (const size_t size : {0u, 1u, 3u, 16u}) zv_swapv(data.data(), 2, size);
  zv_swapv(data.data(), std::numeric_limits<int>::min(), 2);
  EXPECT_EQ(data, before);
}

}  // namespace
