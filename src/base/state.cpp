#include "base/state.h"

uint16_t platform;
int16_t os_class;
uint32_t startup_flags;
char text_ini_path[INI_PATH_SIZE];
char chip_ini_path[INI_PATH_SIZE];
HINSTANCE instance;
HWND main_window;
uint16_t shell_state;
uint32_t last_activity_tick;
