// The S3 family: Trio32/64/64V2, Trio3D and Trio3D/2X, ViRGE, ViRGE/VX,
// DX/GX, GX2 and Savage3D, all through the VGA sequencer and CRT controller
// and the S3 extensions behind them.
#include <math.h>
#include <string.h>

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chip_io.h"
#include "chips/chips.h"
#include "chips/s3.h"
#include "chips/synth.h"
#include "hardware/register_access.h"

// VGA port p lies at 0x8000 + p of the register window.
static const ChipPortWindow s3_ports = {true, 1, 0, 0, 0x8000};
static const RegisterWindowPlace s3_window = {0x10, 0xFC000000u, 0x01000000u};
static const RegisterWindowPlace savage3d_window = {0x10, 0xF8000000u, 0x01000000u};

enum : uint8_t {
    SR01_CLOCKING = 0x01,
    SR08_UNLOCK = 0x08,
    SR0D_SYNC = 0x0D,
    SR10_MCLK_NR = 0x10,
    SR11_MCLK_M = 0x11,
    SR12_DCLK_NR = 0x12,
    SR13_DCLK_M = 0x13,
    SR18_RAMDAC = 0x18,
    SR29_DCLK_HIGH = 0x29,
    CR00_HTOTAL = 0x00,
    CR06_VTOTAL = 0x06,
    CR07_OVERFLOW = 0x07,
    CR36_CONFIG1 = 0x36,
    CR37_CONFIG2 = 0x37,
    CR42_MODE = 0x42,
    CR43_EXT_MODE = 0x43,
    CR5D_EXT_HORZ = 0x5D,
    CR5E_EXT_VERT = 0x5E,
    CR5F_SAVAGE_HORZ = 0x5F,
};

static const uint8_t sr08_unlock_key = 0x06;
static const uint8_t sr01_screen_off = 0x20;
static const uint8_t sr18_clock_doubled = 0x80;
static const uint8_t cr37_agp = 0x40;
static const uint8_t cr42_interlaced = 0x20;
static const uint8_t cr43_double_horizontal = 0x80;
static const uint8_t sr0d_sync_mask = 0xF0;
static const uint8_t sr29_kept = 0xE3;

// How the DCLK synthesizer fields are packed into SR12 (and SR29).
enum S3ClockLayout {
    CLOCK_R_3BITS,    // SR12: N 4..0, R 7..5
    CLOCK_R_2BITS,    // SR12: N 4..0, R 6..5
    CLOCK_SAVAGE3D,   // SR12: N 5..0, R 7..6; SR13 all M; high bits in SR29
};

// Memory straps in CR36 bits 7..5, decoded per chip.
enum S3MemoryCode { MEMORY_SAVAGE3D, MEMORY_VIRGE_VX, MEMORY_STANDARD };

struct S3Chip {
    uint16_t device_id;
    double vco_min_mhz, vco_max_mhz;
    uint16_t m_max, n_min, n_max, r_max;
    uint32_t init_result;
    uint32_t agp_rate;
    S3ClockLayout layout;
    S3MemoryCode memory;
};

static const S3Chip s3_chips[] = {
    {0x8a20, 220, 550, 511, 1, 127, 4, 0, 2, CLOCK_SAVAGE3D, MEMORY_SAVAGE3D},
    {0x8a21, 220, 550, 511, 1, 127, 4, 0, 2, CLOCK_SAVAGE3D, MEMORY_SAVAGE3D},
    {0x883d, 220, 440, 127, 0, 31, 4, 0, 0, CLOCK_R_3BITS, MEMORY_VIRGE_VX},
    {0x8901, 140, 340, 127, 1, 31, 4, 0, 0, CLOCK_R_3BITS, MEMORY_STANDARD},
    {0x8a01, 140, 340, 127, 1, 31, 4, 0, 0, CLOCK_R_3BITS, MEMORY_STANDARD},
    {0x8a10, 140, 340, 127, 1, 31, 4, 0, 1, CLOCK_R_3BITS, MEMORY_STANDARD},
    {0x8904, 140, 340, 127, 1, 31, 4, 0, 1, CLOCK_R_3BITS, MEMORY_STANDARD},
    {0x8a13, 135, 270, 127, 1, 31, 3, CHIP_CAP_NO_CLOCK_REFRESH, 2, CLOCK_R_3BITS, MEMORY_STANDARD},
    {0x5631, 135, 270, 127, 1, 31, 3, 0, 0, CLOCK_R_2BITS, MEMORY_STANDARD},
    {0x8811, 135, 270, 127, 1, 31, 3, 0, 0, CLOCK_R_2BITS, MEMORY_STANDARD},
};
// Any other S3 id: the older chips' limits.
static const S3Chip s3_other_chip = {0, 135, 270, 127, 1, 31, 3, 0, 0, CLOCK_R_3BITS, MEMORY_STANDARD};

// The memory clock has fixed limits on every chip: VCO 135 to 270 MHz.
static const SynthLimits s3_mclk_limits = {14.31818, 2, 2, 1, 127, 1, 31, 0, 3, 135.0, 270.0};

// DPMS sync control values of SR0D bits 7..4, by command code.
struct S3DpmsState {
    uint32_t command;
    uint8_t sync_bits;
};
static const S3DpmsState s3_dpms_states[] = {
    {CMD_DPMS_ON, 0x00},       // both syncs running
    {CMD_DPMS_STANDBY, 0x20},  // horizontal sync off
    {CMD_DPMS_SUSPEND, 0x80},  // vertical sync off
    {CMD_DPMS_OFF, 0xA0},      // both off
};

// Megabytes per CR36 strap value.
static const uint8_t savage3d_memory_mb[4] = {8, 4, 4, 2};
static const uint8_t virge_vx_memory_mb[4] = {2, 4, 6, 8};
static const uint8_t standard_memory_mb[8] = {4, 0, 4, 0, 2, 0, 1, 0};

// Pixel clock limits loaded by CMD_INIT_CHIP, shared by every S3 adapter.
static SynthLimits s3_dclk_limits = {reference_crystal_hz, 2, 2, 1, 127, 1, 31, 0, 3, 135e6, 270e6};

static const S3Chip* CurrentChip()
{
    uint16_t id = CurrentAdapter()->device_id;
    for (const S3Chip& chip : s3_chips)
        if (chip.device_id == id) return &chip;
    return &s3_other_chip;
}

static uint8_t ReadSeq(uint8_t index) { return ChipReadIndexed(&s3_ports, VGA_SEQ_INDEX, index); }
static void WriteSeq(uint8_t index, uint8_t value) { ChipWriteIndexed(&s3_ports, VGA_SEQ_INDEX, index, value); }
static uint8_t ReadCrtc(uint8_t index) { return ChipReadIndexed(&s3_ports, VGA_CRTC_INDEX, index); }

// SR08 = 0x06 opens the extended sequencer registers SR09 and above.
static void UnlockExtendedSequencer() { WriteSeq(SR08_UNLOCK, sr08_unlock_key); }

static uint32_t SetDpms(uint32_t command)
{
    uint8_t sync_bits = 0;
    for (const S3DpmsState& s : s3_dpms_states)
        if (s.command == command) sync_bits = s.sync_bits;
    if (!OpenRegisterAccess()) return 0;
    WriteSeq(SR08_UNLOCK, (uint8_t)((ReadSeq(SR08_UNLOCK) & 0xF0) | sr08_unlock_key));
    WriteSeq(SR0D_SYNC, (uint8_t)((ReadSeq(SR0D_SYNC) & ~sr0d_sync_mask) | sync_bits));
    CloseRegisterAccess();
    return 1;
}

static uint32_t InitChip()
{
    const S3Chip* chip = CurrentChip();
    s3_dclk_limits.m_max = chip->m_max;
    s3_dclk_limits.n_min = chip->n_min;
    s3_dclk_limits.n_max = chip->n_max;
    s3_dclk_limits.r_max = chip->r_max;
    s3_dclk_limits.vco_min = chip->vco_min_mhz * 1e6;
    s3_dclk_limits.vco_max = chip->vco_max_mhz * 1e6;
    if (chip->layout == CLOCK_SAVAGE3D && platform == PLATFORM_9X) {
        OpenRegisterAccess();
        uint8_t cr37 = ReadCrtc(CR37_CONFIG2);
        CloseRegisterAccess();
        return (cr37 & cr37_agp) ? CHIP_CAP_AGP : 0;
    }
    return chip->init_result;
}

static uint32_t HorizontalTotal()
{
    uint32_t t = ReadCrtc(CR00_HTOTAL) + 256u * (ReadCrtc(CR5D_EXT_HORZ) & 1);
    if (CurrentChip()->layout == CLOCK_SAVAGE3D) t += 512u * (ReadCrtc(CR5F_SAVAGE_HORZ) & 3);
    if (ReadCrtc(CR43_EXT_MODE) & cr43_double_horizontal) t *= 2;
    return t + 5;
}

static uint32_t VerticalTotal()
{
    uint8_t overflow = ReadCrtc(CR07_OVERFLOW);
    return ReadCrtc(CR06_VTOTAL) + 256u * (overflow & 1) + 512u * ((overflow >> 5) & 1) +
           1024u * (ReadCrtc(CR5E_EXT_VERT) & 1) + 2;
}

static uint32_t CharacterWidth()
{
    uint16_t bits = CurrentAdapter()->bits_per_pixel;
    return bits == 15 || bits == 16 ? 4 : 8;
}

static uint32_t MemorySize()
{
    OpenRegisterAccess();
    uint8_t straps = (uint8_t)(ReadCrtc(CR36_CONFIG1) >> 5);
    CloseRegisterAccess();
    uint32_t mb;
    switch (CurrentChip()->memory) {
    case MEMORY_SAVAGE3D: mb = savage3d_memory_mb[(straps & 6) >> 1]; break;
    case MEMORY_VIRGE_VX: mb = virge_vx_memory_mb[straps & 3]; break;
    default: mb = standard_memory_mb[straps & 7]; break;
    }
    return mb << 16;
}

// The 9x display driver takes the refresh rate from its mode key.
static uint32_t PrepareMode() { return platform == PLATFORM_9X ? PREPARE_REFRESH_KEY : 0; }

static uint32_t IsInterlaced()
{
    OpenRegisterAccess();
    uint8_t mode = ReadCrtc(CR42_MODE);
    CloseRegisterAccess();
    return (mode & cr42_interlaced) ? 1 : 0;
}

static SynthSetting ReadMemoryClockFields()
{
    UnlockExtendedSequencer();
    uint8_t sr10 = ReadSeq(SR10_MCLK_NR);
    SynthSetting s = {(uint16_t)(ReadSeq(SR11_MCLK_M) & 0x7F), (uint16_t)(sr10 & 0x1F), (uint16_t)((sr10 >> 5) & 3)};
    return s;
}

static uint32_t GetMemoryClock()
{
    if (!OpenRegisterAccess()) return 0;
    SynthSetting s = ReadMemoryClockFields();
    CloseRegisterAccess();
    if (s.m == 0) return 0;
    return (uint32_t)trunc(SynthFrequency(&s3_mclk_limits, s) + 0.5);
}

static uint32_t SetMemoryClock(uint32_t mhz)
{
    if (!OpenRegisterAccess()) return 0;
    SynthSetting s = ReadMemoryClockFields();
    if (!SearchSynthesizer(&s3_mclk_limits, (double)mhz, &s)) {
        CloseRegisterAccess();
        return 0;
    }
    UnlockExtendedSequencer();
    WriteSeq(SR11_MCLK_M, (uint8_t)(s.m | (ReadSeq(SR11_MCLK_M) & 0x80)));
    WriteSeq(SR10_MCLK_NR, (uint8_t)(s.n | s.r << 5 | (ReadSeq(SR10_MCLK_NR) & 0x80)));
    CloseRegisterAccess();
    return GetMemoryClock();
}

uint32_t S3Dispatch(uint32_t command, uintptr_t argument)
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
    case CMD_GET_VTOTAL: return VerticalTotal();
    case CMD_GET_CHAR_WIDTH: return CharacterWidth();
    case CMD_WRITE_PORT: return ChipOutByte(&s3_ports, (uint16_t)argument, (uint8_t)(argument >> 16));
    case CMD_READ_PORT: return ChipInByte(&s3_ports, (uint16_t)argument);
    case CMD_GET_MEM_SIZE: return MemorySize();
    case CMD_PREPARE_MODE: return PrepareMode();
    case CMD_MAP_REGISTERS:
        return MapRegisterWindow(CurrentChip()->layout == CLOCK_SAVAGE3D ? &savage3d_window : &s3_window);
    case CMD_IS_INTERLACED: return IsInterlaced();
    case CMD_GET_MCLK: return GetMemoryClock();
    case CMD_SET_MCLK: return SetMemoryClock((uint32_t)argument);
    case CMD_GET_AGP_RATE: return CurrentChip()->agp_rate;
    case CMD_HAS_DPMS: return 1;
    }
    return 0;
}

static SynthSetting ReadPixelClockFields()
{
    UnlockExtendedSequencer();
    uint8_t sr12 = ReadSeq(SR12_DCLK_NR);
    uint8_t sr13 = ReadSeq(SR13_DCLK_M);
    SynthSetting s;
    switch (CurrentChip()->layout) {
    case CLOCK_SAVAGE3D: {
        uint8_t sr29 = ReadSeq(SR29_DCLK_HIGH);
        s.m = (uint16_t)(sr13 + 256 * ((sr29 >> 3) & 1));
        s.n = (uint16_t)((sr12 & 0x3F) + 64 * ((sr29 >> 4) & 1));
        s.r = (uint16_t)(((sr12 >> 6) & 3) + 4 * ((sr29 >> 2) & 1));
        break;
    }
    case CLOCK_R_2BITS:
        s.m = sr13 & 0x7F;
        s.n = sr12 & 0x1F;
        s.r = (sr12 >> 5) & 3;
        break;
    default:
        s.m = sr13 & 0x7F;
        s.n = sr12 & 0x1F;
        s.r = (sr12 >> 5) & 7;
        break;
    }
    return s;
}

// SR18 bit 7: above 8 bits per pixel the DCLK runs at twice the CRT rate.
static bool ClockDoubled()
{
    return CurrentAdapter()->bits_per_pixel != 8 && (ReadSeq(SR18_RAMDAC) & sr18_clock_doubled);
}

double S3GetPixelClock()
{
    SynthSetting s = ReadPixelClockFields();
    double hz = SynthFrequency(&s3_dclk_limits, s);
    return ClockDoubled() ? hz / 2 : hz;
}

static void WriteSavage3DClock(SynthSetting s)
{
    uint8_t clocking = ReadSeq(SR01_CLOCKING);
    // Blank the screen while the synthesizer fields are inconsistent.
    WriteSeq(SR01_CLOCKING, (uint8_t)(clocking | sr01_screen_off));
    uint8_t high = ReadSeq(SR29_DCLK_HIGH) & sr29_kept;
    if (s.m >= 256) { s.m -= 256; high |= 0x08; }
    if (s.n >= 64) { s.n -= 64; high |= 0x10; }
    if (s.r >= 4) { s.r -= 4; high |= 0x04; }
    WriteSeq(SR29_DCLK_HIGH, high);
    WriteSeq(SR13_DCLK_M, (uint8_t)s.m);
    WriteSeq(SR12_DCLK_NR, (uint8_t)(s.n | s.r << 6));
    WriteSeq(SR01_CLOCKING, clocking);
}

uint32_t S3SetPixelClock(double hz)
{
    if (ClockDoubled()) hz *= 2;
    SynthSetting s = ReadPixelClockFields();
    if (!SearchSynthesizer(&s3_dclk_limits, hz, &s)) return 0;
    UnlockExtendedSequencer();
    if (CurrentChip()->layout == CLOCK_SAVAGE3D) {
        WriteSavage3DClock(s);
    } else {
        WriteSeq(SR13_DCLK_M, (uint8_t)(s.m | (ReadSeq(SR13_DCLK_M) & 0x80)));
        WriteSeq(SR12_DCLK_NR, (uint8_t)(s.n | s.r << 5));
    }
    return 1;
}
