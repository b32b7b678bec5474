// Decimal numbers in texts that others wrote, read as the C library reads them.
#ifndef ZARVO_TRANSFER_NUMBER_H
#define ZARVO_TRANSFER_NUMBER_H

#include <charconv>
#include <limits>
#include <span>
#include <string_view>
#include <system_error>

#include "frame/text_view.h"

namespace zv {

// Takes a number off the front of the text: white space, an optional sign, digits. False when there
// is none (the number is 0) or when it does not fit (the number is the nearest limit).
template <class Number>
bool take_number(std::string_view& text, Number& number) {
  using Limits = std::numeric_limits<Number>;
  while (!text.empty() && is_space(text.front())) text.remove_prefix(1);
  const bool negative = text.starts_with('-');
  const bool two_signs = text.size() > 1 && text[1] == '-';
  if (text.starts_with('+') && !two_signs) text.remove_prefix(1);
  number = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  text.remove_prefix(static_cast<size_t>(end - text.data()));
  if (error == std::errc::result_out_of_range) number = negative ? Limits::min() : Limits::max();
  return error == std::errc();
}

// Takes as many numbers as there is room for, each pair with just the separator between them.
inline bool take_numbers(std::string_view& text, char separator, std::span<int> numbers) {
  bool first = true;
  for (int& number : numbers) {
    if (!first && !text.starts_with(separator)) return false;
    if (!first) text.remove_prefix(1);
    if (!take_number(text, number)) return false;
    first = false;
  }
  return true;
}

// The number after the first word of a line.
template <class Number>
bool number_after_word(std::string_view line, Number& number) {
  while (!line.empty() && is_space(line.front())) line.remove_prefix(1);
  while (!line.empty() && !is_space(line.front())) line.remove_prefix(1);
  return take_number(line, number);
}

}  // namespace zv

#endif
