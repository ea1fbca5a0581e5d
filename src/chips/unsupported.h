// Families whose driver is not part of this build: every command is
// unsupported and answers 0.
#ifndef VISTREL_UNSUPPORTED_H
#define VISTREL_UNSUPPORTED_H

#include <stdint.h>

uint32_t UnsupportedDispatch(uint32_t command, uintptr_t argument);
uint32_t UnsupportedSetPixelClock(double hz);
double UnsupportedGetPixelClock();

#endif
