// The full-screen adjustment window, class "ScreenAdjust".
#ifndef VISTREL_ADJUST_WINDOW_H
#define VISTREL_ADJUST_WINDOW_H

#include <windows.h>

LRESULT CALLBACK AdjustWindowProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam);
int OpenAdjustWindow(HWND owner);
void ResetAdjustOffsets();

#endif
