// The Permedia 2 family's entry points, for the chip table.
#ifndef VISTREL_PERMEDIA2_H
#define VISTREL_PERMEDIA2_H

#include <stdint.h>

uint32_t Permedia2Dispatch(uint32_t command, uintptr_t argument);
uint32_t Permedia2SetPixelClock(double hz);
double Permedia2GetPixelClock();

#endif
