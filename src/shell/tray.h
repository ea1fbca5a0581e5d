// The tray side of the main window.
#ifndef VISTREL_TRAY_H
#define VISTREL_TRAY_H

#include <windows.h>

// Parks the main window at the far end of the taskbar: 1 when it had to move.
int PlaceMainWindow(HWND window);

struct TaskbarPlace {
    int screen_width, screen_height;
    RECT taskbar;
};
// The pixel the main window belongs on, from the screen and taskbar.
POINT MainWindowSpot(const TaskbarPlace* place);

#endif
