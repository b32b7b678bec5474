// A folder of one's own for a short time.
#define _CRT_RAND_S
#include <stdlib.h>
#include <windows.h>
// It needs what windows.h declares.
#include <sddl.h>

#include <algorithm>
#include <cstdio>
#include <iterator>
#include <memory>

#include "platform/platform.h"

namespace zv::platform {

namespace {

struct FreeLocal {
  void operator()(void* block) const { LocalFree(block); }
};

// Full rights for the owner, inherited by what is made inside, and none for anyone else.
std::unique_ptr<void, FreeLocal> owner_only() {
  PSECURITY_DESCRIPTOR descriptor = nullptr;
  ConvertStringSecurityDescriptorToSecurityDescriptorA("D:P(A;OICI;FA;;;OW)", SDDL_REVISION_1,
                                                       &descriptor, nullptr);
  return std::unique_ptr<void, FreeLocal>(descriptor);
}

bool append_random(PathBuffer& path) {
  unsigned number = 0;
  TextBuffer<24> name;
  return rand_s(&number) == 0 && name.fill([number](char* room, size_t size) {
    return std::snprintf(room, size, "zarvo-%08x", number) > 0;
  }) && path.append(name.view());
}

bool begins_with(std::string_view name, std::string_view device) {
  return name.size() >= device.size() &&
         zv_strnicmp(name.data(), device.data(), device.size()) == 0;
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

bool make_private_folder(PathBuffer& path) {
  const std::unique_ptr<void, FreeLocal> descriptor = owner_only();
  if (descriptor == nullptr) return false;
  SECURITY_ATTRIBUTES attributes = {sizeof attributes, descriptor.get(), FALSE};
  for (int tries = 0; tries < 100; ++tries) {
    PathBuffer folder = path;
    if (!append_random(folder)) return false;
    if (CreateDirectoryA(folder.c_str(), &attributes) != 0) {
      path = folder;
      return true;
    }
    if (GetLastError() != ERROR_ALREADY_EXISTS) return false;
  }
  return false;
}

bool names_a_file(std::string_view name) {
  if (name.empty() || name.ends_with('.') || name.ends_with(' ') || is_device(name)) return false;
  return std::none_of(name.begin(), name.end(), [](unsigned char ch) {
    return ch < ' ' ||
           std::string_view("\\/:*?\"<>|").find(static_cast<char>(ch)) != std::string_view::npos;
  });
}

}  // namespace zv::platform
