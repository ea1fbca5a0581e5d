// The hidden 1 x 1 main window and its messages.
#ifndef VISTREL_MAIN_WINDOW_H
#define VISTREL_MAIN_WINDOW_H

#include <windows.h>
#include <stdint.h>

// Private messages; other programs use these numbers.
enum {
    MSG_QUERY_REFRESH = 1126,
    MSG_GET_REFRESH = 1127,
    MSG_SET_REFRESH = 1128,
    MSG_POWER_STATE = 1134,
    MSG_OPEN_MENU = 1152,
    MSG_TRAY_CALLBACK = 1224,
    MSG_GATE_REPLY = 1228,
};

// The quiet time after user activity before the main window re-applies
// refresh rates and positions on a redraw.
enum { REAPPLY_QUIET_MS = 3000 };

LRESULT CALLBACK MainWindowProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam);

void ReapplyAfterRedraw(HWND window);
void OnDisplayChange(HWND window);
// MSG_SET_REFRESH: only a rate the current mode offers is taken.
LRESULT OnSetRefreshMessage(WPARAM rate);
// MSG_POWER_STATE: only the DPMS states are carried out.
LRESULT OnPowerStateMessage(WPARAM state);

#endif
