// The companion executable gatectl.exe and the power-saving hook library.
#ifndef VISTREL_COMPANIONS_H
#define VISTREL_COMPANIONS_H

#include <windows.h>
#include <stdint.h>

int GateRestart();
uint32_t GateMemorySize();
int StartPowerTimers(HWND main_window, int on);

// ExitWindowsEx, or what a test puts in its place.
extern BOOL(WINAPI* restart_windows)(UINT flags, DWORD reason);

#endif
