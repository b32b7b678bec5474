// What the DLL does when it is loaded. It is part of the DLL alone: a program with the static
// library may be a DLL too, and has a start of its own.
#include <windows.h>

extern "C" BOOL WINAPI DllMain(HINSTANCE library, DWORD reason, LPVOID);

// Threads that come and go are no concern of the library's. The system does not leave out a DLL
// with variables of each thread's own, such as a compiler's runtime may bring along.
BOOL WINAPI DllMain(HINSTANCE library, DWORD reason, LPVOID) {
  if (reason == DLL_PROCESS_ATTACH) DisableThreadLibraryCalls(library);
  return TRUE;
}
