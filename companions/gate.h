// gatectl.exe's work, apart from its process entry so that it can be driven
// without restarting anything.
#ifndef VISTREL_GATE_H
#define VISTREL_GATE_H

#include <windows.h>
#include <stdint.h>

#include "gate_command.h"

// The memory-size format: whole megabytes << 16, OR the kilobytes beyond
// them in steps of 64.
uint32_t PackMemorySize(uint32_t bytes);

// Posts the answer (message 1228, lParam = size) to the window of that
// class. 1 when there was such a window.
int ReplyMemorySize(const char* window_class, uint32_t size);

// Restarts Windows through exit_windows (ExitWindowsEx in gatectl.exe),
// taking the shutdown privilege first on NT. 1 when exit_windows agreed.
int RestartWindows(BOOL(WINAPI* exit_windows)(UINT, DWORD));

#endif
