// Results as JSON (RFC 8259): bytes that are no UTF-8 as lone surrogates.
#include "json.h"

#include <cstdio>

namespace tool {
namespace {

unsigned byte_at(std::string_view text, size_t place) {
  return place < text.size() ? static_cast<unsigned char>(text[place]) : 0;
}

// The second byte's range keeps long forms, surrogates and what is above U+10FFFF out.
bool is_second(unsigned first, unsigned second) {
  if (first == 0xE0) return second >= 0xA0 && second <= 0xBF;
  if (first == 0xED) return second >= 0x80 && second <= 0x9F;
  if (first == 0xF0) return second >= 0x90 && second <= 0xBF;
  if (first == 0xF4) return second >= 0x80 && second <= 0x8F;
  return second >= 0x80 && second <= 0xBF;
}

// The bytes of the UTF-8 sequence that the text begins with; 0 when it is none.
size_t sequence_length(std::string_view text) {
  const unsigned first = byte_at(text, 0);
  if (first < 0x80) return 1;
  const size_t length = first < 0xC2 || first > 0xF4 ? 0 : first < 0xE0 ? 2 : first < 0xF0 ? 3 : 4;
  if (length == 0 || !is_second(first, byte_at(text, 1))) return 0;
  for (size_t i = 2; i < length; ++i)
    if ((byte_at(text, i) & 0xC0U) != 0x80) return 0;
  return length;
}

std::string escaped(unsigned code_point) {
  char text[8];
  std::snprintf(text, sizeof text, "\\u%04x", code_point & 0xFFFFU);
  return text;
}

// Appends a value after those that are there.
void append_value(std::string& json, std::string_view value) {
  json.append(json.size() > 1 ? ", " : "").append(value);
}

}  // namespace

std::string json_string(std::string_view text) {
  std::string json = "\"";
  while (!text.empty()) {
    const size_t length = sequence_length(text);
    const unsigned first = byte_at(text, 0);
    if (length == 0)
      json += escaped(0xDC00 + first);
    else if (first < 0x20 || first == 0x7F)
      json += escaped(first);
    else
      json.append(first == '"' || first == '\\' ? "\\" : "").append(text.data(), length);
    text.remove_prefix(length == 0 ? 1 : length);
  }
  return json + '"';
}

std::string json_array(const std::vector<std::string>& values) {
  std::string json = "[";
  for (const std::string& value : values) append_value(json, value);
  return json + ']';
}

std::string json_object(const std::vector<std::pair<const char*, std::string>>& members) {
  std::string json = "{";
  for (const auto& [name, value] : members) append_value(json, json_string(name) + ": " + value);
  return json + '}';
}

}  // namespace tool
