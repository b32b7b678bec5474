// What the tool asks of the system, on Windows.
#include <fcntl.h>
#include <io.h>
#include <sys/stat.h>
#include <windows.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <system_error>

#include "system.h"

namespace {

// Gone when it is closed.
int temporary_file() {
  char folder[MAX_PATH + 1] = "";
  char name[MAX_PATH + 1] = "";
  if (GetTempPathA(sizeof folder, folder) == 0 || GetTempFileNameA(folder, "zv", 0, name) == 0)
    return -1;
  return _open(name, _O_RDWR | _O_CREAT | _O_BINARY | _O_TEMPORARY | _O_NOINHERIT,
               _S_IREAD | _S_IWRITE);
}

}  // namespace

// _isatty() would take the empty device for one: any device is to it.
bool tool::is_terminal(std::FILE* stream) {
  DWORD mode = 0;
  return GetConsoleMode(reinterpret_cast<HANDLE>(_get_osfhandle(_fileno(stream))), &mode) != 0;
}

// A console has a code page of its own.
void tool::prepare_console() {
  static UINT before = 0;
  if (!is_terminal(stdout) && !is_terminal(stderr)) return;
  before = GetConsoleOutputCP();
  if (SetConsoleOutputCP(GetACP()) != 0) std::atexit([] { SetConsoleOutputCP(before); });
}

std::string tool::messages_of(const std::function<void()>& speak) {
  constexpr int standard_error = 2;
  const int file = temporary_file();
  const int shown = _dup(standard_error);  // -1 where it is closed
  if (file < 0 || _dup2(file, standard_error) < 0)
    throw std::system_error(errno, std::generic_category(), "messages cannot be read");
  speak();
  if (shown < 0)
    _close(standard_error);
  else
    _dup2(shown, standard_error);
  std::string text(static_cast<size_t>(_lseeki64(file, 0, SEEK_END)), '\0');
  _lseeki64(file, 0, SEEK_SET);
  const int size = _read(file, text.data(), static_cast<unsigned>(text.size()));
  text.resize(static_cast<size_t>(std::max(size, 0)));
  _close(file);
  _close(shown);
  return text;
}

std::string tool::loader_words() {
  const int error = static_cast<int>(GetLastError());
  SetLastError(0);
  return std::system_category().message(error);
}
