// The S3 chips (Trio, ViRGE, Trio3D, Savage3D): extended sequencer behind
// the SR08 key, the DCLK and MCLK synthesizers, the extended CRT timing
// bits, the memory straps and the DPMS sync control. Field layouts follow
// the program's register table; sim/README.md lists where public documents
// of the chips say otherwise.
#include <math.h>

#include "machine_state.h"
#include "modes.h"

namespace {

const double fref_hz = 14318180.0;

// Register fields.
enum {
    SR08_KEY_MASK = 0x0F,
    SR08_UNLOCKED = 0x06,          // SR09 and above answer only with this key
    SR0D_HSYNC_MASK = 0x30,        // hsync off when non-zero
    SR0D_VSYNC_MASK = 0xC0,        // vsync off when non-zero
    SR18_DOUBLE_CLOCK = 0x80,      // two DCLK periods per pixel above 8 bits per pixel
    SR29_M_BIT8 = 0x08, SR29_N_BIT6 = 0x10, SR29_R_BIT2 = 0x04,
    CR42_INTERLACED = 0x20,
    CR43_DOUBLE_HORIZONTAL = 0x80,
    CR37_AGP = 0x40,
    MISC_CLOCK_SELECT = 0x0C,
    MISC_HSYNC_NEGATIVE = 0x40,
    MISC_VSYNC_NEGATIVE = 0x80,
};

SimVga* Core(int card) { return &sim->cards[card].vga; }
const SimS3Chip* Chip(int card) { return SimCardChip(card)->s3; }
bool IsSavage(int card) { return Chip(card)->dclk == S3_DCLK_SAVAGE; }
bool Unlocked(int card) { return (Core(card)->sr[0x08] & SR08_KEY_MASK) == SR08_UNLOCKED; }
int Bit(uint8_t reg, int bit) { return (reg >> bit) & 1; }

uint8_t ReadSr(int card, uint8_t index)
{
    if (index >= 0x09 && !Unlocked(card)) return 0;
    return Core(card)->sr[index];
}

void WriteSr(int card, uint8_t index, uint8_t value)
{
    if (index >= 0x09 && !Unlocked(card)) return;
    Core(card)->sr[index] = value;
}

void WriteCr(int card, uint8_t index, uint8_t value)
{
    // CR2D-CR30 hold the chip's identification and do not take writes.
    if (index >= 0x2D && index <= 0x30) return;
    VgaGenericWriteCr(card, index, value);
}

SimPllLimits DclkLimits(int card)
{
    const SimS3Chip* c = Chip(card);
    return {fref_hz, 2, 2, 1, c->m_max, c->n_min, c->n_max, 0, c->r_max, c->vco_min_hz, c->vco_max_hz};
}

void DecodeDclk(int card, int* m, int* n, int* r)
{
    const uint8_t* sr = Core(card)->sr;
    switch (Chip(card)->dclk) {
    case S3_DCLK_SAVAGE:
        *m = sr[0x13] + 256 * Bit(sr[0x29], 3);
        *n = (sr[0x12] & 0x3F) + 64 * Bit(sr[0x29], 4);
        *r = (sr[0x12] >> 6) + 4 * Bit(sr[0x29], 2);
        break;
    case S3_DCLK_R2:
        *m = sr[0x13] & 0x7F;
        *n = sr[0x12] & 0x1F;
        *r = (sr[0x12] >> 5) & 3;
        break;
    case S3_DCLK_R3:
        *m = sr[0x13] & 0x7F;
        *n = sr[0x12] & 0x1F;
        *r = (sr[0x12] >> 5) & 7;
        break;
    }
}

void EncodeDclk(int card, int m, int n, int r)
{
    uint8_t* sr = Core(card)->sr;
    switch (Chip(card)->dclk) {
    case S3_DCLK_SAVAGE:
        sr[0x29] = (uint8_t)((sr[0x29] & 0xE3) | (m >= 256 ? SR29_M_BIT8 : 0) | (n >= 64 ? SR29_N_BIT6 : 0) |
                             (r >= 4 ? SR29_R_BIT2 : 0));
        sr[0x13] = (uint8_t)(m & 0xFF);
        sr[0x12] = (uint8_t)((n & 0x3F) | ((r & 3) << 6));
        break;
    case S3_DCLK_R2:
        sr[0x13] = (uint8_t)((sr[0x13] & 0x80) | m);
        sr[0x12] = (uint8_t)((sr[0x12] & 0x80) | n | (r << 5));
        break;
    case S3_DCLK_R3:
        sr[0x13] = (uint8_t)((sr[0x13] & 0x80) | m);
        sr[0x12] = (uint8_t)(n | (r << 5));
        break;
    }
}

int Depth(int card) { return sim->cards[card].mode.bits ? sim->cards[card].mode.bits : 8; }
int CharWidth(int card) { return Depth(card) == 15 || Depth(card) == 16 ? 4 : 8; }

double SynthesizerHz(int card)
{
    int m = 0, n = 0, r = 0;
    DecodeDclk(card, &m, &n, &r);
    return fref_hz * (m + 2) / ((double)(n + 2) * (1 << r));
}

// The dot clock the CRT controller sees: MISC selects one of the two fixed
// VGA clocks or the DCLK synthesizer.
double PixelClock(int card)
{
    switch ((Core(card)->misc & MISC_CLOCK_SELECT) >> 2) {
    case 0: return 25175000.0;
    case 1: return 28322000.0;
    default: return SynthesizerHz(card);
    }
}

double MemoryClock(int card)
{
    const uint8_t* sr = Core(card)->sr;
    int m = sr[0x11] & 0x7F, n = sr[0x10] & 0x1F, r = (sr[0x10] >> 5) & 3;
    return fref_hz * (m + 2) / ((double)(n + 2) * (1 << r));
}

int HTotal(int card)
{
    const uint8_t* cr = Core(card)->cr;
    int t = cr[0x00] + 256 * Bit(cr[0x5D], 0);
    if (IsSavage(card)) t += 512 * (cr[0x5F] & 3);
    if (cr[0x43] & CR43_DOUBLE_HORIZONTAL) t *= 2;
    return t + 5;
}

int VTotal(int card)
{
    const uint8_t* cr = Core(card)->cr;
    return cr[0x06] + 256 * Bit(cr[0x07], 0) + 512 * Bit(cr[0x07], 5) + 1024 * Bit(cr[0x5E], 0) + 2;
}

// The pixel clock as the CRT timing counts it: half the DCLK when a deeper
// mode takes two DCLK periods per pixel.
double TimingClock(int card)
{
    double f = PixelClock(card);
    if (Depth(card) != 8 && (Core(card)->sr[0x18] & SR18_DOUBLE_CLOCK)) f /= 2;
    return f;
}

double Refresh(int card)
{
    double per_field = TimingClock(card) / ((double)CharWidth(card) * HTotal(card) * VTotal(card));
    return (Core(card)->cr[0x42] & CR42_INTERLACED) ? per_field / 2 : per_field;
}

SimDpms Dpms(int card)
{
    uint8_t sr0d = Core(card)->sr[0x0D];
    bool hsync_off = (sr0d & SR0D_HSYNC_MASK) != 0, vsync_off = (sr0d & SR0D_VSYNC_MASK) != 0;
    if (hsync_off && vsync_off) return SIM_DPMS_OFF;
    if (hsync_off) return SIM_DPMS_STANDBY;
    if (vsync_off) return SIM_DPMS_SUSPEND;
    return SIM_DPMS_ON;
}

// CR36 bits 7..5 as the straps set them for the card's memory.
uint8_t MemoryStraps(int card)
{
    const SimCardConfig* c = &sim->config.cards[card];
    uint32_t mb = c->memory_mb;
    int code = 0;
    switch (Chip(card)->memory_code) {
    case S3_MEM_SAVAGE: code = mb >= 8 ? 0 : mb >= 4 ? 2 : 6; break;
    case S3_MEM_VIRGE_VX: code = mb >= 8 ? 3 : mb >= 6 ? 2 : mb >= 4 ? 1 : 0; break;
    case S3_MEM_TRIO:
        // 8 MB and 3 MB have codes on the chips (3 and 2) that the program's
        // table does not know; 3 MB then reads as 4.
        code = mb >= 8 ? 3 : mb >= 4 ? 0 : mb >= 3 ? 2 : mb >= 2 ? 4 : 6;
        break;
    }
    return (uint8_t)(code << 5);
}

void Reset(int card)
{
    VgaReset(card);
    SimVga* v = Core(card);
    const SimCardConfig* c = &sim->config.cards[card];
    const SimChip* chip = SimCardChip(card);
    v->cr[0x2D] = (uint8_t)(c->device_id >> 8);
    v->cr[0x2E] = (uint8_t)c->device_id;
    v->cr[0x2F] = chip->revision;
    v->cr[0x30] = chip->s3->cr30_chip_id;
    v->cr[0x36] = (uint8_t)(MemoryStraps(card) | 0x0E);
    v->cr[0x37] = (uint8_t)((IsSavage(card) && c->bus == 1) ? CR37_AGP : 0);
    // MCLK about 60 MHz: M = 115, N = 12, R = 1.
    v->sr[0x10] = 0x2C;
    v->sr[0x11] = 0x73;
    SimPllLimits limits = DclkLimits(card);
    SimPllSetting pll;
    if (SimPllBest(&limits, 25175000.0, &pll)) EncodeDclk(card, pll.m, pll.n, pll.r);
}

// The clock that makes a horizontal total (in characters) and a vertical
// total (in lines) run at the timing's own rate, per field.
double TimingClockFor(const SimTiming* t, int char_width, int htotal, int vtotal)
{
    double field_rate = SimTimingFrameRate(t) * ((t->flags & SIM_TIMING_INTERLACED) ? 2 : 1);
    return field_rate * char_width * htotal * vtotal;
}

int FieldLines(const SimTiming* t) { return (t->flags & SIM_TIMING_INTERLACED) ? t->vtotal / 2 : t->vtotal; }

// The horizontal total register value nearest the timing's total that the
// synthesizer can clock closest to the timing's rate.
int ChooseHTotal(int card, const SimTiming* t, int char_width, int h_factor, bool double_clock)
{
    double exact = (t->htotal / (double)char_width - 5) / h_factor;
    SimPllLimits limits = DclkLimits(card);
    int best = (int)floor(exact + 0.5);
    double best_error = -1;
    for (int reg = (int)floor(exact); reg <= (int)floor(exact) + 1; reg++) {
        double wanted = TimingClockFor(t, char_width, reg * h_factor + 5, FieldLines(t)) * (double_clock ? 2 : 1);
        SimPllSetting pll;
        if (!SimPllBest(&limits, wanted, &pll)) continue;
        double error = fabs(SimPllOutput(&limits, pll.m, pll.n, pll.r) / wanted - 1);
        if (best_error < 0 || error < best_error) {
            best_error = error;
            best = reg;
        }
    }
    return best;
}

void ProgramMode(int card, const SimTiming* t, int bits)
{
    SimVga* v = Core(card);
    uint8_t* cr = v->cr;
    uint8_t* sr = v->sr;
    bool high_colour = bits == 15 || bits == 16;
    bool double_clock = high_colour && Chip(card)->doubles_clock_16;
    bool interlaced = (t->flags & SIM_TIMING_INTERLACED) != 0;
    int char_width = high_colour ? 4 : 8;
    int h_factor = high_colour ? 2 : 1;  // CR43 bit 7 doubles the horizontal total

    // Horizontal registers count 8 pixels; the total is counted in
    // characters of char_width pixels, of which CR43 makes two per unit.
    SimCrtcTiming c;
    c.htotal = ChooseHTotal(card, t, char_width, h_factor, double_clock);
    c.hdisplay_end = t->width / 8 - 1;
    c.hblank_start = t->width / 8;
    c.hblank_end = (t->htotal / 8 - 1) & 0x3F;
    c.hsync_start = t->hsync_start / 8;
    c.hsync_end = (t->hsync_end / 8) & 0x1F;
    int lines = FieldLines(t);
    int shown = interlaced ? t->height / 2 : t->height;
    c.vtotal = lines - 2;
    c.vdisplay_end = shown - 1;
    c.vblank_start = shown;
    c.vblank_end = (lines - 1) & 0xFF;
    c.vsync_start = interlaced ? t->vsync_start / 2 : t->vsync_start;
    c.vsync_end = (interlaced ? t->vsync_end / 2 : t->vsync_end) & 0x0F;
    VgaWriteTiming(card, &c);

    cr[0x5D] = (uint8_t)(Bit((uint8_t)(c.htotal >> 8), 0) | (Bit((uint8_t)(c.hdisplay_end >> 8), 0) << 1) |
                         (Bit((uint8_t)(c.hblank_start >> 8), 0) << 2) |
                         (Bit((uint8_t)(c.hsync_start >> 8), 0) << 4));
    if (IsSavage(card)) cr[0x5F] = (uint8_t)((cr[0x5F] & ~3) | ((c.htotal >> 9) & 3));
    cr[0x5E] = (uint8_t)(((c.vtotal >> 10) & 1) | (((c.vdisplay_end >> 10) & 1) << 1) |
                         (((c.vblank_start >> 10) & 1) << 2) | (((c.vsync_start >> 10) & 1) << 4) | 0x40);
    cr[0x42] = (uint8_t)((cr[0x42] & ~CR42_INTERLACED) | (interlaced ? CR42_INTERLACED : 0));
    cr[0x43] = (uint8_t)((cr[0x43] & ~CR43_DOUBLE_HORIZONTAL) | (high_colour ? CR43_DOUBLE_HORIZONTAL : 0));
    int pitch = t->width * ((bits + 7) / 8) / 8;
    cr[0x13] = (uint8_t)pitch;
    cr[0x51] = (uint8_t)((cr[0x51] & 0xCF) | ((pitch >> 4) & 0x30));
    static const uint8_t pixel_format[] = {0x00, 0x30, 0x50, 0xD0};  // CR67: 8, 15, 16, 32 bits
    cr[0x67] = (uint8_t)((cr[0x67] & 0x0F) | pixel_format[bits == 8 ? 0 : bits == 15 ? 1 : bits == 16 ? 2 : 3]);
    sr[0x18] = (uint8_t)((sr[0x18] & ~SR18_DOUBLE_CLOCK) | (double_clock ? SR18_DOUBLE_CLOCK : 0));
    v->misc = (uint8_t)((v->misc & 0x3F & ~MISC_CLOCK_SELECT) | MISC_CLOCK_SELECT |
                        ((t->flags & SIM_TIMING_HSYNC_NEGATIVE) ? MISC_HSYNC_NEGATIVE : 0) |
                        ((t->flags & SIM_TIMING_VSYNC_NEGATIVE) ? MISC_VSYNC_NEGATIVE : 0));
    sim->cards[card].mode.bits = (uint16_t)bits;

    // The clock that makes the totals just programmed run at the timing's
    // own rate (per field for an interlaced timing).
    double timing_clock = TimingClockFor(t, char_width, HTotal(card), VTotal(card));
    SimPllLimits limits = DclkLimits(card);
    SimPllSetting pll;
    if (SimPllBest(&limits, timing_clock * (double_clock ? 2 : 1), &pll)) {
        // A Savage3D blanks the screen while its synthesizer is rewritten.
        uint8_t sr01 = sr[0x01];
        if (IsSavage(card)) sr[0x01] |= 0x20;
        EncodeDclk(card, pll.m, pll.n, pll.r);
        sr[0x01] = sr01;
    }
}

}  // namespace

const SimFamilyOps sim_s3_ops = {
    Reset, ReadSr, WriteSr, VgaGenericReadCr, WriteCr, NULL, NULL, PixelClock, MemoryClock, HTotal, VTotal, Refresh,
    Dpms, ProgramMode,
};
