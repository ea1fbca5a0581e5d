// Operations whose modules are still being written. Each answers "nothing
// done" so that the program runs; none pretends to work.
#include "adjust/adjust_window.h"
#include "adjust/position.h"
#include "hardware/companions.h"

int RestorePosition() { return 1; }
LRESULT CALLBACK AdjustWindowProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    return DefWindowProcA(window, message, wparam, lparam);
}
int GateRestart() { return 0; }
uint32_t GateMemorySize() { return 0; }
int StartPowerTimers(HWND main_window, int on) { return 1; }
BOOL(WINAPI* restart_windows)(UINT flags, DWORD reason) = ExitWindowsEx;
