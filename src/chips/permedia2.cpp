// The Permedia 2 family (Texas Instruments and 3Dlabs Permedia 2, 3Dlabs
// Permedia 2v): everything is left to the display driver, which is handed
// timings of higher refresh rates than it offers by itself.
#include "chips/permedia2.h"

#include <windows.h>

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chip_io.h"
#include "chips/chips.h"
#include "chips/reg_field.h"
#include "chips/synth.h"
#include "hardware/driver_key.h"
#include "hardware/pci.h"
#include "hardware/register_access.h"

// Always the port instructions (or the kernel device on NT).
static const ChipPortWindow permedia2_ports = {.windowed = false, .low_first = 1, .low_last = 0, .low_offset = 0, .offset = 0};

enum : uint8_t {
    SR08_UNLOCK = 0x08,
    SR12_DCLK_NR = 0x12,
    SR13_DCLK_M = 0x13,
    CR00_HTOTAL = 0x00,
    CR06_VTOTAL = 0x06,
    CR07_OVERFLOW = 0x07,
    CR5D_EXT_HORZ = 0x5D,
    CR5E_EXT_VERT = 0x5E,
};

static const uint8_t sr08_unlock_key = 0x06;
static const uint8_t pci_status_offset = 0x06;
static const uint16_t pci_status_66mhz = 0x0020;
static const uint32_t permedia2_caps = CHIP_CAP_NO_ADJUST | CHIP_CAP_UNCLAMPED_RATE;

static const RegField horizontal_total = {{CR00_HTOTAL, 0, 7}, {CR5D_EXT_HORZ, 0, 0}};
static const RegField vertical_total = {
    {CR06_VTOTAL, 0, 7}, {CR07_OVERFLOW, 0, 0}, {CR07_OVERFLOW, 5, 5}, {CR5E_EXT_VERT, 0, 0}};
static const RegField dclk_m = {{SR13_DCLK_M, 0, 6}};
static const RegField dclk_n = {{SR12_DCLK_NR, 0, 4}};
static const RegField dclk_r = {{SR12_DCLK_NR, 5, 7}};

// N stops at what its 5-bit field holds.
static constexpr SynthLimits permedia2_dclk = {.fref_hz = reference_crystal_hz, .a = 2, .b = 2, .m_min = 1, .m_max = 127,
                                               .n_min = 1, .n_max = 31, .r_min = 0, .r_max = 5,
                                               .vco_min_hz = 0.0, .vco_max_hz = 203e6};

// A built-in timing, as the display driver keeps it in its list: byte 0 is
// the refresh rate in Hz.
struct Permedia2Timing {
    uint16_t width;
    uint8_t record[CHIP_TIMING_SIZE];
};
// The records of one width in a row, lowest rate first.
static const Permedia2Timing permedia2_timings[] = {
    {.width = 640, .record = {0x78, 0x96, 0x6a, 0x00, 0x05, 0x08, 0x0d, 0x00, 0xfd, 0x01, 0x01, 0x03, 0x19, 0x00}},
    {.width = 640, .record = {0xa0, 0xc8, 0x6a, 0x00, 0x05, 0x08, 0x0d, 0x00, 0xfd, 0x01, 0x01, 0x03, 0x19, 0x00}},
    {.width = 640, .record = {0xc8, 0xe0, 0x6a, 0x00, 0x05, 0x08, 0x0d, 0x00, 0xfd, 0x01, 0x01, 0x03, 0x19, 0x00}},
    {.width = 800, .record = {0x78, 0x96, 0x86, 0x00, 0x06, 0x0b, 0x11, 0x01, 0x7c, 0x02, 0x01, 0x03, 0x20, 0x01}},
    {.width = 800, .record = {0xa0, 0xc8, 0x86, 0x00, 0x06, 0x0b, 0x11, 0x01, 0x7c, 0x02, 0x01, 0x03, 0x20, 0x01}},
    {.width = 1024, .record = {0x78, 0x96, 0xae, 0x00, 0x09, 0x0e, 0x17, 0x01, 0x2e, 0x03, 0x01, 0x03, 0x2a, 0x01}},
    {.width = 1024, .record = {0x96, 0xa0, 0xae, 0x00, 0x09, 0x0e, 0x17, 0x01, 0x2e, 0x03, 0x01, 0x03, 0x2a, 0x01}},
    {.width = 1152, .record = {0x64, 0x78, 0xc4, 0x00, 0x0a, 0x10, 0x1a, 0x01, 0x9a, 0x03, 0x01, 0x03, 0x30, 0x01}},
    {.width = 1152, .record = {0x78, 0x96, 0xc4, 0x00, 0x0a, 0x10, 0x1a, 0x01, 0x9a, 0x03, 0x01, 0x03, 0x30, 0x01}},
    {.width = 1280, .record = {0x64, 0x78, 0xdc, 0x00, 0x0c, 0x12, 0x1e, 0x01, 0x3d, 0x04, 0x01, 0x03, 0x39, 0x01}},
    {.width = 1600, .record = {0x55, 0x64, 0x0e, 0x01, 0x08, 0x18, 0x26, 0x01, 0xe2, 0x04, 0x01, 0x03, 0x2e, 0x01}},
};

// Megabytes by byte 2 of the display driver's memory size value.
struct Permedia2RegistrySize {
    uint8_t byte2, mb;
};
static const Permedia2RegistrySize registry_sizes[] = {
    {.byte2 = 0x80, .mb = 8}, {.byte2 = 0x40, .mb = 4}, {.byte2 = 0xC0, .mb = 12}};

enum { PAGE_MONITOR = 2 };

static uint8_t ReadSeq(uint8_t index) { return ChipReadIndexed(&permedia2_ports, VGA_SEQ_INDEX, index); }
static void WriteSeq(uint8_t index, uint8_t value) { ChipWriteIndexed(&permedia2_ports, VGA_SEQ_INDEX, index, value); }
static uint8_t ReadCrtc(uint8_t index) { return ChipReadIndexed(&permedia2_ports, VGA_CRTC_INDEX, index); }
static void WriteCrtc(uint8_t index, uint8_t value) { ChipWriteIndexed(&permedia2_ports, VGA_CRTC_INDEX, index, value); }
static const RegAccess permedia2_sequencer = {.read = ReadSeq, .write = WriteSeq};
static const RegAccess permedia2_crtc = {.read = ReadCrtc, .write = WriteCrtc};

static uint32_t InitChip()
{
    if (platform != PLATFORM_9X) return permedia2_caps;
    const AdapterRecord* a = CurrentAdapter();
    uint16_t status = PciReadConfigWord(a->bus, a->devfn, pci_status_offset);
    return (status & pci_status_66mhz) ? permedia2_caps | CHIP_CAP_AGP : permedia2_caps;
}

// The width's records: the first, and how many.
static const Permedia2Timing* TimingsOfWidth(uint16_t width, int* count)
{
    const Permedia2Timing* first = nullptr;
    *count = 0;
    for (const Permedia2Timing& t : permedia2_timings) {
        if (t.width != width) continue;
        if (!first) first = &t;
        ++*count;
    }
    return first;
}

static uint32_t PrepareMode(ChipModeRecord* mode)
{
    if (platform != PLATFORM_9X) return 0;
    int count;
    const Permedia2Timing* first = TimingsOfWidth(mode->width, &count);
    for (int i = count - 1; i >= 0; --i) {
        if (first[i].record[0] != mode->refresh_hz) continue;
        mode->timing = {.record = first[i].record, .shift_above = first->record[0]};
        return PREPARE_REFRESH_KEY | PREPARE_TIMING;
    }
    return PREPARE_REFRESH_KEY;
}

static uint32_t MemorySize()
{
    uint8_t size[4] = {};
    int read = platform == PLATFORM_NT
                   ? DriverKeyValue("", "HardwareInformation.MemorySize", size, sizeof size, REG_BINARY, 1)
                   : DriverKeyValue("\\INFO", "VideoMemory", size, sizeof size, REG_DWORD, 1);
    if (read != 1) return 0;
    for (const Permedia2RegistrySize& s : registry_sizes)
        if (s.byte2 == size[2]) return (uint32_t)s.mb << 16;
    return 0;
}

static uint32_t CharacterWidth()
{
    uint16_t bits = CurrentAdapter()->bits_per_pixel;
    return bits == 15 || bits == 16 ? 4 : 8;
}

uint32_t Permedia2Dispatch(uint32_t command, uintptr_t argument)
{
    switch (command) {
    case CMD_INIT_CHIP: return InitChip();
    case CMD_OPEN_IO: return OpenRegisterAccess();
    case CMD_CLOSE_IO: return CloseRegisterAccess();
    case CMD_GET_HTOTAL: return ReadField(&permedia2_crtc, &horizontal_total) + 5;
    case CMD_GET_VTOTAL: return ReadField(&permedia2_crtc, &vertical_total) + 2;
    case CMD_GET_CHAR_WIDTH: return CharacterWidth();
    case CMD_WRITE_PORT: return ChipOutByte(&permedia2_ports, (uint16_t)argument, (uint8_t)(argument >> 16));
    case CMD_READ_PORT: return ChipInByte(&permedia2_ports, (uint16_t)argument);
    case CMD_GET_MEM_SIZE: return MemorySize();
    case CMD_PREPARE_MODE: return PrepareMode((ChipModeRecord*)argument);
    case CMD_HIDE_PAGE: return argument == PAGE_MONITOR ? 1 : 0;
    case CMD_GET_AGP_RATE: return 1;
    }
    return 0;
}

// SR08 = 0x06 opens the extended sequencer registers.
static SynthSetting ReadClock()
{
    WriteSeq(SR08_UNLOCK, sr08_unlock_key);
    return {.m = (uint16_t)ReadField(&permedia2_sequencer, &dclk_m),
            .n = (uint16_t)ReadField(&permedia2_sequencer, &dclk_n),
            .r = (uint16_t)ReadField(&permedia2_sequencer, &dclk_r)};
}

double Permedia2GetPixelClock() { return SynthFrequency(&permedia2_dclk, ReadClock()); }

uint32_t Permedia2SetPixelClock(double hz)
{
    SynthSetting s = ReadClock();
    if (!SearchSynthesizer(&permedia2_dclk, hz, &s)) return 0;
    const RegFieldValue values[] = {
        {.field = &dclk_m, .value = s.m}, {.field = &dclk_n, .value = s.n}, {.field = &dclk_r, .value = s.r}};
    WriteSeq(SR08_UNLOCK, sr08_unlock_key);
    WriteFields(&permedia2_sequencer, values, 3);
    return 1;
}
