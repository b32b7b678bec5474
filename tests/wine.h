// Whether the Windows build runs on Wine, which differs from Windows in a few results.
#ifndef ZARVO_TESTS_WINE_H
#define ZARVO_TESTS_WINE_H

#ifdef _WIN32
#include <windows.h>

inline bool under_wine() {
  return GetProcAddress(GetModuleHandleA("ntdll.dll"), "wine_get_version") != nullptr;
}
#else
inline bool under_wine() {
  return false;
}
#endif

#endif
