// The 3dfx Voodoo Banshee: the 32-bit registers at the start of its
// register window (memory set-up, the three clock synthesizers, the DAC
// mode with its DPMS bits, the video processor's configuration), the CRT
// controller's extension registers CR1A/CR1B, and the display driver's
// mode set. Written from Linux tdfxfb, the X.org tdfx driver, 86Box's
// Banshee model and Haiku's 3dfx accelerant; sim/README.md lists where the
// program's register description differs and which one the model follows.
#include <math.h>
#include <string.h>

#include "fields.h"
#include "machine_state.h"
#include "modes.h"

namespace {

const double fref_hz = 14318180.0;
const double vga_clock_hz[2] = {25175000.0, 28322000.0};
// From this width on the display driver runs the DAC in 2X mode, two pixels
// a clock edge, with the horizontal CRT values halved (sim/README.md: tdfxfb
// switches by the pixel clock instead).
const int twice_min_width = 1600;

enum Offset : uint32_t {
    MISC_INIT0 = 0x10,
    DRAM_INIT0 = 0x18,
    DRAM_INIT1 = 0x1C,
    VGA_INIT0 = 0x28,
    PLL_CTRL0 = 0x40,  // the video clock
    PLL_CTRL1 = 0x44,  // the graphics core clock
    PLL_CTRL2 = 0x48,  // read as the memory clock (sim/README.md)
    DAC_MODE = 0x4C,
    VID_PROC_CFG = 0x5C,
    VID_DESKTOP_STRIDE = 0xE8,
};

struct BansheeRegister {
    Offset offset;
    const char* name;  // as tdfxfb and the 3dfx documents name it
};
const BansheeRegister registers[] = {
    {.offset = MISC_INIT0, .name = "miscInit0"},   {.offset = DRAM_INIT0, .name = "dramInit0"},
    {.offset = DRAM_INIT1, .name = "dramInit1"},   {.offset = VGA_INIT0, .name = "vgaInit0"},
    {.offset = PLL_CTRL0, .name = "pllCtrl0"},     {.offset = PLL_CTRL1, .name = "pllCtrl1"},
    {.offset = PLL_CTRL2, .name = "pllCtrl2"},     {.offset = DAC_MODE, .name = "dacMode"},
    {.offset = VID_PROC_CFG, .name = "vidProcCfg"}, {.offset = VID_DESKTOP_STRIDE, .name = "vidDesktopOverlayStride"},
};

// Fields on the four bytes of one register, low byte first.
struct BansheeFields {
    SimField pll_k, pll_m, pll_n;      // pllCtrl 1..0 post-divider exponent, 7..2 divider, 15..8 multiplier
    SimField memory_code;              // dramInit0 28..27: 8, 16, 32 MB (the program's table)
    SimField eight_chips;              // dramInit0 26: 8 memory chips, else 4 (tdfxfb)
    SimField dac_2x, vsync_off, hsync_off;  // dacMode 0, 1, 3
    SimField proc_enable, pixel_format, proc_2x;  // vidProcCfg 0, 20..18, 26
    SimField extended_shift_out;       // vgaInit0 12
};
const BansheeFields f = {
    .pll_k = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 0, .high_bit = 1}}},
    .pll_m = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 2, .high_bit = 7}}},
    .pll_n = {.piece_count = 1, .pieces = {{.reg = 1, .low_bit = 0, .high_bit = 7}}},
    .memory_code = {.piece_count = 1, .pieces = {{.reg = 3, .low_bit = 3, .high_bit = 4}}},
    .eight_chips = {.piece_count = 1, .pieces = {{.reg = 3, .low_bit = 2, .high_bit = 2}}},
    .dac_2x = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 0, .high_bit = 0}}},
    .vsync_off = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 1, .high_bit = 1}}},
    .hsync_off = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 3, .high_bit = 3}}},
    .proc_enable = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 0, .high_bit = 0}}},
    .pixel_format = {.piece_count = 1, .pieces = {{.reg = 2, .low_bit = 2, .high_bit = 4}}},
    .proc_2x = {.piece_count = 1, .pieces = {{.reg = 3, .low_bit = 2, .high_bit = 2}}},
    .extended_shift_out = {.piece_count = 1, .pieces = {{.reg = 1, .low_bit = 4, .high_bit = 4}}},
};
const int memory_mb_by_code[3] = {8, 16, 32};
const uint32_t core_clock_reset = 0x592C;  // 14.31818 MHz x 91 / 13 = 100.2 MHz

// CR1A holds bit 8 of the horizontal total (0), display end (2), blanking
// start (4) and retrace start (6), bit 6 of the blanking end (5); CR1B bit
// 10 of the vertical total (0), display end (2), blanking start (4) and
// retrace start (6) (86Box).
SimCrtcFields BansheeCrtc()
{
    SimCrtcFields c = sim_vga_crtc;
    auto widen = [](SimField* field, uint8_t reg, uint8_t bit) {
        field->pieces[field->piece_count++] = {.reg = reg, .low_bit = bit, .high_bit = bit};
    };
    widen(&c.htotal, 0x1A, 0);
    widen(&c.hdisplay_end, 0x1A, 2);
    widen(&c.hblank_start, 0x1A, 4);
    widen(&c.hblank_end, 0x1A, 5);
    widen(&c.hsync_start, 0x1A, 6);
    widen(&c.vtotal, 0x1B, 0);
    widen(&c.vdisplay_end, 0x1B, 2);
    widen(&c.vblank_start, 0x1B, 4);
    widen(&c.vsync_start, 0x1B, 6);
    return c;
}
const SimCrtcFields crtc = BansheeCrtc();

SimVga* Core(int card) { return &sim->cards[card].vga; }
uint8_t* Bytes(int card, Offset offset) { return sim->cards[card].family + offset; }
uint32_t Load(int card, Offset offset)
{
    uint32_t v;
    memcpy(&v, Bytes(card, offset), 4);
    return v;
}
void Store(int card, Offset offset, uint32_t v) { memcpy(Bytes(card, offset), &v, 4); }

const BansheeRegister* FindRegister(uint32_t offset)
{
    for (const BansheeRegister& r : registers)
        if (r.offset == offset) return &r;
    return NULL;
}

// f = fref x (multiplier + 2) / ((divider + 2) x 2^K).
double SynthesizerHz(int card, Offset offset)
{
    const uint8_t* b = Bytes(card, offset);
    return fref_hz * (SimFieldRead(b, &f.pll_n) + 2) /
           ((SimFieldRead(b, &f.pll_m) + 2) * (double)(1 << SimFieldRead(b, &f.pll_k)));
}

// MISC clock select 0 and 1 are the VGA's fixed clocks; 2 and 3 the video PLL.
double PixelClock(int card)
{
    int select = SimFieldRead(&Core(card)->misc, &sim_misc_clock_select);
    return select < 2 ? vga_clock_hz[select] : SynthesizerHz(card, PLL_CTRL0);
}
double MemoryClock(int card) { return SynthesizerHz(card, PLL_CTRL2); }

bool TwiceMode(int card) { return SimFieldRead(Bytes(card, VID_PROC_CFG), &f.proc_2x) != 0; }

// A line is the horizontal total plus 5 character clocks of 8 pixels; in
// 2X mode every unit of the total counts two (sim/README.md).
int LineCharacters(int card)
{
    return SimFieldRead(Core(card)->cr, &crtc.htotal) * (TwiceMode(card) ? 2 : 1) + 5;
}
int FrameLines(int card) { return SimFieldRead(Core(card)->cr, &crtc.vtotal) + 2; }
double Refresh(int card) { return PixelClock(card) / (8.0 * LineCharacters(card) * FrameLines(card)); }

SimDpms Dpms(int card)
{
    const uint8_t* dac = Bytes(card, DAC_MODE);
    bool hsync_off = SimFieldRead(dac, &f.hsync_off) != 0, vsync_off = SimFieldRead(dac, &f.vsync_off) != 0;
    if (hsync_off && vsync_off) return SIM_DPMS_OFF;
    if (hsync_off) return SIM_DPMS_STANDBY;
    return vsync_off ? SIM_DPMS_SUSPEND : SIM_DPMS_ON;
}

// --- the register window: BAR0's first 256 bytes are the I/O registers ---

int WindowRead(int card, int bar, uint32_t offset, uint8_t* value)
{
    const BansheeRegister* r = bar == 0 ? FindRegister(offset & ~3u) : NULL;
    if (!r) return 0;
    *value = *Bytes(card, (Offset)offset);
    return 1;
}

int WindowWrite(int card, int bar, uint32_t offset, uint8_t value)
{
    const BansheeRegister* r = bar == 0 ? FindRegister(offset & ~3u) : NULL;
    if (!r) return 0;
    *Bytes(card, (Offset)offset) = value;
    return 1;
}

int ReadInternal32(int card, uint32_t offset, uint32_t* value)
{
    const BansheeRegister* r = FindRegister(offset);
    if (r) *value = Load(card, r->offset);
    return r != NULL;
}

int WriteInternal32(int card, uint32_t offset, uint32_t value)
{
    const BansheeRegister* r = FindRegister(offset);
    if (r) Store(card, r->offset, value);
    return r != NULL;
}

// --- reset and the display driver's mode set ---

// tdfxfb's search, in its order: K from 3 down, the divider from 63 down,
// the two multipliers next to the exact one; of equally close settings the
// first stays, so the finest steps win.
void SetPll(int card, Offset offset, double hz)
{
    int best_multiplier = 0, best_divider = 0, best_k = 0;
    double best_error = hz;
    for (int k = 3; k >= 0; k--) {
        for (int divider = 63; divider >= 0; divider--) {
            int estimate = (int)(hz * (divider + 2) * (1 << k) / fref_hz) - 2;
            for (int multiplier = estimate < 0 ? 0 : estimate; multiplier <= estimate + 1 && multiplier <= 255;
                 multiplier++) {
                double error = fabs(fref_hz * (multiplier + 2) / ((divider + 2) * (double)(1 << k)) - hz);
                if (error >= best_error) continue;
                best_error = error;
                best_multiplier = multiplier, best_divider = divider, best_k = k;
            }
        }
    }
    uint8_t* b = Bytes(card, offset);
    SimFieldWrite(b, &f.pll_n, best_multiplier);
    SimFieldWrite(b, &f.pll_m, best_divider);
    SimFieldWrite(b, &f.pll_k, best_k);
}

int MemoryCode(int card)
{
    for (int code = 0; code < 3; code++)
        if ((uint32_t)memory_mb_by_code[code] == sim->config.cards[card].memory_mb) return code;
    return 3;
}

void Reset(int card)
{
    VgaReset(card);
    uint8_t* dram = Bytes(card, DRAM_INIT0);
    SimFieldWrite(dram, &f.memory_code, MemoryCode(card));
    SimFieldWrite(dram, &f.eight_chips, sim->config.cards[card].memory_mb >= 16);
    Store(card, PLL_CTRL1, core_clock_reset);
    Store(card, PLL_CTRL2, core_clock_reset);
    SetPll(card, PLL_CTRL0, vga_clock_hz[0]);
}

void ProgramMode(int card, const SimTiming* t, int bits)
{
    SimVga* v = Core(card);
    bool twice = t->width >= twice_min_width;
    SimCrtcTiming c = VgaCrtcValues(t, twice ? 16 : 8);
    v->cr[0x1A] = 0;
    v->cr[0x1B] = 0;
    VgaWriteTiming(card, &c, &crtc);
    uint8_t* proc = Bytes(card, VID_PROC_CFG);
    SimFieldWrite(proc, &f.proc_enable, 1);
    SimFieldWrite(proc, &f.pixel_format, bits == 8 ? 0 : bits == 32 ? 3 : 1);
    SimFieldWrite(proc, &f.proc_2x, twice);
    SimFieldWrite(Bytes(card, DAC_MODE), &f.dac_2x, twice);
    SimFieldWrite(Bytes(card, VGA_INIT0), &f.extended_shift_out, 1);
    Store(card, VID_DESKTOP_STRIDE, t->width * ((bits + 7) / 8));
    SimFieldWrite(&v->misc, &sim_misc_clock_select, 3);
    SimFieldWrite(&v->misc, &sim_misc_hsync_negative, (t->flags & SIM_TIMING_HSYNC_NEGATIVE) != 0);
    SimFieldWrite(&v->misc, &sim_misc_vsync_negative, (t->flags & SIM_TIMING_VSYNC_NEGATIVE) != 0);
    SetPll(card, PLL_CTRL0, t->pixel_hz);
}

void PrintRaw(FILE* out, int card)
{
    for (const BansheeRegister& r : registers) fprintf(out, "%s=%08X\n", r.name, Load(card, r.offset));
}

}  // namespace

const SimFamilyOps sim_banshee_ops = {
    .reset = Reset,
    .read_sr = [](int card, uint8_t index) { return sim->cards[card].vga.sr[index]; },
    .write_sr = [](int card, uint8_t index, uint8_t value) { sim->cards[card].vga.sr[index] = value; },
    .read_cr = VgaGenericReadCr,
    .write_cr = VgaGenericWriteCr,
    .window_read = WindowRead,
    .window_write = WindowWrite,
    .pixel_clock_hz = PixelClock,
    .memory_clock_hz = MemoryClock,
    .htotal = LineCharacters,
    .vtotal = FrameLines,
    .refresh_hz = Refresh,
    .dpms = Dpms,
    .program_mode = ProgramMode,
    .read_port = NULL,
    .write_port = NULL,
    .print_raw = PrintRaw,
    .read_internal32 = ReadInternal32,
    .write_internal32 = WriteInternal32,
};
