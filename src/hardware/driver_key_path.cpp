#include "hardware/driver_key_path.h"

#include "base/runtime.h"

int DriverKeyFromDevicePath(const char* path, char* out, size_t size)
{
    // An empty value has nothing after its terminator to search.
    if (!path[0]) return -1;
    const char* rest = path + 1;
    for (int i = 0; i < 2 && rest; ++i) {
        rest = FindChar(rest, '\\');
        if (rest) ++rest;
    }
    if (!rest) return -1;
    CopyText(out, size, rest);
    return 1;
}
