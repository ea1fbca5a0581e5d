// The entry points of each chip family, for the chip table.
#ifndef VISTREL_FAMILIES_H
#define VISTREL_FAMILIES_H

#include <stdint.h>

uint32_t S3Dispatch(uint32_t command, uintptr_t argument);
uint32_t S3SetPixelClock(double hz);
double S3GetPixelClock();

// Families whose driver is not part of this build: every command is
// unsupported and answers 0.
uint32_t UnsupportedDispatch(uint32_t command, uintptr_t argument);
uint32_t UnsupportedSetPixelClock(double hz);
double UnsupportedGetPixelClock();

#endif
