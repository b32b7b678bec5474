// A folder of one's own for a short time.
#define _CRT_RAND_S
#include <stdlib.h>
#include <windows.h>
// It needs what windows.h declares.
#include <sddl.h>

#include <cstdio>
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
  uint64_t number = 0;
  TextBuffer<24> name;
  return random_number(number) && name.fill([number](char* room, size_t size) {
    return std::snprintf(room, size, "zarvo-%08x", static_cast<unsigned>(number)) > 0;
  }) && path.append(name.view());
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

bool random_number(uint64_t& out) {
  unsigned low = 0;
  unsigned high = 0;
  if (rand_s(&low) != 0 || rand_s(&high) != 0) return false;
  out = uint64_t{high} << 32 | low;
  return true;
}

}  // namespace zv::platform
