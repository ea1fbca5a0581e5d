// Mode lists, rate choice and the synthesizer search of the simulated
// display driver.
#include "modes.h"

#include <math.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

// 848x480 is a DMT size too, but Wine's virtual desktop cannot take it.
const SimSize sim_desktop_sizes[] = {
    {640, 480}, {800, 600}, {1024, 768}, {1152, 864}, {1280, 720},
    {1280, 768}, {1280, 800}, {1280, 960}, {1280, 1024},
};
const int sim_desktop_size_count = sizeof sim_desktop_sizes / sizeof sim_desktop_sizes[0];

// No 24-bit modes: the chips modelled run true colour in 32 bits.
const int sim_desktop_depths[] = {8, 15, 16, 32};
const int sim_desktop_depth_count = sizeof sim_desktop_depths / sizeof sim_desktop_depths[0];

double SimTimingFrameRate(const SimTiming* timing)
{
    return timing->pixel_hz / ((double)timing->htotal * timing->vtotal);
}

const SimTiming* SimFindTiming(int width, int height, int refresh, bool interlaced)
{
    for (int i = 0; i < sim_dmt_timing_count; i++) {
        const SimTiming* t = &sim_dmt_timings[i];
        if (t->width == width && t->height == height && t->refresh == refresh &&
            ((t->flags & SIM_TIMING_INTERLACED) != 0) == interlaced)
            return t;
    }
    return NULL;
}

static int DepthSlot(int bits)
{
    switch (bits) {
    case 8: return 0;
    case 15: case 16: return 1;
    case 32: return 2;
    default: return -1;
    }
}

static bool TimingFits(const SimModeLimits* limits, const SimTiming* t, int bits)
{
    int slot = DepthSlot(bits);
    if (slot < 0 || (bits == 15 && !limits->has_15bit)) return false;
    uint64_t bytes = (uint64_t)t->width * t->height * ((bits + 7) / 8);
    return bytes <= limits->memory_bytes && t->pixel_hz <= limits->max_pixel_hz[slot];
}

static bool IsDesktopSize(int width, int height)
{
    for (int i = 0; i < sim_desktop_size_count; i++)
        if (sim_desktop_sizes[i].width == width && sim_desktop_sizes[i].height == height) return true;
    return false;
}

int SimModeRates(const SimModeLimits* limits, int width, int height, int bits, uint16_t* rates)
{
    if (!IsDesktopSize(width, height)) return 0;
    int count = 0;
    for (int i = 0; i < sim_dmt_timing_count && count < SIM_MAX_RATES; i++) {
        const SimTiming* t = &sim_dmt_timings[i];
        if (t->width != width || t->height != height || (t->flags & SIM_TIMING_INTERLACED)) continue;
        if (!TimingFits(limits, t, bits)) continue;
        int at = count;
        while (at > 0 && rates[at - 1] > t->refresh) at--;
        if (at > 0 && rates[at - 1] == t->refresh) continue;
        memmove(rates + at + 1, rates + at, (count - at) * sizeof *rates);
        rates[at] = t->refresh;
        count++;
    }
    return count;
}

bool SimModeInterlacedOffered(const SimModeLimits* limits, int width, int height, int bits)
{
    for (int i = 0; i < sim_dmt_timing_count; i++) {
        const SimTiming* t = &sim_dmt_timings[i];
        if (t->width == width && t->height == height && (t->flags & SIM_TIMING_INTERLACED) &&
            TimingFits(limits, t, bits))
            return true;
    }
    return false;
}

bool SimModeOffered(const SimModeLimits* limits, int width, int height, int bits)
{
    uint16_t rates[SIM_MAX_RATES];
    return SimModeRates(limits, width, height, bits, rates) > 0;
}

void SimFormatRates(const uint16_t* rates, int count, char* out, size_t size)
{
    size_t used = 0;
    out[0] = 0;
    for (int i = 0; i < count && used + 1 < size; i++) {
        int n = snprintf(out + used, size - used, i ? ",%u" : "%u", rates[i]);
        if (n < 0 || (size_t)n >= size - used) {
            out[size - 1] = 0;
            break;
        }
        used += n;
    }
}

int SimDefaultRate(const uint16_t* rates, int count)
{
    if (count == 0) return 0;
    for (int i = 0; i < count; i++)
        if (rates[i] == 60) return 60;
    return rates[0];
}

int SimChooseRate(const uint16_t* rates, int count, const char* refresh_text)
{
    if (count == 0) return 0;
    long wanted = refresh_text ? strtol(refresh_text, NULL, 10) : 0;
    if (wanted == -1) return rates[count - 1];
    if (wanted <= 1) return SimDefaultRate(rates, count);
    int best = rates[0];
    for (int i = 0; i < count; i++)
        if (rates[i] <= wanted) best = rates[i];
    return best;
}

double SimPllOutput(const SimPllLimits* limits, int m, int n, int r)
{
    return limits->fref_hz * (m + limits->a) / ((double)(n + limits->b) * (1 << r));
}

int SimPllBest(const SimPllLimits* limits, double target_hz, SimPllSetting* out)
{
    double best_error = -1;
    for (int r = limits->r_min; r <= limits->r_max; r++) {
        for (int n = limits->n_min; n <= limits->n_max; n++) {
            double exact = target_hz * (n + limits->b) * (1 << r) / limits->fref_hz - limits->a;
            for (int m = (int)floor(exact); m <= (int)floor(exact) + 1; m++) {
                if (m < limits->m_min || m > limits->m_max) continue;
                double vco = limits->fref_hz * (m + limits->a) / (n + limits->b);
                if (vco < limits->vco_min_hz || vco > limits->vco_max_hz) continue;
                double error = fabs(SimPllOutput(limits, m, n, r) - target_hz);
                if (best_error < 0 || error < best_error) {
                    best_error = error;
                    out->m = m;
                    out->n = n;
                    out->r = r;
                }
            }
        }
    }
    return best_error >= 0;
}
