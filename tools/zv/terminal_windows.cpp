// The terminal on Windows.
#include <io.h>

#include "terminal.h"

bool tool::is_terminal(std::FILE* stream) {
  return _isatty(_fileno(stream)) != 0;
}
