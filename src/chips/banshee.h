// The 3dfx Voodoo Banshee's entry points, for the chip table, and its pure
// arithmetic.
#ifndef VISTREL_BANSHEE_H
#define VISTREL_BANSHEE_H

#include <stdint.h>

uint32_t BansheeDispatch(uint32_t command, uintptr_t argument);
uint32_t BansheeSetPixelClock(double hz);
double BansheeGetPixelClock();

// A synthesizer register's output in whole MHz (rounded), 0 when its
// multiplier or divider field is 0.
uint32_t BansheeSynthMhz(uint16_t value);
// The horizontal total in character clocks from CR00 and CR1A at a mode width.
uint32_t BansheeHorizontalTotal(uint8_t cr00, uint8_t cr1a, uint16_t width);
// NT's "HardwareInformation.MemorySize" bytes in the memory-size format.
uint32_t BansheeNtMemorySize(const uint8_t size[4]);

#endif
