// The NT video device map names the display driver's key as a kernel path;
// the program opens it below HKEY_LOCAL_MACHINE.
#ifndef VISTREL_DRIVER_KEY_PATH_H
#define VISTREL_DRIVER_KEY_PATH_H

#include <stddef.h>

// "\Registry\Machine\System\..." -> "System\..." into out of size bytes,
// cut at size - 1: 1, or -1 when the path has fewer than three parts.
int DriverKeyFromDevicePath(const char* path, char* out, size_t size);

#endif
