// What EnumDisplaySettingsA reports for the current adapter's display,
// remembered from one walk until the display changes or another display
// device is asked about: on NT every refresh-rate lookup would otherwise walk
// the whole list again. And the mode change of that display.
#ifndef VISTREL_DISPLAY_SETTINGS_H
#define VISTREL_DISPLAY_SETTINGS_H

#include <windows.h>
#include <stdint.h>

struct ListedMode {
    uint16_t width;
    uint16_t height;
    uint16_t bits_per_pixel;
    uint16_t frequency;
    bool vga_device;  // reported under a device name beginning "VGA"
};

// Calls visit for every mode in enumeration order until it returns false.
void ForEachListedMode(bool (*visit)(const ListedMode* mode, void* data), void* data);
void ForgetDisplaySettings();

// The current adapter's display device on Windows 98 with several of them,
// else NULL: the one display.
const char* CurrentDisplayDevice();
// ChangeDisplaySettingsA, or its Ex form for the current adapter's own
// display device where there are several.
LONG ChangeCurrentDisplay(DEVMODEA* mode, DWORD flags);

#endif
