// The 3dfx Voodoo Banshee: the CRT controller through the port instructions
// or the kernel device, and the clock synthesizers, memory configuration and
// DPMS control as 32-bit registers of the register window, which only
// Windows 9x maps.
#include "chips/banshee.h"

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chip_io.h"
#include "chips/chips.h"
#include "chips/reg_field.h"
#include "chips/synth.h"
#include "hardware/driver_key.h"
#include "hardware/machine.h"
#include "hardware/register_access.h"

// The VGA ports are never reached through the window.
static const ChipPortWindow banshee_ports = {
    .windowed = false, .low_first = 1, .low_last = 0, .low_offset = 0, .offset = 0};
static const RegisterWindowPlace banshee_window = {.config_offset = 0x10, .mask = 0xFFFFFF00u, .added = 0};

// 32-bit registers of the window.
enum : uint32_t {
    DRAM_INIT1 = 0x18,  // memory configuration
    PLL_CTRL0 = 0x40,   // pixel clock synthesizer
    PLL_CTRL2 = 0x48,   // memory clock synthesizer
    DAC_MODE = 0x4C,    // DPMS sync control
};

// A field of a 32-bit window register.
struct WindowField {
    uint8_t shift;
    uint32_t mask;  // after the shift
};
static const WindowField memory_size_code = {.shift = 27, .mask = 0x3};
static const WindowField pll_multiplier = {.shift = 8, .mask = 0xFF};
static const WindowField pll_divider = {.shift = 2, .mask = 0x3F};
static const WindowField pll_post_divider = {.shift = 0, .mask = 0x3};
static const WindowField dpms_syncs = {.shift = 1, .mask = 0xF};

static const uint8_t memory_size_mb[4] = {8, 16, 32, 0};

struct BansheeDpmsState {
    uint32_t command;
    uint32_t syncs;  // the sync control's bits 4..1 for the state
};
static const BansheeDpmsState banshee_dpms_states[] = {
    {.command = CMD_DPMS_ON, .syncs = 0x0},
    {.command = CMD_DPMS_STANDBY, .syncs = 0xC},
    {.command = CMD_DPMS_SUSPEND, .syncs = 0x3},
    {.command = CMD_DPMS_OFF, .syncs = 0xF},
};

// Both synthesizers: f = fref * (multiplier + 2) / ((divider + 2) * 2^K).
static constexpr SynthLimits banshee_pll_limits = {.fref_hz = reference_crystal_hz, .a = 2, .b = 2, .m_min = 1,
                                                   .m_max = 255, .n_min = 1, .n_max = 63, .r_min = 0, .r_max = 3,
                                                   .vco_min_hz = 0, .vco_max_hz = 550e6};

enum : uint8_t { CR00_HTOTAL = 0x00, CR06_VTOTAL = 0x06, CR07_OVERFLOW = 0x07, CR1A_EXT_HORZ = 0x1A, CR1B_EXT_VERT = 0x1B };
static const RegField vertical_total = {
    {CR06_VTOTAL, 0, 7}, {CR07_OVERFLOW, 0, 0}, {CR07_OVERFLOW, 5, 5}, {CR1B_EXT_VERT, 0, 0}};
static const uint8_t cr1a_htotal_8 = 0x01;
// From this width on, a clear CR1A bit 0 means every unit of CR00 counts two characters.
static const uint16_t double_total_width = 1600;

static const uint32_t mclk_max_mhz = 133, mclk_min_mhz = 100;
static const uint32_t agp_rate = 1;
static const uint32_t monitor_page = 2;

static uint8_t ReadCrtc(uint8_t index) { return ChipReadIndexed(&banshee_ports, VGA_CRTC_INDEX, index); }
static void WriteCrtc(uint8_t index, uint8_t value) { ChipWriteIndexed(&banshee_ports, VGA_CRTC_INDEX, index, value); }
static const RegAccess banshee_crtc = {.read = ReadCrtc, .write = WriteCrtc};

static uint32_t Window() { return CurrentAdapter()->mapped_registers; }
static uint32_t Unpack(uint32_t value, const WindowField* f) { return (value >> f->shift) & f->mask; }
static uint32_t Pack(uint32_t value, const WindowField* f) { return (value & f->mask) << f->shift; }

// A synthesizer as its 16 bits: fields 0 without a window.
static SynthSetting ReadPll(uint32_t offset)
{
    uint32_t value = Window() ? MachineReadWord(Window() + offset) : 0;
    return {.m = (uint16_t)Unpack(value, &pll_multiplier), .n = (uint16_t)Unpack(value, &pll_divider),
            .r = (uint16_t)Unpack(value, &pll_post_divider)};
}

// The whole dword holds the 16-bit value.
static void WritePll(uint32_t offset, SynthSetting s)
{
    if (!Window()) return;
    MachineWriteDword(Window() + offset, Pack(s.m, &pll_multiplier) | Pack(s.n, &pll_divider) | Pack(s.r, &pll_post_divider));
}

static uint32_t WholeMegahertz(SynthSetting s)
{
    if (s.m == 0 || s.n == 0) return 0;
    return WholeMegahertz(SynthFrequency(&banshee_pll_limits, s));
}

uint32_t BansheeSynthMhz(uint16_t value)
{
    return WholeMegahertz({.m = (uint16_t)Unpack(value, &pll_multiplier), .n = (uint16_t)Unpack(value, &pll_divider),
                           .r = (uint16_t)Unpack(value, &pll_post_divider)});
}

uint32_t BansheeHorizontalTotal(uint8_t cr00, uint8_t cr1a, uint16_t width)
{
    if (width >= double_total_width && !(cr1a & cr1a_htotal_8)) return 2u * cr00 + 5;
    return cr00 + ((cr1a & cr1a_htotal_8) ? 256u : 0u) + 5;
}

uint32_t BansheeNtMemorySize(const uint8_t size[4])
{
    uint32_t mb = size[3] == 1 ? 16 : size[3] == 2 ? 32 : 0;
    switch (size[2]) {
    case 0x80: mb += 8; break;
    case 0x40: mb += 4; break;
    case 0xC0: mb += 12; break;
    }
    return mb << 16;
}

// Without a window there is no synthesizer to read: no clock rather than the
// 14.3 MHz that fields of 0 would give.
double BansheeGetPixelClock()
{
    if (!Window()) return 0.0;
    return SynthFrequency(&banshee_pll_limits, ReadPll(PLL_CTRL0));
}

// Without a window nothing can be written, which is a failure, not a fit.
uint32_t BansheeSetPixelClock(double hz)
{
    SynthSetting s = ReadPll(PLL_CTRL0);
    if (!SearchSynthesizer(&banshee_pll_limits, hz, &s) || !Window()) return 0;
    WritePll(PLL_CTRL0, s);
    return 1;
}

static uint32_t GetMemoryClock()
{
    if (platform == PLATFORM_NT || !OpenRegisterAccess()) return 0;
    SynthSetting s = ReadPll(PLL_CTRL2);
    CloseRegisterAccess();
    return WholeMegahertz(s);
}

static uint32_t SetMemoryClock(uint32_t mhz)
{
    if (!OpenRegisterAccess()) return 0;
    SynthSetting s = ReadPll(PLL_CTRL2);
    bool fits = SearchSynthesizer(&banshee_pll_limits, (mhz + 0.5) * 1e6, &s);
    if (fits) WritePll(PLL_CTRL2, s);
    CloseRegisterAccess();
    return fits ? GetMemoryClock() : 0;
}

static uint32_t InitChip()
{
    if (platform == PLATFORM_NT) return CHIP_CAP_NO_CLOCK_REFRESH;
    return monitor_count > 1 ? CHIP_CAP_NO_ADJUST | CHIP_CAP_NO_CLOCK_REFRESH : 0;
}

static uint32_t MemorySize()
{
    if (platform == PLATFORM_NT) {
        uint8_t size[4] = {};
        if (DriverKeyValue("", "HardwareInformation.MemorySize", size, sizeof size, REG_BINARY, 1) != 1) return 0;
        return BansheeNtMemorySize(size);
    }
    if (!Window()) return 0;
    return (uint32_t)memory_size_mb[Unpack(MachineReadDword(Window() + DRAM_INIT1), &memory_size_code)] << 16;
}

static uint32_t SetDpms(uint32_t command)
{
    if (!Window()) return 0;
    uint32_t value = MachineReadDword(Window() + DAC_MODE);
    // Every state replaces the one before: ORed onto Standby's bits a
    // Suspend would stop both syncs, which is Off.
    for (const BansheeDpmsState& s : banshee_dpms_states)
        if (s.command == command) value = (value & ~Pack(dpms_syncs.mask, &dpms_syncs)) | Pack(s.syncs, &dpms_syncs);
    MachineWriteDword(Window() + DAC_MODE, value);
    return 1;
}

static uint32_t HorizontalTotal()
{
    return BansheeHorizontalTotal(ReadCrtc(CR00_HTOTAL), ReadCrtc(CR1A_EXT_HORZ), CurrentAdapter()->width);
}

// The 9x display driver takes the refresh rate from its mode key.
static uint32_t PrepareMode() { return platform == PLATFORM_9X ? PREPARE_REFRESH_KEY : 0; }

static uint32_t OnNineX(uint32_t value) { return platform == PLATFORM_9X ? value : 0; }

uint32_t BansheeDispatch(uint32_t command, uintptr_t argument)
{
    switch (command) {
    case CMD_DPMS_ON:
    case CMD_DPMS_STANDBY:
    case CMD_DPMS_SUSPEND:
    case CMD_DPMS_OFF: return SetDpms(command);
    case CMD_INIT_CHIP: return InitChip();
    case CMD_OPEN_IO: return OpenRegisterAccess();
    case CMD_CLOSE_IO: return CloseRegisterAccess();
    case CMD_GET_HTOTAL: return HorizontalTotal();
    case CMD_GET_VTOTAL: return ReadField(&banshee_crtc, &vertical_total) + 2;
    case CMD_GET_CHAR_WIDTH: return 8;
    case CMD_WRITE_PORT: return ChipOutByte(&banshee_ports, (uint16_t)argument, (uint8_t)(argument >> 16));
    case CMD_READ_PORT: return ChipInByte(&banshee_ports, (uint16_t)argument);
    case CMD_GET_MEM_SIZE: return MemorySize();
    case CMD_PREPARE_MODE: return PrepareMode();
    case CMD_HIDE_PAGE: return argument == monitor_page;
    case CMD_MAP_REGISTERS: return MapRegisterWindow(&banshee_window);
    case CMD_GET_MCLK: return GetMemoryClock();
    case CMD_SET_MCLK: return SetMemoryClock((uint32_t)argument);
    case CMD_GET_AGP_RATE: return agp_rate;
    case CMD_HAS_DPMS: return OnNineX(1);
    case CMD_GET_MCLK_MAX: return OnNineX(mclk_max_mhz);
    case CMD_GET_MCLK_MIN: return OnNineX(mclk_min_mhz);
    }
    return 0;
}
