// The NT video device map's path of the display driver key, as any
// program may have written it.
#include <stdint.h>
#include <stdlib.h>
#include <string.h>

#include "hardware/driver_key_path.h"

enum { KEY_SIZE = 120 };

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    // Exactly as long as the text, so that a read past its end shows.
    char* path = new char[size + 1];
    memcpy(path, data, size);
    path[size] = 0;
    char out[KEY_SIZE];
    memset(out, 0x5A, sizeof out);
    int r = DriverKeyFromDevicePath(path, out, sizeof out);
    // What comes back is the end of the path, cut to the buffer.
    bool sound = r == -1 || (r == 1 && strnlen(out, sizeof out) < sizeof out && strstr(path, out));
    delete[] path;
    if (!sound) abort();
    return 0;
}
