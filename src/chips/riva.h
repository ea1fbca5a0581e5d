// The NVIDIA Riva family's entry points, for the chip table.
#ifndef VISTREL_RIVA_H
#define VISTREL_RIVA_H

#include <stdint.h>

uint32_t RivaDispatch(uint32_t command, uintptr_t argument);
uint32_t RivaSetPixelClock(double hz);
double RivaGetPixelClock();

#endif
