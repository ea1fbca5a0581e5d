#include "base/settings.h"

#include <windows.h>

#include "base/adapters.h"
#include "base/number.h"
#include "base/runtime.h"

const char settings_program_key[] = "SOFTWARE\\QUORVEL\\PANEL";

enum { KEY_PATH_SIZE = 64, VALUE_NAME_SIZE = 64, LOAD_BUFFER_SIZE = 10 };

static const char* const timer_value_names[] = {"Standby", "Suspend", "Shutoff"};

static bool IsProgramKeySetting(int id)
{
    return id == SETTING_RESET || id == SETTING_STANDBY || id == SETTING_SUSPEND || id == SETTING_SHUTOFF;
}

static void BuildKeyPath(int id, char* path)
{
    if (IsProgramKeySetting(id)) {
        FormatText(path, KEY_PATH_SIZE, "%s", settings_program_key);
        return;
    }
    const AdapterRecord* a = CurrentAdapter();
    FormatText(path, KEY_PATH_SIZE, "%s\\%04x%04x", settings_program_key, a->vendor_id, a->device_id);
}

// The value name of an id, empty for an id that names no value.
static void BuildValueName(int id, char* name)
{
    const AdapterRecord* a = CurrentAdapter();
    name[0] = 0;
    switch (id) {
    case SETTING_REFRESH: CopyText(name, VALUE_NAME_SIZE, "refresh"); break;
    case SETTING_WIDTH: CopyText(name, VALUE_NAME_SIZE, "width"); break;
    case SETTING_HEIGHT: CopyText(name, VALUE_NAME_SIZE, "height"); break;
    case SETTING_BITS: CopyText(name, VALUE_NAME_SIZE, "bits"); break;
    case SETTING_POSITION_H:
    case SETTING_POSITION_V:
        FormatText(name, VALUE_NAME_SIZE, "%dx%dx%dx%d%c", a->width, a->height, a->bits_per_pixel, a->refresh_hz,
                   id == SETTING_POSITION_H ? 'H' : 'V');
        break;
    case SETTING_STANDBY: CopyText(name, VALUE_NAME_SIZE, timer_value_names[0]); break;
    case SETTING_SUSPEND: CopyText(name, VALUE_NAME_SIZE, timer_value_names[1]); break;
    case SETTING_SHUTOFF: CopyText(name, VALUE_NAME_SIZE, timer_value_names[2]); break;
    case SETTING_MCLK: CopyText(name, VALUE_NAME_SIZE, "mclk"); break;
    case SETTING_MCLK_DEFAULT: CopyText(name, VALUE_NAME_SIZE, "mclkdef"); break;
    }
}

static void EraseStore(HKEY program)
{
    char name[MAX_PATH];
    DWORD index = 0;
    for (;;) {
        DWORD size = sizeof name;
        if (RegEnumKeyExA(program, index, name, &size, NULL, NULL, NULL, NULL) != ERROR_SUCCESS) break;
        // A key that will not go keeps its place; step over it.
        if (RegDeleteKeyA(program, name) != ERROR_SUCCESS) ++index;
    }
    for (const char* timer : timer_value_names) RegDeleteValueA(program, timer);
}

static int32_t LoadFromKey(HKEY key, const char* name)
{
    char data[LOAD_BUFFER_SIZE];
    DWORD size = sizeof data;
    if (RegQueryValueExA(key, name, NULL, NULL, (BYTE*)data, &size) != ERROR_SUCCESS) return -1;
    return ParseNumber(data, size);
}

static int32_t SaveToKey(HKEY key, int id, const char* name, int32_t value)
{
    if ((id == SETTING_POSITION_H || id == SETTING_POSITION_V) && value < 1) {
        RegDeleteValueA(key, name);
        return value;
    }
    char text[16];
    int length = FormatText(text, sizeof text, "%d", (int)value);
    // Stored without a terminating zero; readers go by the data length.
    if (RegSetValueExA(key, name, 0, REG_SZ, (const BYTE*)text, (DWORD)length) != ERROR_SUCCESS) return -1;
    return value;
}

static int32_t AccessSetting(int id, bool save, int32_t value)
{
    char path[KEY_PATH_SIZE], name[VALUE_NAME_SIZE];
    BuildKeyPath(id, path);
    BuildValueName(id, name);
    if (id != SETTING_RESET && !name[0]) return -1;

    HKEY key;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, path, 0, KEY_ALL_ACCESS, &key) != ERROR_SUCCESS) {
        if (id == SETTING_RESET) return 1;
        if (!save) return -1;
        if (RegCreateKeyExA(HKEY_LOCAL_MACHINE, path, 0, NULL, REG_OPTION_NON_VOLATILE, KEY_ALL_ACCESS, NULL, &key,
                            NULL) != ERROR_SUCCESS)
            return -1;
    }
    int32_t result;
    if (id == SETTING_RESET) {
        EraseStore(key);
        result = 1;
    } else if (save) {
        result = SaveToKey(key, id, name, value);
    } else {
        result = LoadFromKey(key, name);
    }
    RegCloseKey(key);
    return result;
}

int32_t LoadSetting(int id) { return AccessSetting(id, false, 0); }

int32_t SaveSetting(int id, int32_t value) { return AccessSetting(id, true, value); }

void ResetSettings() { AccessSetting(SETTING_RESET, true, 0); }
