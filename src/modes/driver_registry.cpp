// Values below the display driver's own registry key.
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <windows.h>

#include "hardware/adapters.h"
#include "hardware/detect.h"
#include "hardware/registry_text.h"
#include "modes/mode_list.h"
#include "shell/globals.h"

enum { VALUE_TEXT_SIZE = 80, KEY_PATH_SIZE = DRIVER_KEY_SIZE + 64, SERVICE_NAME_SIZE = 80 };
static const char nt_resource_map[] = "hardware\\resourcemap\\video";
static const char nt_primary_raw[] = "\\Device\\Video0.Raw";
static const char nt_services[] = "System\\CurrentControlSet\\Services\\";
static const char nt_bits_value[] = "DefaultSettings.BitsPerPel";

int DriverKeyValue(const char* subkey, const char* name, void* buffer, uint32_t size, uint32_t type, int read)
{
    char path[KEY_PATH_SIZE];
    if (FindDriverKey(path) != 1) return -1;
    if (strlen(path) + strlen(subkey) >= sizeof path) return -1;
    strcat(path, subkey);
    HKEY key;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, path, 0, read ? KEY_READ : KEY_WRITE, &key) != ERROR_SUCCESS) return -1;
    LONG r;
    if (read) {
        DWORD length = size;
        r = RegQueryValueExA(key, name, NULL, NULL, (BYTE*)buffer, &length);
    } else {
        r = RegSetValueExA(key, name, 0, type, (const BYTE*)buffer, size);
    }
    RegCloseKey(key);
    return r == ERROR_SUCCESS ? 1 : -1;
}

static void ModeKeyPath(int width, int height, int bits, char* out, size_t size)
{
    snprintf(out, size, "\\MODES\\%d\\%d,%d", bits, width, height);
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
        int length = snprintf(text, sizeof text, "%d", value);
        // The display driver reads this key as Windows writes it: terminated.
        return DriverKeyValue(subkey, "RefreshRate", text, (uint32_t)length + 1, REG_SZ, 0) == 1 ? 1 : -1;
    }
    char text[VALUE_TEXT_SIZE + 1];
    memset(text, 0, sizeof text);
    if (DriverKeyValue(subkey, "RefreshRate", text, VALUE_TEXT_SIZE, REG_SZ, 1) != 1 || !text[0]) return -1;
    return atoi(text);
}

int DefaultKeyRefresh()
{
    char text[VALUE_TEXT_SIZE + 1];
    memset(text, 0, sizeof text);
    if (DriverKeyValue("\\DEFAULT", "RefreshRate", text, VALUE_TEXT_SIZE, REG_SZ, 1) == 1 && text[0] && atoi(text) > 0)
        return atoi(text);
    if (!ReadRegistryText(HKEY_CURRENT_CONFIG, "Display\\Settings", "RefreshRate", text, sizeof text)) return -1;
    return atoi(text);
}

int DriverImageName(char* out)
{
    out[0] = 0;
    char path[KEY_PATH_SIZE];
    if (FindDriverKey(path) != 1) return -1;
    int ok;
    if (platform == PLATFORM_NT) {
        char* last = strrchr(path, '\\');
        if (last) *last = 0;
        ok = ReadRegistryText(HKEY_LOCAL_MACHINE, path, "imagepath", out, VALUE_TEXT_SIZE);
    } else {
        strcat(path, "\\DEFAULT");
        ok = ReadRegistryText(HKEY_LOCAL_MACHINE, path, "drv", out, VALUE_TEXT_SIZE);
    }
    if (!ok) out[0] = 0;
    return ok ? 1 : -1;
}

// The video service whose key names the primary display's raw device.
static int FindPrimaryVideoService(char* service, DWORD size)
{
    HKEY map;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, nt_resource_map, 0, KEY_READ, &map) != ERROR_SUCCESS) return 0;
    int found = 0;
    for (DWORD i = 0; !found; ++i) {
        DWORD length = size;
        LONG r = RegEnumKeyExA(map, i, service, &length, NULL, NULL, NULL, NULL);
        if (r == ERROR_MORE_DATA) continue;
        if (r != ERROR_SUCCESS) break;
        HKEY key;
        if (RegOpenKeyExA(map, service, 0, KEY_READ, &key) != ERROR_SUCCESS) continue;
        found = RegQueryValueExA(key, nt_primary_raw, NULL, NULL, NULL, NULL) == ERROR_SUCCESS;
        RegCloseKey(key);
    }
    RegCloseKey(map);
    return found;
}

int NtDefaultBits()
{
    char service[SERVICE_NAME_SIZE];
    if (!FindPrimaryVideoService(service, sizeof service)) return 0;
    char path[sizeof nt_services + SERVICE_NAME_SIZE + 16];
    snprintf(path, sizeof path, "%s%s\\device0", nt_services, service);
    HKEY key;
    if (RegOpenKeyExA(HKEY_CURRENT_CONFIG, path, 0, KEY_READ, &key) != ERROR_SUCCESS) return 0;
    DWORD bits = 0, size = sizeof bits, type = 0;
    LONG r = RegQueryValueExA(key, nt_bits_value, NULL, &type, (BYTE*)&bits, &size);
    RegCloseKey(key);
    if (r != ERROR_SUCCESS || size != sizeof bits) return 0;
    switch (bits) {
    case 8: case 15: case 16: case 24: case 32: return (int)bits;
    }
    return 0;
}

int TrueBitsPerPixel(int bits)
{
    // NT reports 16 for 15-bit modes too; its registry tells them apart.
    if (platform == PLATFORM_NT && bits == 16 && NtDefaultBits() == 15) return 15;
    return bits;
}
