// Where Windows keeps what it knows about the current adapter: its display
// driver's registry key and, on Windows 9x, its Config Manager device node.
#ifndef VISTREL_DRIVER_KEY_H
#define VISTREL_DRIVER_KEY_H

#include <windows.h>
#include <stdint.h>

enum { DRIVER_KEY_SIZE = 120, DRIVER_IMAGE_SIZE = 80 };

// The current adapter's display driver key below HKEY_LOCAL_MACHINE: 1, or -1.
int FindDriverKey(char* out);
// 9x: 1 read, 0 node without the value, -1 no node for the current adapter.
int ReadDeviceNodeValue(const char* name, uint32_t* out);
// Reads (read = 1) or writes a value of the display driver key with the
// subkey text appended. 1, or -1 on any failure.
int DriverKeyValue(const char* subkey, const char* name, void* buffer, uint32_t size, uint32_t type, int read);
// Opens a subkey of the display driver key for reading and writing,
// creating it when missing: 1, or -1.
int OpenDriverSubkeyForUpdate(const char* subkey, HKEY* key);
// Opens the driver key once so that the reads of DriverKeyValue until
// ReleaseDriverKey skip finding it again: 1, or -1 (reads then find it).
int HoldDriverKey();
void ReleaseDriverKey();
// The display driver's file into DRIVER_IMAGE_SIZE bytes: NT "imagepath" of
// its service, 9x "drv".
int DriverImageName(char* out);
// NT: the primary display's depth from its service key, telling 15 from 16.
int NtDefaultBits();
int TrueBitsPerPixel(int bits);

#endif
