// Operations whose modules are still being written. Each answers "nothing
// done" so that the program runs; none pretends to work.
#include "hardware/companions.h"
#include "modes/font_size.h"

void SwitchFontSize(int dpi_x, int dpi_y) {}
int GateRestart() { return 0; }
uint32_t GateMemorySize() { return 0; }
int StartPowerTimers(HWND main_window, int on) { return 1; }
BOOL(WINAPI* restart_windows)(UINT flags, DWORD reason) = ExitWindowsEx;
