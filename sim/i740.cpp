// The Intel i740: its extended registers XRxx behind the index/data pair
// 0x3D6/0x3D7 (two video clock synthesizers, the memory clock choice, DPMS
// sync select), the CRT controller's extension registers, and the display
// driver's mode set. Written from Linux i740fb and the X.org i740 driver;
// sim/README.md lists where the program's register description differs and
// which one the model follows.
#include "fields.h"
#include "machine_state.h"
#include "modes.h"

namespace {

// The synthesizers run from a 66.667 MHz reference (i740fb).
const double fref_hz = 66666700.0;
const double vco_max_hz = 450e6;
const double memory_clock_hz[4] = {66667000.0, 75000000.0, 88889000.0, 100000000.0};  // XRCE 1..0

enum : uint16_t { XR_INDEX_PORT = 0x3D6, XR_DATA_PORT = 0x3D7 };
// Where the model keeps the index latch: after the 256 XR registers.
enum { XR_INDEX_SLOT = 0x100 };

// A synthesizer's four registers: M, N, their high bits, the divisor select.
struct I740Synthesizer {
    SimField m, n;          // 10 bits each: low byte, bits 9..8 in the high-bits register (1..0 M, 5..4 N)
    SimField post_divider;  // divisor select 6..4: output = VCO / 2^P
    SimField loop_by_16;    // divisor select 2: the VCO loop divides by 16 M, else 4 M
    SimField reference_by_1;  // divisor select 0: the reference is used whole, else divided by 4
    const char* names[4];   // as i740fb names set B's (VCLK2_*)
};
#define I740_SYNTHESIZER(base, prefix)                                                                          \
    {.m = {.piece_count = 2, .pieces = {{.reg = base, .low_bit = 0, .high_bit = 7},                             \
                                        {.reg = base + 2, .low_bit = 0, .high_bit = 1}}},                       \
     .n = {.piece_count = 2, .pieces = {{.reg = base + 1, .low_bit = 0, .high_bit = 7},                         \
                                        {.reg = base + 2, .low_bit = 4, .high_bit = 5}}},                       \
     .post_divider = {.piece_count = 1, .pieces = {{.reg = base + 3, .low_bit = 4, .high_bit = 6}}},            \
     .loop_by_16 = {.piece_count = 1, .pieces = {{.reg = base + 3, .low_bit = 2, .high_bit = 2}}},              \
     .reference_by_1 = {.piece_count = 1, .pieces = {{.reg = base + 3, .low_bit = 0, .high_bit = 0}}},          \
     .names = {prefix "_VCO_M", prefix "_VCO_N", prefix "_VCO_MN_MSBS", prefix "_VCO_DIV_SEL"}}
// Clock select 0 runs from set A (XRC0-XRC3), any other from set B (XRC8-XRCB).
const I740Synthesizer set_a = I740_SYNTHESIZER(0xC0, "VCLK0");
const I740Synthesizer set_b = I740_SYNTHESIZER(0xC8, "VCLK2");
const uint8_t synthesizer_base[2] = {0xC0, 0xC8};

struct I740Fields {
    SimField memory_clock;        // XRCE (PLL_CNTL) 1..0
    SimField hsync_off, vsync_off;  // XR61 (DPMS_SYNC_SELECT) 1, 3
};
const I740Fields f = {
    .memory_clock = {.piece_count = 1, .pieces = {{.reg = 0xCE, .low_bit = 0, .high_bit = 1}}},
    .hsync_off = {.piece_count = 1, .pieces = {{.reg = 0x61, .low_bit = 1, .high_bit = 1}}},
    .vsync_off = {.piece_count = 1, .pieces = {{.reg = 0x61, .low_bit = 3, .high_bit = 3}}},
};

// The extended CRT registers: horizontal total bit 8 in CR35 bit 0,
// blanking end bit 6 in CR39 bit 0; bits 11..8 of the vertical total,
// display end, retrace start and blanking start in CR30..CR33 bits 3..0,
// which take the place of the VGA's overflow bits (i740fb).
SimCrtcFields I740Crtc()
{
    SimCrtcFields c = sim_vga_crtc;
    c.htotal = {.piece_count = 2,
                .pieces = {{.reg = 0x00, .low_bit = 0, .high_bit = 7}, {.reg = 0x35, .low_bit = 0, .high_bit = 0}}};
    c.hblank_end.pieces[c.hblank_end.piece_count++] = {.reg = 0x39, .low_bit = 0, .high_bit = 0};
    auto twelve_bits = [](uint8_t low, uint8_t high) {
        return SimField{.piece_count = 2,
                        .pieces = {{.reg = low, .low_bit = 0, .high_bit = 7}, {.reg = high, .low_bit = 0, .high_bit = 3}}};
    };
    c.vtotal = twelve_bits(0x06, 0x30);
    c.vdisplay_end = twelve_bits(0x12, 0x31);
    c.vsync_start = twelve_bits(0x10, 0x32);
    c.vblank_start = twelve_bits(0x15, 0x33);
    return c;
}
const SimCrtcFields crtc = I740Crtc();

SimVga* Core(int card) { return &sim->cards[card].vga; }
uint8_t* Xr(int card) { return sim->cards[card].family; }

const I740Synthesizer* Selected(int card)
{
    return SimFieldRead(&Core(card)->misc, &sim_misc_clock_select) == 0 ? &set_a : &set_b;
}

// f = fref (/4 without the whole-reference bit) x 4 or 16 x (M + 2) / ((N + 2) x 2^P).
double SynthesizerHz(int card, const I740Synthesizer* s)
{
    const uint8_t* xr = Xr(card);
    double reference = SimFieldRead(xr, &s->reference_by_1) ? fref_hz : fref_hz / 4;
    int loop = SimFieldRead(xr, &s->loop_by_16) ? 16 : 4;
    return reference * loop * (SimFieldRead(xr, &s->m) + 2) /
           ((SimFieldRead(xr, &s->n) + 2) * (double)(1 << SimFieldRead(xr, &s->post_divider)));
}
double PixelClock(int card) { return SynthesizerHz(card, Selected(card)); }
double MemoryClock(int card) { return memory_clock_hz[SimFieldRead(Xr(card), &f.memory_clock)]; }

int LineCharacters(int card) { return SimFieldRead(Core(card)->cr, &crtc.htotal) + 5; }
int FrameLines(int card) { return SimFieldRead(Core(card)->cr, &crtc.vtotal) + 2; }
double Refresh(int card) { return PixelClock(card) / (8.0 * LineCharacters(card) * FrameLines(card)); }

SimDpms Dpms(int card)
{
    bool hsync_off = SimFieldRead(Xr(card), &f.hsync_off) != 0, vsync_off = SimFieldRead(Xr(card), &f.vsync_off) != 0;
    if (hsync_off && vsync_off) return SIM_DPMS_OFF;
    if (hsync_off) return SIM_DPMS_STANDBY;
    return vsync_off ? SIM_DPMS_SUSPEND : SIM_DPMS_ON;
}

// --- the XR index/data pair (also in the register window at window + port) ---

int ReadPort(int card, uint16_t port, uint8_t* value)
{
    if (port == XR_INDEX_PORT) *value = Xr(card)[XR_INDEX_SLOT];
    else if (port == XR_DATA_PORT) *value = Xr(card)[Xr(card)[XR_INDEX_SLOT]];
    else return 0;
    return 1;
}

int WritePort(int card, uint16_t port, uint8_t value)
{
    if (port == XR_INDEX_PORT) Xr(card)[XR_INDEX_SLOT] = value;
    else if (port == XR_DATA_PORT) Xr(card)[Xr(card)[XR_INDEX_SLOT]] = value;
    else return 0;
    return 1;
}

// --- reset and the display driver's mode set ---

// The whole reference and the loop by 4, as i740fb runs them; the VCO
// (the output before the post-divider) at most 450 MHz.
void SetSynthesizer(int card, const I740Synthesizer* s, double hz)
{
    SimPllLimits limits = {.fref_hz = fref_hz * 4, .a = 2, .b = 2, .m_min = 1, .m_max = 1023, .n_min = 1,
                           .n_max = 28, .r_min = 0, .r_max = 5, .vco_min_hz = 0, .vco_max_hz = vco_max_hz};
    SimPllSetting pll;
    if (!SimPllBest(&limits, hz, &pll)) return;
    uint8_t* xr = Xr(card);
    SimFieldWrite(xr, &s->m, pll.m);
    SimFieldWrite(xr, &s->n, pll.n);
    SimFieldWrite(xr, &s->post_divider, pll.r);
    SimFieldWrite(xr, &s->loop_by_16, 0);
    SimFieldWrite(xr, &s->reference_by_1, 1);
}

void Reset(int card)
{
    VgaReset(card);
    SetSynthesizer(card, &set_a, 25175000.0);
    SetSynthesizer(card, &set_b, 28322000.0);
    SimFieldWrite(Xr(card), &f.memory_clock, 3);
}

void ProgramMode(int card, const SimTiming* t, int bits)
{
    SimVga* v = Core(card);
    SimCrtcTiming c = VgaCrtcValues(t);
    // The VGA's overflow bits as well, as i740fb writes both.
    VgaWriteTiming(card, &c, &sim_vga_crtc);
    VgaWriteTiming(card, &c, &crtc);
    // Clock select 2: the second programmable clock.
    SimFieldWrite(&v->misc, &sim_misc_clock_select, 2);
    SimFieldWrite(&v->misc, &sim_misc_hsync_negative, (t->flags & SIM_TIMING_HSYNC_NEGATIVE) != 0);
    SimFieldWrite(&v->misc, &sim_misc_vsync_negative, (t->flags & SIM_TIMING_VSYNC_NEGATIVE) != 0);
    SetSynthesizer(card, &set_b, t->pixel_hz);
}

void PrintRaw(FILE* out, int card)
{
    for (int set = 0; set < 2; set++)
        for (int i = 0; i < 4; i++)
            fprintf(out, "%s=%02X\n", (set ? set_b : set_a).names[i], Xr(card)[synthesizer_base[set] + i]);
    fprintf(out, "PLL_CNTL=%02X\nDPMS_SYNC_SELECT=%02X\n", Xr(card)[0xCE], Xr(card)[0x61]);
}

}  // namespace

const SimFamilyOps sim_i740_ops = {
    .reset = Reset,
    .read_sr = [](int card, uint8_t index) { return sim->cards[card].vga.sr[index]; },
    .write_sr = [](int card, uint8_t index, uint8_t value) { sim->cards[card].vga.sr[index] = value; },
    .read_cr = VgaGenericReadCr,
    .write_cr = VgaGenericWriteCr,
    .window_read = NULL,
    .window_write = NULL,
    .pixel_clock_hz = PixelClock,
    .memory_clock_hz = MemoryClock,
    .htotal = LineCharacters,
    .vtotal = FrameLines,
    .refresh_hz = Refresh,
    .dpms = Dpms,
    .program_mode = ProgramMode,
    .read_port = ReadPort,
    .write_port = WritePort,
    .print_raw = PrintRaw,
    .read_internal32 = NULL,
    .write_internal32 = NULL,
};
