// The S3 family: Trio32/64/64V2, Trio3D and Trio3D/2X, ViRGE, ViRGE/VX,
// DX/GX, GX2 and Savage3D, all through the VGA sequencer and CRT controller
// and the S3 extensions behind them.
#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/state.h"
#include "chips/chip_io.h"
#include "chips/chips.h"
#include "chips/reg_field.h"
#include "chips/s3.h"
#include "chips/synth.h"
#include "hardware/register_access.h"

// VGA port p lies at 0x8000 + p of the register window.
static const ChipPortWindow s3_ports = {
    .windowed = true, .low_first = 1, .low_last = 0, .low_offset = 0, .offset = 0x8000};
static const RegisterWindowPlace s3_window = {.config_offset = 0x10, .mask = 0xFC000000u, .added = 0x01000000u};
static const RegisterWindowPlace savage3d_window = {.config_offset = 0x10, .mask = 0xF8000000u, .added = 0x01000000u};

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

static const RegField horizontal_total = {{CR00_HTOTAL, 0, 7}, {CR5D_EXT_HORZ, 0, 0}};
static const RegField savage3d_horizontal_total = {
    {CR00_HTOTAL, 0, 7}, {CR5D_EXT_HORZ, 0, 0}, {CR5F_SAVAGE_HORZ, 0, 1}};
static const RegField vertical_total = {
    {CR06_VTOTAL, 0, 7}, {CR07_OVERFLOW, 0, 0}, {CR07_OVERFLOW, 5, 5}, {CR5E_EXT_VERT, 0, 0}};

// A synthesizer's M, N and R in the sequencer, and how a new setting is
// written: bits of `cleared` go to 0 with it, the registers of `first` lead.
struct S3ClockFields {
    RegField m, n, r;
    RegField cleared = {};
    uint8_t first[1] = {};
    uint8_t first_count = 0;
    bool screen_off = false;  // blanks the screen while the fields disagree
};

static const S3ClockFields s3_mclk = {
    .m = {{SR11_MCLK_M, 0, 6}},
    .n = {{SR10_MCLK_NR, 0, 4}},
    .r = {{SR10_MCLK_NR, 5, 6}},
};
static const S3ClockFields dclk_r_3bits = {
    .m = {{SR13_DCLK_M, 0, 6}},
    .n = {{SR12_DCLK_NR, 0, 4}},
    .r = {{SR12_DCLK_NR, 5, 7}},
};
// ViRGE and Trio32/64: SR12 is written whole, bit 7 clear.
static const S3ClockFields dclk_r_2bits = {
    .m = {{SR13_DCLK_M, 0, 6}},
    .n = {{SR12_DCLK_NR, 0, 4}},
    .r = {{SR12_DCLK_NR, 5, 6}},
    .cleared = {{SR12_DCLK_NR, 7, 7}},
};
static const S3ClockFields dclk_savage3d = {
    .m = {{SR13_DCLK_M, 0, 7}, {SR29_DCLK_HIGH, 3, 3}},
    .n = {{SR12_DCLK_NR, 0, 5}, {SR29_DCLK_HIGH, 4, 4}},
    .r = {{SR12_DCLK_NR, 6, 7}, {SR29_DCLK_HIGH, 2, 2}},
    .first = {SR29_DCLK_HIGH},
    .first_count = 1,
    .screen_off = true,
};

// The memory straps in CR36 and the megabytes of each value.
struct S3MemoryStraps {
    RegField straps;
    const uint8_t* mb;
};
static const uint8_t savage3d_memory_mb[4] = {8, 4, 4, 2};
static const uint8_t virge_vx_memory_mb[4] = {2, 4, 6, 8};
static const uint8_t standard_memory_mb[8] = {4, 0, 4, 0, 2, 0, 1, 0};
static const S3MemoryStraps savage3d_memory = {.straps = {{CR36_CONFIG1, 6, 7}}, .mb = savage3d_memory_mb};
static const S3MemoryStraps virge_vx_memory = {.straps = {{CR36_CONFIG1, 5, 6}}, .mb = virge_vx_memory_mb};
static const S3MemoryStraps standard_memory = {.straps = {{CR36_CONFIG1, 5, 7}}, .mb = standard_memory_mb};

// Pixel clock synthesizer limits: a = b = 2, M from 1, R from 0.
static constexpr SynthLimits savage3d_dclk = {.fref_hz = reference_crystal_hz, .a = 2, .b = 2, .m_min = 1, .m_max = 511,
                                          .n_min = 1, .n_max = 127, .r_min = 0, .r_max = 4,
                                          .vco_min_hz = 220e6, .vco_max_hz = 550e6};
static constexpr SynthLimits virge_vx_dclk = {.fref_hz = reference_crystal_hz, .a = 2, .b = 2, .m_min = 1, .m_max = 127,
                                          .n_min = 0, .n_max = 31, .r_min = 0, .r_max = 4,
                                          .vco_min_hz = 220e6, .vco_max_hz = 440e6};
static constexpr SynthLimits newer_dclk = {.fref_hz = reference_crystal_hz, .a = 2, .b = 2, .m_min = 1, .m_max = 127,
                                       .n_min = 1, .n_max = 31, .r_min = 0, .r_max = 4,
                                       .vco_min_hz = 140e6, .vco_max_hz = 340e6};
static constexpr SynthLimits older_dclk = {.fref_hz = reference_crystal_hz, .a = 2, .b = 2, .m_min = 1, .m_max = 127,
                                       .n_min = 1, .n_max = 31, .r_min = 0, .r_max = 3,
                                       .vco_min_hz = 135e6, .vco_max_hz = 270e6};
// The memory clock has the same limits on every chip.
static constexpr SynthLimits s3_mclk_limits = older_dclk;

// What tells the S3 chips apart; a row names only what differs from the
// older chips' defaults.
struct S3Chip {
    uint16_t device_id;
    const SynthLimits* dclk_limits = &older_dclk;
    const S3ClockFields* dclk = &dclk_r_3bits;
    const RegField* htotal = &horizontal_total;
    const S3MemoryStraps* memory = &standard_memory;
    const RegisterWindowPlace* window = &s3_window;
    uint32_t init_result = 0;
    bool agp_strap = false;  // on Windows 9x CR37 tells an AGP card
    uint32_t agp_rate = 0;
};

static const S3Chip s3_chips[] = {
    {.device_id = 0x8a20, .dclk_limits = &savage3d_dclk, .dclk = &dclk_savage3d, .htotal = &savage3d_horizontal_total,
     .memory = &savage3d_memory, .window = &savage3d_window, .agp_strap = true, .agp_rate = 2},
    {.device_id = 0x8a21, .dclk_limits = &savage3d_dclk, .dclk = &dclk_savage3d, .htotal = &savage3d_horizontal_total,
     .memory = &savage3d_memory, .window = &savage3d_window, .agp_strap = true, .agp_rate = 2},
    {.device_id = 0x883d, .dclk_limits = &virge_vx_dclk, .memory = &virge_vx_memory},
    {.device_id = 0x8901, .dclk_limits = &newer_dclk},
    {.device_id = 0x8a01, .dclk_limits = &newer_dclk},
    {.device_id = 0x8a10, .dclk_limits = &newer_dclk, .agp_rate = 1},
    {.device_id = 0x8904, .dclk_limits = &newer_dclk, .agp_rate = 1},
    {.device_id = 0x8a13, .init_result = CHIP_CAP_NO_CLOCK_REFRESH, .agp_rate = 2},
    {.device_id = 0x5631, .dclk = &dclk_r_2bits},
    {.device_id = 0x8811, .dclk = &dclk_r_2bits},
};
// Any other S3 id: the older chips.
static const S3Chip s3_other_chip = {.device_id = 0};

// DPMS sync control values of SR0D bits 7..4, by command code.
struct S3DpmsState {
    uint32_t command;
    uint8_t sync_bits;
};
static const S3DpmsState s3_dpms_states[] = {
    {.command = CMD_DPMS_ON, .sync_bits = 0x00},       // both syncs running
    {.command = CMD_DPMS_STANDBY, .sync_bits = 0x20},  // horizontal sync off
    {.command = CMD_DPMS_SUSPEND, .sync_bits = 0x80},  // vertical sync off
    {.command = CMD_DPMS_OFF, .sync_bits = 0xA0},      // both off
};

// Pixel clock limits loaded by CMD_INIT_CHIP, shared by every S3 adapter.
static const SynthLimits* s3_dclk_limits = &older_dclk;

static void ResetS3() { s3_dclk_limits = &older_dclk; }
VISTREL_MODULE_RESET(ResetS3);

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
static void WriteCrtc(uint8_t index, uint8_t value) { ChipWriteIndexed(&s3_ports, VGA_CRTC_INDEX, index, value); }
static const RegAccess s3_sequencer = {.read = ReadSeq, .write = WriteSeq};
static const RegAccess s3_crtc = {.read = ReadCrtc, .write = WriteCrtc};

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
    s3_dclk_limits = chip->dclk_limits;
    if (chip->agp_strap && platform == PLATFORM_9X) {
        OpenRegisterAccess();
        uint8_t cr37 = ReadCrtc(CR37_CONFIG2);
        CloseRegisterAccess();
        return (cr37 & cr37_agp) ? CHIP_CAP_AGP : 0;
    }
    return chip->init_result;
}

static uint32_t HorizontalTotal()
{
    uint32_t t = ReadField(&s3_crtc, CurrentChip()->htotal);
    if (ReadCrtc(CR43_EXT_MODE) & cr43_double_horizontal) t *= 2;
    return t + 5;
}

static uint32_t VerticalTotal() { return ReadField(&s3_crtc, &vertical_total) + 2; }

static uint32_t CharacterWidth()
{
    uint16_t bits = CurrentAdapter()->bits_per_pixel;
    return bits == 15 || bits == 16 ? 4 : 8;
}

static uint32_t MemorySize()
{
    // Without register access CR36 reads 0, which would pass for a size.
    if (!OpenRegisterAccess()) return 0;
    const S3MemoryStraps* memory = CurrentChip()->memory;
    uint32_t straps = ReadField(&s3_crtc, &memory->straps);
    CloseRegisterAccess();
    return (uint32_t)memory->mb[straps] << 16;
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

// The extended sequencer must be unlocked.
static SynthSetting ReadClock(const S3ClockFields* f)
{
    return {.m = (uint16_t)ReadField(&s3_sequencer, &f->m),
            .n = (uint16_t)ReadField(&s3_sequencer, &f->n),
            .r = (uint16_t)ReadField(&s3_sequencer, &f->r)};
}

// Writes a setting found by the search, each register once.
static void CommitClock(const S3ClockFields* f, SynthSetting s)
{
    const RegFieldValue values[] = {
        {.field = &f->m, .value = s.m}, {.field = &f->n, .value = s.n},
        {.field = &f->r, .value = s.r}, {.field = &f->cleared, .value = 0}};
    UnlockExtendedSequencer();
    uint8_t clocking = f->screen_off ? ReadSeq(SR01_CLOCKING) : 0;
    // SR01 bit 5 turns the screen off while the synthesizer fields disagree.
    if (f->screen_off) WriteSeq(SR01_CLOCKING, (uint8_t)(clocking | sr01_screen_off));
    WriteFields(&s3_sequencer, values, 4, f->first, f->first_count);
    if (f->screen_off) WriteSeq(SR01_CLOCKING, clocking);
}


static uint32_t GetMemoryClock()
{
    if (!OpenRegisterAccess()) return 0;
    UnlockExtendedSequencer();
    SynthSetting s = ReadClock(&s3_mclk);
    CloseRegisterAccess();
    if (s.m == 0) return 0;
    return WholeMegahertz(SynthFrequency(&s3_mclk_limits, s));
}

static uint32_t SetMemoryClock(uint32_t mhz)
{
    if (!OpenRegisterAccess()) return 0;
    UnlockExtendedSequencer();
    SynthSetting s = ReadClock(&s3_mclk);
    bool fits = SearchSynthesizer(&s3_mclk_limits, mhz * 1e6, &s);
    if (fits) CommitClock(&s3_mclk, s);
    CloseRegisterAccess();
    return fits ? GetMemoryClock() : 0;
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
    case CMD_MAP_REGISTERS: return MapRegisterWindow(CurrentChip()->window);
    case CMD_IS_INTERLACED: return IsInterlaced();
    case CMD_GET_MCLK: return GetMemoryClock();
    case CMD_SET_MCLK: return SetMemoryClock((uint32_t)argument);
    case CMD_GET_AGP_RATE: return CurrentChip()->agp_rate;
    case CMD_HAS_DPMS: return 1;
    }
    return 0;
}

// SR18 bit 7: above 8 bits per pixel the DCLK runs at twice the CRT rate.
// SR18 answers only while the extended sequencer is unlocked.
static bool ClockDoubled()
{
    return CurrentAdapter()->bits_per_pixel != 8 && (ReadSeq(SR18_RAMDAC) & sr18_clock_doubled);
}

double S3GetPixelClock()
{
    UnlockExtendedSequencer();
    double hz = SynthFrequency(s3_dclk_limits, ReadClock(CurrentChip()->dclk));
    return ClockDoubled() ? hz / 2 : hz;
}

uint32_t S3SetPixelClock(double hz)
{
    const S3ClockFields* fields = CurrentChip()->dclk;
    UnlockExtendedSequencer();
    if (ClockDoubled()) hz *= 2;
    SynthSetting s = ReadClock(fields);
    if (!SearchSynthesizer(s3_dclk_limits, hz, &s)) return 0;
    CommitClock(fields, s);
    return 1;
}
