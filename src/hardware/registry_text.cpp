#include "hardware/registry_text.h"

int ReadRegistryText(HKEY root, const char* path, const char* name, char* out, DWORD size)
{
    out[0] = 0;
    HKEY key;
    if (RegOpenKeyExA(root, path, 0, KEY_READ, &key) != ERROR_SUCCESS) return 0;
    DWORD length = size - 1;
    LONG r = RegQueryValueExA(key, name, NULL, NULL, (BYTE*)out, &length);
    RegCloseKey(key);
    if (r != ERROR_SUCCESS) {
        out[0] = 0;
        return 0;
    }
    out[length < size ? length : size - 1] = 0;
    return 1;
}
