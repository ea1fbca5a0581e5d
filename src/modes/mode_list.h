// The mode table and the refresh-rate model of the current adapter.
#ifndef VISTREL_MODE_LIST_H
#define VISTREL_MODE_LIST_H

#include <stdint.h>

enum {
    MODE_TABLE_SIZE = 100,
    MODE_RATES = 30,
    NO_RATE_LIMIT = 1000,
    RATE_INTERLACED = 43,
    RATE_FALLBACK = 60,
    RATE_LIST_TEXT_SIZE = 128,
};

struct ModeEntry {
    uint16_t width;
    uint16_t height;
    uint16_t bits_per_pixel;  // 0 ends the table
    uint16_t rates[MODE_RATES];
};

extern ModeEntry* mode_table;

int RefreshRateAt(int index, int width, int height, int bits);
// Lowest and highest rate of a mode's combined list; 0 when it has none.
int CombinedRateRange(int width, int height, int bits, int* lowest, int* highest);
int MaxRefreshRate(int width, int height, int bits);
int NearestListedRefresh(int target);
int OsRefreshRate();
int SavedRefreshRate();
int MeasuredRefreshRate();
int BuildModeTable(int include_15bit);
void FreeModeTable();

#endif
