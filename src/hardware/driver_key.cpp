// The display driver's own registry key and the device node of a card:
// where Windows keeps what it knows about the current adapter.
#include "hardware/driver_key.h"

#include <windows.h>

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/runtime.h"
#include "base/state.h"
#include "hardware/driver_key_path.h"
#include "hardware/registry_text.h"

static const char config_manager_enum[] = "Config Manager\\Enum";
static const char class_key_prefix[] = "System\\CurrentControlSet\\Services\\Class\\";
static const char nt_video_map[] = "hardware\\devicemap\\video";
static const char nt_video0_value[] = "\\device\\video0";
static const char nt_resource_map[] = "hardware\\resourcemap\\video";
static const char nt_primary_raw[] = "\\Device\\Video0.Raw";
static const char nt_services[] = "System\\CurrentControlSet\\Services\\";
static const char nt_bits_value[] = "DefaultSettings.BitsPerPel";
enum {
    KEY_PATH_SIZE = DRIVER_KEY_SIZE + 64,
    SERVICE_NAME_SIZE = 80,
    HARDWARE_KEY_SIZE = 120,
    NODE_KEY_SIZE = 80,
};

// The Config Manager node of the current adapter: its key name below
// "Config Manager\Enum" and its hardware key.
static int FindDeviceNode(char* node, DWORD node_size, char* hardware_key, DWORD key_size)
{
    const AdapterRecord* a = CurrentAdapter();
    char pci[40], location[40];
    FormatText(pci, sizeof pci, "PCI\\VEN_%04x&DEV_%04x", a->vendor_id, a->device_id);
    FormatText(location, sizeof location, "BUS_%02x&DEV_%02x", a->bus, a->devfn >> 3);
    UpperText(pci);
    UpperText(location);
    HKEY nodes;
    if (RegOpenKeyExA(HKEY_DYN_DATA, config_manager_enum, 0, KEY_READ, &nodes) != ERROR_SUCCESS) return 0;
    int found = 0;
    for (DWORD i = 0; !found; ++i) {
        DWORD length = node_size;
        LONG r = RegEnumKeyExA(nodes, i, node, &length, NULL, NULL, NULL, NULL);
        if (r == ERROR_MORE_DATA) continue;  // a name too long to be ours
        if (r != ERROR_SUCCESS) break;
        if (!ReadRegistryText(nodes, node, "HardWareKey", hardware_key, key_size)) continue;
        UpperText(hardware_key);
        if (!FindInText(hardware_key, pci)) continue;
        if ((a->flags & ADAPTER_TWIN) && !FindInText(hardware_key, location)) continue;
        found = 1;
    }
    RegCloseKey(nodes);
    return found;
}

int FindDriverKey(char* out)
{
    out[0] = 0;
    if (platform == PLATFORM_NT) {
        char path[DRIVER_KEY_SIZE];
        if (!ReadRegistryText(HKEY_LOCAL_MACHINE, nt_video_map, nt_video0_value, path, sizeof path)) return -1;
        return DriverKeyFromDevicePath(path, out, DRIVER_KEY_SIZE);
    }
    char node[HARDWARE_KEY_SIZE], hardware_key[HARDWARE_KEY_SIZE];
    if (!FindDeviceNode(node, sizeof node, hardware_key, sizeof hardware_key)) return -1;
    char enum_path[HARDWARE_KEY_SIZE + 8], driver[HARDWARE_KEY_SIZE];
    FormatText(enum_path, sizeof enum_path, "Enum\\%s", hardware_key);
    if (!ReadRegistryText(HKEY_LOCAL_MACHINE, enum_path, "Driver", driver, sizeof driver) || !driver[0]) return -1;
    FormatText(out, DRIVER_KEY_SIZE, "%s%s", class_key_prefix, driver);
    return 1;
}

int ReadDeviceNodeValue(const char* name, uint32_t* out)
{
    char node[NODE_KEY_SIZE], hardware_key[NODE_KEY_SIZE];
    if (!FindDeviceNode(node, sizeof node, hardware_key, sizeof hardware_key)) return -1;
    char path[sizeof config_manager_enum + NODE_KEY_SIZE + 1];
    FormatText(path, sizeof path, "%s\\%s", config_manager_enum, node);
    HKEY key;
    if (RegOpenKeyExA(HKEY_DYN_DATA, path, 0, KEY_READ, &key) != ERROR_SUCCESS) return 0;
    DWORD size = sizeof *out;
    LONG r = RegQueryValueExA(key, name, NULL, NULL, (BYTE*)out, &size);
    RegCloseKey(key);
    return r == ERROR_SUCCESS ? 1 : 0;
}

// The driver key found and opened once while many of its values are read;
// finding it on 9x walks every device node.
static HKEY held_key;
static size_t held_path_length;

int HoldDriverKey()
{
    ReleaseDriverKey();
    char path[KEY_PATH_SIZE];
    if (FindDriverKey(path) != 1) return -1;
    held_path_length = TextLength(path);
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, path, 0, KEY_READ, &held_key) == ERROR_SUCCESS) return 1;
    held_key = NULL;
    return -1;
}

void ReleaseDriverKey()
{
    if (held_key) RegCloseKey(held_key);
    held_key = NULL;
}
VISTREL_MODULE_RESET(ReleaseDriverKey);

static LONG OpenDriverSubkey(const char* subkey, int read, HKEY* key)
{
    if (read && held_key) {
        // The same paths as without the held key, and none longer.
        if (held_path_length + TextLength(subkey) >= KEY_PATH_SIZE) return ERROR_BAD_PATHNAME;
        // A path below an open key must not begin at a backslash.
        while (*subkey == '\\') ++subkey;
        return RegOpenKeyExA(held_key, subkey, 0, KEY_READ, key);
    }
    char path[KEY_PATH_SIZE];
    if (FindDriverKey(path) != 1) return ERROR_FILE_NOT_FOUND;
    if (!AppendText(path, sizeof path, subkey)) return ERROR_BAD_PATHNAME;
    return RegOpenKeyExA(HKEY_LOCAL_MACHINE, path, 0, read ? KEY_READ : KEY_WRITE, key);
}

int OpenDriverSubkeyForUpdate(const char* subkey, HKEY* key)
{
    char path[KEY_PATH_SIZE];
    if (FindDriverKey(path) != 1 || !AppendText(path, sizeof path, subkey)) return -1;
    LONG r = RegCreateKeyExA(HKEY_LOCAL_MACHINE, path, 0, NULL, REG_OPTION_NON_VOLATILE, KEY_READ | KEY_WRITE, NULL,
                             key, NULL);
    return r == ERROR_SUCCESS ? 1 : -1;
}

int DriverKeyValue(const char* subkey, const char* name, void* buffer, uint32_t size, uint32_t type, int read)
{
    HKEY key;
    if (OpenDriverSubkey(subkey, read, &key) != ERROR_SUCCESS) return -1;
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

int DriverImageName(char* out)
{
    out[0] = 0;
    char path[KEY_PATH_SIZE];
    if (FindDriverKey(path) != 1) return -1;
    int ok;
    if (platform == PLATFORM_NT) {
        const char* last = FindLastChar(path, '\\');
        if (last) path[last - path] = 0;
        ok = ReadRegistryText(HKEY_LOCAL_MACHINE, path, "imagepath", out, DRIVER_IMAGE_SIZE);
    } else {
        ok = AppendText(path, sizeof path, "\\DEFAULT") &&
             ReadRegistryText(HKEY_LOCAL_MACHINE, path, "drv", out, DRIVER_IMAGE_SIZE);
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
    FormatText(path, sizeof path, "%s%s\\device0", nt_services, service);
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
