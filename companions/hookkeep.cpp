#define HOOKKEEP_BUILD
#include "hookkeep.h"

HOOKKEEP_API DWORD WINAPI SetKeepHook(HWND window, DWORD state, DWORD enable, DWORD minutes) { return 0; }
