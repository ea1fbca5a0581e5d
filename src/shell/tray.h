// The tray side of the main window: its notification icon, the clicks on
// it, and its place at the far end of the taskbar.
#ifndef VISTREL_TRAY_H
#define VISTREL_TRAY_H

#include <windows.h>

enum { TRAY_ICON_ID = 100 };

// Tray start-up, from WM_CREATE: every adapter's mode, the menu, the window's
// place, the icon and the power-saving timers.
void AddTrayIcon(HWND window);
// Tray shut-down, from WM_DESTROY.
void RemoveTrayIcon(HWND window);
// The shell's message that the taskbar was made anew (after Explorer
// restarted): the icon is added again. 1 when message was that one.
int OnTaskbarCreated(HWND window, UINT message);

// MSG_TRAY_CALLBACK: a click asks for the menu, which opens from the queue.
LRESULT OnTrayCallback(HWND window, WPARAM wparam, LPARAM lparam);

// Parks the main window at the far end of the taskbar: 1 when it had to move.
int PlaceMainWindow(HWND window);

struct TaskbarPlace {
    int screen_width, screen_height;
    RECT taskbar;
};
// The pixel the main window belongs on, from the screen and taskbar.
POINT MainWindowSpot(const TaskbarPlace* place);

#endif
