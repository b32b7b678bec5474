// The terminal on Linux.
#include <unistd.h>

#include "terminal.h"

bool tool::is_terminal(std::FILE* stream) {
  return isatty(fileno(stream)) != 0;
}
