// The Tseng Labs ET6000: its PCI I/O range with the CLKDAC (the clock
// synthesizer's index and data ports and its PLL registers) and the memory
// configuration, the extended CRT registers (clock select bit 2, timing
// overflow, DPMS), the video BIOS's memory answer, and the display
// driver's mode set. Written from the X.org tseng driver (tseng_mode.c,
// tseng_driver.c); sim/README.md lists where the program's register
// description differs and which one the model follows.
#include "fields.h"
#include "machine_state.h"
#include "modes.h"

namespace {

const double fref_hz = 14318180.0;
enum { IO_BAR = 1 };

// Offsets in the PCI I/O range (base address register 1).
enum : uint8_t {
    IO_MEMORY_DOUBLED = 0x45,  // bit 2: banks of 512 KB instead of 256 KB
    IO_MEMORY_BANKS = 0x47,    // bits 2..0: banks - 1
    IO_CLKDAC_INDEX = 0x67,
    IO_CLKDAC_DATA = 0x69,
    IO_RGB_565 = 0x58,         // bit 1: 5-6-5, else 5-5-5
};
// CLKDAC registers: eight video clocks, and the memory clock at 0x0A.
enum { CLOCKS = 16, MCLK_INDEX = 0x0A, PIXEL_CLOCK = 2 };
enum { MEMORY_TYPE_MDRAM = 3 };  // input status 0 bits 1..0

// The model's place for each: offsets in the card's family file.
enum : uint16_t { SLOT_IO = 0x000, SLOT_PLL = 0x100, SLOT_PHASE = 0x100 + 2 * CLOCKS };

constexpr SimField Bits(uint8_t reg, uint8_t low, uint8_t high)
{
    return {.piece_count = 1, .pieces = {{.reg = reg, .low_bit = low, .high_bit = high}}};
}
constexpr SimField Bit(uint8_t reg, uint8_t bit) { return Bits(reg, bit, bit); }

struct Et6000Fields {
    SimField pll_m, pll_n, pll_r;  // a PLL's two bytes: M 6..0; N 4..0, R 6..5
    SimField clock_select_2;       // CR34 1 (CS2); MISC 3..2 are CS1..CS0
    SimField hsync_off, vsync_off; // CR34 0, 5
    SimField interlaced;           // CR35 7
    SimField offset;               // CR13 7..0, CR3F 7 and 6: bytes per line / 8
    SimField bytes_per_pixel;      // AR16 5..4: bytes per pixel clock - 1
    SimField memory_banks, memory_doubled, rgb_565;  // in the I/O range
};
constexpr Et6000Fields fields = {
    .pll_m = Bits(0, 0, 6),
    .pll_n = Bits(1, 0, 4),
    .pll_r = Bits(1, 5, 6),
    .clock_select_2 = Bit(0x34, 1),
    .hsync_off = Bit(0x34, 0),
    .vsync_off = Bit(0x34, 5),
    .interlaced = Bit(0x35, 7),
    .offset = {.piece_count = 3,
               .pieces = {{.reg = 0x13, .low_bit = 0, .high_bit = 7}, {.reg = 0x3F, .low_bit = 7, .high_bit = 7},
                          {.reg = 0x3F, .low_bit = 6, .high_bit = 6}}},
    .bytes_per_pixel = Bits(0x16, 4, 5),
    .memory_banks = Bits(IO_MEMORY_BANKS, 0, 2),
    .memory_doubled = Bit(IO_MEMORY_DOUBLED, 2),
    .rgb_565 = Bit(IO_RGB_565, 1),
};

// Bit 8 of the horizontal total, display end, blanking start and retrace
// start in CR3F bits 0, 1, 2 and 4; bit 10 of the vertical blanking start,
// total, display end, retrace start and line compare in CR35 bits 0-4.
const SimCrtcFields crtc = {
    .htotal = SimFieldWithBit(sim_vga_crtc.htotal, 0x3F, 0),
    .hdisplay_end = SimFieldWithBit(sim_vga_crtc.hdisplay_end, 0x3F, 1),
    .hblank_start = SimFieldWithBit(sim_vga_crtc.hblank_start, 0x3F, 2),
    .hblank_end = sim_vga_crtc.hblank_end,
    .hsync_start = SimFieldWithBit(sim_vga_crtc.hsync_start, 0x3F, 4),
    .hsync_end = sim_vga_crtc.hsync_end,
    .vtotal = SimFieldWithBit(sim_vga_crtc.vtotal, 0x35, 1),
    .vdisplay_end = SimFieldWithBit(sim_vga_crtc.vdisplay_end, 0x35, 2),
    .vblank_start = SimFieldWithBit(sim_vga_crtc.vblank_start, 0x35, 0),
    .vblank_end = sim_vga_crtc.vblank_end,
    .vsync_start = SimFieldWithBit(sim_vga_crtc.vsync_start, 0x35, 3),
    .vsync_end = sim_vga_crtc.vsync_end,
    .line_compare = SimFieldWithBit(sim_vga_crtc.line_compare, 0x35, 4),
};

// X.org tseng's search for the pixel clock: M 1..127, N 1..31, R 1..3 (R 0
// is allowed but less stable), the VCO from 100 MHz to twice the RAMDAC's
// 135 MHz.
const SimPllLimits pixel_limits = {.fref_hz = fref_hz, .a = 2, .b = 2, .m_min = 1, .m_max = 127, .n_min = 1,
                                   .n_max = 31, .r_min = 1, .r_max = 3, .vco_min_hz = 100e6, .vco_max_hz = 270001e3};
// Start-up clocks, distinct so that each clock number reads differently.
const double reset_clock_hz[8] = {25175000, 28322000, 32514000, 36000000, 40000000, 44900000, 50350000, 65000000};
// Memory clock 91.9 MHz: M 75, N 4, R 1 (Tseng's 92 MHz; N at most 4, R 1).
const uint8_t mclk_reset[2] = {75, 4 | 1 << 5};

SimVga* Core(int card) { return &sim->cards[card].vga; }
uint8_t* Family(int card) { return sim->cards[card].family; }
uint8_t* Io(int card) { return Family(card) + SLOT_IO; }
uint8_t* Pll(int card, int index) { return Family(card) + SLOT_PLL + 2 * (index % CLOCKS); }

double PllHz(int card, int index)
{
    const uint8_t* p = Pll(card, index);
    return fref_hz * (SimFieldRead(p, &fields.pll_m) + 2) /
           ((double)(SimFieldRead(p, &fields.pll_n) + 2) * (1 << SimFieldRead(p, &fields.pll_r)));
}

void SetPll(int card, int index, double hz)
{
    SimPllSetting pll;
    if (!SimPllBest(&pixel_limits, hz, &pll)) return;
    uint8_t* p = Pll(card, index);
    SimFieldWrite(p, &fields.pll_m, pll.m);
    SimFieldWrite(p, &fields.pll_n, pll.n);
    SimFieldWrite(p, &fields.pll_r, pll.r);
}

// The clock number: CS2 (CR34 bit 1) over CS1..CS0 (MISC bits 3..2).
int ClockNumber(int card)
{
    const SimVga* v = Core(card);
    return SimFieldRead(&v->misc, &sim_misc_clock_select) | SimFieldRead(v->cr, &fields.clock_select_2) << 2;
}

double PixelClock(int card) { return PllHz(card, ClockNumber(card)); }
double MemoryClock(int card) { return PllHz(card, MCLK_INDEX); }
int LineCharacters(int card) { return SimFieldRead(Core(card)->cr, &crtc.htotal) + 5; }
int FieldLines(int card) { return SimFieldRead(Core(card)->cr, &crtc.vtotal) + 2; }

// Characters of 8 pixels at every depth (the ET6000's RAMDAC is inside: a
// pixel clock per pixel).
double Refresh(int card)
{
    double field_hz = PixelClock(card) / (8.0 * LineCharacters(card) * FieldLines(card));
    return SimFieldRead(Core(card)->cr, &fields.interlaced) ? field_hz / 2 : field_hz;
}

SimDpms Dpms(int card)
{
    const uint8_t* cr = Core(card)->cr;
    bool hsync_off = SimFieldRead(cr, &fields.hsync_off) != 0;
    bool vsync_off = SimFieldRead(cr, &fields.vsync_off) != 0;
    if (hsync_off && vsync_off) return SIM_DPMS_OFF;
    if (hsync_off) return SIM_DPMS_STANDBY;
    if (vsync_off) return SIM_DPMS_SUSPEND;
    return SIM_DPMS_ON;
}

// CR21: the high byte of the I/O range, where the CLKDAC ports lie.
uint8_t ReadCr(int card, uint8_t index)
{
    if (index == 0x21) return (uint8_t)(PciIoBarBase(card, IO_BAR) >> 8);
    return VgaGenericReadCr(card, index);
}
void WriteCr(int card, uint8_t index, uint8_t value)
{
    if (index != 0x21) VgaGenericWriteCr(card, index, value);
}
uint8_t ReadSr(int card, uint8_t index) { return Core(card)->sr[index]; }
void WriteSr(int card, uint8_t index, uint8_t value) { Core(card)->sr[index] = value; }

// --- the I/O range ---

// After an index write the data port gives M, then N and R, then M again.
uint8_t* DataByte(int card)
{
    uint8_t* phase = Family(card) + SLOT_PHASE;
    uint8_t* byte = Pll(card, Io(card)[IO_CLKDAC_INDEX]) + *phase;
    *phase ^= 1;
    return byte;
}

int IoOffset(int card, uint16_t port)
{
    uint32_t base = PciIoBarBase(card, IO_BAR);
    return base && port >= base && port - base < SimCardChip(card)->bars[IO_BAR].size ? (int)(port - base) : -1;
}

int ReadPort(int card, uint16_t port, uint8_t* value)
{
    if (port == 0x3C2) {
        // Input status 0: the monitor sense line high, the memory type below.
        *value = 0x10 | MEMORY_TYPE_MDRAM;
        return 1;
    }
    int offset = IoOffset(card, port);
    if (offset < 0) return 0;
    *value = offset == IO_CLKDAC_DATA ? *DataByte(card) : Io(card)[offset];
    return 1;
}

int WritePort(int card, uint16_t port, uint8_t value)
{
    int offset = IoOffset(card, port);
    if (offset < 0) return 0;
    if (offset == IO_CLKDAC_DATA) {
        *DataByte(card) = value;
        return 1;
    }
    Io(card)[offset] = value;
    if (offset == IO_CLKDAC_INDEX) Family(card)[SLOT_PHASE] = 0;
    return 1;
}

uint32_t MemoryKb(int card)
{
    const SimCardConfig* c = &sim->config.cards[card];
    return c->memory_mb * 1024 + c->memory_extra_kb;
}

// MDRAM in banks of 256 KB (512 KB above 2 MB), rounded up: a card of
// 2.25 MB reports 2.5 MB here, as X.org tseng notes.
void SetMemoryConfiguration(int card)
{
    uint32_t kb = MemoryKb(card);
    bool doubled = kb > 2048;
    uint32_t bank_kb = doubled ? 512 : 256;
    uint32_t banks = (kb + bank_kb - 1) / bank_kb;
    SimFieldWrite(Io(card), &fields.memory_doubled, doubled);
    SimFieldWrite(Io(card), &fields.memory_banks, banks ? banks - 1 : 0);
}

void Reset(int card)
{
    VgaReset(card);
    for (int i = 0; i < 8; i++) SetPll(card, i, reset_clock_hz[i]);
    Pll(card, MCLK_INDEX)[0] = mclk_reset[0];
    Pll(card, MCLK_INDEX)[1] = mclk_reset[1];
    SetMemoryConfiguration(card);
}

// --- the display driver's mode set (X.org tseng's TsengModeInit) ---

void ProgramMode(int card, const SimTiming* t, int bits)
{
    SimVga* v = Core(card);
    SimCrtcTiming c = VgaCrtcValues(t);
    int bytes = (bits + 7) / 8;
    // The overflow registers are written whole.
    v->cr[0x35] = 0;
    v->cr[0x3F] = 0;
    VgaWriteTiming(card, &c, &crtc);
    SimFieldWrite(v->cr, &fields.offset, t->width * bytes / 8);
    v->ar[0x16] = 0x80;
    SimFieldWrite(v->ar, &fields.bytes_per_pixel, bytes - 1);
    SimFieldWrite(Io(card), &fields.rgb_565, bits == 16);
    SimFieldWrite(v->sr, &sim_sr01_eight_dots, 1);
    // Clock 2: CS1..CS0 = 2, CS2 clear.
    SimFieldWrite(&v->misc, &sim_misc_clock_select, PIXEL_CLOCK);
    SimFieldWrite(v->cr, &fields.clock_select_2, 0);
    SimFieldWrite(&v->misc, &sim_misc_hsync_negative, (t->flags & SIM_TIMING_HSYNC_NEGATIVE) != 0);
    SimFieldWrite(&v->misc, &sim_misc_vsync_negative, (t->flags & SIM_TIMING_VSYNC_NEGATIVE) != 0);
    SetPll(card, PIXEL_CLOCK, t->pixel_hz);
}

// The CLKDAC registers, M byte first as the data port gives them.
void PrintRaw(FILE* out, int card)
{
    fprintf(out, "ET6000_CLKDAC_INDEX=%02X\n", Io(card)[IO_CLKDAC_INDEX]);
    for (int i = 0; i < 8; i++) fprintf(out, "ET6000_CLKDAC_PLL%d=%02X%02X\n", i, Pll(card, i)[0], Pll(card, i)[1]);
    fprintf(out, "ET6000_CLKDAC_MCLK=%02X%02X\n", Pll(card, MCLK_INDEX)[0], Pll(card, MCLK_INDEX)[1]);
}

}  // namespace

// The BIOS tests the memory in blocks of 64 KB: BX = megabytes << 4 |
// the remaining 64 KB blocks.
uint16_t Et6000BiosMemory(int card)
{
    uint32_t kb = MemoryKb(card);
    return (uint16_t)((kb / 1024) << 4 | ((kb % 1024) / 64 & 0x0F));
}

const SimFamilyOps sim_et6000_ops = {
    .reset = Reset,
    .read_sr = ReadSr,
    .write_sr = WriteSr,
    .read_cr = ReadCr,
    .write_cr = WriteCr,
    .window_read = NULL,
    .window_write = NULL,
    .pixel_clock_hz = PixelClock,
    .memory_clock_hz = MemoryClock,
    .htotal = LineCharacters,
    .vtotal = FieldLines,
    .refresh_hz = Refresh,
    .dpms = Dpms,
    .program_mode = ProgramMode,
    .read_port = ReadPort,
    .write_port = WritePort,
    .print_raw = PrintRaw,
    .read_internal32 = NULL,
    .write_internal32 = NULL,
};
