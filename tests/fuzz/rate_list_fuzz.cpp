// Rate lists as the display driver and the chip file hand them over. The
// first byte picks the item (-1: the last), the rest is the list.
#include <stdint.h>
#include <stdlib.h>
#include <string.h>

#include "modes/rate_list.h"

enum { SLOTS = 8 };

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    if (size == 0) return 0;
    // Exactly as long as the text, so that a read past its end shows.
    char* text = new char[size];
    memcpy(text, data + 1, size - 1);
    text[size - 1] = 0;
    int hz = ParseRateList(text, (int8_t)data[0]);
    if (hz < 0 || hz > 0xFFFF || ParseRateList(text, RATE_LAST) < 0) abort();
    if (CountRateListItems(text) < (text[0] ? 1 : 0)) abort();

    // The bytes as rates into a list of exactly SLOTS slots: it stays
    // ascending, without repeats and without zeros inside.
    uint16_t* rates = new uint16_t[SLOTS]();
    for (size_t i = 1; i + 1 < size; i += 2) {
        uint16_t rate = (uint16_t)(data[i] | data[i + 1] << 8);
        if (rate) InsertRate(rates, SLOTS, rate);
    }
    for (int i = 1; i < SLOTS; ++i)
        if (rates[i] && rates[i] <= rates[i - 1]) abort();
    delete[] rates;
    delete[] text;
    return 0;
}
