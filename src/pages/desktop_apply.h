// The Desktop page's Apply.
#ifndef VISTREL_DESKTOP_APPLY_H
#define VISTREL_DESKTOP_APPLY_H

#include <windows.h>

// What the Desktop page has selected.
struct DesktopSelection {
    int width, height, bits;
    int dpi_x, dpi_y;
    int refresh;
};
// Changes to the selection, asks the user to keep it and goes back to the
// mode before when not; on Cancel the selection holds that mode again.
int ApplyDesktopPage(HWND page, DesktopSelection* selection);

#endif
