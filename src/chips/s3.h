// The S3 family's entry points, for the chip table.
#ifndef VISTREL_S3_H
#define VISTREL_S3_H

#include <stdint.h>

uint32_t S3Dispatch(uint32_t command, uintptr_t argument);
uint32_t S3SetPixelClock(double hz);
double S3GetPixelClock();

#endif
