// The NVIDIA Riva 128/128ZX (NV3) and Riva TNT (NV4): the 32-bit internal
// registers of the register window (memory configuration, straps, the three
// clock synthesizers), the real-mode access port pair that reaches them from
// I/O space, the extended CRT registers behind their lock, the DPMS sync
// control, and the display driver's mode set. Written from the X.org nv
// driver, Linux rivafb (riva_hw.c) and envytools; sim/README.md lists where
// the program's register description differs and which one the model
// follows.
#include <string.h>

#include "fields.h"
#include "machine_state.h"
#include "modes.h"

namespace {

const double crystal_14318_hz = 14318180.0, crystal_13500_hz = 13500000.0;
const double vco_min_hz = 128e6;

// The chips' differences.
struct NvChip {
    bool lock_in_cr1f;          // TNT: CR1F; Riva 128: SR06
    uint8_t memory_mb[4];       // NV_PFB_BOOT_0 bits 1..0 (the program's table)
    int p_max;                  // post-divider exponent
    double vco_max_hz;
    // Reference divider range with the 14.31818 MHz crystal; one lower at 13.5 MHz.
    int m_min, m_max;
};
const NvChip nv3 = {
    .lock_in_cr1f = false, .memory_mb = {8, 2, 4, 8}, .p_max = 3, .vco_max_hz = 256e6, .m_min = 8, .m_max = 13};
const NvChip nv4 = {
    .lock_in_cr1f = true, .memory_mb = {2, 4, 8, 16}, .p_max = 4, .vco_max_hz = 350e6, .m_min = 8, .m_max = 14};

// Where the model keeps each 32-bit register: four bytes of the card's
// family file, low byte first.
enum Slot { SLOT_NVPLL, SLOT_MPLL, SLOT_VPLL, SLOT_STRAPS, SLOT_MEMORY, SLOT_RMA_ADDRESS, SLOT_RMA_LATCH };

struct NvRegister {
    uint32_t offset;  // in the register window (BAR0)
    Slot slot;
    bool writable;
    const char* name;
};
const NvRegister registers[] = {
    {.offset = 0x680500, .slot = SLOT_NVPLL, .writable = true, .name = "NV_PRAMDAC_NVPLL_COEFF"},
    {.offset = 0x680504, .slot = SLOT_MPLL, .writable = true, .name = "NV_PRAMDAC_MPLL_COEFF"},
    {.offset = 0x680508, .slot = SLOT_VPLL, .writable = true, .name = "NV_PRAMDAC_VPLL_COEFF"},
    {.offset = 0x101000, .slot = SLOT_STRAPS, .writable = false, .name = "NV_PEXTDEV_BOOT_0"},
    {.offset = 0x100000, .slot = SLOT_MEMORY, .writable = true, .name = "NV_PFB_BOOT_0"},
};

// Power-on synthesizer settings: NVCLK 90.2 MHz (N = 126, M = 10, P = 1),
// MCLK 100.2 MHz (N = 140, M = 10, P = 1) with the 14.31818 MHz crystal.
const uint32_t nvpll_reset = 0x00017E0A, mpll_reset = 0x00018C0A;

enum : uint8_t {
    LOCK_UNLOCK = 0x57,     // CR1F / SR06: any other value locks
    CR1F_READ_UNLOCKED = 3,
    SR06_READ_UNLOCKED = 1,
    FIRST_EXTENDED_CR = 0x19,
    RMA_SIGNATURE = 1, RMA_ADDRESS = 3, RMA_DATA = 5,  // CR38 bits 2..0
};
const uint32_t rma_signature = 0x2B16D065;
const uint16_t rma_port = 0x3D0;

SimVga* Core(int card) { return &sim->cards[card].vga; }
const NvChip* Chip(int card) { return SimCardChip(card)->device_id == 0x0020 ? &nv4 : &nv3; }
uint8_t* Bytes(int card, Slot slot) { return sim->cards[card].family + 4 * slot; }

uint32_t Load(int card, Slot slot)
{
    uint32_t v;
    memcpy(&v, Bytes(card, slot), 4);
    return v;
}
void Store(int card, Slot slot, uint32_t v) { memcpy(Bytes(card, slot), &v, 4); }

const NvRegister* FindRegister(uint32_t offset)
{
    for (const NvRegister& r : registers)
        if (r.offset == offset) return &r;
    return NULL;
}

double CrystalHz(int card)
{
    return SimFieldRead(Bytes(card, SLOT_STRAPS), &sim_nv.crystal_14318) ? crystal_14318_hz : crystal_13500_hz;
}

// f = fref x N / (M x 2^P); an M of 0 stops the synthesizer.
double SynthesizerHz(int card, Slot slot)
{
    const uint8_t* b = Bytes(card, slot);
    int m = SimFieldRead(b, &sim_nv.pll_m);
    if (m == 0) return 0;
    return CrystalHz(card) * SimFieldRead(b, &sim_nv.pll_n) / ((double)m * (1 << SimFieldRead(b, &sim_nv.pll_p)));
}
double PixelClock(int card) { return SynthesizerHz(card, SLOT_VPLL); }
double MemoryClock(int card) { return SynthesizerHz(card, SLOT_MPLL); }

// --- the extended registers' lock ---

bool Unlocked(int card)
{
    const SimVga* v = Core(card);
    return (Chip(card)->lock_in_cr1f ? v->cr[0x1F] : v->sr[0x06]) == LOCK_UNLOCK;
}
bool IsLockRegisterCr(int card, uint8_t index) { return Chip(card)->lock_in_cr1f && index == 0x1F; }
bool IsLockRegisterSr(int card, uint8_t index) { return !Chip(card)->lock_in_cr1f && index == 0x06; }

uint8_t ReadCr(int card, uint8_t index)
{
    if (IsLockRegisterCr(card, index)) return Unlocked(card) ? CR1F_READ_UNLOCKED : 0;
    if (index >= FIRST_EXTENDED_CR && !Unlocked(card)) return 0;
    return VgaGenericReadCr(card, index);
}

void WriteCr(int card, uint8_t index, uint8_t value)
{
    if (IsLockRegisterCr(card, index)) {
        Core(card)->cr[index] = value;
        return;
    }
    if (index >= FIRST_EXTENDED_CR && !Unlocked(card)) return;
    VgaGenericWriteCr(card, index, value);
}

uint8_t ReadSr(int card, uint8_t index)
{
    if (IsLockRegisterSr(card, index)) return Unlocked(card) ? SR06_READ_UNLOCKED : 0;
    return Core(card)->sr[index];
}
void WriteSr(int card, uint8_t index, uint8_t value) { Core(card)->sr[index] = value; }

// --- the register window: 32-bit registers, each byte a lane ---

int WindowRead(int card, int bar, uint32_t offset, uint8_t* value)
{
    const NvRegister* r = bar == 0 ? FindRegister(offset & ~3u) : NULL;
    if (!r) return 0;
    *value = Bytes(card, r->slot)[offset & 3];
    return 1;
}

int WindowWrite(int card, int bar, uint32_t offset, uint8_t value)
{
    const NvRegister* r = bar == 0 ? FindRegister(offset & ~3u) : NULL;
    if (!r) return 0;
    if (r->writable) Bytes(card, r->slot)[offset & 3] = value;
    return 1;
}

// --- real-mode access: CR38 bits 2..0 choose what the 32-bit port 0x3D0 shows ---

int ReadPort(int card, uint16_t port, uint8_t* value)
{
    if (port < rma_port || port > rma_port + 3) return 0;
    int lane = port - rma_port;
    switch (SimFieldRead(Core(card)->cr, &sim_nv.rma_phase)) {
    case RMA_SIGNATURE: *value = (uint8_t)(rma_signature >> (8 * lane)); break;
    case RMA_ADDRESS: *value = Bytes(card, SLOT_RMA_ADDRESS)[lane]; break;
    case RMA_DATA:
        if (!WindowRead(card, 0, Load(card, SLOT_RMA_ADDRESS) + lane, value)) *value = 0xFF;
        break;
    default: *value = 0xFF; break;
    }
    return 1;
}

// The port latches each byte; a 32-bit write reaches the address or the
// internal register when its last lane (0x3D3) arrives, so a dword comes
// in whole and narrower writes to the lower lanes only prepare it.
int WritePort(int card, uint16_t port, uint8_t value)
{
    if (port < rma_port || port > rma_port + 3) return 0;
    int lane = port - rma_port;
    Bytes(card, SLOT_RMA_LATCH)[lane] = value;
    if (lane != 3) return 1;
    uint32_t latch = Load(card, SLOT_RMA_LATCH);
    switch (SimFieldRead(Core(card)->cr, &sim_nv.rma_phase)) {
    case RMA_ADDRESS: Store(card, SLOT_RMA_ADDRESS, latch); break;
    case RMA_DATA: {
        uint32_t address = Load(card, SLOT_RMA_ADDRESS);
        for (int i = 0; i < 4; i++) WindowWrite(card, 0, address + i, (uint8_t)(latch >> (8 * i)));
        break;
    }
    default: break;
    }
    return 1;
}

// --- what the registers make of the picture ---

// A line is the horizontal total plus 5 character clocks of 8 pixels at
// every depth; a frame the vertical total plus 2 lines.
int LineCharacters(int card) { return SimFieldRead(Core(card)->cr, &sim_nv_crtc.htotal) + 5; }
int FrameLines(int card) { return SimFieldRead(Core(card)->cr, &sim_nv_crtc.vtotal) + 2; }

double Refresh(int card) { return PixelClock(card) / (8.0 * LineCharacters(card) * FrameLines(card)); }

SimDpms Dpms(int card)
{
    const uint8_t* cr = Core(card)->cr;
    bool hsync_off = SimFieldRead(cr, &sim_nv.hsync_off) != 0;
    bool vsync_off = SimFieldRead(cr, &sim_nv.vsync_off) != 0;
    if (hsync_off && vsync_off) return SIM_DPMS_OFF;
    if (hsync_off) return SIM_DPMS_STANDBY;
    if (vsync_off) return SIM_DPMS_SUSPEND;
    return SIM_DPMS_ON;
}

SimPllLimits VpllLimits(int card)
{
    const NvChip* c = Chip(card);
    int low = CrystalHz(card) == crystal_14318_hz ? 0 : 1;
    // SimPllLimits' numerator is NV's N, its denominator M and its exponent P.
    return {.fref_hz = CrystalHz(card), .a = 0, .b = 0, .m_min = 1, .m_max = 255, .n_min = c->m_min - low,
            .n_max = c->m_max - low, .r_min = 0, .r_max = c->p_max, .vco_min_hz = vco_min_hz,
            .vco_max_hz = c->vco_max_hz};
}

void SetVpll(int card, double hz)
{
    SimPllLimits limits = VpllLimits(card);
    SimPllSetting pll;
    if (!SimPllBest(&limits, hz, &pll)) return;
    uint8_t* b = Bytes(card, SLOT_VPLL);
    SimFieldWrite(b, &sim_nv.pll_m, pll.n);
    SimFieldWrite(b, &sim_nv.pll_n, pll.m);
    SimFieldWrite(b, &sim_nv.pll_p, pll.r);
}

// The straps' memory size code: the first code of the card's size, else of
// the largest size below it, else the smallest.
int MemoryCode(int card)
{
    uint32_t mb = sim->config.cards[card].memory_mb;
    const uint8_t* sizes = Chip(card)->memory_mb;
    int code = 0;
    for (int i = 1; i < 4; i++)
        if (sizes[i] < sizes[code]) code = i;
    for (int i = 0; i < 4; i++)
        if (sizes[i] <= mb && sizes[i] > sizes[code]) code = i;
    return code;
}

void Reset(int card)
{
    VgaReset(card);
    SimFieldWrite(Bytes(card, SLOT_STRAPS), &sim_nv.crystal_14318,
                  sim->config.cards[card].crystal_hz != (uint32_t)crystal_13500_hz);
    SimFieldWrite(Bytes(card, SLOT_MEMORY), &sim_nv.ram_amount, MemoryCode(card));
    Store(card, SLOT_NVPLL, nvpll_reset);
    Store(card, SLOT_MPLL, mpll_reset);
    SetVpll(card, 25175000.0);
}

// --- the display driver's mode set ---

void ProgramMode(int card, const SimTiming* t, int bits)
{
    SimVga* v = Core(card);
    SimCrtcTiming c = VgaCrtcValues(t);
    // The extended overflow registers are written whole.
    v->cr[0x25] = 0;
    v->cr[0x2D] = 0;
    VgaWriteTiming(card, &c, &sim_nv_crtc);
    SimFieldWrite(v->cr, &sim_nv.pixel_format, bits == 8 ? 1 : bits == 32 ? 3 : 2);
    SimFieldWrite(v->cr, &sim_nv.offset, t->width * ((bits + 7) / 8) / 8);
    SimFieldWrite(v->sr, &sim_sr01_eight_dots, 1);
    SimFieldWrite(&v->misc, &sim_misc_clock_select, 3);
    SimFieldWrite(&v->misc, &sim_misc_hsync_negative, (t->flags & SIM_TIMING_HSYNC_NEGATIVE) != 0);
    SimFieldWrite(&v->misc, &sim_misc_vsync_negative, (t->flags & SIM_TIMING_VSYNC_NEGATIVE) != 0);
    SetVpll(card, t->pixel_hz);
}

void PrintRaw(FILE* out, int card)
{
    for (const NvRegister& r : registers) fprintf(out, "%s=%08X\n", r.name, Load(card, r.slot));
}

int ReadInternal32(int card, uint32_t offset, uint32_t* value)
{
    const NvRegister* r = FindRegister(offset);
    if (r) *value = Load(card, r->slot);
    return r != NULL;
}

int WriteInternal32(int card, uint32_t offset, uint32_t value)
{
    const NvRegister* r = FindRegister(offset);
    if (r) Store(card, r->slot, value);
    return r != NULL;
}

}  // namespace

const SimFamilyOps sim_riva_ops = {
    .reset = Reset,
    .read_sr = ReadSr,
    .write_sr = WriteSr,
    .read_cr = ReadCr,
    .write_cr = WriteCr,
    .window_read = WindowRead,
    .window_write = WindowWrite,
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
    .read_internal32 = ReadInternal32,
    .write_internal32 = WriteInternal32,
};
