#include "shell/tray.h"

#include <shellapi.h>

#include "base/module_reset.h"
#include "base/protocol.h"
#include "base/resource_ids.h"
#include "base/runtime.h"
#include "base/state.h"
#include "base/texts.h"
#include "hardware/companions.h"
#include "modes/detect.h"
#include "shell/tray_menu.h"

#if defined(__i386__)
static_assert(sizeof(APPBARDATA) == 36, "the taskbar query of Windows 95 and NT 4.0");
static_assert(NOTIFYICONDATAA_V1_SIZE == 88, "the notification icon data of Windows 95 and NT 4.0");
#endif

enum {
    CAPTION_SIZE = 120,
    TIP_SIZE = 64,  // what the first form of the icon data holds
};

// The shell's "taskbar made anew" message, once the icon exists.
static UINT taskbar_created;

static void ResetTray() { taskbar_created = 0; }
VISTREL_MODULE_RESET(ResetTray);

static void FillIconData(NOTIFYICONDATAA* data, HWND window)
{
    memset(data, 0, sizeof *data);
    data->cbSize = NOTIFYICONDATAA_V1_SIZE;
    data->hWnd = window;
    data->uID = TRAY_ICON_ID;
}

static void AddNotificationIcon(HWND window)
{
    char caption[CAPTION_SIZE];
    LoadText("CAPTION", "Vistrel", caption, sizeof caption);
    NOTIFYICONDATAA data;
    FillIconData(&data, window);
    data.uFlags = NIF_MESSAGE | NIF_ICON | NIF_TIP;
    data.uCallbackMessage = MSG_TRAY_CALLBACK;
    // The shell keeps a copy of the icon: ours goes right after the call.
    data.hIcon = (HICON)LoadImageA(instance, MAKEINTRESOURCEA(IDI_TRAY), IMAGE_ICON, GetSystemMetrics(SM_CXSMICON),
                                   GetSystemMetrics(SM_CYSMICON), 0);
    CopyText(data.szTip, TIP_SIZE, caption);
    Shell_NotifyIconA(NIM_ADD, &data);
    if (data.hIcon) DestroyIcon(data.hIcon);
}

void AddTrayIcon(HWND window)
{
    // With "/A" the saved refresh rates and picture positions come back here.
    RefreshAdapterModes(REFRESH_AT_STARTUP);
    BuildTrayMenu();
    PlaceMainWindow(window);
    taskbar_created = RegisterWindowMessageA("TaskbarCreated");
    AddNotificationIcon(window);
    last_activity_tick = GetTickCount();
    StartPowerTimers(window, 1);
}

void RemoveTrayIcon(HWND window)
{
    StartPowerTimers(window, 0);
    NOTIFYICONDATAA data;
    FillIconData(&data, window);
    Shell_NotifyIconA(NIM_DELETE, &data);
    taskbar_created = 0;
    DestroyTrayMenu();
}

int OnTaskbarCreated(HWND window, UINT message)
{
    if (!taskbar_created || message != taskbar_created) return 0;
    AddNotificationIcon(window);
    return 1;
}

static void OpenMenu(HWND window, WPARAM at)
{
    bool pending = shell_state & STATE_MENU_PENDING;
    // Only a menu of the foreground window closes when the user clicks elsewhere.
    SetForegroundWindow(window);
    TrackPopupMenu(TrayMenu(), TPM_RIGHTBUTTON, (short)LOWORD(at), (short)HIWORD(at), 0, window, NULL);
    // WM_CANCELMODE took the menu away: it opens again at the same place.
    if (pending && !(shell_state & STATE_MENU_PENDING)) PostMessageA(window, MSG_TRAY_CALLBACK, at, MSG_OPEN_MENU);
    else shell_state &= ~(STATE_TRAY_BUSY | STATE_MENU_PENDING);
}

LRESULT OnTrayCallback(HWND window, WPARAM wparam, LPARAM lparam)
{
    bool click = lparam == WM_LBUTTONDOWN || lparam == WM_RBUTTONDOWN;
    if (shell_state & STATE_COMMAND_RUNNING) {
        // The sheet or question that runs is what the user is after.
        if (click) SetForegroundWindow(window);
        return 0;
    }
    if (click) {
        shell_state |= STATE_TRAY_BUSY;
        POINT cursor;
        GetCursorPos(&cursor);
        // The menu opens once the shell's notification has returned.
        PostMessageA(window, MSG_TRAY_CALLBACK, MAKEWPARAM(cursor.x, cursor.y), MSG_OPEN_MENU);
        shell_state |= STATE_MENU_PENDING;
        return 1;
    }
    if (lparam == MSG_OPEN_MENU) {
        OpenMenu(window, wparam);
        return 1;
    }
    return 0;
}

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
