// Pure pieces of the simulated display driver: the VESA timings, which
// modes and rates a card offers, and the clock synthesizer search. No
// window, registry or machine state is touched here.
#ifndef VISTREL_SIM_MODES_H
#define VISTREL_SIM_MODES_H

#include <stddef.h>
#include <stdint.h>

enum { SIM_TIMING_INTERLACED = 1, SIM_TIMING_HSYNC_NEGATIVE = 2, SIM_TIMING_VSYNC_NEGATIVE = 4 };

// One VESA timing; horizontal values in pixels, vertical in lines (for an
// interlaced timing, lines of the whole frame).
struct SimTiming {
    uint16_t width, height, refresh;  // refresh: the nominal rate (43 for 1024x768 interlaced)
    uint32_t pixel_hz;
    uint16_t hsync_start, hsync_end, htotal;
    uint16_t vsync_start, vsync_end, vtotal;
    uint8_t flags;
};

extern const SimTiming sim_dmt_timings[];
extern const int sim_dmt_timing_count;

// The exact frame rate of a timing.
double SimTimingFrameRate(const SimTiming* timing);
const SimTiming* SimFindTiming(int width, int height, int refresh, bool interlaced);

// What limits the modes of a card.
struct SimModeLimits {
    uint64_t memory_bytes;
    uint32_t max_pixel_hz[3];  // at 8, 15/16 and 32 bits
    bool has_15bit;
};

// The desktop sizes the machine offers: the DMT resolutions from 640x480
// to 1280x1024 that Wine's virtual desktop can take.
struct SimSize {
    uint16_t width, height;
};
extern const SimSize sim_desktop_sizes[];
extern const int sim_desktop_size_count;
// The depths the machine offers them at.
extern const int sim_desktop_depths[];
extern const int sim_desktop_depth_count;

enum { SIM_MAX_RATES = 16 };
// The rates (ascending, distinct, progressive only) a driver offers for a
// mode; 0 when the depth or the mode is not offered at all.
int SimModeRates(const SimModeLimits* limits, int width, int height, int bits, uint16_t* rates);
// 1 when the 1024x768 interlaced timing fits that depth.
bool SimModeInterlacedOffered(const SimModeLimits* limits, int width, int height, int bits);
bool SimModeOffered(const SimModeLimits* limits, int width, int height, int bits);
// "60,72,75" for a rate list; the text is cut at size - 1.
void SimFormatRates(const uint16_t* rates, int count, char* out, size_t size);

// The rate a 9x display driver runs for a mode, given the RefreshRate text
// it found (NULL when none): a listed rate is used as it is, -1 asks for the
// highest, anything else that is positive for the highest listed rate not
// above it (or the lowest); 0, 1 or none for the default, 60 Hz or the
// lowest rate.
int SimChooseRate(const uint16_t* rates, int count, const char* refresh_text);
// The rate a driver uses when asked for its default timing.
int SimDefaultRate(const uint16_t* rates, int count);

// A clock synthesizer: f = fref x (M + a) / ((N + b) x 2^R), its VCO running
// at fref x (M + a) / (N + b).
struct SimPllLimits {
    double fref_hz;
    int a, b;
    int m_min, m_max, n_min, n_max, r_min, r_max;
    double vco_min_hz, vco_max_hz;
};
struct SimPllSetting {
    int m, n, r;
};
double SimPllOutput(const SimPllLimits* limits, int m, int n, int r);
// The setting whose output is nearest to the target with the VCO in range,
// as a display driver chooses it. 0 when no setting keeps the VCO in range.
int SimPllBest(const SimPllLimits* limits, double target_hz, SimPllSetting* out);

#endif
