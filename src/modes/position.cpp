// The picture is moved by the CRT controller's horizontal and vertical
// retrace start alone; blank, retrace end and totals stay as the mode set them.
#include "modes/position.h"

#include <windows.h>

#include "base/adapters.h"
#include "base/settings.h"
#include "chips/chip_io.h"
#include "chips/chips.h"

int adjust_offset_h, adjust_offset_v;


enum : uint8_t {
    CR02_HBLANK_START = 0x02,
    CR04_HRETRACE_START = 0x04,
    CR07_OVERFLOW = 0x07,
    CR09_MAX_SCAN_LINE = 0x09,
    CR10_VRETRACE_START = 0x10,
    CR11_VRETRACE_END = 0x11,
    CR15_VBLANK_START = 0x15,
};

static const uint8_t cr07_vretrace_bit8 = 0x04;
static const uint8_t cr07_vblank_bit8 = 0x08;
static const uint8_t cr07_vretrace_bit9 = 0x80;
static const uint8_t cr09_vblank_bit9 = 0x20;
static const uint8_t cr11_write_protect = 0x80;

static const unsigned hretrace_highest = 0xFF;    // CR04 alone
static const unsigned vretrace_highest = 0x3FF;   // CR10 + two overflow bits

// The stored V value is CR10 + 256 * CR07, so CR07's retrace bits 2 and 7
// sit at bits 10 and 15 of it.
static const uint32_t stored_v_retrace_bits = 0x8400;
static const uint8_t cr07_kept_on_restore = 0x7B;
static const int32_t stored_h_highest = 255;
static const int32_t stored_v_highest = 65535;

static uint8_t ReadCrtc(uint8_t index)
{
    chip_write_port(VGA_CRTC_INDEX, index);
    return (uint8_t)chip_read_port(VGA_CRTC_DATA);
}

static void WriteCrtc(uint8_t index, uint8_t value)
{
    chip_write_port(VGA_CRTC_INDEX, index);
    chip_write_port(VGA_CRTC_DATA, value);
}

// CR11 bit 7 write-protects CR00-CR07; clear it before moving the retrace.
// Returns CR11 as it was, for RelockCrtc.
static uint8_t UnlockCrtc()
{
    uint8_t cr11 = ReadCrtc(CR11_VRETRACE_END);
    WriteCrtc(CR11_VRETRACE_END, (uint8_t)(cr11 & ~cr11_write_protect));
    return cr11;
}

static void RelockCrtc(uint8_t cr11) { WriteCrtc(CR11_VRETRACE_END, cr11); }

int StepDelta(StepDirection direction) { return direction == STEP_LEFT || direction == STEP_UP ? 1 : -1; }

bool StepIsVertical(StepDirection direction) { return direction == STEP_UP || direction == STEP_DOWN; }

int SteppedRetraceStart(unsigned retrace, unsigned blank, int delta, unsigned highest)
{
    unsigned next = (retrace + (unsigned)delta) & 0xFFFF;
    if (next < blank || next > highest) return -1;
    return (int)next;
}

bool OffsetMayStep(int offset, int delta)
{
    return delta > 0 ? offset <= OFFSET_LIMIT - 1 : offset >= -(OFFSET_LIMIT - 1);
}

bool DirectionOfKey(unsigned virtual_key, StepDirection* direction)
{
    switch (virtual_key) {
    case VK_LEFT: *direction = STEP_LEFT; return true;
    case VK_RIGHT: *direction = STEP_RIGHT; return true;
    case VK_UP: *direction = STEP_UP; return true;
    case VK_DOWN: *direction = STEP_DOWN; return true;
    }
    return false;
}

// One vertical step on the working copy of CR07; false when refused.
static bool StepVertical(int delta, uint8_t* overflow)
{
    unsigned blank = ReadCrtc(CR15_VBLANK_START);
    if (*overflow & cr07_vblank_bit8) blank |= 0x100;
    if (ReadCrtc(CR09_MAX_SCAN_LINE) & cr09_vblank_bit9) blank |= 0x200;
    unsigned retrace = ReadCrtc(CR10_VRETRACE_START);
    if (*overflow & cr07_vretrace_bit8) retrace |= 0x100;
    if (*overflow & cr07_vretrace_bit9) retrace |= 0x200;

    int next = SteppedRetraceStart(retrace, blank, delta, vretrace_highest);
    if (next < 0) return false;
    *overflow &= (uint8_t)~(cr07_vretrace_bit8 | cr07_vretrace_bit9);
    if (next & 0x200) *overflow |= cr07_vretrace_bit9;
    if (next & 0x100) *overflow |= cr07_vretrace_bit8;
    WriteCrtc(CR10_VRETRACE_START, (uint8_t)next);
    WriteCrtc(CR07_OVERFLOW, *overflow);
    return true;
}

static bool StepHorizontal(int delta)
{
    unsigned blank = ReadCrtc(CR02_HBLANK_START);
    unsigned retrace = ReadCrtc(CR04_HRETRACE_START);
    int next = SteppedRetraceStart(retrace, blank, delta, hretrace_highest);
    if (next < 0) return false;
    WriteCrtc(CR04_HRETRACE_START, (uint8_t)next);
    return true;
}

int StepPicture(StepDirection direction, int count)
{
    if (count <= 0) return 0;
    // Not offered on this chip: a position moved here would never be restored.
    if (CurrentAdapter()->flags & ADAPTER_NO_ADJUST) return 0;
    // Without register access every read answers 0 and every write is
    // lost: report no step rather than steps that never happened.
    if (!chip_open_io()) return 0;
    uint8_t cr11 = UnlockCrtc();
    uint8_t overflow = ReadCrtc(CR07_OVERFLOW);
    int delta = StepDelta(direction);
    int done = 0;
    while (done < count) {
        bool taken = StepIsVertical(direction) ? StepVertical(delta, &overflow) : StepHorizontal(delta);
        if (!taken) break;
        ++done;
    }
    RelockCrtc(cr11);
    chip_close_io();
    return done;
}

void UndoOffsets(int horizontal, int vertical)
{
    if (horizontal > 0) StepPicture(STEP_RIGHT, horizontal);
    if (horizontal < 0) StepPicture(STEP_LEFT, -horizontal);
    if (vertical > 0) StepPicture(STEP_DOWN, vertical);
    if (vertical < 0) StepPicture(STEP_UP, -vertical);
}

StepOutcome StepWithinLimit(StepDirection direction, int* horizontal, int* vertical)
{
    int* offset = StepIsVertical(direction) ? vertical : horizontal;
    int delta = StepDelta(direction);
    if (!OffsetMayStep(*offset, delta)) return STEP_AT_LIMIT;
    if (StepPicture(direction, 1) != 1) return STEP_REFUSED;
    *offset += delta;
    return STEP_TAKEN;
}

void SavePosition(int horizontal, int vertical)
{
    if (horizontal == 0 && vertical == 0) return;
    // Registers that cannot be read would store 0, which deletes the value.
    if (!chip_open_io()) return;
    int32_t h = horizontal != 0 ? ReadCrtc(CR04_HRETRACE_START) : 0;
    int32_t v = 0;
    if (vertical != 0) {
        v = ReadCrtc(CR10_VRETRACE_START);
        v += 256 * ReadCrtc(CR07_OVERFLOW);
    }
    chip_close_io();
    if (horizontal != 0) SaveSetting(SETTING_POSITION_H, h);
    if (vertical != 0) SaveSetting(SETTING_POSITION_V, v);
}

void ResetPosition()
{
    UndoOffsets(adjust_offset_h, adjust_offset_v);
    adjust_offset_h = 0;
    adjust_offset_v = 0;
    // A value below 1 deletes a stored position.
    SaveSetting(SETTING_POSITION_H, 0);
    SaveSetting(SETTING_POSITION_V, 0);
}

int RestorePosition()
{
    if (CurrentAdapter()->flags & ADAPTER_NO_ADJUST) return 1;
    int32_t h = LoadSetting(SETTING_POSITION_H);
    int32_t v = LoadSetting(SETTING_POSITION_V);
    if (h < 1 && v < 1) return 1;
    if (!chip_open_io()) return 1;
    uint8_t cr11 = UnlockCrtc();
    if (h >= 1 && h <= stored_h_highest) WriteCrtc(CR04_HRETRACE_START, (uint8_t)h);
    if (v >= 1 && v <= stored_v_highest) {
        WriteCrtc(CR10_VRETRACE_START, (uint8_t)v);
        uint8_t overflow = ReadCrtc(CR07_OVERFLOW);
        WriteCrtc(CR07_OVERFLOW, (uint8_t)((overflow & cr07_kept_on_restore) | ((v & stored_v_retrace_bits) >> 8)));
    }
    RelockCrtc(cr11);
    chip_close_io();
    return 1;
}
