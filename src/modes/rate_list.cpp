#include "modes/rate_list.h"

#include "base/number.h"
#include "base/runtime.h"

// An item runs to the next comma or the end; a number too large to be a
// rate reads as no rate.
static int RateItem(const char* item)
{
    int32_t hz = ParseNumber(item, TextLength(item));
    return FitsRate(hz) ? hz : 0;
}

int ParseRateList(const char* text, int index)
{
    if (!text || !text[0]) return 0;
    const char* item = text;
    if (index == RATE_LAST) {
        const char* comma = FindLastChar(text, ',');
        if (comma) item = comma + 1;
        return RateItem(item);
    }
    if (index < 0) return 0;
    for (int k = 0; k < index; ++k) {
        item = FindChar(item, ',');
        if (!item) return 0;
        ++item;
    }
    return RateItem(item);
}

int CountRateListItems(const char* text)
{
    if (!text || !text[0]) return 0;
    int n = 1;
    for (const char* p = text; *p; ++p)
        if (*p == ',') ++n;
    return n;
}

void InsertRate(uint16_t* rates, int slots, uint16_t rate)
{
    int count = 0;
    while (count < slots && rates[count]) ++count;
    for (int i = 0; i < count; ++i) {
        if (rates[i] == rate) return;
        if (rates[i] > rate) {
            if (count == slots) --count;  // the largest falls off a full list
            memmove(&rates[i + 1], &rates[i], (size_t)(count - i) * sizeof *rates);
            rates[i] = rate;
            return;
        }
    }
    if (count < slots) rates[count] = rate;
}
