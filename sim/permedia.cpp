// The 3Dlabs Permedia 2 and 2v (and TI's Permedia 2): the control
// registers of BAR0 that the display uses (memory configuration, the video
// timing generator and its sync control), the built-in RAMDAC's indexed
// registers with the pixel and memory clock synthesizers, the PCI status
// word's 66 MHz bit, and the display driver's mode set. Written from Linux
// pm2fb; sim/README.md lists where the program's register description
// differs and which one the model follows.
#include <string.h>

#include "fields.h"
#include "machine_state.h"
#include "modes.h"

namespace {

const double fref_hz = 14318180.0;

enum Offset : uint32_t {
    MEM_CONFIG = 0x10C0,
    SCREEN_STRIDE = 0x3008,
    H_TOTAL = 0x3010,
    HG_END = 0x3018,
    HB_END = 0x3020,
    HS_START = 0x3028,
    HS_END = 0x3030,
    V_TOTAL = 0x3038,
    VB_END = 0x3040,
    VS_START = 0x3048,
    VS_END = 0x3050,
    VIDEO_CONTROL = 0x3058,
    // The RAMDAC: the Permedia 2 takes the index in the palette write
    // address; the 2v has an index pair of its own.
    RD_PALETTE_WRITE_ADDRESS = 0x4000,
    RD_INDEX_LOW = 0x4020,
    RD_INDEX_HIGH = 0x4028,
    RD_INDEXED_DATA_2V = 0x4030,
    RD_INDEXED_DATA = 0x4050,
};

struct PmRegister {
    Offset offset;
    uint8_t slot;  // where the model keeps it: four bytes at 4 x slot
    const char* name;
};
const PmRegister registers[] = {
    {.offset = MEM_CONFIG, .slot = 0, .name = "PM2R_MEM_CONFIG"},
    {.offset = SCREEN_STRIDE, .slot = 1, .name = "PM2R_SCREEN_STRIDE"},
    {.offset = H_TOTAL, .slot = 2, .name = "PM2R_H_TOTAL"},
    {.offset = HG_END, .slot = 3, .name = "PM2R_HG_END"},
    {.offset = HB_END, .slot = 4, .name = "PM2R_HB_END"},
    {.offset = HS_START, .slot = 5, .name = "PM2R_HS_START"},
    {.offset = HS_END, .slot = 6, .name = "PM2R_HS_END"},
    {.offset = V_TOTAL, .slot = 7, .name = "PM2R_V_TOTAL"},
    {.offset = VB_END, .slot = 8, .name = "PM2R_VB_END"},
    {.offset = VS_START, .slot = 9, .name = "PM2R_VS_START"},
    {.offset = VS_END, .slot = 10, .name = "PM2R_VS_END"},
    {.offset = VIDEO_CONTROL, .slot = 11, .name = "PM2R_VIDEO_CONTROL"},
};
// The RAMDAC's indexed registers (up to 0x3FF on the 2v) and its index.
enum { RAMDAC_BASE = 0x400, RAMDAC_SIZE = 0x400, RAMDAC_INDEX_SLOT = 0x800 };

// One synthesizer: f = fref x numerator / (denominator x 2^P).
struct PmSynthesizer {
    uint16_t numerator, denominator, post;  // RAMDAC indices
    uint8_t post_mask;
    uint8_t enable_bit;                     // in the post register; 0: always running
    const char* names[3];
};
struct PmChip {
    bool v;                          // the 2v's RAMDAC
    PmSynthesizer pixel, memory;
    SimPllLimits limits;             // pm2fb's search
};
// Permedia 2: M (feedback) 0x20/0x30, N (reference divider) 0x21/0x31, P in
// bits 2..0 of 0x22/0x32 with bit 3 running the synthesizer; M 2..255,
// N 2..14, P 0..4, VCO 150..300 MHz.
const PmChip pm2 = {
    .v = false,
    .pixel = {.numerator = 0x20, .denominator = 0x21, .post = 0x22, .post_mask = 7, .enable_bit = 0x08,
              .names = {"PM2I_RD_PIXEL_CLOCK_A1", "PM2I_RD_PIXEL_CLOCK_A2", "PM2I_RD_PIXEL_CLOCK_A3"}},
    .memory = {.numerator = 0x30, .denominator = 0x31, .post = 0x32, .post_mask = 7, .enable_bit = 0x08,
               .names = {"PM2I_RD_MEMORY_CLOCK_1", "PM2I_RD_MEMORY_CLOCK_2", "PM2I_RD_MEMORY_CLOCK_3"}},
    .limits = {.fref_hz = fref_hz, .a = 0, .b = 0, .m_min = 2, .m_max = 255, .n_min = 2, .n_max = 14, .r_min = 0,
               .r_max = 4, .vco_min_hz = 150e6, .vco_max_hz = 300e6},
};
// Permedia 2v: prescale (divider) 0x201/0x20E, feedback 0x202/0x20F,
// postscale 0x203/0x210. pm2fb asks it for half the clock as
// fref / 2^(P + 1) x feedback / prescale: the clock is fref x feedback /
// (prescale x 2^P), prescale 1..127, feedback above twice the prescale, P 0..1.
const PmChip pm2v = {
    .v = true,
    .pixel = {.numerator = 0x202, .denominator = 0x201, .post = 0x203, .post_mask = 0xFF, .enable_bit = 0,
              .names = {"PM2VI_RD_CLK0_FEEDBACK", "PM2VI_RD_CLK0_PRESCALE", "PM2VI_RD_CLK0_POSTSCALE"}},
    .memory = {.numerator = 0x20F, .denominator = 0x20E, .post = 0x210, .post_mask = 0xFF, .enable_bit = 0,
               .names = {"PM2VI_RD_MCLK_FEEDBACK", "PM2VI_RD_MCLK_PRESCALE", "PM2VI_RD_MCLK_POSTSCALE"}},
    .limits = {.fref_hz = fref_hz, .a = 0, .b = 0, .m_min = 3, .m_max = 255, .n_min = 1, .n_max = 127, .r_min = 0,
               .r_max = 1, .vco_min_hz = 2 * fref_hz, .vco_max_hz = 1e12},
};

enum : uint16_t {
    PM2_COLOR_MODE = 0x18,   // bit 7 true colour; 3..0 the format: 6 RGB565, 8 RGBA8888, 9 RGB888
    PM2V_PIXEL_SIZE = 0x003,  // 0 8 bits, 1 16, 2 32, 4 24
};
enum : uint8_t {
    COLOR_TRUECOLOR = 0x80, COLOR_RGB565 = 0x06, COLOR_RGBA8888 = 0x08,
    COLOR_RGB_GUI = 0x30,  // RGB colour mode, graphics active
};

// VIDEO_CONTROL: 0 video on, 4..3 horizontal sync and 6..5 vertical sync
// (0 forced low: the sync stops; 1 active high; 3 active low), 16 the
// 64-bit data path (timings in units of 64 bits).
struct PmFields {
    SimField video_enable, hsync, vsync, data64;
    SimField memory_banks;  // MEM_CONFIG 30..29: (banks + 1) x 2 MB
};
const PmFields f = {
    .video_enable = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 0, .high_bit = 0}}},
    .hsync = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 3, .high_bit = 4}}},
    .vsync = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 5, .high_bit = 6}}},
    .data64 = {.piece_count = 1, .pieces = {{.reg = 2, .low_bit = 0, .high_bit = 0}}},
    .memory_banks = {.piece_count = 1, .pieces = {{.reg = 3, .low_bit = 5, .high_bit = 6}}},
};
enum { SYNC_ACTIVE_HIGH = 1 };
const uint16_t status_66mhz = 0x0020;  // PCI status bit 5

const PmChip* Chip(int card) { return SimCardChip(card)->device_id == 0x0009 ? &pm2v : &pm2; }
uint8_t* Family(int card) { return sim->cards[card].family; }
uint8_t* Bytes(int card, const PmRegister* r) { return Family(card) + 4 * r->slot; }
uint8_t* Ramdac(int card) { return Family(card) + RAMDAC_BASE; }

const PmRegister* FindRegister(uint32_t offset)
{
    for (const PmRegister& r : registers)
        if (r.offset == offset) return &r;
    return NULL;
}
uint32_t Load(int card, Offset offset)
{
    uint32_t v;
    memcpy(&v, Bytes(card, FindRegister(offset)), 4);
    return v;
}
void Store(int card, Offset offset, uint32_t v) { memcpy(Bytes(card, FindRegister(offset)), &v, 4); }

uint16_t RamdacIndex(int card)
{
    uint16_t index;
    memcpy(&index, Family(card) + RAMDAC_INDEX_SLOT, 2);
    return index % RAMDAC_SIZE;
}
void SetRamdacIndex(int card, uint16_t index) { memcpy(Family(card) + RAMDAC_INDEX_SLOT, &index, 2); }

double SynthesizerHz(int card, const PmSynthesizer* s)
{
    const uint8_t* dac = Ramdac(card);
    int numerator = dac[s->numerator], denominator = dac[s->denominator];
    if (s->enable_bit && !(dac[s->post] & s->enable_bit)) return 0;
    if (denominator == 0) return 0;
    return fref_hz * numerator / (denominator * (double)(1 << (dac[s->post] & s->post_mask & 7)));
}
double PixelClock(int card) { return SynthesizerHz(card, &Chip(card)->pixel); }
double MemoryClock(int card) { return SynthesizerHz(card, &Chip(card)->memory); }

int Depth(int card)
{
    const uint8_t* dac = Ramdac(card);
    if (Chip(card)->v) return dac[PM2V_PIXEL_SIZE] == 1 ? 16 : dac[PM2V_PIXEL_SIZE] == 2 ? 32 : 8;
    if (!(dac[PM2_COLOR_MODE] & COLOR_TRUECOLOR)) return 8;
    return (dac[PM2_COLOR_MODE] & 0x0F) == COLOR_RGBA8888 ? 32 : 16;
}

// The timing generator counts in units of the video data path: 32 bits,
// or 64 with VIDEO_CONTROL bit 16.
int PixelsPerUnit(int card)
{
    int per_32_bits = 32 / Depth(card);
    return SimFieldRead(Bytes(card, FindRegister(VIDEO_CONTROL)), &f.data64) ? 2 * per_32_bits : per_32_bits;
}

// HTotal is in the generator's units, H_TOTAL + 1; a field V_TOTAL + 1 lines.
int LineUnits(int card) { return (int)Load(card, H_TOTAL) + 1; }
int FrameLines(int card) { return (int)Load(card, V_TOTAL) + 1; }
double Refresh(int card)
{
    return PixelClock(card) / ((double)PixelsPerUnit(card) * LineUnits(card) * FrameLines(card));
}

SimDpms Dpms(int card)
{
    const uint8_t* video = Bytes(card, FindRegister(VIDEO_CONTROL));
    bool hsync_off = SimFieldRead(video, &f.hsync) == 0, vsync_off = SimFieldRead(video, &f.vsync) == 0;
    if (hsync_off && vsync_off) return SIM_DPMS_OFF;
    if (hsync_off) return SIM_DPMS_STANDBY;
    return vsync_off ? SIM_DPMS_SUSPEND : SIM_DPMS_ON;
}

// --- the control registers in BAR0: byte lanes of 32-bit registers ---

bool IsDataRegister(int card, uint32_t offset)
{
    return offset == (Chip(card)->v ? RD_INDEXED_DATA_2V : RD_INDEXED_DATA);
}

int WindowRead(int card, int bar, uint32_t offset, uint8_t* value)
{
    if (bar != 0) return 0;
    uint32_t base = offset & ~3u;
    int lane = offset & 3;
    if (IsDataRegister(card, base)) {
        *value = lane ? 0 : Ramdac(card)[RamdacIndex(card)];
        return 1;
    }
    const PmRegister* r = FindRegister(base);
    if (!r) return 0;
    *value = Bytes(card, r)[lane];
    return 1;
}

// The RAMDAC's registers are 8 bits wide: only a register's low lane counts.
int WindowWrite(int card, int bar, uint32_t offset, uint8_t value)
{
    if (bar != 0) return 0;
    uint32_t base = offset & ~3u;
    int lane = offset & 3;
    const PmChip* chip = Chip(card);
    uint16_t index = RamdacIndex(card);
    if (IsDataRegister(card, base)) {
        if (!lane) Ramdac(card)[index] = value;
    } else if (base == (chip->v ? RD_INDEX_LOW : RD_PALETTE_WRITE_ADDRESS)) {
        if (!lane) SetRamdacIndex(card, (uint16_t)((index & 0xFF00) | value));
    } else if (chip->v && base == RD_INDEX_HIGH) {
        if (!lane) SetRamdacIndex(card, (uint16_t)((index & 0x00FF) | (value & 3) << 8));
    } else if (const PmRegister* r = FindRegister(base)) {
        Bytes(card, r)[lane] = value;
    } else {
        return 0;
    }
    return 1;
}

int ReadInternal32(int card, uint32_t offset, uint32_t* value)
{
    const PmRegister* r = FindRegister(offset);
    if (r) *value = Load(card, r->offset);
    return r != NULL;
}

int WriteInternal32(int card, uint32_t offset, uint32_t value)
{
    const PmRegister* r = FindRegister(offset);
    if (r) Store(card, r->offset, value);
    return r != NULL;
}

// --- reset and the display driver's mode set ---

void SetSynthesizer(int card, const PmSynthesizer* s, double hz)
{
    SimPllLimits limits = Chip(card)->limits;
    SimPllSetting pll;
    if (!SimPllBest(&limits, hz, &pll)) return;
    uint8_t* dac = Ramdac(card);
    dac[s->numerator] = (uint8_t)pll.m;
    dac[s->denominator] = (uint8_t)pll.n;
    dac[s->post] = (uint8_t)(s->enable_bit | pll.r);
}

void Reset(int card)
{
    VgaReset(card);
    const SimCardConfig* c = &sim->config.cards[card];
    int banks = (int)c->memory_mb / 2 - 1;
    SimFieldWrite(Bytes(card, FindRegister(MEM_CONFIG)), &f.memory_banks, banks < 0 ? 0 : banks > 3 ? 3 : banks);
    // AGP boards run their bus at 66 MHz.
    if (c->bus == 1) sim->cards[card].pci[0x06] |= status_66mhz;
    SetSynthesizer(card, &Chip(card)->pixel, 25175000.0);
    SetSynthesizer(card, &Chip(card)->memory, 100e6);
}

// pm2fb's to3264: a horizontal value in units of the data path (cut).
uint32_t Units(int pixels, int per_unit) { return (uint32_t)(pixels / per_unit); }

void ProgramMode(int card, const SimTiming* t, int bits)
{
    const PmChip* chip = Chip(card);
    uint8_t* dac = Ramdac(card);
    if (chip->v) dac[PM2V_PIXEL_SIZE] = bits == 8 ? 0 : bits == 32 ? 2 : 1;
    else
        dac[PM2_COLOR_MODE] = COLOR_RGB_GUI | (bits == 8 ? 0 : COLOR_TRUECOLOR | (bits == 32 ? COLOR_RGBA8888 : COLOR_RGB565));
    bool data64 = bits > 8 || chip->v;
    int per_unit = (32 / (bits == 15 ? 16 : bits)) * (data64 ? 2 : 1);
    uint32_t hs_start = Units(t->hsync_start - t->width, per_unit);
    uint32_t hs_end = hs_start + Units(t->hsync_end - t->hsync_start, per_unit);
    uint32_t hb_end = hs_end + Units(t->htotal - t->hsync_end, per_unit);
    Store(card, H_TOTAL, Units(t->width, per_unit) + hb_end - 1);
    Store(card, HS_START, hs_start);
    Store(card, HS_END, hs_end);
    Store(card, HG_END, hb_end);
    Store(card, HB_END, hb_end);
    int lower = t->vsync_start - t->height, sync = t->vsync_end - t->vsync_start;
    uint32_t vb_end = (uint32_t)(t->vtotal - t->height);
    Store(card, V_TOTAL, t->height + vb_end - 1);
    Store(card, VS_START, lower ? lower - 1 : 0);
    Store(card, VS_END, lower + sync - 1);
    Store(card, VB_END, vb_end);
    Store(card, SCREEN_STRIDE, Units(t->width, 64 / (bits == 15 ? 16 : bits)));
    uint8_t* video = Bytes(card, FindRegister(VIDEO_CONTROL));
    SimFieldWrite(video, &f.video_enable, 1);
    // Both syncs run active high; the RAMDAC inverts them where the timing wants.
    SimFieldWrite(video, &f.hsync, SYNC_ACTIVE_HIGH);
    SimFieldWrite(video, &f.vsync, SYNC_ACTIVE_HIGH);
    SimFieldWrite(video, &f.data64, data64);
    SetSynthesizer(card, &chip->pixel, t->pixel_hz);
}

void PrintRaw(FILE* out, int card)
{
    const PmChip* chip = Chip(card);
    const PmSynthesizer* synthesizers[2] = {&chip->pixel, &chip->memory};
    for (const PmSynthesizer* s : synthesizers) {
        const uint16_t index[3] = {s->numerator, s->denominator, s->post};
        for (int i = 0; i < 3; i++) fprintf(out, "%s=%02X\n", s->names[i], Ramdac(card)[index[i]]);
    }
    for (const PmRegister& r : registers) fprintf(out, "%s=%08X\n", r.name, Load(card, r.offset));
}

}  // namespace

void PermediaTimingRecord(const SimTiming* t, uint8_t* record)
{
    int htotal = t->htotal / 8, vtotal = t->vtotal;
    uint8_t r[SIM_PERMEDIA_RECORD_SIZE] = {
        (uint8_t)t->refresh,
        (uint8_t)t->refresh,
        (uint8_t)htotal,
        (uint8_t)(htotal >> 8),
        (uint8_t)((t->hsync_start - t->width) / 8),
        (uint8_t)((t->hsync_end - t->hsync_start) / 8),
        (uint8_t)((t->htotal - t->hsync_end) / 8),
        (uint8_t)!(t->flags & SIM_TIMING_HSYNC_NEGATIVE),
        (uint8_t)vtotal,
        (uint8_t)(vtotal >> 8),
        (uint8_t)(t->vsync_start - t->height),
        (uint8_t)(t->vsync_end - t->vsync_start),
        (uint8_t)(t->vtotal - t->vsync_end),
        (uint8_t)!(t->flags & SIM_TIMING_VSYNC_NEGATIVE),
    };
    memcpy(record, r, sizeof r);
}

const SimFamilyOps sim_permedia_ops = {
    .reset = Reset,
    .read_sr = [](int card, uint8_t index) { return sim->cards[card].vga.sr[index]; },
    .write_sr = [](int card, uint8_t index, uint8_t value) { sim->cards[card].vga.sr[index] = value; },
    .read_cr = VgaGenericReadCr,
    .write_cr = VgaGenericWriteCr,
    .window_read = WindowRead,
    .window_write = WindowWrite,
    .pixel_clock_hz = PixelClock,
    .memory_clock_hz = MemoryClock,
    .htotal = LineUnits,
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
