// The one reader of decimal numbers from the registry and the INI files,
// which hand over text that need not be terminated and may be anything.
#ifndef VISTREL_NUMBER_H
#define VISTREL_NUMBER_H

#include <stddef.h>
#include <stdint.h>

// Leading blanks, an optional sign, then digits up to the first other
// character, the end of the text or length bytes, as atoi reads them; no
// digits read as 0. A value beyond 32 bits stops at INT32_MIN or INT32_MAX
// instead of wrapping.
int32_t ParseNumber(const char* text, size_t length);

// Refresh rates are kept in 16 bits: a larger number is not a rate, nor is
// a negative one (which would pass for "no list" or "cannot read").
enum { RATE_HIGHEST = 0xFFFF };
inline bool FitsRate(int32_t hz) { return hz >= 0 && hz <= RATE_HIGHEST; }

#endif
