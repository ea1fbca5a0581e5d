// What EnumDisplaySettingsA reports, remembered from one walk until the
// display changes: on NT every refresh-rate lookup would otherwise walk the
// whole list again.
#ifndef VISTREL_DISPLAY_SETTINGS_H
#define VISTREL_DISPLAY_SETTINGS_H

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

#endif
