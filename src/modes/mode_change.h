// Changing the refresh rate and the display mode.
#ifndef VISTREL_MODE_CHANGE_H
#define VISTREL_MODE_CHANGE_H

#include <windows.h>
#include <stdint.h>

int SetRefreshRate(int target);
// Whether the rate running now counts as the target: within 5 Hz above
// 90 Hz, within 3 Hz up to 90, or both interlaced.
bool RefreshCloseEnough(int target, int current);
int ProgramRefreshClock(int rate);
void SyncRefreshRate(int at_startup);
LONG ApplyDisplayMode(HWND owner, DWORD mask, int width, int height, int bits, int dpi_x, int dpi_y, int refresh);

#endif
