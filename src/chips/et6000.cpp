// The Tseng ET6000: its built-in pixel clock synthesizer in the chip's own
// I/O range, the CRT totals, and the memory size. It withdraws when more
// than one monitor is attached.
#include "chips/et6000.h"

#include <windows.h>

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

// Always the port instructions (or the kernel device on NT).
static const ChipPortWindow et6000_ports = {.windowed = false, .low_first = 1, .low_last = 0, .low_offset = 0, .offset = 0};

enum : uint8_t {
    CR00_HTOTAL = 0x00,
    CR06_VTOTAL = 0x06,
    CR07_OVERFLOW = 0x07,
    CR21_IO_BASE = 0x21,
    CR34_CLOCK_SELECT = 0x34,
    CR35_EXTRA_VERT = 0x35,
    CR3F_EXTRA_HORZ = 0x3F,
};

enum : uint16_t { VGA_INPUT_STATUS_0 = 0x3C2 };

// Offsets in the chip's I/O range, whose high byte CR21 holds.
enum : uint8_t {
    IO_MEMORY_CONFIG = 0x45,
    IO_MDRAM_BANKS = 0x47,
    IO_CLOCK_INDEX = 0x67,
    IO_CLOCK_DATA = 0x69,
};

static const RegField horizontal_total = {{CR00_HTOTAL, 0, 7}, {CR3F_EXTRA_HORZ, 0, 0}};
static const RegField vertical_total = {
    {CR06_VTOTAL, 0, 7}, {CR07_OVERFLOW, 0, 0}, {CR07_OVERFLOW, 5, 5}, {CR35_EXTRA_VERT, 1, 1}};
// The clock number: MISC bits 3..2 and CR34 bit 1.
static const uint8_t misc_clock_select_shift = 2, misc_clock_select_mask = 0x03;
static const RegField high_clock_select = {{CR34_CLOCK_SELECT, 1, 1}};

// The synthesizer's two bytes: M, then N and R.
static const uint8_t clock_m_mask = 0x7F;
static const uint8_t clock_n_mask = 0x1F;
static const uint8_t clock_r_shift = 5, clock_r_mask = 0x03;

// The M field holds 7 bits: a fit above 127 would be written as another M.
// Nothing bounds the VCO.
constexpr SynthLimits et6000_pixel_clock = {.fref_hz = reference_crystal_hz, .a = 2, .b = 2, .m_min = 1,
                                            .m_max = 127,
                                                  .n_min = 1, .n_max = 31, .r_min = 0, .r_max = 3,
                                                  .vco_min_hz = 0.0, .vco_max_hz = 1e300};

// Video BIOS function 12h, BL = F2h: the memory installed.
static const uint16_t bios_memory_ax = 0x1203, bios_memory_bl = 0xF2;
static const uint16_t bios_kb_blocks_mask = 0x0F;
static const uint32_t kb_block = 64;

// Megabytes by byte 2 of the display driver's memory size value.
struct Et6000RegistrySize {
    uint8_t byte2, mb;
};
static const Et6000RegistrySize registry_sizes[] = {
    {.byte2 = 0x10, .mb = 1}, {.byte2 = 0x20, .mb = 2}, {.byte2 = 0x30, .mb = 3}, {.byte2 = 0x40, .mb = 4}};

// The memory configuration as the X.org tseng driver reads it
// (xf86-video-tseng, src/tseng_driver.c, TsengDetectMem): input status 0
// bits 1..0 give the memory type; multibank DRAM counts (register 0x47 bits
// 2..0) + 1 units of eight 32 KB banks, twice that with register 0x45 bit 2;
// standard DRAM is 1 MB shifted left by register 0x45 bits 1..0. The chip
// uses 4 MB at most.
enum : uint8_t { MEMORY_TYPE_DRAM = 0, MEMORY_TYPE_MDRAM = 3 };
static const uint8_t status0_memory_type_mask = 0x03;
static const uint8_t mdram_units_mask = 0x07;
static const uint32_t mdram_unit_kb = 8 * 32;
static const uint8_t config_mdram_double = 0x04;
static const uint8_t config_dram_shift_mask = 0x03;
static const uint32_t dram_base_kb = 1024;
static const uint32_t memory_limit_kb = 4096;

// Loaded by CMD_INIT_CHIP on a single-monitor system.
static uint8_t clock_number;
static uint16_t clock_port_base;

static void ResetEt6000()
{
    clock_number = 0;
    clock_port_base = 0;
}
VISTREL_MODULE_RESET(ResetEt6000);

static uint8_t ReadCrtc(uint8_t index) { return ChipReadIndexed(&et6000_ports, VGA_CRTC_INDEX, index); }
static void WriteCrtc(uint8_t index, uint8_t value) { ChipWriteIndexed(&et6000_ports, VGA_CRTC_INDEX, index, value); }
static const RegAccess et6000_crtc = {.read = ReadCrtc, .write = WriteCrtc};

static uint16_t IoPort(uint8_t offset) { return (uint16_t)(clock_port_base | offset); }
static uint8_t InIo(uint8_t offset) { return (uint8_t)ChipInByte(&et6000_ports, IoPort(offset)); }
static void OutIo(uint8_t offset, uint8_t value) { ChipOutByte(&et6000_ports, IoPort(offset), value); }

static bool SeveralMonitors() { return monitor_count > 1; }

static uint32_t InitChip()
{
    if (SeveralMonitors()) return CHIP_CAP_NO_ADJUST | CHIP_CAP_NO_CLOCK_REFRESH;
    if (!OpenRegisterAccess()) return 0;
    uint8_t misc = (uint8_t)ChipInByte(&et6000_ports, VGA_MISC_READ);
    clock_number = (uint8_t)((misc >> misc_clock_select_shift & misc_clock_select_mask) |
                             ReadField(&et6000_crtc, &high_clock_select) << 2);
    clock_port_base = (uint16_t)(ReadCrtc(CR21_IO_BASE) << 8);
    CloseRegisterAccess();
    return 0;
}

// --- the synthesizer ---

static SynthSetting ReadClock()
{
    // Writing the clock number points the data port at that clock's M byte.
    OutIo(IO_CLOCK_INDEX, clock_number);
    uint8_t m = InIo(IO_CLOCK_DATA);
    uint8_t nr = InIo(IO_CLOCK_DATA);
    return {.m = (uint16_t)(m & clock_m_mask),
            .n = (uint16_t)(nr & clock_n_mask),
            .r = (uint16_t)(nr >> clock_r_shift & clock_r_mask)};
}

static void WriteClock(SynthSetting s)
{
    OutIo(IO_CLOCK_INDEX, clock_number);
    OutIo(IO_CLOCK_DATA, (uint8_t)s.m);
    OutIo(IO_CLOCK_DATA, (uint8_t)(s.n | s.r << clock_r_shift));
}

double Et6000GetPixelClock() { return SynthFrequency(&et6000_pixel_clock, ReadClock()); }

uint32_t Et6000SetPixelClock(double hz)
{
    SynthSetting s = ReadClock();
    if (!SearchSynthesizer(&et6000_pixel_clock, hz, &s)) return 0;
    WriteClock(s);
    return 1;
}

// --- the memory size ---

uint32_t Et6000MemoryFromBios(uint16_t bx) { return (uint32_t)(bx >> 4) << 16 | (bx & bios_kb_blocks_mask) * kb_block; }

uint32_t Et6000MemoryFromConfiguration(uint8_t status0, uint8_t config45, uint8_t banks47)
{
    uint32_t kb;
    switch (status0 & status0_memory_type_mask) {
    case MEMORY_TYPE_MDRAM:
        kb = ((banks47 & mdram_units_mask) + 1u) * mdram_unit_kb;
        if (config45 & config_mdram_double) kb *= 2;
        break;
    case MEMORY_TYPE_DRAM: kb = dram_base_kb << (config45 & config_dram_shift_mask); break;
    default: return 0;
    }
    if (kb > memory_limit_kb) kb = memory_limit_kb;
    return Et6000MemoryFromBios((uint16_t)((kb / 1024) << 4 | (kb % 1024) / kb_block));
}

// Windows 95: the video BIOS where the machine lets the program call it;
// a Win32 process there has no way to, and reads the chip instead.
static uint32_t MemorySizeOnWindows95()
{
    BiosRegisters regs = {.ax = bios_memory_ax, .bx = bios_memory_bl, .cx = 0, .dx = 0};
    if (MachineVideoBios(&regs)) return Et6000MemoryFromBios(regs.bx);
    if (!OpenRegisterAccess()) return 0;
    uint8_t status0 = (uint8_t)ChipInByte(&et6000_ports, VGA_INPUT_STATUS_0);
    uint16_t saved_base = clock_port_base;
    clock_port_base = (uint16_t)(ReadCrtc(CR21_IO_BASE) << 8);
    uint32_t size = Et6000MemoryFromConfiguration(status0, InIo(IO_MEMORY_CONFIG), InIo(IO_MDRAM_BANKS));
    clock_port_base = saved_base;
    CloseRegisterAccess();
    return size;
}

static uint32_t MemorySizeFromRegistry()
{
    uint8_t size[4] = {};
    int read = platform == PLATFORM_NT
                   ? DriverKeyValue("", "HardwareInformation.MemorySize", size, sizeof size, REG_BINARY, 1)
                   : DriverKeyValue("\\INFO", "VideoMemory", size, sizeof size, REG_DWORD, 1);
    if (read != 1) return 0;
    for (const Et6000RegistrySize& s : registry_sizes)
        if (s.byte2 == size[2]) return (uint32_t)s.mb << 16;
    return 0;
}

static uint32_t MemorySize()
{
    if (platform == PLATFORM_9X && !IsWindows98()) return MemorySizeOnWindows95();
    return MemorySizeFromRegistry();
}

enum { PAGE_MONITOR = 2 };

uint32_t Et6000Dispatch(uint32_t command, uintptr_t argument)
{
    switch (command) {
    case CMD_INIT_CHIP: return InitChip();
    case CMD_OPEN_IO: return OpenRegisterAccess();
    case CMD_CLOSE_IO: return CloseRegisterAccess();
    case CMD_GET_HTOTAL: return ReadField(&et6000_crtc, &horizontal_total) + 5;
    case CMD_GET_VTOTAL: return ReadField(&et6000_crtc, &vertical_total) + 2;
    case CMD_GET_CHAR_WIDTH: return 8;
    case CMD_WRITE_PORT: return ChipOutByte(&et6000_ports, (uint16_t)argument, (uint8_t)(argument >> 16));
    case CMD_READ_PORT: return ChipInByte(&et6000_ports, (uint16_t)argument);
    case CMD_GET_MEM_SIZE: return MemorySize();
    case CMD_HIDE_PAGE: return argument == PAGE_MONITOR && SeveralMonitors() ? 1 : 0;
    }
    return 0;
}
