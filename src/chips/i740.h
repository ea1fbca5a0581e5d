// The Intel i740's entry points, for the chip table, and its synthesizer
// arithmetic.
#ifndef VISTREL_I740_H
#define VISTREL_I740_H

#include <stdint.h>

uint32_t I740Dispatch(uint32_t command, uintptr_t argument);
uint32_t I740SetPixelClock(double hz);
double I740GetPixelClock();

// f = 66.6667 MHz * k * (M + 2) / ((N + 2) * 2^P), k 4 or 16.
struct I740Pll {
    uint16_t m, n, p, k;
};
double I740PllHz(I740Pll pll);
// Walks N (then P) from the setting for at most 20 steps, k unchanged,
// until M fits and the output stays at or below 203 MHz. 1 with the fit in
// *pll, 0 with *pll unchanged.
int I740SearchPll(double target_hz, I740Pll* pll);

#endif
