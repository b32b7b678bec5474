// The terminal on Windows. _isatty() would take the empty device for one: any device is to it.
#include <io.h>
#include <windows.h>

#include "terminal.h"

bool tool::is_terminal(std::FILE* stream) {
  DWORD mode = 0;
  return GetConsoleMode(reinterpret_cast<HANDLE>(_get_osfhandle(_fileno(stream))), &mode) != 0;
}
