// Fetches a file, and tries again when the network fails for a moment; what was there before stays
// until all of the new file is.
#include <chrono>
#include <cstdio>
#include <filesystem>
#include <string>
#include <thread>

#include <zarvo.h>

namespace {

// Only a source is tried again: nobody knows what a destination that failed has taken already.
int copy_with_retries(const char* from, const char* to, int tries) {
  std::chrono::milliseconds pause(200);
  int result = zv_copy(from, to);
  for (; result == ZV_COPY_SOURCE_FAILED && --tries > 0; pause *= 2) {
    std::fprintf(stderr, "retry: failed, %d more\n", tries);
    std::this_thread::sleep_for(pause);
    result = zv_copy(from, to);
  }
  return result;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 3) {
    std::fprintf(stderr, "usage: retry LOCATION FILE\n");
    return 2;
  }
  const std::string part = std::string(argv[2]) + ".part";
  const int result = copy_with_retries(argv[1], part.c_str(), 3);
  std::error_code error;
  if (result == 0) std::filesystem::rename(part, argv[2], error);
  if (result == 0 && !error) return 0;

  // The location is not printed: a password may stand in it.
  if (result == ZV_COPY_SOURCE_FAILED)
    std::fprintf(stderr, "retry: the source could not be read\n");
  else
    std::fprintf(stderr, "retry: %s could not be written\n", argv[2]);
  std::filesystem::remove(part, error);
  return 1;
}
