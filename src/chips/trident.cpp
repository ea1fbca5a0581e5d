// The Trident 939a: memory size and type from its configuration registers,
// the monitor's power state through the sequencer, and the refresh rate
// left to the display driver.
#include "chips/trident.h"

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chip_io.h"
#include "chips/chips.h"
#include "chips/reg_field.h"
#include "chips/synth.h"
#include "hardware/register_access.h"

// VGA port p lies at p in the register window.
static const ChipPortWindow trident_ports = {.windowed = true, .low_first = 1, .low_last = 0, .low_offset = 0, .offset = 0};
static const RegisterWindowPlace trident_window = {.config_offset = 0x14, .mask = 0xFFF00000u, .added = 0};

enum : uint8_t {
    SR01_CLOCKING = 0x01,
    SR08_UNLOCK = 0x08,
    SR0D_SYNC = 0x0D,
    SR18_CLOCK_A_M = 0x18,
    SR19_CLOCK_A_NR = 0x19,
    SR1A_CLOCK_B_M = 0x1A,
    SR1B_CLOCK_B_NR = 0x1B,
    CR00_HTOTAL = 0x00,
    CR06_VTOTAL = 0x06,
    CR07_OVERFLOW = 0x07,
    CR0E_MODE = 0x0E,
    CR1F_CONFIG = 0x1F,
    CR27_EXTRA_VERT = 0x27,
    CR2A_MEMORY = 0x2A,
    CR2B_EXTRA_HORZ = 0x2B,
    CR2F_CLOCK_SELECT = 0x2F,
};

static const uint8_t sr08_unlock_key = 0x06;
static const uint8_t sr01_screen_off = 0x20;
static const uint8_t sr0d_sync_mask = 0xF0;
static const uint8_t cr0e_interlaced = 0x04;
static const uint8_t cr2f_clock_a = 0x02;

static const RegField horizontal_total = {{CR00_HTOTAL, 0, 7}, {CR2B_EXTRA_HORZ, 0, 0}};
static const RegField vertical_total = {
    {CR06_VTOTAL, 0, 7}, {CR07_OVERFLOW, 0, 0}, {CR07_OVERFLOW, 5, 5}, {CR27_EXTRA_VERT, 7, 7}};
static const RegField memory_size_code = {{CR1F_CONFIG, 0, 3}};
static const RegField memory_type_code = {{CR2A_MEMORY, 2, 3}};

// One of the two pixel clock synthesizers: M in the first register, N and R
// in the second.
struct TridentClock {
    RegField m, n, r;
};
static const TridentClock clock_a = {
    .m = {{SR18_CLOCK_A_M, 0, 7}}, .n = {{SR19_CLOCK_A_NR, 0, 5}}, .r = {{SR19_CLOCK_A_NR, 6, 7}}};
static const TridentClock clock_b = {
    .m = {{SR1A_CLOCK_B_M, 0, 7}}, .n = {{SR1B_CLOCK_B_NR, 0, 5}}, .r = {{SR1B_CLOCK_B_NR, 6, 7}}};

static constexpr SynthLimits trident_dclk = {.fref_hz = reference_crystal_hz, .a = 8, .b = 2, .m_min = 1, .m_max = 255,
                                             .n_min = 1, .n_max = 31, .r_min = 0, .r_max = 3,
                                             .vco_min_hz = 135e6, .vco_max_hz = 270e6};

// Megabytes by the CR1F size code; codes not listed are not shown.
struct TridentMemorySize {
    uint8_t code, mb;
};
static const TridentMemorySize trident_memory_sizes[] = {
    {.code = 3, .mb = 1}, {.code = 4, .mb = 8}, {.code = 7, .mb = 2}, {.code = 15, .mb = 4}};

// The chip commands' memory type by the CR2A code: none, EDO, SDRAM, SGRAM.
static const uint8_t trident_memory_types[4] = {0, 2, 3, 4};

// DPMS sync control values of SR0D bits 7..4, by command code.
struct TridentDpmsState {
    uint32_t command;
    uint8_t sync_bits;
};
static const TridentDpmsState trident_dpms_states[] = {
    {.command = CMD_DPMS_ON, .sync_bits = 0x00},       // both syncs running
    {.command = CMD_DPMS_STANDBY, .sync_bits = 0x20},  // horizontal sync off
    {.command = CMD_DPMS_SUSPEND, .sync_bits = 0x80},  // vertical sync off
    {.command = CMD_DPMS_OFF, .sync_bits = 0xA0},      // both off
};

static uint8_t ReadSeq(uint8_t index) { return ChipReadIndexed(&trident_ports, VGA_SEQ_INDEX, index); }
static void WriteSeq(uint8_t index, uint8_t value) { ChipWriteIndexed(&trident_ports, VGA_SEQ_INDEX, index, value); }
static uint8_t ReadCrtc(uint8_t index) { return ChipReadIndexed(&trident_ports, VGA_CRTC_INDEX, index); }
static void WriteCrtc(uint8_t index, uint8_t value) { ChipWriteIndexed(&trident_ports, VGA_CRTC_INDEX, index, value); }
static const RegAccess trident_sequencer = {.read = ReadSeq, .write = WriteSeq};
static const RegAccess trident_crtc = {.read = ReadCrtc, .write = WriteCrtc};

static uint32_t SetDpms(uint32_t command)
{
    uint8_t sync_bits = 0;
    for (const TridentDpmsState& s : trident_dpms_states)
        if (s.command == command) sync_bits = s.sync_bits;
    if (!OpenRegisterAccess()) return 0;
    // SR0D answers only behind the key in SR08's low bits.
    WriteSeq(SR08_UNLOCK, (uint8_t)((ReadSeq(SR08_UNLOCK) & 0xF0) | sr08_unlock_key));
    WriteSeq(SR0D_SYNC, (uint8_t)((ReadSeq(SR0D_SYNC) & ~sr0d_sync_mask) | sync_bits));
    CloseRegisterAccess();
    return 1;
}

// A CRT controller field read on its own, opening and closing register
// access; false when access cannot be had.
static bool ReadCrtcFieldAlone(const RegField* field, uint32_t* value)
{
    if (!OpenRegisterAccess()) return false;
    *value = ReadField(&trident_crtc, field);
    CloseRegisterAccess();
    return true;
}

static uint32_t MemorySize()
{
    uint32_t code;
    if (!ReadCrtcFieldAlone(&memory_size_code, &code)) return 0;
    for (const TridentMemorySize& s : trident_memory_sizes)
        if (s.code == code) return (uint32_t)s.mb << 16;
    return 0;
}

static uint32_t MemoryType()
{
    uint32_t code;
    return ReadCrtcFieldAlone(&memory_type_code, &code) ? trident_memory_types[code] : 0;
}

static uint32_t IsInterlaced()
{
    if (!OpenRegisterAccess()) return 0;
    uint8_t mode = ReadCrtc(CR0E_MODE);
    CloseRegisterAccess();
    return (mode & cr0e_interlaced) ? 1 : 0;
}

// The 9x display driver takes the refresh rate from its mode key.
static uint32_t PrepareMode() { return platform == PLATFORM_9X ? PREPARE_REFRESH_KEY : 0; }

uint32_t TridentDispatch(uint32_t command, uintptr_t argument)
{
    switch (command) {
    case CMD_DPMS_ON:
    case CMD_DPMS_STANDBY:
    case CMD_DPMS_SUSPEND:
    case CMD_DPMS_OFF: return SetDpms(command);
    case CMD_INIT_CHIP: return CHIP_CAP_NO_CLOCK_REFRESH;
    case CMD_OPEN_IO: return OpenRegisterAccess();
    case CMD_CLOSE_IO: return CloseRegisterAccess();
    case CMD_GET_HTOTAL: return ReadField(&trident_crtc, &horizontal_total) + 5;
    case CMD_GET_VTOTAL: return ReadField(&trident_crtc, &vertical_total) + 2;
    case CMD_GET_CHAR_WIDTH: return 8;
    case CMD_WRITE_PORT: return ChipOutByte(&trident_ports, (uint16_t)argument, (uint8_t)(argument >> 16));
    case CMD_READ_PORT: return ChipInByte(&trident_ports, (uint16_t)argument);
    case CMD_GET_MEM_SIZE: return MemorySize();
    case CMD_PREPARE_MODE: return PrepareMode();
    case CMD_MAP_REGISTERS: return MapRegisterWindow(&trident_window);
    case CMD_GET_MEM_TYPE: return MemoryType();
    case CMD_IS_INTERLACED: return IsInterlaced();
    }
    return 0;
}

// CR2F bit 1 tells which synthesizer drives the dot clock.
static const TridentClock* CurrentClock() { return (ReadCrtc(CR2F_CLOCK_SELECT) & cr2f_clock_a) ? &clock_a : &clock_b; }

static SynthSetting ReadClock(const TridentClock* c)
{
    return {.m = (uint16_t)ReadField(&trident_sequencer, &c->m),
            .n = (uint16_t)ReadField(&trident_sequencer, &c->n),
            .r = (uint16_t)ReadField(&trident_sequencer, &c->r)};
}

double TridentGetPixelClock() { return SynthFrequency(&trident_dclk, ReadClock(CurrentClock())); }

uint32_t TridentSetPixelClock(double hz)
{
    const TridentClock* c = CurrentClock();
    SynthSetting s = ReadClock(c);
    if (!SearchSynthesizer(&trident_dclk, hz, &s)) return 0;
    const RegFieldValue values[] = {
        {.field = &c->m, .value = s.m}, {.field = &c->n, .value = s.n}, {.field = &c->r, .value = s.r}};
    uint8_t clocking = ReadSeq(SR01_CLOCKING);
    // SR01 bit 5 blanks the screen while the two registers disagree.
    WriteSeq(SR01_CLOCKING, (uint8_t)(clocking | sr01_screen_off));
    WriteFields(&trident_sequencer, values, 3);
    WriteSeq(SR01_CLOCKING, clocking);
    return 1;
}
