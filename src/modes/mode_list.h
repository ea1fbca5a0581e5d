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

// Index of a rate-list item: a position from 0, or the last item.
enum { RATE_LAST = -1 };

struct ModeEntry {
    uint16_t width;
    uint16_t height;
    uint16_t bits_per_pixel;  // 0 ends the table
    uint16_t rates[MODE_RATES];
};

extern ModeEntry* mode_table;

// Item of a comma-separated rate list: the rate, or 0 when the list has no
// such item. index is a position from 0 or RATE_LAST.
int ParseRateList(const char* text, int index);
int CountRateListItems(const char* text);
// Puts a rate into an ascending, zero-terminated list of slots, without repeats.
void InsertRate(uint16_t* rates, int slots, uint16_t rate);

int RefreshRateAt(int index, int width, int height, int bits);
// Lowest and highest rate of a mode's combined list; 0 when it has none.
int CombinedRateRange(int width, int height, int bits, int* lowest, int* highest);
int MaxRefreshRate(int width, int height, int bits);
int NearestListedRefresh(int target);
int OsRefreshRate();
int DefaultKeyRefresh();
// Reads (write = 0) or writes "RefreshRate" of a mode's MODES key.
int ModeKeyRefresh(int width, int height, int bits, int write, int value);
int SavedRefreshRate();
int MeasuredRefreshRate();
int BuildModeTable(int include_15bit);
void FreeModeTable();
// The unnamed value of a mode's MODES key (the 9x driver's rate list), or
// 0 when there is none; the 8-bit key stands in above 8 bits.
int ModeKeyRates(int width, int height, int bits, char* out, int size);
int DriverKeyValue(const char* subkey, const char* name, void* buffer, uint32_t size, uint32_t type, int read);
int DriverImageName(char* out);
int NtDefaultBits();
int TrueBitsPerPixel(int bits);

#endif
