// The power-saving hook library's one function.
#ifndef VISTREL_HOOKKEEP_H
#define VISTREL_HOOKKEEP_H

#include <windows.h>

#ifdef HOOKKEEP_BUILD
#define HOOKKEEP_API extern "C" __declspec(dllexport)
#else
#define HOOKKEEP_API extern "C" __declspec(dllimport)
#endif

// The states, numbered as the DPMS chip commands they ask for.
enum {
    KEEP_STATE_ALL = 0,
    KEEP_STATE_STANDBY = 1,
    KEEP_STATE_SUSPEND = 2,
    KEEP_STATE_OFF = 4,
};

// The start call's last argument: the length of one timer minute in 1/65536
// of a real minute.
enum { KEEP_REAL_MINUTE = 65536 };

// window: where MSG_POWER_STATE goes (NULL keeps the registered one).
//   (window, 1, 1, length)   start watching for window; length as above
//   (window or NULL, state, 1, n >= 1)   arm that state's timer with n minutes
//   (NULL, state, 0, 0)      disarm it
//   (NULL, state, 1, 0)      enter that state now (and disarm every timer)
//   (NULL, 0, 0, 0)          stop watching
// 1 when the call was taken, 0 when it made no sense.
HOOKKEEP_API DWORD WINAPI SetKeepHook(HWND window, DWORD state, DWORD enable, DWORD minutes);

#endif
