#include "hardware/multimon.h"

#include "base/adapters.h"
#include "base/state.h"
#include "hardware/machine.h"

static_assert(sizeof(MONITORINFO) == 40, "the monitor information of Windows 98");

const HMONITOR primary_monitor_stub = (HMONITOR)(uintptr_t)0x12340042;

static MachineDisplayFunctions functions;
static bool complete;  // the system has every multi-monitor function

// Looked up at every use: cheap, and right whichever system is beneath.
static void LookUp()
{
    complete = false;
    if (!MachineFindDisplayFunctions(&functions)) return;
    complete = functions.EnumDisplayMonitors && functions.GetMonitorInfoA && functions.MonitorFromPoint &&
               functions.MonitorFromRect && functions.MonitorFromWindow;
}

static RECT ScreenRect()
{
    RECT r = {0, 0, GetSystemMetrics(SM_CXSCREEN), GetSystemMetrics(SM_CYSCREEN)};
    return r;
}

int MultimonGetSystemMetrics(int index)
{
    LookUp();
    if (!complete) {
        switch (index) {
        case SM_CMONITORS: return 1;
        case SM_SAMEDISPLAYFORMAT: return 1;
        case SM_XVIRTUALSCREEN:
        case SM_YVIRTUALSCREEN: return 0;
        case SM_CXVIRTUALSCREEN: return GetSystemMetrics(SM_CXSCREEN);
        case SM_CYVIRTUALSCREEN: return GetSystemMetrics(SM_CYSCREEN);
        }
    }
    return GetSystemMetrics(index);
}

static HMONITOR StubForPoint(POINT p, DWORD flags)
{
    RECT screen = ScreenRect();
    if (PtInRect(&screen, p) || (flags & (MONITOR_DEFAULTTOPRIMARY | MONITOR_DEFAULTTONEAREST)))
        return primary_monitor_stub;
    return NULL;
}

HMONITOR MultimonMonitorFromPoint(POINT point, DWORD flags)
{
    LookUp();
    if (complete) return functions.MonitorFromPoint(point, flags);
    return StubForPoint(point, flags);
}

HMONITOR MultimonMonitorFromRect(LPCRECT rect, DWORD flags)
{
    LookUp();
    if (complete) return functions.MonitorFromRect(rect, flags);
    RECT screen = ScreenRect(), overlap;
    if ((flags & (MONITOR_DEFAULTTOPRIMARY | MONITOR_DEFAULTTONEAREST)) || IntersectRect(&overlap, &screen, rect))
        return primary_monitor_stub;
    return NULL;
}

HMONITOR MultimonMonitorFromWindow(HWND window, DWORD flags)
{
    LookUp();
    if (complete) return functions.MonitorFromWindow(window, flags);
    if (flags & (MONITOR_DEFAULTTOPRIMARY | MONITOR_DEFAULTTONEAREST)) return primary_monitor_stub;
    if (IsIconic(window)) return primary_monitor_stub;
    RECT r;
    if (!GetWindowRect(window, &r)) return NULL;
    return MultimonMonitorFromRect(&r, flags);
}

BOOL MultimonGetMonitorInfo(HMONITOR monitor, LPMONITORINFO info)
{
    LookUp();
    if (complete) return functions.GetMonitorInfoA(monitor, info);
    if (monitor != primary_monitor_stub || !info || info->cbSize < sizeof(MONITORINFO)) return FALSE;
    info->rcMonitor = ScreenRect();
    if (!SystemParametersInfoA(SPI_GETWORKAREA, 0, &info->rcWork, 0)) info->rcWork = info->rcMonitor;
    info->dwFlags = MONITORINFOF_PRIMARY;
    return TRUE;
}

BOOL MultimonEnumDisplayMonitors(HDC dc, LPCRECT clip, MONITORENUMPROC callback, LPARAM data)
{
    LookUp();
    if (complete) return functions.EnumDisplayMonitors(dc, clip, callback, data);
    RECT area = ScreenRect();
    if (clip && !IntersectRect(&area, &area, clip)) return TRUE;
    RECT monitor_rect = area;
    if (dc) {
        RECT clip_box;
        if (GetClipBox(dc, &clip_box) == NULLREGION) return TRUE;
        if (!IntersectRect(&monitor_rect, &area, &clip_box)) return TRUE;
    }
    if (callback) callback(primary_monitor_stub, dc, &monitor_rect, data);
    return TRUE;
}

struct MonitorCountdown {
    uint16_t* remaining;
    HMONITOR found;
};

static BOOL CALLBACK SkipToMonitor(HMONITOR monitor, HDC dc, LPRECT rect, LPARAM data)
{
    MonitorCountdown* c = (MonitorCountdown*)data;
    if (*c->remaining == 0) {
        c->found = monitor;
        return FALSE;
    }
    --*c->remaining;
    return TRUE;
}

int GetAdapterMonitorRect(RECT* out)
{
    HMONITOR monitor = NULL;
    if (IsWindows98() && monitor_count >= 2) {
        AdapterRecord* a = CurrentAdapter();
        uint16_t saved = a->display_index;
        MonitorCountdown countdown = {&a->display_index, NULL};
        MultimonEnumDisplayMonitors(NULL, NULL, SkipToMonitor, (LPARAM)&countdown);
        a->display_index = saved;
        monitor = countdown.found;
    }
    if (monitor) {
        MONITORINFO info;
        info.cbSize = sizeof info;
        if (MultimonGetMonitorInfo(monitor, &info)) {
            *out = info.rcMonitor;
            return 1;
        }
    }
    *out = ScreenRect();
    return 1;
}
