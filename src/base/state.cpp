#include "base/state.h"

#include "base/module_reset.h"

uint16_t platform;
int16_t os_class;
uint32_t startup_flags;
char text_ini_path[INI_PATH_SIZE];
char chip_ini_path[INI_PATH_SIZE];
HINSTANCE instance;
HWND main_window;
uint16_t shell_state;
uint32_t last_activity_tick;

static void ResetState()
{
    platform = 0;
    os_class = 0;
    startup_flags = 0;
    text_ini_path[0] = 0;
    chip_ini_path[0] = 0;
    instance = GetModuleHandleA(NULL);
    main_window = NULL;
    shell_state = 0;
    last_activity_tick = 0;
}
VISTREL_MODULE_RESET(ResetState);
