// Names of files.
#include <windows.h>

#include <algorithm>
#include <array>
#include <iterator>

#include "platform/platform.h"

namespace zv::platform {

namespace {

bool begins_with(std::string_view name, std::string_view device) {
  return name.size() >= device.size() &&
         compare_without_case(name.data(), device.data(), device.size()) == 0;
}

// The superscript digits count, in Latin-1 and in UTF-8.
bool is_port_number(std::string_view text) {
  if (text.starts_with('\xC2')) text.remove_prefix(1);
  return text.size() == 1 && ((text[0] >= '1' && text[0] <= '9') || text[0] == '\xB9' ||
                              text[0] == '\xB2' || text[0] == '\xB3');
}

// Names that lead to a device, with any extension, in every folder.
bool is_device(std::string_view name) {
  constexpr std::string_view devices[] = {"con", "prn", "aux", "nul", "conin$", "conout$"};
  std::string_view stem(name.data(), std::min(name.find('.'), name.size()));
  while (stem.ends_with(' ')) stem.remove_suffix(1);
  if (begins_with(stem, "com") || begins_with(stem, "lpt"))
    return is_port_number({stem.data() + 3, stem.size() - 3});
  return std::any_of(std::begin(devices), std::end(devices), [stem](std::string_view device) {
    return stem.size() == device.size() && begins_with(stem, device);
  });
}

}  // namespace

bool names_a_file(std::string_view name) {
  if (name.empty() || name.ends_with('.') || name.ends_with(' ') || is_device(name)) return false;
  return std::none_of(name.begin(), name.end(), [](unsigned char ch) {
    return ch < ' ' ||
           std::string_view("\\/:*?\"<>|").find(static_cast<char>(ch)) != std::string_view::npos;
  });
}

// From the process's code page.
bool utf8_name(const char* name, Utf8Name& out) {
  std::array<wchar_t, ZV_PATH_MAX> wide;
  const int length = MultiByteToWideChar(CP_ACP, MB_ERR_INVALID_CHARS, name, -1, wide.data(),
                                         static_cast<int>(wide.size()));
  return length > 0 && out.fill([&](char* room, size_t size) {
    return WideCharToMultiByte(CP_UTF8, WC_ERR_INVALID_CHARS, wide.data(), length, room,
                               static_cast<int>(size), nullptr, nullptr) > 0;
  });
}

}  // namespace zv::platform
