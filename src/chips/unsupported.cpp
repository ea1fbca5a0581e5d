#include "chips/unsupported.h"

uint32_t UnsupportedDispatch(uint32_t command, uintptr_t argument) { return 0; }
uint32_t UnsupportedSetPixelClock(double hz) { return 0; }
double UnsupportedGetPixelClock() { return 0.0; }
