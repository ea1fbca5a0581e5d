#include "hardware/registry_text.h"

int ReadRegistryText(HKEY root, const char* path, const char* name, char* out, DWORD size)
{
    out[0] = 0;
    HKEY key;
    if (RegOpenKeyExA(root, path, 0, KEY_READ, &key) != ERROR_SUCCESS) return 0;
    DWORD length = size;
    LONG r = RegQueryValueExA(key, name, NULL, NULL, (BYTE*)out, &length);
    RegCloseKey(key);
    bool terminated = r == ERROR_SUCCESS && length > 0 && out[length - 1] == 0;
    // Data stored without its terminator fits only with room for one.
    if (r != ERROR_SUCCESS || (!terminated && length >= size)) {
        out[0] = 0;
        return 0;
    }
    if (!terminated) out[length] = 0;
    return 1;
}
