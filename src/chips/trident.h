// The Trident 939a's entry points, for the chip table.
#ifndef VISTREL_TRIDENT_H
#define VISTREL_TRIDENT_H

#include <stdint.h>

uint32_t TridentDispatch(uint32_t command, uintptr_t argument);
uint32_t TridentSetPixelClock(double hz);
double TridentGetPixelClock();

#endif
