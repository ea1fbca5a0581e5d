// The Trident 939a: the memory size and type codes, the two pixel clock
// synthesizer pairs and the memory clock synthesizer, the extended CRT
// timing bits, the DPMS sync control, and the display driver's mode set.
// Written from Linux tridentfb (include/video/trident.h names the
// registers) and the X.org trident driver; sim/README.md lists where the
// program's register description differs and which one the model follows.
#include "fields.h"
#include "machine_state.h"
#include "modes.h"

namespace {

const double fref_hz = 14318180.0;
const double vga_clock_hz[2] = {25175000.0, 28322000.0};  // MISC clock select 0 and 1

// A synthesizer is a register pair: low M (7..0), high N (5..0) and R
// (7..6); f = fref x (M + 8) / ((N + 2) x 2^R).
struct ClockPair {
    uint8_t low, high;
    const char *low_name, *high_name;
};
const ClockPair mclk = {.low = 0x16, .high = 0x17, .low_name = "TRIDENT_SR16_MCLK_LOW", .high_name = "TRIDENT_SR17_MCLK_HIGH"};
const ClockPair vclk = {.low = 0x18, .high = 0x19, .low_name = "TRIDENT_SR18_CLOCK_LOW", .high_name = "TRIDENT_SR19_CLOCK_HIGH"};
const ClockPair vclk_b = {.low = 0x1A, .high = 0x1B, .low_name = "TRIDENT_SR1A_CLOCK_LOW_B", .high_name = "TRIDENT_SR1B_CLOCK_HIGH_B"};

constexpr SimField Bits(uint8_t reg, uint8_t low, uint8_t high)
{
    return {.piece_count = 1, .pieces = {{.reg = reg, .low_bit = low, .high_bit = high}}};
}
constexpr SimField Bit(uint8_t reg, uint8_t bit) { return Bits(reg, bit, bit); }

// The single-register fields; the split ones are in the CRT table below.
struct TridentFields {
    SimField pll_m, pll_n, pll_r;        // of a pair, the low register at index 0
    SimField memory_size;                // CR1F 3..0 (tridentfb's SPR)
    SimField memory_type;                // CR2A 3..2: 1 EDO, 2 SDRAM, 3 SGRAM
    SimField first_pair;                 // CR2F 1: SR18/SR19 drive the pixels, else SR1A/SR1B
    SimField interlaced;                 // CR0E 2
    SimField hsync_off, vsync_off;       // SR0D 5..4, 7..6
    SimField clock_halved;               // GR0F 3 (MiscExtFunc): the pixel clock is the synthesizer's / 2
    SimField offset;                     // CR13 7..0, CR29 5..4: bytes per line / 8
};
constexpr TridentFields fields = {
    .pll_m = Bits(0, 0, 7),
    .pll_n = Bits(1, 0, 5),
    .pll_r = Bits(1, 6, 7),
    .memory_size = Bits(0x1F, 0, 3),
    .memory_type = Bits(0x2A, 2, 3),
    .first_pair = Bit(0x2F, 1),
    .interlaced = Bit(0x0E, 2),
    .hsync_off = Bits(0x0D, 4, 5),
    .vsync_off = Bits(0x0D, 6, 7),
    .clock_halved = Bit(0x0F, 3),
    .offset = {.piece_count = 2, .pieces = {{.reg = 0x13, .low_bit = 0, .high_bit = 7}, {.reg = 0x29, .low_bit = 4, .high_bit = 5}}},
};

// Bit 8 of the horizontal total, display end, retrace start and blanking
// start in CR2B bits 0, 1, 3 and 4 (HorizOverflow); bit 10 of the vertical
// total, blanking start, retrace start, display end and line compare in
// CR27 bits 7, 6, 5, 4 and 3 (CRTHiOrd).
const SimCrtcFields crtc = {
    .htotal = SimFieldWithBit(sim_vga_crtc.htotal, 0x2B, 0),
    .hdisplay_end = SimFieldWithBit(sim_vga_crtc.hdisplay_end, 0x2B, 1),
    .hblank_start = SimFieldWithBit(sim_vga_crtc.hblank_start, 0x2B, 4),
    .hblank_end = sim_vga_crtc.hblank_end,
    .hsync_start = SimFieldWithBit(sim_vga_crtc.hsync_start, 0x2B, 3),
    .hsync_end = sim_vga_crtc.hsync_end,
    .vtotal = SimFieldWithBit(sim_vga_crtc.vtotal, 0x27, 7),
    .vdisplay_end = SimFieldWithBit(sim_vga_crtc.vdisplay_end, 0x27, 4),
    .vblank_start = SimFieldWithBit(sim_vga_crtc.vblank_start, 0x27, 6),
    .vblank_end = sim_vga_crtc.vblank_end,
    .vsync_start = SimFieldWithBit(sim_vga_crtc.vsync_start, 0x27, 5),
    .vsync_end = sim_vga_crtc.vsync_end,
    .line_compare = SimFieldWithBit(sim_vga_crtc.line_compare, 0x27, 3),
};

// CR1F 3..0 for the sizes the chip reports (tridentfb).
struct MemoryCode {
    uint32_t mb;
    uint8_t code;
};
const MemoryCode memory_codes[] = {{.mb = 1, .code = 0x3}, {.mb = 2, .code = 0x7}, {.mb = 4, .code = 0xF}, {.mb = 8, .code = 0x4}};
enum { MEMORY_SGRAM = 3 };

// tridentfb's search: R 0..2, N 1..31, M 0..121 with M + 8 at least
// 4 x (N + 2), i.e. a VCO of at least four times the crystal.
const SimPllLimits vclk_limits = {.fref_hz = fref_hz, .a = 8, .b = 2, .m_min = 0, .m_max = 121, .n_min = 1,
                                  .n_max = 31, .r_min = 0, .r_max = 2, .vco_min_hz = 4 * fref_hz,
                                  .vco_max_hz = fref_hz * 129 / 3};
const double mclk_reset_hz = 100e6;

SimVga* Core(int card) { return &sim->cards[card].vga; }

const ClockPair* PixelPair(int card)
{
    return SimFieldRead(Core(card)->cr, &fields.first_pair) ? &vclk : &vclk_b;
}

double PairHz(int card, const ClockPair* pair)
{
    const uint8_t* sr = Core(card)->sr;
    uint8_t regs[2] = {sr[pair->low], sr[pair->high]};
    return fref_hz * (SimFieldRead(regs, &fields.pll_m) + 8) /
           ((double)(SimFieldRead(regs, &fields.pll_n) + 2) * (1 << SimFieldRead(regs, &fields.pll_r)));
}

void SetPair(int card, const ClockPair* pair, double hz)
{
    SimPllSetting pll;
    if (!SimPllBest(&vclk_limits, hz, &pll)) return;
    uint8_t* sr = Core(card)->sr;
    uint8_t regs[2] = {sr[pair->low], sr[pair->high]};
    SimFieldWrite(regs, &fields.pll_m, pll.m);
    SimFieldWrite(regs, &fields.pll_n, pll.n);
    SimFieldWrite(regs, &fields.pll_r, pll.r);
    // tridentfb writes the high register first; the pair takes effect with the low.
    sr[pair->high] = regs[1];
    sr[pair->low] = regs[0];
}

// The dot clock: MISC selects one of the two fixed VGA clocks or (2, 3) the
// synthesizer pair CR2F chooses.
double DotClock(int card)
{
    int select = SimFieldRead(&Core(card)->misc, &sim_misc_clock_select);
    return select < 2 ? vga_clock_hz[select] : PairHz(card, PixelPair(card));
}
double MemoryClock(int card) { return PairHz(card, &mclk); }

uint8_t ReadSr(int card, uint8_t index) { return Core(card)->sr[index]; }
void WriteSr(int card, uint8_t index, uint8_t value) { Core(card)->sr[index] = value; }

int LineCharacters(int card) { return SimFieldRead(Core(card)->cr, &crtc.htotal) + 5; }
int FieldLines(int card) { return SimFieldRead(Core(card)->cr, &crtc.vtotal) + 2; }

// Characters of 8 pixels at every depth; at 32 bits the synthesizer runs at
// twice the pixel rate and GR0F bit 3 halves it.
double Refresh(int card)
{
    const SimVga* v = Core(card);
    double pixel_hz = DotClock(card) / (SimFieldRead(v->gr, &fields.clock_halved) ? 2 : 1);
    double field_hz = pixel_hz / (8.0 * LineCharacters(card) * FieldLines(card));
    return SimFieldRead(v->cr, &fields.interlaced) ? field_hz / 2 : field_hz;
}

SimDpms Dpms(int card)
{
    const uint8_t* sr = Core(card)->sr;
    bool hsync_off = SimFieldRead(sr, &fields.hsync_off) != 0;
    bool vsync_off = SimFieldRead(sr, &fields.vsync_off) != 0;
    if (hsync_off && vsync_off) return SIM_DPMS_OFF;
    if (hsync_off) return SIM_DPMS_STANDBY;
    if (vsync_off) return SIM_DPMS_SUSPEND;
    return SIM_DPMS_ON;
}

// The code of the card's size, else of the largest size below it, else 1 MB's.
uint8_t MemorySizeCode(int card)
{
    uint32_t mb = sim->config.cards[card].memory_mb;
    const MemoryCode* best = &memory_codes[0];
    for (const MemoryCode& c : memory_codes)
        if (c.mb <= mb && c.mb > best->mb) best = &c;
    return best->code;
}

void Reset(int card)
{
    VgaReset(card);
    SimVga* v = Core(card);
    SimFieldWrite(v->cr, &fields.memory_size, MemorySizeCode(card));
    SimFieldWrite(v->cr, &fields.memory_type, MEMORY_SGRAM);
    SimFieldWrite(v->cr, &fields.first_pair, 1);
    SetPair(card, &mclk, mclk_reset_hz);
    SetPair(card, &vclk, vga_clock_hz[0]);
    SetPair(card, &vclk_b, vga_clock_hz[1]);
}

// --- the display driver's mode set (tridentfb's set_par) ---

// CR38 (PixelBusReg) for a depth, as tridentfb and X.org trident set it.
uint8_t PixelBus(int bits) { return bits == 8 ? 0x00 : bits == 15 ? 0x04 : bits == 16 ? 0x05 : 0x09; }

void ProgramMode(int card, const SimTiming* t, int bits)
{
    SimVga* v = Core(card);
    SimCrtcTiming c = VgaCrtcValues(t);
    // The overflow registers are written whole.
    v->cr[0x27] = 0;
    v->cr[0x2B] = 0;
    VgaWriteTiming(card, &c, &crtc);
    SimFieldWrite(v->cr, &fields.interlaced, 0);
    SimFieldWrite(v->cr, &fields.offset, t->width * ((bits + 7) / 8) / 8);
    v->cr[0x38] = PixelBus(bits);
    SimFieldWrite(v->gr, &fields.clock_halved, bits == 32);
    SimFieldWrite(v->sr, &sim_sr01_eight_dots, 1);
    SimFieldWrite(&v->misc, &sim_misc_clock_select, 2);
    SimFieldWrite(&v->misc, &sim_misc_hsync_negative, (t->flags & SIM_TIMING_HSYNC_NEGATIVE) != 0);
    SimFieldWrite(&v->misc, &sim_misc_vsync_negative, (t->flags & SIM_TIMING_VSYNC_NEGATIVE) != 0);
    SetPair(card, PixelPair(card), (double)t->pixel_hz * (bits == 32 ? 2 : 1));
}

void PrintRaw(FILE* out, int card)
{
    const uint8_t* sr = Core(card)->sr;
    const ClockPair* pairs[] = {&mclk, &vclk, &vclk_b};
    for (const ClockPair* p : pairs)
        fprintf(out, "%s=%02X\n%s=%02X\n", p->low_name, sr[p->low], p->high_name, sr[p->high]);
}

}  // namespace

const SimFamilyOps sim_trident_ops = {
    .reset = Reset,
    .read_sr = ReadSr,
    .write_sr = WriteSr,
    .read_cr = VgaGenericReadCr,
    .write_cr = VgaGenericWriteCr,
    .window_read = NULL,
    .window_write = NULL,
    .pixel_clock_hz = DotClock,
    .memory_clock_hz = MemoryClock,
    .htotal = LineCharacters,
    .vtotal = FieldLines,
    .refresh_hz = Refresh,
    .dpms = Dpms,
    .program_mode = ProgramMode,
    .read_port = NULL,
    .write_port = NULL,
    .print_raw = PrintRaw,
    .read_internal32 = NULL,
    .write_internal32 = NULL,
};
