// The tray menu's commands, as WM_COMMAND brings them to the main window.
#ifndef VISTREL_COMMANDS_H
#define VISTREL_COMMANDS_H

#include <windows.h>

// Carries out a command id (MenuCommand of shell/tray_menu.h): 1 when it was
// one of the program's, 0 to leave it to DefWindowProcA.
int OnMenuCommand(HWND window, UINT command);

// How long the power entries let the menu close and the mouse settle before
// the monitor changes its state.
enum { POWER_SETTLE_MS = 500 };

// WinExec, through which every program the menu starts goes; tests put a
// recorder here.
extern UINT(WINAPI* run_program)(LPCSTR command_line, UINT show);

#endif
