// Adapter detection: the supported cards, their registry places and their
// current modes.
#ifndef VISTREL_DETECT_H
#define VISTREL_DETECT_H

#include <stdint.h>

enum { REFRESH_AT_STARTUP = 0, REFRESH_LATER = 1 };
enum { DRIVER_KEY_SIZE = 120 };

int DetectAdapters();
int FindChipRow(uint16_t vendor_id, uint16_t device_id, uint16_t* row);
int CountDisplayDevices();
void ReconcileAdapters();
void RefreshAdapterModes(int at_startup);
// The current adapter's display driver key below HKEY_LOCAL_MACHINE: 1, or -1.
int FindDriverKey(char* out);
// 9x: 1 read, 0 node without the value, -1 no node for the current adapter.
int ReadDeviceNodeValue(const char* name, uint32_t* out);

#endif
