// Values of the display driver's MODES and DEFAULT keys: the 9x driver's
// rate lists and the refresh rate it programs.
#include "modes/mode_keys.h"

#include <windows.h>

#include "base/number.h"
#include "base/runtime.h"
#include "hardware/driver_key.h"
#include "hardware/registry_text.h"

enum { VALUE_TEXT_SIZE = 80 };

// A refresh value as the display driver keeps it; a number too large to be
// a rate counts as no value.
static int StoredRate(const char* text)
{
    int32_t hz = ParseNumber(text, TextLength(text));
    return FitsRate(hz) ? hz : -1;
}

static void ModeKeyPath(int width, int height, int bits, char* out, size_t size)
{
    FormatText(out, size, "\\MODES\\%d\\%d,%d", bits, width, height);
}

// One MODES key's list text; 0 when missing, empty or too long.
static int ReadModeList(int width, int height, int bits, char* out, int size)
{
    char subkey[40];
    ModeKeyPath(width, height, bits, subkey, sizeof subkey);
    char text[VALUE_TEXT_SIZE + 1];
    memset(text, 0, sizeof text);
    if (DriverKeyValue(subkey, "", text, VALUE_TEXT_SIZE, REG_SZ, 1) != 1) return 0;
    if (!text[0]) return 0;
    lstrcpynA(out, text, size);
    return 1;
}

int ModeKeyRates(int width, int height, int bits, char* out, int size)
{
    out[0] = 0;
    if (ReadModeList(width, height, bits, out, size)) return 1;
    return bits > 8 && ReadModeList(width, height, 8, out, size);
}

int ModeKeyRefresh(int width, int height, int bits, int write, int value)
{
    char subkey[40];
    ModeKeyPath(width, height, bits, subkey, sizeof subkey);
    if (write) {
        char text[16];
        int length = FormatText(text, sizeof text, "%d", value);
        // The display driver reads this key as Windows writes it: terminated.
        return DriverKeyValue(subkey, "RefreshRate", text, (uint32_t)length + 1, REG_SZ, 0) == 1 ? 1 : -1;
    }
    char text[VALUE_TEXT_SIZE + 1];
    memset(text, 0, sizeof text);
    if (DriverKeyValue(subkey, "RefreshRate", text, VALUE_TEXT_SIZE, REG_SZ, 1) != 1 || !text[0]) return -1;
    return StoredRate(text);
}

int DefaultKeyRefresh()
{
    char text[VALUE_TEXT_SIZE + 1];
    memset(text, 0, sizeof text);
    if (DriverKeyValue("\\DEFAULT", "RefreshRate", text, VALUE_TEXT_SIZE, REG_SZ, 1) == 1 && text[0]) {
        int hz = StoredRate(text);
        if (hz > 0) return hz;
    }
    if (!ReadRegistryText(HKEY_CURRENT_CONFIG, "Display\\Settings", "RefreshRate", text, sizeof text)) return -1;
    return StoredRate(text);
}

