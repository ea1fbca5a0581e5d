// The 9x display driver's MODES and DEFAULT keys: its rate lists and the
// refresh rate it programs on a mode change.
#ifndef VISTREL_MODE_KEYS_H
#define VISTREL_MODE_KEYS_H

// The unnamed value of a mode's MODES key (the 9x driver's rate list), or
// 0 when there is none; the 8-bit key stands in above 8 bits.
int ModeKeyRates(int width, int height, int bits, char* out, int size);
// Reads (write = 0) or writes "RefreshRate" of a mode's MODES key.
int ModeKeyRefresh(int width, int height, int bits, int write, int value);
int DefaultKeyRefresh();

#endif
