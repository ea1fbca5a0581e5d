// The NVIDIA Riva 128, 128ZX and TNT: VGA registers behind an extended
// lock, and 32-bit internal registers reached in the register window or,
// without one, through the real-mode access port pair.
#include "chips/riva.h"

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/state.h"
#include "chips/chip_io.h"
#include "chips/chips.h"
#include "chips/reg_field.h"
#include "chips/synth.h"
#include "hardware/driver_key.h"
#include "hardware/machine.h"
#include "hardware/register_access.h"

// The VGA sequencer ports lie in the PRMVIO block, everything else in PRMCIO.
static const ChipPortWindow riva_ports = {
    .windowed = true, .low_first = 0x3C2, .low_last = 0x3C5, .low_offset = 0xC0000, .offset = 0x601000};
static const RegisterWindowPlace riva_window = {.config_offset = 0x10, .mask = 0xFF000000u, .added = 0};

// Internal registers, as offsets into the register window.
enum : uint32_t {
    PFB_BOOT = 0x100000,       // memory configuration
    PEXTDEV_STRAPS = 0x101000,  // board straps
    PRAMDAC_MPLL = 0x680504,    // memory clock synthesizer
    PRAMDAC_VPLL = 0x680508,    // pixel clock synthesizer
};

enum : uint16_t { RMA_DATA_PORT = 0x3D0, VGA_INPUT_STATUS = 0x3DA };

enum : uint8_t {
    SR01_CLOCKING = 0x01,
    SR06_LOCK = 0x06,
    CR00_HTOTAL = 0x00,
    CR01_HDISPLAY = 0x01,
    CR06_VTOTAL = 0x06,
    CR07_OVERFLOW = 0x07,
    CR11_VSYNC_END = 0x11,
    CR1A_REPAINT = 0x1A,
    CR1F_LOCK = 0x1F,
    CR25_EXTRA_VERT = 0x25,
    CR2D_EXTRA_HORZ = 0x2D,
    CR38_RMA_MODE = 0x38,
    CR3D_SYNC_LOAD = 0x3D,
};

static const uint8_t unlock_key = 0x57;
static const uint8_t tnt_lock_key = 0x75;
static const uint8_t sr01_screen_off = 0x20;
static const uint8_t cr11_during_dpms = 0x01;
static const uint8_t cr3d_load_sync = 0x40;
static const uint8_t cr1a_hsync_off = 0x80;
static const uint8_t rma_mode_mask = 0x07;
static const uint8_t rma_address_phase = 3;
static const uint8_t rma_data_phase = 5;
static const uint32_t strap_crystal_14318 = 0x40;
static const uint32_t pfb_memory_size_mask = 0x3;

static const RegField horizontal_total = {{CR00_HTOTAL, 0, 7}, {CR2D_EXTRA_HORZ, 0, 0}};
static const RegField vertical_total = {
    {CR06_VTOTAL, 0, 7}, {CR07_OVERFLOW, 0, 0}, {CR07_OVERFLOW, 5, 5}, {CR25_EXTRA_VERT, 0, 0}};
static const RegField sync_disable = {{CR1A_REPAINT, 6, 7}};

// One synthesizer coefficient register: f = fref * N / (M * 2^P).
struct RivaPll {
    uint16_t n, m, p;
};
struct PllField {
    uint8_t shift;
    uint32_t mask;
};
static const PllField pll_m = {.shift = 0, .mask = 0xFF};
static const PllField pll_n = {.shift = 8, .mask = 0xFF};
static const PllField pll_p = {.shift = 16, .mask = 0x7};
static const uint32_t pll_coefficients = 0x7FFFF;  // bits above stay as they are

struct RivaPllLimits {
    uint16_t n_min, n_max, m_min, m_max, p_min, p_max;
    double vco_min_hz, vco_max_hz;
};
// Both synthesizers share them.
static const RivaPllLimits riva_pll_limits = {
    .n_min = 1, .n_max = 255, .m_min = 1, .m_max = 255, .p_min = 1, .p_max = 4, .vco_min_hz = 128e6, .vco_max_hz = 256e6};

static const double crystal_14318_hz = 14318180.0;
static const double crystal_13500_hz = 13500000.0;
static const int pll_search_steps = 20;
static const int mclk_tolerance_mhz = 4;

enum RivaLock { LOCK_SR06, LOCK_CR1F };

struct RivaChip {
    uint16_t device_id;
    RivaLock lock;
    uint8_t standby_sync;  // CR1A bits 7..6 for Standby
    uint8_t memory_mb[4];  // by PFB_BOOT bits 1..0
    uint32_t mclk_max_mhz;
    uint32_t agp_rate;
};
static const RivaChip riva_128 = {
    .device_id = 0x0018, .lock = LOCK_SR06, .standby_sync = 0x40, .memory_mb = {8, 2, 4, 8}, .mclk_max_mhz = 120,
    .agp_rate = 0};
static const RivaChip riva_tnt = {
    .device_id = 0x0020, .lock = LOCK_CR1F, .standby_sync = 0x80, .memory_mb = {2, 4, 8, 16}, .mclk_max_mhz = 133,
    .agp_rate = 2};
static const uint32_t mclk_min_mhz = 90;

struct RivaDpmsState {
    uint32_t command;
    uint8_t sync_bits;  // 0xFF: the chip's Standby bits
};
static const RivaDpmsState riva_dpms_states[] = {
    {.command = CMD_DPMS_ON, .sync_bits = 0x00},
    {.command = CMD_DPMS_STANDBY, .sync_bits = 0xFF},
    {.command = CMD_DPMS_SUSPEND, .sync_bits = 0x40},
    {.command = CMD_DPMS_OFF, .sync_bits = 0xC0},
};

// Detection records a 128ZX as 0x0018, so the id tells the two chips apart.
static const RivaChip* CurrentChip() { return CurrentAdapter()->device_id == riva_tnt.device_id ? &riva_tnt : &riva_128; }

static double fref_hz = crystal_13500_hz;
// SR06 as the last open found it: 0 = it was locked.
static uint8_t sr06_found = 1;

static void ResetRiva()
{
    fref_hz = crystal_13500_hz;
    sr06_found = 1;
}
VISTREL_MODULE_RESET(ResetRiva);

static uint8_t ReadSeq(uint8_t index) { return ChipReadIndexed(&riva_ports, VGA_SEQ_INDEX, index); }
static void WriteSeq(uint8_t index, uint8_t value) { ChipWriteIndexed(&riva_ports, VGA_SEQ_INDEX, index, value); }
static uint8_t ReadCrtc(uint8_t index) { return ChipReadIndexed(&riva_ports, VGA_CRTC_INDEX, index); }
static void WriteCrtc(uint8_t index, uint8_t value) { ChipWriteIndexed(&riva_ports, VGA_CRTC_INDEX, index, value); }
static const RegAccess riva_crtc = {.read = ReadCrtc, .write = WriteCrtc};

static uint32_t OpenIo()
{
    uint32_t opened = OpenRegisterAccess();
    if (CurrentChip()->lock == LOCK_CR1F) {
        WriteCrtc(CR1F_LOCK, unlock_key);
    } else {
        sr06_found = ReadSeq(SR06_LOCK);
        if (sr06_found == 0) WriteSeq(SR06_LOCK, unlock_key);
    }
    return opened;
}

static uint32_t CloseIo()
{
    if (CurrentChip()->lock == LOCK_CR1F) WriteCrtc(CR1F_LOCK, tnt_lock_key);
    else if (sr06_found == 0) WriteSeq(SR06_LOCK, 0);
    sr06_found = 1;
    return CloseRegisterAccess();
}

// --- the internal registers ---

// Selects the real-mode access phase in CR38 bits 2..0.
static void SetAccessPhase(uint8_t cr38, uint8_t phase) { WriteCrtc(CR38_RMA_MODE, (uint8_t)((cr38 & ~rma_mode_mask) | phase)); }

// Points the real-mode access port at a register and switches to its data
// phase; gives the CR38 value to put back.
static uint8_t BeginRealModeAccess(uint32_t offset)
{
    uint8_t cr38 = ReadCrtc(CR38_RMA_MODE);
    SetAccessPhase(cr38, rma_address_phase);
    SetAccessPhase(cr38, rma_address_phase);
    ChipOutDword(&riva_ports, RMA_DATA_PORT, offset);
    SetAccessPhase(cr38, rma_data_phase);
    return cr38;
}

// The caller has register access open.
static uint32_t ReadInternal(uint32_t offset)
{
    uint32_t window = CurrentAdapter()->mapped_registers;
    if (window) return MachineReadDword(window + offset);
    uint8_t cr38 = BeginRealModeAccess(offset);
    uint32_t value = ChipInDword(&riva_ports, RMA_DATA_PORT);
    WriteCrtc(CR38_RMA_MODE, cr38);
    return value;
}

// Replaces the bits of mask, keeping the others. Register access is open.
static void UpdateInternal(uint32_t offset, uint32_t mask, uint32_t bits)
{
    uint32_t window = CurrentAdapter()->mapped_registers;
    if (window) {
        MachineWriteDword(window + offset, (MachineReadDword(window + offset) & ~mask) | bits);
        return;
    }
    uint8_t cr38 = BeginRealModeAccess(offset);
    uint32_t old = ChipInDword(&riva_ports, RMA_DATA_PORT);
    ChipOutDword(&riva_ports, RMA_DATA_PORT, (old & ~mask) | bits);
    WriteCrtc(CR38_RMA_MODE, cr38);
}

// A register read on its own, opening and closing register access; false
// when access cannot be had (the value would be whatever the bus floats).
static bool ReadInternalAlone(uint32_t offset, uint32_t* value)
{
    if (!CurrentAdapter()->mapped_registers) {
        if (!OpenIo()) return false;
        *value = ReadInternal(offset);
        CloseIo();
        return true;
    }
    *value = ReadInternal(offset);
    return true;
}

// --- the synthesizers ---

static uint16_t Unpack(uint32_t value, const PllField* f) { return (uint16_t)((value >> f->shift) & f->mask); }

static RivaPll ReadPll(uint32_t offset)
{
    uint32_t value = ReadInternal(offset);
    return {.n = Unpack(value, &pll_n), .m = Unpack(value, &pll_m), .p = Unpack(value, &pll_p)};
}

static void WritePll(uint32_t offset, RivaPll pll)
{
    uint32_t bits = (uint32_t)pll.p << pll_p.shift | (uint32_t)pll.n << pll_n.shift | (uint32_t)pll.m << pll_m.shift;
    UpdateInternal(offset, pll_coefficients, bits);
}

static double PllHz(RivaPll pll)
{
    if (pll.m == 0) return 0.0;
    return fref_hz * pll.n / ((double)pll.m * (double)(1u << pll.p));
}


// N for a target from M and P, in the chip code's 16-bit arithmetic: a
// product beyond 32 bits stands for a huge N.
static uint16_t MultiplierFor(double target_hz, uint16_t m, uint16_t p)
{
    double product = (double)(1u << p) * m * target_hz / fref_hz;
    uint32_t whole = product >= 0.0 && product < 4294967296.0 ? (uint32_t)product : 0xFFFFFFFFu;
    return (uint16_t)whole;
}

static bool InVcoWindow(uint16_t n, uint16_t m)
{
    const RivaPllLimits* l = &riva_pll_limits;
    double ratio = (double)n / m;
    return ratio >= l->vco_min_hz / fref_hz && ratio <= l->vco_max_hz / fref_hz;
}

// One step of the walk over M and P from a setting that does not fit;
// false when the walk has run out of room.
static bool StepPll(uint16_t n, uint16_t* m, uint16_t* p)
{
    const RivaPllLimits* l = &riva_pll_limits;
    if (n >= l->n_min && n <= l->n_max) {
        if ((double)n / *m < l->vco_min_hz / fref_hz) {  // VCO too slow: a larger P raises N
            if (*p < l->p_max) ++*p;
            else if (*m < l->m_max) ++*m;
            else return false;
        } else {
            if (*p > l->p_min) --*p;
            else if (*m > l->m_min) --*m;
            else return false;
        }
    } else if (n == 0) {
        if (*m < l->m_max) ++*m;
        else if (*p < l->p_max) ++*p;
        else return false;
    } else {
        if (*m > l->m_min) --*m;
        else if (*p > l->p_min) --*p;
        else return false;
    }
    return true;
}

// Walks M and P from the current setting, computing N, for at most 20
// steps. True with the fit in *pll; *pll unchanged otherwise.
static bool SearchPll(double target_hz, RivaPll* pll)
{
    uint16_t m = pll->m, p = pll->p;
    for (int step = 0; step < pll_search_steps; ++step) {
        uint16_t n = MultiplierFor(target_hz, m, p);
        if (n >= riva_pll_limits.n_min && n <= riva_pll_limits.n_max && InVcoWindow(n, m)) {
            *pll = {.n = n, .m = m, .p = p};
            return true;
        }
        if (!StepPll(n, &m, &p)) return false;
    }
    return false;
}

double RivaGetPixelClock() { return PllHz(ReadPll(PRAMDAC_VPLL)); }

uint32_t RivaSetPixelClock(double hz)
{
    RivaPll pll = ReadPll(PRAMDAC_VPLL);
    if (!SearchPll(hz, &pll)) return 0;
    WritePll(PRAMDAC_VPLL, pll);
    return 1;
}

static uint32_t GetMemoryClock()
{
    if (!OpenIo()) return 0;
    RivaPll pll = ReadPll(PRAMDAC_MPLL);
    CloseIo();
    if (pll.n == 0 || pll.m == 0) return 0;
    return WholeMegahertz(PllHz(pll));
}

static bool NearRequest(RivaPll pll, uint32_t mhz)
{
    int64_t off = (int64_t)WholeMegahertz(PllHz(pll)) - mhz;
    return off >= -mclk_tolerance_mhz && off <= mclk_tolerance_mhz;
}

// A first fit that lands more than 4 MHz off may have a better neighbour
// one step of M away.
static RivaPll NeighbourIfCloser(RivaPll fit, double target_hz, uint32_t mhz)
{
    if (NearRequest(fit, mhz)) return fit;
    uint16_t m = fit.m < riva_pll_limits.m_max ? (uint16_t)(fit.m + 1) : (uint16_t)(fit.m - 1);
    double n = (double)(1u << fit.p) * m * target_hz / fref_hz;  // not cut to 16 bits here
    if (n < riva_pll_limits.n_min || n >= riva_pll_limits.n_max + 1.0) return fit;
    RivaPll other = {.n = (uint16_t)n, .m = m, .p = fit.p};
    return InVcoWindow(other.n, m) && NearRequest(other, mhz) ? other : fit;
}

static uint32_t SetMemoryClock(uint32_t mhz)
{
    if (!OpenIo()) return 0;
    RivaPll pll = ReadPll(PRAMDAC_MPLL);
    double target_hz = (mhz + 0.5) * 1e6;
    if (!SearchPll(target_hz, &pll)) {
        CloseIo();
        return 0;
    }
    WritePll(PRAMDAC_MPLL, NeighbourIfCloser(pll, target_hz, mhz));
    CloseIo();
    return GetMemoryClock();
}

// --- the other commands ---

static uint32_t InitChip()
{
    uint32_t straps = 0;
    ReadInternalAlone(PEXTDEV_STRAPS, &straps);
    fref_hz = (straps & strap_crystal_14318) ? crystal_14318_hz : crystal_13500_hz;
    return 0;
}

// NT keeps the size in the display driver's binary
// "HardwareInformation.MemorySize".
static uint32_t MemorySizeOnNt()
{
    uint8_t size[4] = {};
    if (DriverKeyValue("", "HardwareInformation.MemorySize", size, sizeof size, REG_BINARY, 1) != 1) return 0;
    switch (size[2]) {
    case 0x80: return 8u << 16;
    case 0x40: return 4u << 16;
    case 0xC0: return 12u << 16;
    }
    if (size[3] == 1) return 16u << 16;
    if (size[3] == 2) return 32u << 16;
    return 0;
}

static uint32_t MemorySize()
{
    if (platform == PLATFORM_NT) return MemorySizeOnNt();
    uint32_t boot;
    if (!ReadInternalAlone(PFB_BOOT, &boot)) return 0;
    return (uint32_t)CurrentChip()->memory_mb[boot & pfb_memory_size_mask] << 16;
}

static uint8_t SyncBits(uint32_t command)
{
    for (const RivaDpmsState& s : riva_dpms_states)
        if (s.command == command) return s.sync_bits == 0xFF ? CurrentChip()->standby_sync : s.sync_bits;
    return 0;
}

// Turning the horizontal sync off takes one more pass: CR3D bit 6 set, CR00
// briefly at the display end, three status reads.
static void LoadSyncState()
{
    uint8_t hdisplay = ReadCrtc(CR01_HDISPLAY);
    WriteCrtc(CR3D_SYNC_LOAD, cr3d_load_sync);
    WriteCrtc(CR00_HTOTAL, hdisplay);
    for (int i = 0; i < 3; ++i) ChipInByte(&riva_ports, VGA_INPUT_STATUS);
    WriteCrtc(CR3D_SYNC_LOAD, 0);
}

static uint32_t SetDpms(uint32_t command)
{
    if (!OpenIo()) return 0;
    WriteSeq(SR01_CLOCKING, (uint8_t)(ReadSeq(SR01_CLOCKING) | sr01_screen_off));
    uint8_t cr11 = ReadCrtc(CR11_VSYNC_END);
    WriteCrtc(CR11_VSYNC_END, cr11_during_dpms);
    uint8_t cr00 = ReadCrtc(CR00_HTOTAL);
    uint8_t sync = SyncBits(command);
    WriteField(&riva_crtc, &sync_disable, sync >> 6);
    if (sync & cr1a_hsync_off) LoadSyncState();
    WriteCrtc(CR00_HTOTAL, cr00);
    WriteCrtc(CR11_VSYNC_END, cr11);
    if (command == CMD_DPMS_ON) WriteSeq(SR01_CLOCKING, (uint8_t)(ReadSeq(SR01_CLOCKING) & ~sr01_screen_off));
    CloseIo();
    return 1;
}

// The 9x display driver takes the refresh rate from its mode key.
static uint32_t PrepareMode() { return platform == PLATFORM_9X ? PREPARE_REFRESH_KEY : 0; }

uint32_t RivaDispatch(uint32_t command, uintptr_t argument)
{
    switch (command) {
    case CMD_DPMS_ON:
    case CMD_DPMS_STANDBY:
    case CMD_DPMS_SUSPEND:
    case CMD_DPMS_OFF: return SetDpms(command);
    case CMD_INIT_CHIP: return InitChip();
    case CMD_OPEN_IO: return OpenIo();
    case CMD_CLOSE_IO: return CloseIo();
    case CMD_GET_HTOTAL: return ReadField(&riva_crtc, &horizontal_total) + 5;
    case CMD_GET_VTOTAL: return ReadField(&riva_crtc, &vertical_total) + 2;
    case CMD_GET_CHAR_WIDTH: return 8;
    case CMD_WRITE_PORT: return ChipOutByte(&riva_ports, (uint16_t)argument, (uint8_t)(argument >> 16));
    case CMD_READ_PORT: return ChipInByte(&riva_ports, (uint16_t)argument);
    case CMD_GET_MEM_SIZE: return MemorySize();
    case CMD_PREPARE_MODE: return PrepareMode();
    case CMD_MAP_REGISTERS: return MapRegisterWindow(&riva_window);
    case CMD_GET_MCLK: return GetMemoryClock();
    case CMD_SET_MCLK: return SetMemoryClock((uint32_t)argument);
    case CMD_GET_AGP_RATE: return CurrentChip()->agp_rate;
    case CMD_HAS_DPMS: return 1;
    case CMD_GET_MCLK_MAX: return CurrentChip()->mclk_max_mhz;
    case CMD_GET_MCLK_MIN: return mclk_min_mhz;
    }
    return 0;
}
