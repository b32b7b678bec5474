// Numbers as protocols write them: digits and nothing else.
#ifndef ZARVO_TRANSFER_DECIMAL_H
#define ZARVO_TRANSFER_DECIMAL_H

#include <charconv>
#include <cstdint>
#include <string_view>
#include <system_error>

namespace zv {

// Takes a number off the front of the text. False when it begins with none, or that is too large.
inline bool take_decimal(std::string_view& text, int64_t& number, int base = 10) {
  if (text.starts_with('-')) return false;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number, base);
  if (error != std::errc()) return false;
  text.remove_prefix(static_cast<size_t>(end - text.data()));
  return true;
}

// The whole text, but for blanks around it, is a number.
inline bool read_decimal(std::string_view text, int64_t& number) {
  while (text.starts_with(' ') || text.starts_with('\t')) text.remove_prefix(1);
  while (text.ends_with(' ') || text.ends_with('\t')) text.remove_suffix(1);
  return take_decimal(text, number) && text.empty();
}

}  // namespace zv

#endif
