// The hidden 1 x 1 main window and its messages.
#ifndef VISTREL_MAIN_WINDOW_H
#define VISTREL_MAIN_WINDOW_H

#include <windows.h>
#include <stdint.h>

#include "base/protocol.h"

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
