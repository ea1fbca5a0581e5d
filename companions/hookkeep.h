// The power-saving hook library's one function.
#ifndef VISTREL_HOOKKEEP_H
#define VISTREL_HOOKKEEP_H

#include <windows.h>

#ifdef HOOKKEEP_BUILD
#define HOOKKEEP_API extern "C" __declspec(dllexport)
#else
#define HOOKKEEP_API extern "C" __declspec(dllimport)
#endif

// window: where MSG_POWER_STATE goes (NULL keeps the registered one);
// state: 1 standby, 2 suspend, 4 off, 0 all; enable and minutes as the calls
// of the program describe them.
HOOKKEEP_API DWORD WINAPI SetKeepHook(HWND window, DWORD state, DWORD enable, DWORD minutes);

#endif
