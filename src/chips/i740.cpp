// The Intel i740: the CRT controller and the extended XR registers (the two
// pixel clock synthesizer sets, DPMS) through the register window or the
// ports; the memory size from the companion on 9x and the registry on NT.
#include "chips/i740.h"

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chip_io.h"
#include "chips/chips.h"
#include "chips/reg_field.h"
#include "hardware/companions.h"
#include "hardware/driver_key.h"
#include "hardware/register_access.h"

static const ChipPortWindow i740_ports = {.windowed = true, .low_first = 1, .low_last = 0, .low_offset = 0, .offset = 0};
static const RegisterWindowPlace i740_window = {.config_offset = 0x14, .mask = 0xFFF80000u, .added = 0};

enum : uint16_t { XR_INDEX = 0x3D6 };

enum : uint8_t {
    CR00_HTOTAL = 0x00,
    CR06_VTOTAL = 0x06,
    CR30_EXT_VTOTAL = 0x30,
    CR35_EXT_HTOTAL = 0x35,
    XR1B_DPMS_PREPARE = 0x1B,
    XR61_DPMS_SYNCS = 0x61,
};

static const RegField horizontal_total = {{CR00_HTOTAL, 0, 7}, {CR35_EXT_HTOTAL, 0, 0}};
static const RegField vertical_total = {{CR06_VTOTAL, 0, 7}, {CR30_EXT_VTOTAL, 0, 3}};

// One synthesizer set: M and N low bytes, their bits 9..8 in a high
// register the driver only reads, and the control register.
struct I740PllSet {
    uint8_t m, n, high, control;
};
static const I740PllSet set_a = {.m = 0xC0, .n = 0xC1, .high = 0xC2, .control = 0xC3};
static const I740PllSet set_b = {.m = 0xC8, .n = 0xC9, .high = 0xCA, .control = 0xCB};
// MISC (read at 0x3CC) bits 3..2: the clock select.
static const uint8_t misc_clock_shift = 2, misc_clock_mask = 0x3;

struct ControlBits {
    uint8_t kept;        // bits a write keeps
    uint8_t p_shift;     // P in bits 6..4
    uint8_t p_mask;
    uint8_t k16;         // bit 2: the reference multiplied by 16, else by 4
};
static const ControlBits control_bits = {.kept = 0x8F, .p_shift = 4, .p_mask = 0x7, .k16 = 0x04};
static const uint8_t high_m_mask = 0x03, high_n_shift = 4, high_n_mask = 0x03;

static const double reference_hz = 66666700.0;

struct I740PllLimits {
    uint16_t m_min, m_max, n_min, n_max, p_min, p_max;
    double out_max_hz;
};
static const I740PllLimits i740_limits = {
    .m_min = 1, .m_max = 127, .n_min = 1, .n_max = 127, .p_min = 0, .p_max = 5, .out_max_hz = 203e6};
static const int pll_search_steps = 20;

struct I740DpmsState {
    uint32_t command;
    uint8_t xr61;
};
static const I740DpmsState i740_dpms_states[] = {
    {.command = CMD_DPMS_ON, .xr61 = 0x00},
    {.command = CMD_DPMS_STANDBY, .xr61 = 0x03},
    {.command = CMD_DPMS_SUSPEND, .xr61 = 0x08},
    {.command = CMD_DPMS_OFF, .xr61 = 0x0B},
};

static const uint32_t agp_rate = 2;

static uint8_t ReadCrtc(uint8_t index) { return ChipReadIndexed(&i740_ports, VGA_CRTC_INDEX, index); }
static void WriteCrtc(uint8_t index, uint8_t value) { ChipWriteIndexed(&i740_ports, VGA_CRTC_INDEX, index, value); }
static const RegAccess i740_crtc = {.read = ReadCrtc, .write = WriteCrtc};
static uint8_t ReadXr(uint8_t index) { return ChipReadIndexed(&i740_ports, XR_INDEX, index); }
static void WriteXr(uint8_t index, uint8_t value) { ChipWriteIndexed(&i740_ports, XR_INDEX, index, value); }

double I740PllHz(I740Pll pll)
{
    return reference_hz * pll.k * (pll.m + 2) / ((double)(pll.n + 2) * (double)(1u << pll.p));
}

// M for a target from N, P and k, in the chip code's 16-bit arithmetic: a
// product below 2 wraps around to a huge M.
static uint16_t MultiplierFor(double target_hz, const I740Pll* pll)
{
    double product = (double)(1u << pll->p) * (pll->n + 2) * target_hz / reference_hz;
    uint32_t whole = product >= 0.0 && product < 4294967296.0 ? (uint32_t)product : 0xFFFFFFFFu;
    uint16_t shifted = (uint16_t)((uint16_t)whole >> (pll->k == 16 ? 4 : 2));
    return (uint16_t)(shifted - 2);
}

int I740SearchPll(double target_hz, I740Pll* pll)
{
    const I740PllLimits* l = &i740_limits;
    I740Pll s = *pll;
    for (int step = 0; step < pll_search_steps; ++step) {
        s.m = MultiplierFor(target_hz, &s);
        bool too_low = s.m == 0;
        if (s.m >= l->m_min && s.m <= l->m_max) {
            if (I740PllHz(s) <= l->out_max_hz) {
                *pll = s;
                return 1;
            }
        }
        if (too_low) {
            if (s.n < l->n_max) ++s.n;
            else if (s.p < l->p_max) ++s.p;
            else return 0;
        } else {
            if (s.n > l->n_min) --s.n;
            else if (s.p > l->p_min) --s.p;
            else return 0;
        }
    }
    return 0;
}

// The set MISC's clock select chooses: 0 set A, anything else set B.
static const I740PllSet* SelectedSet()
{
    uint8_t misc = (uint8_t)ChipInByte(&i740_ports, VGA_MISC_READ);
    return ((misc >> misc_clock_shift) & misc_clock_mask) == 0 ? &set_a : &set_b;
}

static I740Pll ReadPll(const I740PllSet* set)
{
    uint8_t high = ReadXr(set->high);
    uint8_t control = ReadXr(set->control);
    return {.m = (uint16_t)(((high & high_m_mask) << 8) | ReadXr(set->m)),
            .n = (uint16_t)((((high >> high_n_shift) & high_n_mask) << 8) | ReadXr(set->n)),
            .p = (uint16_t)((control >> control_bits.p_shift) & control_bits.p_mask),
            .k = (uint16_t)((control & control_bits.k16) ? 16 : 4)};
}

// Bits 9..8 of M and N stay as the high register holds them.
static void WritePll(const I740PllSet* set, I740Pll pll)
{
    uint8_t control = ReadXr(set->control);
    WriteXr(set->m, (uint8_t)pll.m);
    WriteXr(set->n, (uint8_t)pll.n);
    WriteXr(set->control, (uint8_t)((control & control_bits.kept) | (pll.p & control_bits.p_mask) << control_bits.p_shift));
}

double I740GetPixelClock() { return I740PllHz(ReadPll(SelectedSet())); }

uint32_t I740SetPixelClock(double hz)
{
    const I740PllSet* set = SelectedSet();
    I740Pll pll = ReadPll(set);
    if (!I740SearchPll(hz, &pll)) return 0;
    WritePll(set, pll);
    return 1;
}

// NT keeps the size in the display driver's binary
// "HardwareInformation.MemorySize".
static uint32_t MemorySize()
{
    if (platform != PLATFORM_NT) return GateMemorySize();
    uint8_t size[4] = {};
    if (DriverKeyValue("", "HardwareInformation.MemorySize", size, sizeof size, REG_BINARY, 1) != 1) return 0;
    switch (size[2]) {
    case 0x80: return 8u << 16;
    case 0x40: return 4u << 16;
    case 0xC0: return 12u << 16;
    }
    return 0;
}

static uint32_t SetDpms(uint32_t command)
{
    if (!OpenRegisterAccess()) return 0;
    WriteXr(XR1B_DPMS_PREPARE, 0);
    for (const I740DpmsState& s : i740_dpms_states)
        if (s.command == command) WriteXr(XR61_DPMS_SYNCS, s.xr61);
    CloseRegisterAccess();
    return 1;
}

// The 9x display driver takes the refresh rate from its mode key.
static uint32_t PrepareMode() { return platform == PLATFORM_9X ? PREPARE_REFRESH_KEY : 0; }

uint32_t I740Dispatch(uint32_t command, uintptr_t argument)
{
    switch (command) {
    case CMD_DPMS_ON:
    case CMD_DPMS_STANDBY:
    case CMD_DPMS_SUSPEND:
    case CMD_DPMS_OFF: return SetDpms(command);
    case CMD_INIT_CHIP: return CHIP_CAP_AGP;
    case CMD_OPEN_IO: return OpenRegisterAccess();
    case CMD_CLOSE_IO: return CloseRegisterAccess();
    case CMD_GET_HTOTAL: return ReadField(&i740_crtc, &horizontal_total) + 5;
    case CMD_GET_VTOTAL: return ReadField(&i740_crtc, &vertical_total) + 2;
    case CMD_GET_CHAR_WIDTH: return 8;
    case CMD_WRITE_PORT: return ChipOutByte(&i740_ports, (uint16_t)argument, (uint8_t)(argument >> 16));
    case CMD_READ_PORT: return ChipInByte(&i740_ports, (uint16_t)argument);
    case CMD_GET_MEM_SIZE: return MemorySize();
    case CMD_PREPARE_MODE: return PrepareMode();
    case CMD_MAP_REGISTERS: return MapRegisterWindow(&i740_window);
    case CMD_GET_AGP_RATE: return agp_rate;
    case CMD_HAS_DPMS: return 1;
    }
    return 0;
}
