// Dynamic libraries by a handle: open, look up a symbol, close.
#include <cstring>
#include <string_view>

#include "platform/platform.h"
#include "plugin/no_library.h"

namespace {

constexpr std::string_view extension = ".dll";
constexpr std::string_view placeholder = "%s";

// The template is never a format for printf: a caller's own `%` would read what is not there.
bool decorate(const char* name, const char* fmt, zv::PathBuffer& symbol) {
  const char* const place = std::strstr(fmt, placeholder.data());
  if (place == nullptr) return symbol.assign(fmt);
  return symbol.assign({fmt, place}) && symbol.append(name) &&
         symbol.append(place + placeholder.size());
}

}  // namespace

void* zv_dll_open(const char* path, int has_ext) {
  zv::PathBuffer file;
  if (!file.assign(path) || (has_ext == 0 && !file.append(extension))) return zv::no_library();
  void* const library = zv::platform::load_library(file.c_str());
  return library != nullptr ? library : zv::no_library();
}

void* zv_dll_getptr(void* lib, const char* name, const char* fmt) {
  if (lib == zv::no_library()) return nullptr;
  const bool plain = fmt == nullptr || *fmt == '\0';
  zv::PathBuffer symbol;
  if (!decorate(name, plain ? placeholder.data() : fmt, symbol)) return nullptr;
  return zv::platform::library_symbol(lib, symbol.c_str());
}

void* zv_dll_close(void* lib) {
  if (lib != zv::no_library()) zv::platform::unload_library(lib);
  return zv::no_library();
}
