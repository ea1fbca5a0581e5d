// The S3 chips (Trio, ViRGE, Trio3D, Savage3D): extended sequencer behind
// the SR08 key, the DCLK and MCLK synthesizers, the extended CRT timing
// bits, the memory straps and the DPMS sync control, and the display
// driver's mode set. The model reads line length, clocks and refresh from
// its registers through the field tables of fields.cpp; sim/README.md lists
// where public documents of the chips and the program's register
// description differ, and which one the model follows.
#include "fields.h"
#include "machine_state.h"
#include "modes.h"

namespace {

const double fref_hz = 14318180.0;
const double vga_clock_hz[2] = {25175000.0, 28322000.0};  // MISC clock select 0 and 1
enum { SR08_UNLOCKED = 0x06 };  // SR09 and above answer only with this key

SimVga* Core(int card) { return &sim->cards[card].vga; }
const SimS3Chip* Chip(int card) { return SimCardChip(card)->s3; }
bool IsSavage(int card) { return Chip(card)->dclk == S3_DCLK_SAVAGE; }
const SimCrtcFields* Crtc(int card) { return IsSavage(card) ? &sim_savage_crtc : &sim_s3_crtc; }
bool Unlocked(int card) { return SimFieldRead(Core(card)->sr, &sim_s3.unlock_key) == SR08_UNLOCKED; }

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

// Where M, N and R of the DCLK synthesizer live on the chip.
struct DclkFields {
    const SimField *m, *n, *r;
};
DclkFields DclkLayout(int card)
{
    switch (Chip(card)->dclk) {
    case S3_DCLK_SAVAGE: return {&sim_s3.savage_dclk_m, &sim_s3.savage_dclk_n, &sim_s3.savage_dclk_r};
    case S3_DCLK_R2: return {&sim_s3.dclk_m, &sim_s3.dclk_n, &sim_s3.dclk_r2};
    default: return {&sim_s3.dclk_m, &sim_s3.dclk_n, &sim_s3.dclk_r3};
    }
}

void EncodeDclk(int card, const SimPllSetting* pll)
{
    uint8_t* sr = Core(card)->sr;
    DclkFields f = DclkLayout(card);
    SimFieldWrite(sr, f.m, pll->m);
    SimFieldWrite(sr, f.n, pll->n);
    SimFieldWrite(sr, f.r, pll->r);
}

double SynthesizerHz(const uint8_t* sr, const SimField* m, const SimField* n, const SimField* r)
{
    return fref_hz * (SimFieldRead(sr, m) + 2) / ((double)(SimFieldRead(sr, n) + 2) * (1 << SimFieldRead(sr, r)));
}

// The dot clock: MISC selects one of the two fixed VGA clocks or the DCLK
// synthesizer.
double DotClock(int card)
{
    const SimVga* v = Core(card);
    int select = SimFieldRead(&v->misc, &sim_misc_clock_select);
    if (select < 2) return vga_clock_hz[select];
    DclkFields f = DclkLayout(card);
    return SynthesizerHz(v->sr, f.m, f.n, f.r);
}

double MemoryClock(int card) { return SynthesizerHz(Core(card)->sr, &sim_s3.mclk_m, &sim_s3.mclk_n, &sim_s3.mclk_r); }

// Bits per pixel from the colour mode in CR67 7..4: 0 and 1 are 8 bits (1
// with two pixels a clock), 2 and 3 15 bits, 4 and 5 16 bits, 7 24 bits,
// 13 32 bits (24 on the ViRGE/VX).
int Depth(int card)
{
    switch (SimFieldRead(Core(card)->cr, &sim_s3.color_mode)) {
    case 0x2: case 0x3: return 15;
    case 0x4: case 0x5: return 16;
    case 0x7: return 24;
    case 0xD: return 32;
    default: return 8;
    }
}
bool HighColour(int card) { return Depth(card) == 15 || Depth(card) == 16; }

// The CRT controller's line in character clocks: the horizontal total
// register plus 5. With CR43 bit 7 every unit of the register counts two
// character clocks (the 5 of the retrace overhead stays single).
int LineCharacters(int card)
{
    const uint8_t* cr = Core(card)->cr;
    int total = SimFieldRead(cr, &Crtc(card)->htotal);
    int unit = SimFieldRead(cr, &sim_s3.horizontal_double) ? 2 : 1;
    return unit * total + 5;
}

// Lines of a field: the vertical total register plus 2.
int FieldLines(int card) { return SimFieldRead(Core(card)->cr, &Crtc(card)->vtotal) + 2; }

// A character clock spans 8 or 9 pixels (SR01 bit 0); at 15 and 16 bits
// per pixel, two bytes each, half as many.
double PixelsPerCharacter(int card)
{
    int dots = SimFieldRead(Core(card)->sr, &sim_sr01_eight_dots) ? 8 : 9;
    return HighColour(card) ? dots / 2.0 : dots;
}

// SR18 bit 7 above 8 bits per pixel: a pixel takes two periods of the dot
// clock.
int ClocksPerPixel(int card)
{
    return Depth(card) > 8 && SimFieldRead(Core(card)->sr, &sim_s3.pixel_doubling) ? 2 : 1;
}

double Refresh(int card)
{
    double pixel_hz = DotClock(card) / ClocksPerPixel(card);
    double line_hz = pixel_hz / (LineCharacters(card) * PixelsPerCharacter(card));
    double field_hz = line_hz / FieldLines(card);
    // Interlaced: a frame is two fields.
    return SimFieldRead(Core(card)->cr, &sim_s3.interlaced) ? field_hz / 2 : field_hz;
}

SimDpms Dpms(int card)
{
    const uint8_t* sr = Core(card)->sr;
    bool hsync_off = SimFieldRead(sr, &sim_s3.dpms_hsync_off) != 0;
    bool vsync_off = SimFieldRead(sr, &sim_s3.dpms_vsync_off) != 0;
    if (hsync_off && vsync_off) return SIM_DPMS_OFF;
    if (hsync_off) return SIM_DPMS_STANDBY;
    if (vsync_off) return SIM_DPMS_SUSPEND;
    return SIM_DPMS_ON;
}

// CR36 bits 7..5 as the straps set them for the card's memory.
int MemoryStraps(int card)
{
    uint32_t mb = sim->config.cards[card].memory_mb;
    switch (Chip(card)->memory_code) {
    case S3_MEM_SAVAGE: return mb >= 8 ? 0 : mb >= 4 ? 2 : 6;
    case S3_MEM_VIRGE_VX: return mb >= 8 ? 3 : mb >= 6 ? 2 : mb >= 4 ? 1 : 0;
    default:
        // 8 MB and 3 MB have codes on the chips (3 and 2) that the program's
        // table does not know; 3 MB then reads as 4.
        return mb >= 8 ? 3 : mb >= 4 ? 0 : mb >= 3 ? 2 : mb >= 2 ? 4 : 6;
    }
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
    v->cr[0x36] = 0x0E;
    SimFieldWrite(v->cr, &sim_s3.memory_straps, MemoryStraps(card));
    SimFieldWrite(v->cr, &sim_s3.agp_card, IsSavage(card) && c->bus == 1);
    // MCLK about 60 MHz: M = 115, N = 12, R = 1.
    SimFieldWrite(v->sr, &sim_s3.mclk_m, 115);
    SimFieldWrite(v->sr, &sim_s3.mclk_n, 12);
    SimFieldWrite(v->sr, &sim_s3.mclk_r, 1);
    SimPllLimits limits = DclkLimits(card);
    SimPllSetting pll;
    if (SimPllBest(&limits, vga_clock_hz[0], &pll)) EncodeDclk(card, &pll);
}

// --- the display driver's mode set ---

// What a depth asks of the pixel path.
struct DepthSetting {
    int pixels_per_character;  // 4 at 15/16 bits
    int total_unit;            // character clocks per unit of the horizontal total (CR43 bit 7)
    int clocks_per_pixel;      // DCLK periods per pixel (SR18 bit 7)
    int color_mode;            // CR67 7..4
};

DepthSetting SettingFor(int card, int bits)
{
    bool high_colour = bits == 15 || bits == 16;
    // On the Trio32/64, Trio64V2, ViRGE, ViRGE/DX-GX and Trio3D a 15/16-bit
    // pixel takes two DCLK periods.
    int clocks = high_colour && Chip(card)->doubles_clock_16 ? 2 : 1;
    int color_mode = bits == 8 ? 0x0 : bits == 15 ? 0x3 : bits == 16 ? 0x5 : 0xD;
    return {.pixels_per_character = high_colour ? 4 : 8,
            .total_unit = high_colour ? 2 : 1,
            .clocks_per_pixel = clocks,
            .color_mode = color_mode};
}

// The CRT values of a VESA timing: horizontal ones in characters of 8
// pixels, the total in the depth's characters (rounded half up), vertical
// ones in lines of a field.
SimCrtcTiming CrtcValues(const SimTiming* t, const DepthSetting* d)
{
    bool interlaced = (t->flags & SIM_TIMING_INTERLACED) != 0;
    int div = interlaced ? 2 : 1;
    int characters = (t->htotal + d->pixels_per_character / 2) / d->pixels_per_character;
    int lines = t->vtotal / div, shown = t->height / div;
    SimCrtcTiming c;
    c.htotal = (characters - 5 + d->total_unit / 2) / d->total_unit;
    c.hdisplay_end = t->width / 8 - 1;
    c.hblank_start = t->width / 8;
    c.hblank_end = t->htotal / 8 - 1;
    c.hsync_start = t->hsync_start / 8;
    c.hsync_end = t->hsync_end / 8;
    c.vtotal = lines - 2;
    c.vdisplay_end = shown - 1;
    c.vblank_start = shown;
    c.vblank_end = lines - 1;
    c.vsync_start = t->vsync_start / div;
    c.vsync_end = t->vsync_end / div;
    return c;
}

void ProgramMode(int card, const SimTiming* t, int bits)
{
    SimVga* v = Core(card);
    DepthSetting d = SettingFor(card, bits);
    SimCrtcTiming c = CrtcValues(t, &d);
    // The extended overflow registers are written whole.
    v->cr[0x5D] = 0;
    v->cr[0x5E] = 0;
    VgaWriteTiming(card, &c, Crtc(card));
    SimFieldWrite(v->cr, &sim_s3.interlaced, (t->flags & SIM_TIMING_INTERLACED) != 0);
    SimFieldWrite(v->cr, &sim_s3.horizontal_double, d.total_unit == 2);
    SimFieldWrite(v->cr, &sim_s3.offset, t->width * ((bits + 7) / 8) / 8);
    SimFieldWrite(v->cr, &sim_s3.color_mode, d.color_mode);
    SimFieldWrite(v->sr, &sim_s3.pixel_doubling, d.clocks_per_pixel == 2);
    SimFieldWrite(v->sr, &sim_sr01_eight_dots, 1);
    SimFieldWrite(&v->misc, &sim_misc_clock_select, 3);
    SimFieldWrite(&v->misc, &sim_misc_hsync_negative, (t->flags & SIM_TIMING_HSYNC_NEGATIVE) != 0);
    SimFieldWrite(&v->misc, &sim_misc_vsync_negative, (t->flags & SIM_TIMING_VSYNC_NEGATIVE) != 0);

    SimPllLimits limits = DclkLimits(card);
    SimPllSetting pll;
    if (SimPllBest(&limits, (double)t->pixel_hz * d.clocks_per_pixel, &pll)) {
        // A Savage3D blanks the screen while its synthesizer is rewritten.
        uint8_t sr01 = v->sr[0x01];
        if (IsSavage(card)) SimFieldWrite(v->sr, &sim_sr01_screen_off, 1);
        EncodeDclk(card, &pll);
        v->sr[0x01] = sr01;
    }
}

// The synthesizer registers under the names of S3's data books: MCLK and
// DCLK value low (N and R) and high (M); the Savage3D's overflow bits in SR29.
struct RawRegister {
    uint8_t index;
    const char* name;
};
const RawRegister raw_registers[] = {
    {.index = 0x10, .name = "S3_SR10_MCLK_VALUE_LOW"},
    {.index = 0x11, .name = "S3_SR11_MCLK_VALUE_HIGH"},
    {.index = 0x12, .name = "S3_SR12_DCLK_VALUE_LOW"},
    {.index = 0x13, .name = "S3_SR13_DCLK_VALUE_HIGH"},
};
const RawRegister savage_overflow = {.index = 0x29, .name = "S3_SR29_DCLK_OVERFLOW"};

void PrintRaw(FILE* out, int card)
{
    const uint8_t* sr = Core(card)->sr;
    for (const RawRegister& r : raw_registers) fprintf(out, "%s=%02X\n", r.name, sr[r.index]);
    if (IsSavage(card)) fprintf(out, "%s=%02X\n", savage_overflow.name, sr[savage_overflow.index]);
}

}  // namespace

const SimFamilyOps sim_s3_ops = {
    .reset = Reset,
    .read_sr = ReadSr,
    .write_sr = WriteSr,
    .read_cr = VgaGenericReadCr,
    .write_cr = WriteCr,
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
