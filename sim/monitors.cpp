// Windows 98's display devices and monitors, as its multi-monitor functions
// report them: one display device per card that has one (primary first),
// and one monitor per device on the desktop, laid side by side from the
// primary's left edge, each the size of its card's mode. Windows 95 and NT
// 4.0 have none of these functions.
#include <stdio.h>
#include <string.h>

#include "hardware/machine.h"
#include "machine_state.h"

namespace {

const uintptr_t monitor_handle_base = 0x3D100000;

struct Monitor {
    int card;
    int device_number;  // 1-based, as in "\\.\DISPLAYn"
    RECT rect;
};

int ListMonitors(Monitor* out)
{
    int cards[SIM_MAX_CARDS];
    int n = DisplayDeviceCards(cards);
    int count = 0, x = 0;
    for (int i = 0; i < n; i++) {
        const SimCardConfig* c = &sim->config.cards[cards[i]];
        if (!c->attached && cards[i] != sim->config.primary_card) continue;
        const SimDriverMode* m = &sim->cards[cards[i]].mode;
        out[count].card = cards[i];
        out[count].device_number = i + 1;
        SetRect(&out[count].rect, x, 0, x + m->width, m->height);
        x += m->width;
        count++;
    }
    return count;
}

HMONITOR Handle(int index) { return (HMONITOR)(monitor_handle_base + index); }

int Index(HMONITOR monitor, int count)
{
    uintptr_t v = (uintptr_t)monitor;
    if (v < monitor_handle_base || v - monitor_handle_base >= (uintptr_t)count) return -1;
    return (int)(v - monitor_handle_base);
}

BOOL WINAPI SimEnumDisplayDevicesA(LPCSTR device, DWORD number, PDISPLAY_DEVICEA info, DWORD flags)
{
    const DWORD base_size = 4 + 32 + 128 + 4;  // Windows 98's DISPLAY_DEVICE
    if (!sim || device || !info || info->cb < base_size) return FALSE;
    int cards[SIM_MAX_CARDS];
    int count = DisplayDeviceCards(cards);
    if (number >= (DWORD)count) return FALSE;
    int card = cards[number];
    DWORD cb = info->cb;
    memset((char*)info + 4, 0, (cb < sizeof *info ? cb : sizeof *info) - 4);
    snprintf(info->DeviceName, sizeof info->DeviceName, "\\\\.\\DISPLAY%lu", (unsigned long)number + 1);
    lstrcpynA(info->DeviceString, RegistryDriverDesc(card), sizeof info->DeviceString);
    const SimCardConfig* c = &sim->config.cards[card];
    bool primary = card == sim->config.primary_card;
    info->StateFlags = (primary || c->attached ? DISPLAY_DEVICE_ATTACHED_TO_DESKTOP : 0) |
                       (primary ? DISPLAY_DEVICE_PRIMARY_DEVICE : 0);
    if (cb >= sizeof *info) {
        snprintf(info->DeviceID, sizeof info->DeviceID, "PCI\\VEN_%04X&DEV_%04X", c->vendor_id, c->device_id);
        RegistryDriverKey(card, info->DeviceKey, sizeof info->DeviceKey);
    }
    return TRUE;
}

BOOL WINAPI SimEnumDisplayMonitors(HDC dc, LPCRECT clip, MONITORENUMPROC callback, LPARAM data)
{
    if (!sim || !callback) return FALSE;
    Monitor monitors[SIM_MAX_CARDS];
    int count = ListMonitors(monitors);
    RECT limit;
    bool limited = false;
    if (dc && GetClipBox(dc, &limit) != ERROR) limited = true;
    if (clip) {
        if (limited) IntersectRect(&limit, &limit, clip);
        else limit = *clip;
        limited = true;
    }
    for (int i = 0; i < count; i++) {
        RECT r = monitors[i].rect;
        if (limited && !IntersectRect(&r, &r, &limit)) continue;
        if (!callback(Handle(i), dc, &r, data)) break;
    }
    return TRUE;
}

BOOL WINAPI SimGetMonitorInfoA(HMONITOR monitor, LPMONITORINFO info)
{
    if (!sim || !info || info->cbSize < sizeof(MONITORINFO)) return FALSE;
    Monitor monitors[SIM_MAX_CARDS];
    int i = Index(monitor, ListMonitors(monitors));
    if (i < 0) return FALSE;
    info->rcMonitor = monitors[i].rect;
    info->rcWork = monitors[i].rect;
    info->dwFlags = monitors[i].card == sim->config.primary_card ? MONITORINFOF_PRIMARY : 0;
    if (info->dwFlags) {
        RECT work;
        if (SystemParametersInfoA(SPI_GETWORKAREA, 0, &work, 0)) IntersectRect(&info->rcWork, &work, &monitors[i].rect);
    }
    if (info->cbSize >= sizeof(MONITORINFOEXA))
        snprintf(((MONITORINFOEXA*)info)->szDevice, CCHDEVICENAME, "\\\\.\\DISPLAY%d", monitors[i].device_number);
    return TRUE;
}

HMONITOR Fallback(const Monitor* monitors, int count, DWORD flags, const RECT* near_to)
{
    if (flags == MONITOR_DEFAULTTONULL || count == 0) return NULL;
    int best = 0;
    if (flags == MONITOR_DEFAULTTONEAREST) {
        long best_distance = -1;
        for (int i = 0; i < count; i++) {
            const RECT* m = &monitors[i].rect;
            long dx = near_to->right <= m->left ? m->left - near_to->right + 1
                      : near_to->left >= m->right ? near_to->left - m->right + 1 : 0;
            long dy = near_to->bottom <= m->top ? m->top - near_to->bottom + 1
                      : near_to->top >= m->bottom ? near_to->top - m->bottom + 1 : 0;
            long distance = dx * dx + dy * dy;
            if (best_distance < 0 || distance < best_distance) {
                best_distance = distance;
                best = i;
            }
        }
        return Handle(best);
    }
    for (int i = 0; i < count; i++)
        if (monitors[i].card == sim->config.primary_card) return Handle(i);
    return Handle(0);
}

HMONITOR WINAPI SimMonitorFromRect(LPCRECT rect, DWORD flags)
{
    if (!sim || !rect) return NULL;
    Monitor monitors[SIM_MAX_CARDS];
    int count = ListMonitors(monitors);
    long best_area = 0;
    int best = -1;
    for (int i = 0; i < count; i++) {
        RECT r;
        if (!IntersectRect(&r, rect, &monitors[i].rect)) continue;
        long area = (long)(r.right - r.left) * (r.bottom - r.top);
        if (area > best_area) {
            best_area = area;
            best = i;
        }
    }
    return best >= 0 ? Handle(best) : Fallback(monitors, count, flags, rect);
}

HMONITOR WINAPI SimMonitorFromPoint(POINT point, DWORD flags)
{
    RECT r = {point.x, point.y, point.x + 1, point.y + 1};
    return SimMonitorFromRect(&r, flags);
}

HMONITOR WINAPI SimMonitorFromWindow(HWND window, DWORD flags)
{
    RECT r;
    if (!GetWindowRect(window, &r)) return flags == MONITOR_DEFAULTTONULL ? NULL : SimMonitorFromPoint({0, 0}, flags);
    return SimMonitorFromRect(&r, flags);
}

}  // namespace

int MachineFindDisplayFunctions(MachineDisplayFunctions* out)
{
    ZeroMemory(out, sizeof *out);
    HMODULE user32 = GetModuleHandleA("USER32");
    if (!user32) return 0;
    if (!sim) {
        out->EnumDisplayDevicesA = (EnumDisplayDevicesA_fn)GetProcAddress(user32, "EnumDisplayDevicesA");
        out->EnumDisplayMonitors = (EnumDisplayMonitors_fn)GetProcAddress(user32, "EnumDisplayMonitors");
        out->GetMonitorInfoA = (GetMonitorInfoA_fn)GetProcAddress(user32, "GetMonitorInfoA");
        out->MonitorFromPoint = (MonitorFromPoint_fn)GetProcAddress(user32, "MonitorFromPoint");
        out->MonitorFromRect = (MonitorFromRect_fn)GetProcAddress(user32, "MonitorFromRect");
        out->MonitorFromWindow = (MonitorFromWindow_fn)GetProcAddress(user32, "MonitorFromWindow");
        out->ChangeDisplaySettingsExA =
            (ChangeDisplaySettingsExA_fn)GetProcAddress(user32, "ChangeDisplaySettingsExA");
        return 1;
    }
    if (sim->config.windows != SIM_WINDOWS_98) return 1;
    out->EnumDisplayDevicesA = SimEnumDisplayDevicesA;
    out->EnumDisplayMonitors = SimEnumDisplayMonitors;
    out->GetMonitorInfoA = SimGetMonitorInfoA;
    out->MonitorFromPoint = SimMonitorFromPoint;
    out->MonitorFromRect = SimMonitorFromRect;
    out->MonitorFromWindow = SimMonitorFromWindow;
    out->ChangeDisplaySettingsExA = DisplayChangeSettingsEx;
    return 1;
}
