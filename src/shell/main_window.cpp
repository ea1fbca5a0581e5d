#include "shell/main_window.h"

#include "base/adapters.h"
#include "base/state.h"
#include "base/texts.h"
#include "chips/chips.h"
#include "modes/detect.h"
#include "modes/display_settings.h"
#include "modes/mode_change.h"
#include "modes/mode_list.h"
#include "modes/position.h"
#include "shell/commands.h"
#include "shell/tray.h"
#include "shell/tray_menu.h"

enum { NOCARD_TEXT_SIZE = 80 };

static void OnCreate(HWND window)
{
    main_window = window;
    if (!DetectAdapters()) {
        char text[NOCARD_TEXT_SIZE];
        if (LoadSetupText("NoCard", "", text, sizeof text) > 0) MessageBoxA(NULL, text, NULL, MB_ICONHAND);
        DestroyWindow(window);
        return;
    }
    AddTrayIcon(window);
    startup_flags &= ~STARTUP_AUTORUN;
}

void ReapplyAfterRedraw(HWND window)
{
    uint32_t now = GetTickCount();
    if (shell_state & STATE_TRAY_BUSY) {
        last_activity_tick = now;
        return;
    }
    uint32_t previous = last_activity_tick;
    last_activity_tick = now;
    if (now - REAPPLY_QUIET_MS < previous) return;
    // The move causes another redraw, which re-applies.
    if (PlaceMainWindow(window)) return;
    int16_t saved = current_adapter;
    for (int16_t i = 0; i < adapter_count; ++i) {
        current_adapter = i;
        SetRefreshRate(CurrentAdapter()->refresh_hz);
        RestorePosition();
    }
    current_adapter = saved;
    last_activity_tick = GetTickCount();
}

void OnDisplayChange(HWND window)
{
    int moved = PlaceMainWindow(window);
    if (adapter_count > 0 && CurrentAdapter()->refresh_hz == REFRESH_CHANGE_MARKER) {
        last_activity_tick = GetTickCount();
        return;
    }
    if (platform == PLATFORM_NT && !moved) {
        last_activity_tick = 0;  // the next redraw re-applies at once
        return;
    }
    RefreshAdapterModes(REFRESH_LATER);
    last_activity_tick = GetTickCount();
}

LRESULT OnSetRefreshMessage(WPARAM rate)
{
    if (adapter_count <= 0) return 0;
    const AdapterRecord* a = CurrentAdapter();
    int lowest = 0, highest = 0;
    if (!CombinedRateRange(a->width, a->height, a->bits_per_pixel, &lowest, &highest)) return 0;
    if (rate < (WPARAM)lowest || rate > (WPARAM)highest) return 0;
    return SetRefreshRate((int)rate);
}

LRESULT OnPowerStateMessage(WPARAM state)
{
    // Any process can send this message: anything but a DPMS state would
    // reach every card as an arbitrary chip command.
    if (state != (uint32_t)state || !IsDpmsState((uint32_t)state)) return 1;
    chip_set_dpms_all((uint32_t)state);
    return 1;
}

static LRESULT OnQueryRefresh(WPARAM wparam, LPARAM lparam)
{
    if (adapter_count <= 0) return 0;
    return RefreshRateAt(LOWORD(wparam), LOWORD(lparam), HIWORD(lparam), HIWORD(wparam));
}

LRESULT CALLBACK MainWindowProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    switch (message) {
    case WM_CREATE:
        OnCreate(window);
        return 0;
    case WM_DESTROY:
        RemoveTrayIcon(window);
        PostQuitMessage(0);
        return 0;
    case WM_PAINT:
    case WM_NCPAINT:
        ReapplyAfterRedraw(window);
        break;
    case WM_CANCELMODE:
        shell_state &= ~STATE_MENU_PENDING;
        break;
    case WM_MEASUREITEM:
        MeasureMenuItem((MEASUREITEMSTRUCT*)lparam);
        return 1;
    case WM_DRAWITEM:
        DrawMenuItem((const DRAWITEMSTRUCT*)lparam);
        return 1;
    case WM_COMMAND:
        if (OnMenuCommand(window, LOWORD(wparam))) return 0;
        break;
    case MSG_TRAY_CALLBACK:
        OnTrayCallback(window, wparam, lparam);
        return 0;
    case WM_DISPLAYCHANGE:
        ForgetDisplaySettings();
        OnDisplayChange(window);
        return 0;
    case MSG_QUERY_REFRESH:
        return OnQueryRefresh(wparam, lparam);
    case MSG_GET_REFRESH:
        return adapter_count > 0 ? CurrentAdapter()->refresh_hz : 0;
    case MSG_SET_REFRESH:
        return OnSetRefreshMessage(wparam);
    case MSG_POWER_STATE:
        return OnPowerStateMessage(wparam);
    default:
        if (OnTaskbarCreated(window, message)) return 0;
    }
    return DefWindowProcA(window, message, wparam, lparam);
}
