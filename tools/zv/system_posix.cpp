// What the tool asks of the system, on Linux.
#include <dlfcn.h>
#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <system_error>

#include "system.h"

bool tool::is_terminal(std::FILE* stream) {
  return isatty(fileno(stream)) != 0;
}

void tool::prepare_console() {}  // a terminal shows UTF-8

std::string tool::messages_of(const std::function<void()>& speak) {
  const int file = memfd_create("messages", MFD_CLOEXEC);
  const int shown = dup(STDERR_FILENO);  // -1 where it is closed
  if (file < 0 || dup2(file, STDERR_FILENO) < 0)
    throw std::system_error(errno, std::generic_category(), "messages cannot be read");
  speak();
  if (shown < 0)
    close(STDERR_FILENO);
  else
    dup2(shown, STDERR_FILENO);
  std::string text(static_cast<size_t>(lseek(file, 0, SEEK_END)), '\0');
  text.resize(static_cast<size_t>(std::max<ssize_t>(pread(file, text.data(), text.size(), 0), 0)));
  close(file);
  close(shown);
  return text;
}

std::string tool::loader_words() {
  const char* const words = dlerror();
  return words != nullptr ? words : "no library, or not all of one";
}
