// The full-screen adjustment window, class "ScreenAdjust".
#ifndef VISTREL_ADJUST_WINDOW_H
#define VISTREL_ADJUST_WINDOW_H

#include <windows.h>

LRESULT CALLBACK AdjustWindowProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam);
// Covers the current adapter's monitor, owned by owner. 1, or 0 when the
// window cannot be created.
int OpenAdjustWindow(HWND owner);
void ResetAdjustOffsets();

// The sound of a refused step; tests listen here.
extern BOOL(WINAPI* adjust_beep)(UINT type);

#endif
