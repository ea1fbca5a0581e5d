#include "shell/tray.h"

#include <shellapi.h>

#include "base/runtime.h"
#include "base/state.h"

#if defined(__i386__)
static_assert(sizeof(APPBARDATA) == 36, "the taskbar query of Windows 95 and NT 4.0");
#endif

POINT MainWindowSpot(const TaskbarPlace* place)
{
    POINT spot = {place->screen_width - 1, place->screen_height - 1};
    // A taskbar at the top or the left edge.
    if (place->taskbar.left < 1 && place->taskbar.top < 1) {
        if (spot.x > place->taskbar.right) spot.x = 0;  // a narrow taskbar at the left
        else spot.y = 0;                               // a taskbar across the top
    }
    return spot;
}

int PlaceMainWindow(HWND window)
{
    TaskbarPlace place;
    place.screen_width = GetSystemMetrics(SM_CXSCREEN);
    place.screen_height = GetSystemMetrics(SM_CYSCREEN);

    uint16_t saved_state = shell_state;
    shell_state |= STATE_TRAY_BUSY;
    APPBARDATA bar;
    memset(&bar, 0, sizeof bar);
    bar.cbSize = sizeof bar;
    bar.hWnd = window;
    SHAppBarMessage(ABM_GETTASKBARPOS, &bar);
    shell_state = saved_state;
    place.taskbar = bar.rc;

    POINT spot = MainWindowSpot(&place);
    RECT r;
    GetWindowRect(window, &r);
    if (r.left == spot.x && r.top == spot.y) return 0;
    MoveWindow(window, spot.x, spot.y, r.right - r.left, r.bottom - r.top, FALSE);
    return 1;
}
