// Multi-monitor functions that Windows 95 and NT 4.0 lack, answered there
// as for one primary monitor covering the screen.
#ifndef VISTREL_MULTIMON_H
#define VISTREL_MULTIMON_H

#include <windows.h>

extern const HMONITOR primary_monitor_stub;

int MultimonGetSystemMetrics(int index);
HMONITOR MultimonMonitorFromPoint(POINT point, DWORD flags);
HMONITOR MultimonMonitorFromRect(LPCRECT rect, DWORD flags);
HMONITOR MultimonMonitorFromWindow(HWND window, DWORD flags);
BOOL MultimonGetMonitorInfo(HMONITOR monitor, LPMONITORINFO info);
BOOL MultimonEnumDisplayMonitors(HDC dc, LPCRECT clip, MONITORENUMPROC callback, LPARAM data);

// The screen rectangle of the current adapter's monitor. Always 1.
int GetAdapterMonitorRect(RECT* out);

#endif
