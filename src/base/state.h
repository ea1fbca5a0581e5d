// Process-wide state shared by every subsystem. All of it lives for the life
// of the process and is touched only from the thread of the message loop.
#ifndef VISTREL_STATE_H
#define VISTREL_STATE_H

#include <windows.h>
#include <stdint.h>

enum {
    PLATFORM_9X = 1,
    PLATFORM_NT = 4,
};
enum { OS_CLASS_WIN98 = 10 };

enum { STARTUP_AUTORUN = 0x1 };  // started with "/A" from the start-up entry

enum {
    STATE_COMMAND_RUNNING = 0x1,
    STATE_TRAY_BUSY = 0x2,
    STATE_MENU_PENDING = 0x4,
};

enum { INI_PATH_SIZE = 128 };

extern uint16_t platform;
extern int16_t os_class;
extern uint32_t startup_flags;
extern char text_ini_path[INI_PATH_SIZE];
extern char chip_ini_path[INI_PATH_SIZE];
extern HINSTANCE instance;
extern HWND main_window;
extern uint16_t shell_state;

extern uint32_t last_activity_tick;

// The Windows 98 family member that can have several display devices.
inline bool IsWindows98() { return platform == PLATFORM_9X && os_class >= OS_CLASS_WIN98; }

#endif
