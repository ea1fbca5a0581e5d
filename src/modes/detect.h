// Adapter detection: the supported cards, their registry places and their
// current modes.
#ifndef VISTREL_DETECT_H
#define VISTREL_DETECT_H

#include <stdint.h>

enum { REFRESH_AT_STARTUP = 0, REFRESH_LATER = 1 };

int DetectAdapters();
int FindChipRow(uint16_t vendor_id, uint16_t device_id, uint16_t* row);
int CountDisplayDevices();
void ReconcileAdapters();
void RefreshAdapterModes(int at_startup);

#endif
