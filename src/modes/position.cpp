// The picture is moved by the CRT controller's horizontal and vertical
// retrace start alone; blank, retrace end and totals stay as the mode set them.
#include "modes/position.h"

#include <windows.h>

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/settings.h"
#include "chips/chip_io.h"
#include "chips/chips.h"
#include "chips/reg_field.h"

int adjust_offset_h, adjust_offset_v;

static void ResetPositionState()
{
    adjust_offset_h = 0;
    adjust_offset_v = 0;
}
VISTREL_MODULE_RESET(ResetPositionState);

enum : uint8_t {
    CR02_HBLANK_START = 0x02,
    CR04_HRETRACE_START = 0x04,
    CR07_OVERFLOW = 0x07,
    CR09_MAX_SCAN_LINE = 0x09,
    CR10_VRETRACE_START = 0x10,
    CR11_VRETRACE_END = 0x11,
    CR15_VBLANK_START = 0x15,
};

static constexpr RegField horizontal_blank_start = {{CR02_HBLANK_START, 0, 7}};
static constexpr RegField horizontal_retrace_start = {{CR04_HRETRACE_START, 0, 7}};
static constexpr RegField vertical_blank_start = {
    {CR15_VBLANK_START, 0, 7}, {CR07_OVERFLOW, 3, 3}, {CR09_MAX_SCAN_LINE, 5, 5}};
static constexpr RegField vertical_retrace_start = {
    {CR10_VRETRACE_START, 0, 7}, {CR07_OVERFLOW, 2, 2}, {CR07_OVERFLOW, 7, 7}};
// The stored V value: CR10 and the whole overflow register CR07.
static constexpr RegField stored_v_registers = {{CR10_VRETRACE_START, 0, 7}, {CR07_OVERFLOW, 0, 7}};

static const uint8_t cr11_write_protect = 0x80;

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

static const RegAccess crtc = {.read = ReadCrtc, .write = WriteCrtc};

// A run of vertical steps keeps CR07 in a copy read once; each step writes
// the copy after CR10.
static uint8_t working_overflow;

static uint8_t ReadStepping(uint8_t index) { return index == CR07_OVERFLOW ? working_overflow : ReadCrtc(index); }

static void WriteStepping(uint8_t index, uint8_t value)
{
    if (index == CR07_OVERFLOW) working_overflow = value;
    else WriteCrtc(index, value);
}

static const RegAccess stepping_crtc = {.read = ReadStepping, .write = WriteStepping};

// The stored V value being restored, read as the registers it was taken from.
static uint32_t restored_v;

static uint8_t ReadRestored(uint8_t index) { return (uint8_t)(index == CR07_OVERFLOW ? restored_v >> 8 : restored_v); }

static const RegAccess restored_registers = {.read = ReadRestored, .write = nullptr};

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

static bool StepVertical(int delta)
{
    unsigned blank = ReadField(&stepping_crtc, &vertical_blank_start);
    unsigned retrace = ReadField(&stepping_crtc, &vertical_retrace_start);
    int next = SteppedRetraceStart(retrace, blank, delta, vertical_retrace_start.Highest());
    if (next < 0) return false;
    WriteField(&stepping_crtc, &vertical_retrace_start, (uint32_t)next);
    WriteCrtc(CR07_OVERFLOW, working_overflow);
    return true;
}

static bool StepHorizontal(int delta)
{
    unsigned blank = ReadField(&crtc, &horizontal_blank_start);
    unsigned retrace = ReadField(&crtc, &horizontal_retrace_start);
    int next = SteppedRetraceStart(retrace, blank, delta, horizontal_retrace_start.Highest());
    if (next < 0) return false;
    WriteField(&crtc, &horizontal_retrace_start, (uint32_t)next);
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
    working_overflow = ReadCrtc(CR07_OVERFLOW);
    int delta = StepDelta(direction);
    int done = 0;
    while (done < count) {
        bool taken = StepIsVertical(direction) ? StepVertical(delta) : StepHorizontal(delta);
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
    int32_t h = horizontal != 0 ? ReadField(&crtc, &horizontal_retrace_start) : 0;
    int32_t v = vertical != 0 ? ReadField(&crtc, &stored_v_registers) : 0;
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
    if (h >= 1 && h <= (int32_t)horizontal_retrace_start.Highest())
        WriteField(&crtc, &horizontal_retrace_start, (uint32_t)h);
    if (v >= 1 && v <= (int32_t)stored_v_registers.Highest()) {
        // Only the retrace start's bits of the stored CR07: the others stay as the mode set them.
        restored_v = (uint32_t)v;
        WriteField(&crtc, &vertical_retrace_start, ReadField(&restored_registers, &vertical_retrace_start));
    }
    RelockCrtc(cr11);
    chip_close_io();
    return 1;
}
