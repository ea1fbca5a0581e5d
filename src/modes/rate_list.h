// Comma-separated rate lists, as the 9x display driver and the chip file
// write them, and the ascending rate lists of the mode table.
#ifndef VISTREL_RATE_LIST_H
#define VISTREL_RATE_LIST_H

#include <stdint.h>

// Index of a rate-list item: a position from 0, or the last item.
enum { RATE_LAST = -1 };

// Item of a comma-separated rate list: the rate, or 0 when the list has no
// such item. index is a position from 0 or RATE_LAST.
int ParseRateList(const char* text, int index);
int CountRateListItems(const char* text);
// Puts a rate into an ascending, zero-terminated list of slots, without repeats.
void InsertRate(uint16_t* rates, int slots, uint16_t rate);

#endif
