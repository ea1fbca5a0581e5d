// The Tseng ET6000's entry points, for the chip table.
#ifndef VISTREL_ET6000_H
#define VISTREL_ET6000_H

#include <stdint.h>

#include "chips/synth.h"

uint32_t Et6000Dispatch(uint32_t command, uintptr_t argument);
uint32_t Et6000SetPixelClock(double hz);
double Et6000GetPixelClock();

// The pixel clock synthesizer's limits.
extern const SynthLimits et6000_pixel_clock;

// The video BIOS's memory answer (BX of function 12h, BL = F2h: megabytes
// in bits 15..4, further 64 KB blocks in bits 3..0) in the chip commands'
// memory size format.
uint32_t Et6000MemoryFromBios(uint16_t bx);
// The same figure from the memory configuration: input status 0, and the
// chip's own registers 0x45 and 0x47. 0 for an unknown memory type.
uint32_t Et6000MemoryFromConfiguration(uint8_t status0, uint8_t config45, uint8_t banks47);

#endif
