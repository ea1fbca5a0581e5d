#include "modes/display_settings.h"

#include <windows.h>

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/number.h"
#include "base/runtime.h"
#include "base/state.h"
#include "hardware/machine.h"

enum { LISTED_MODES_KEPT = 2048 };

static ListedMode listed[LISTED_MODES_KEPT];
static int listed_count;
static bool walked;      // listed[] holds the start of the list
static bool truncated;   // the list goes on beyond what listed[] keeps
static char walked_device[DEVICE_NAME_SIZE];  // whose list listed[] holds; "" the one display

const char* CurrentDisplayDevice()
{
    const AdapterRecord* a = CurrentAdapter();
    return IsWindows98() && monitor_count >= 2 && a->device_name[0] ? a->device_name : NULL;
}

LONG ChangeCurrentDisplay(DEVMODEA* mode, DWORD flags)
{
    const char* device = CurrentDisplayDevice();
    MachineDisplayFunctions f;
    // The plain form changes the primary display whatever dmDeviceName names.
    if (device && MachineFindDisplayFunctions(&f) && f.ChangeDisplaySettingsExA)
        return f.ChangeDisplaySettingsExA(device, mode, NULL, flags, NULL);
    return MachineChangeDisplaySettings(mode, flags);
}

static bool ReadMode(DWORD n, ListedMode* out)
{
    DEVMODEA mode;
    memset(&mode, 0, sizeof mode);
    mode.dmSize = sizeof mode;
    if (!MachineEnumDisplaySettings(CurrentDisplayDevice(), n, &mode)) return false;
    out->width = (uint16_t)mode.dmPelsWidth;
    out->height = (uint16_t)mode.dmPelsHeight;
    out->bits_per_pixel = (uint16_t)mode.dmBitsPerPel;
    // A frequency too large for a rate counts as none, not as its low bits.
    out->frequency = mode.dmDisplayFrequency <= RATE_HIGHEST ? (uint16_t)mode.dmDisplayFrequency : 0;
    const char* name = (const char*)mode.dmDeviceName;
    out->vga_device = (name[0] | 0x20) == 'v' && (name[1] | 0x20) == 'g' && (name[2] | 0x20) == 'a';
    return true;
}

static void Walk()
{
    listed_count = 0;
    truncated = false;
    const char* device = CurrentDisplayDevice();
    lstrcpynA(walked_device, device ? device : "", sizeof walked_device);
    ListedMode mode;
    while (ReadMode((DWORD)listed_count, &mode)) {
        if (listed_count == LISTED_MODES_KEPT) {
            truncated = true;
            break;
        }
        listed[listed_count++] = mode;
    }
    walked = true;
}

void ForEachListedMode(bool (*visit)(const ListedMode* mode, void* data), void* data)
{
    const char* device = CurrentDisplayDevice();
    if (!walked || lstrcmpiA(walked_device, device ? device : "") != 0) Walk();
    for (int i = 0; i < listed_count; ++i)
        if (!visit(&listed[i], data)) return;
    // A list longer than what is kept is read on from the system each time.
    ListedMode mode;
    for (DWORD n = LISTED_MODES_KEPT; truncated && ReadMode(n, &mode); ++n)
        if (!visit(&mode, data)) return;
}

void ForgetDisplaySettings()
{
    walked = false;
    listed_count = 0;
}
VISTREL_MODULE_RESET(ForgetDisplaySettings);
