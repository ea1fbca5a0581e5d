// Moving, storing and restoring the picture against the simulated CRT controller.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/settings.h"
#include "base/state.h"
#include "modes/position.h"
#include "support/machine.h"
#include "support/support.h"

static uint8_t Crtc(uint16_t index) { return SimReadRegister(0, SIM_REG_CRTC, index); }
static void SetCrtc(uint16_t index, uint8_t value) { SimWriteRegister(0, SIM_REG_CRTC, index, value); }
// From the bits the VGA documents, not through the program's fields.
static unsigned VerticalRetrace() { return Crtc(0x10) | (Crtc(0x07) & 0x04) << 6 | (Crtc(0x07) & 0x80) << 2; }

// Horizontal blank start 0x80; CR07's other bits set, so that a step that
// disturbs them shows; CR11 locked.
static void SetCrt(uint8_t hretrace, unsigned vblank, unsigned vretrace)
{
    uint8_t cr07 = (uint8_t)(0x33 | (vretrace & 0x100) >> 6 | (vblank & 0x100) >> 5 | (vretrace & 0x200) >> 2);
    uint8_t cr09 = (uint8_t)(0x40 | (vblank & 0x200) >> 4);
    const uint8_t crt[][2] = {{0x02, 0x80},           {0x04, hretrace},      {0x07, cr07}, {0x09, cr09},
                              {0x10, (uint8_t)vretrace}, {0x15, (uint8_t)vblank}, {0x11, 0x85}};
    for (const auto& r : crt) SetCrtc(r[0], r[1]);
}

class Position : public ::testing::Test {
protected:
    void SetUp() override
    {
        BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901)}));
        adapter_count = 1;
        adapter_table[0] = AdapterRecord{0x5333, 0x8901, 0, 10 << 3, 16, 1024, 768, 75, 15};
        ClearSettingsStore();
        SetCrt(0x84, 768, 771);  // blank start 768: CR07 bit 3 and CR09 bit 5
    }
    void TearDown() override { ClearSettingsStore(); }
};

TEST_F(Position, StepsStopAtTheBlankStartTheRegistersEndAndTheLimit)
{
    EXPECT_EQ(4, StepPicture(STEP_RIGHT, 10));
    EXPECT_EQ(0x80, Crtc(0x04));
    EXPECT_EQ(0x85, Crtc(0x11)) << "CR11 locked again";
    SetCrtc(0x04, 0xFD);
    EXPECT_EQ(2, StepPicture(STEP_LEFT, 5));
    EXPECT_EQ(0xFF, Crtc(0x04));
    EXPECT_EQ(0x80, Crtc(0x02));
    EXPECT_EQ(3, StepPicture(STEP_DOWN, 21));
    EXPECT_EQ(768u, VerticalRetrace());
    // Blank start 0xFF under retrace 0x100: each takes bit 8 from its own CR07 bit.
    const uint8_t crt[][2] = {{0x15, 0xFF}, {0x09, 0x40}, {0x07, 0x37}, {0x10, 0x00}};
    for (const auto& r : crt) SetCrtc(r[0], r[1]);
    EXPECT_EQ(1, StepPicture(STEP_DOWN, 3));
    EXPECT_EQ(0xFFu, VerticalRetrace());
    EXPECT_EQ(-1, SteppedRetraceStart(0, 0, -1, 0x3FF)) << "wrapped below 0";

    SetCrt(0x98, 0x1E0, 0x1FF);  // 21 steps each way; up from 0x1FF sets bit 9
    int h = 0, v = 0;
    EXPECT_EQ(STEP_TAKEN, StepWithinLimit(STEP_UP, &h, &v));
    EXPECT_EQ(0x200u, VerticalRetrace());
    EXPECT_EQ(0x3B, Crtc(0x07) & 0x7B) << "only the retrace bits of CR07 change";
    for (int i = 0; i < 4; ++i) StepWithinLimit(STEP_DOWN, &h, &v);
    for (int i = 0; i < 2; ++i) StepWithinLimit(STEP_LEFT, &h, &v);
    ASSERT_EQ(2, h);
    ASSERT_EQ(-3, v);
    EXPECT_EQ(0x1FCu, VerticalRetrace());
    UndoOffsets(h, v);
    EXPECT_EQ(0x1FFu, VerticalRetrace());
    EXPECT_EQ(0x98, Crtc(0x04));
    h = OFFSET_LIMIT - 1;
    v = 1 - OFFSET_LIMIT;
    for (StepOutcome expected : {STEP_TAKEN, STEP_AT_LIMIT}) {
        EXPECT_EQ(expected, StepWithinLimit(STEP_LEFT, &h, &v));
        EXPECT_EQ(expected, StepWithinLimit(STEP_DOWN, &h, &v));
    }
    EXPECT_EQ(OFFSET_LIMIT, h);
    EXPECT_EQ(-OFFSET_LIMIT, v);
}

// Only the retrace bits of a stored overflow byte are the position's; with
// nothing stored, adjustment off or no register access nothing moves.
TEST_F(Position, SavedRegistersComeBackInTheirModeOnly)
{
    SimResetCounters();
    RestorePosition();
    SavePosition(0, 0);
    EXPECT_EQ(0u, SimGetCounters()->port_reads + SimGetCounters()->port_writes);
    EXPECT_EQ(-1, LoadSetting(SETTING_POSITION_H));
    StepPicture(STEP_RIGHT, 1);
    for (int h : {1, -1}) {
        SaveSetting(SETTING_POSITION_H, 0);  // 0 deletes
        SavePosition(h, 0);
        EXPECT_EQ(0x83, LoadSetting(SETTING_POSITION_H)) << h;
    }
    EXPECT_EQ(-1, LoadSetting(SETTING_POSITION_V));
    StepPicture(STEP_UP, 4);
    SavePosition(0, 4);
    EXPECT_EQ(Crtc(0x10) + 256 * Crtc(0x07), LoadSetting(SETTING_POSITION_V));

    SetCrt(0x84, 768, 771);  // a mode change programs the timing afresh
    adapter_table[0].refresh_hz = 60;
    RestorePosition();
    EXPECT_EQ(0x84, Crtc(0x04)) << "nothing stored for 60 Hz";
    adapter_table[0].refresh_hz = 75;
    EXPECT_EQ(1, RestorePosition());
    EXPECT_EQ(0x83, Crtc(0x04));
    EXPECT_EQ(771u + 4, VerticalRetrace());
    EXPECT_EQ(0x85, Crtc(0x11));
    SaveSetting(SETTING_POSITION_V, 0x05 + 256 * 0x93);  // retrace 0x205
    SaveSetting(SETTING_POSITION_H, 256);                // out of range
    SetCrtc(0x07, 0x64);
    RestorePosition();
    EXPECT_EQ(0x05, Crtc(0x10));
    EXPECT_EQ(0xE0, Crtc(0x07));
    EXPECT_EQ(0x83, Crtc(0x04));

    SaveSetting(SETTING_POSITION_H, 0x90);
    adapter_table[0].flags |= ADAPTER_NO_ADJUST;
    SimResetCounters();
    RestorePosition();
    EXPECT_EQ(0, StepPicture(STEP_LEFT, 1));
    EXPECT_EQ(0u, SimGetCounters()->port_reads + SimGetCounters()->port_writes);
    // NT without the kernel device: registers that cannot be read neither
    // move nor replace a stored position.
    SimMachineConfig config = Machine(SIM_WINDOWS_NT4, {Card(0x5333, 0x8901)});
    config.nt_device = false;
    SimBoot(&config);
    platform = PLATFORM_NT;
    adapter_table[0].flags = 0;
    SaveSetting(SETTING_POSITION_H, 0x90);
    int h = 0, v = 0;
    EXPECT_EQ(STEP_REFUSED, StepWithinLimit(STEP_UP, &h, &v));
    EXPECT_EQ(0, v);
    SavePosition(1, 0);
    EXPECT_EQ(0x90, LoadSetting(SETTING_POSITION_H));
}
