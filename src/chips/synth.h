// The clock synthesizers of the chips: f = fref * (M + a) / ((N + b) * 2^R),
// with the VCO running at fref * (M + a) / (N + b).
#ifndef VISTREL_SYNTH_H
#define VISTREL_SYNTH_H

#include <stdint.h>

struct SynthLimits {
    double fref_hz;  // reference crystal
    int a, b;        // offsets of the M and N fields
    uint16_t m_min, m_max;
    uint16_t n_min, n_max;
    uint16_t r_min, r_max;
    double vco_min_hz, vco_max_hz;
};

struct SynthSetting {
    uint16_t m, n, r;
};

enum { SYNTH_SEARCH_STEPS = 20 };

inline constexpr double reference_crystal_hz = 14318180.0;

double SynthFrequency(const SynthLimits* limits, SynthSetting s);

// A clock in whole MHz, rounded half up, as the memory-clock commands answer.
inline uint32_t WholeMegahertz(double hz) { return (uint32_t)(hz / 1e6 + 0.5); }

// Looks for M, N, R that put the target within the VCO window, starting from
// the current N and R in *setting: M follows from N and R, and N (then R)
// moves by one until M fits, for at most 20 steps. Returns 1 with the fit in
// *setting, 0 with *setting unchanged.
int SearchSynthesizer(const SynthLimits* limits, double target_hz, SynthSetting* setting);

#endif
