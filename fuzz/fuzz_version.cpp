// Version texts.
#include <cstring>
#include <memory>
#include <string>

#include "check.h"
#include "zarvo.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  int major = -1;
  int minor = -1;
  int patch = -1;
  const std::unique_ptr<char[]> release(new char[12]);
  release[0] = '\0';
  const int ok = zv_split_version(text.c_str(), &major, &minor, &patch, release.get());
  CHECK((ok == 1) == (text.c_str()[0] != '\0'));
  CHECK((ok == 1) == (release[0] != '\0'));
  CHECK(std::strlen(release.get()) < 12);
  return 0;
}
