// What a function of characters makes of each byte, looked up.
#ifndef ZARVO_FRAME_BYTE_MAP_H
#define ZARVO_FRAME_BYTE_MAP_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>

namespace zv {

using ByteMap = std::array<int32_t, 256>;

constexpr ByteMap shifted(char first, char last, int32_t by) {
  ByteMap map{};
  for (int32_t byte = 0; byte < 256; ++byte)
    map[static_cast<size_t>(byte)] = byte >= first && byte <= last ? byte + by : byte;
  return map;
}

// Case of the letters of ASCII alone, which is that of the "C" locale and of all with UTF-8.
inline constexpr ByteMap ascii_lower = shifted('A', 'Z', 'a' - 'A');
inline constexpr ByteMap ascii_upper = shifted('a', 'z', 'A' - 'a');

// Whether a map is the same as another for its first bytes.
inline bool agrees(const int32_t* map, const ByteMap& other, size_t bytes = 256) {
  return map == other.data() || std::memcmp(map, other.data(), bytes * sizeof *map) == 0;
}

}  // namespace zv

#endif
