// The program's calls of its two companions: gatectl.exe, started by
// command line on Windows 9x, and the power-saving hook library HookKeep.dll.
#ifndef VISTREL_COMPANIONS_H
#define VISTREL_COMPANIONS_H

#include <windows.h>
#include <stdint.h>

// How long GateMemorySize waits for the companion's answer.
enum { GATE_REPLY_TIMEOUT_MS = 10000 };

// Restarts Windows by way of gatectl.exe, or directly when it cannot be
// started. The result of the restart request.
int GateRestart();

// The video memory size in the memory-size format, as gatectl.exe measures
// it; 0 when it cannot be started or does not answer in time. A nonzero
// answer is kept for the rest of the run.
uint32_t GateMemorySize();

// Registers main_window with the hook library and arms the stored timers
// (on = 1), or stops the library (on = 0). Returns 1.
int StartPowerTimers(HWND main_window, int on);

// The direct restart; tests put a recorder here.
extern BOOL(WINAPI* restart_windows)(UINT flags, DWORD reason);
// The hook library's SetKeepHook, through which every call of the program
// goes; tests put a recorder here.
extern DWORD(WINAPI* keep_hook)(HWND window, DWORD state, DWORD enable, DWORD minutes);
// The companion's answer wait; tests shorten it.
extern DWORD gate_reply_timeout;
// The timer minute StartPowerTimers gives the hook library, in 1/65536 of a
// real minute; tests shorten it.
extern DWORD power_minute_length;
// Forgets the kept memory size.
void ForgetGateMemorySize();

#endif
