// Stepping, storing and restoring against the simulated CRT controller.
#include "adjust/adjust_test.h"
#include "base/adapters.h"
#include "base/settings.h"
#include "base/state.h"
#include "modes/position.h"

TEST(StepRule, RegisterBounds)
{
    EXPECT_EQ(0x80, SteppedRetraceStart(0x81, 0x80, -1, 0xFF)) << "down to the blank start";
    EXPECT_EQ(-1, SteppedRetraceStart(0x80, 0x80, -1, 0xFF)) << "before the blank start";
    EXPECT_EQ(-1, SteppedRetraceStart(0xFF, 0x80, +1, 0xFF)) << "past the 8-bit register";
    EXPECT_EQ(-1, SteppedRetraceStart(0, 0, -1, 0x3FF)) << "wrapped below 0";
    EXPECT_EQ(-1, SteppedRetraceStart(0x3FF, 0x300, +1, 0x3FF)) << "past 10 bits";
}

typedef AdjustTest StepPictureTest;

TEST_F(StepPictureTest, HorizontalStopsAtBlankStartAnd255)
{
    EXPECT_EQ(4, StepPicture(STEP_RIGHT, 10));
    EXPECT_EQ(0x80, Crtc(0x04));
    EXPECT_EQ(0x85, Crtc(0x11)) << "CR11 locked again";
    SetCrtc(0x04, 0xFD);
    EXPECT_EQ(2, StepPicture(STEP_LEFT, 5));
    EXPECT_EQ(0xFF, Crtc(0x04));
    EXPECT_EQ(0x80, Crtc(0x02));
}

TEST_F(StepPictureTest, VerticalCarriesOverflowBitsAndStopsAtTenBitBlank)
{
    SetRoomyCrt();
    uint8_t others = Crtc(0x07) & 0x7B;
    EXPECT_EQ(1, StepPicture(STEP_UP, 1));
    EXPECT_EQ(0x200u, VerticalRetrace());
    EXPECT_EQ(others, Crtc(0x07) & 0x7B) << "only the retrace bits of CR07 change";
    SetUsualCrt();  // blank start 768 needs CR07 bit 3 and CR09 bit 5
    EXPECT_EQ(3, StepPicture(STEP_DOWN, 21));
    EXPECT_EQ(768u, VerticalRetrace());
    EXPECT_EQ(0x85, Crtc(0x11));
    // Blank start 0xFF under retrace 0x100: each takes bit 8 from its own CR07 bit.
    SetCrtc(0x15, 0xFF);
    SetCrtc(0x09, 0x40);
    SetCrtc(0x07, 0x37);
    SetCrtc(0x10, 0x00);
    EXPECT_EQ(1, StepPicture(STEP_DOWN, 3));
    EXPECT_EQ(0xFFu, VerticalRetrace());
}

TEST_F(StepPictureTest, UndoReturnsMixedOffsets)
{
    SetRoomyCrt();
    int h = 0, v = 0;
    for (int i = 0; i < 3; ++i) StepWithinLimit(STEP_DOWN, &h, &v);
    for (int i = 0; i < 2; ++i) StepWithinLimit(STEP_LEFT, &h, &v);
    ASSERT_EQ(2, h);
    ASSERT_EQ(-3, v);
    EXPECT_EQ(0x1FCu, VerticalRetrace());
    UndoOffsets(h, v);
    EXPECT_EQ(0x1FFu, VerticalRetrace());
    EXPECT_EQ(0x98, Crtc(0x04));
}

TEST_F(StepPictureTest, SaveStoresRegisterContentsOfMovedAxes)
{
    int value = 0;
    SavePosition(0, 0);
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value));
    StepPicture(STEP_RIGHT, 1);
    SavePosition(-1, 0);
    ASSERT_TRUE(StoredValue("1024x768x16x75H", &value));
    EXPECT_EQ(0x83, value);
    EXPECT_FALSE(StoredValue("1024x768x16x75V", &value));
    StepPicture(STEP_DOWN, 1);
    SavePosition(0, -1);
    ASSERT_TRUE(StoredValue("1024x768x16x75V", &value));
    EXPECT_EQ(Crtc(0x10) + 256 * Crtc(0x07), value);
}

TEST_F(StepPictureTest, RestoreWritesStoredValuesOfThisModeOnly)
{
    StepPicture(STEP_LEFT, 5);
    StepPicture(STEP_UP, 4);
    SavePosition(5, 4);
    SetUsualCrt();  // a mode change programs the timing afresh
    CurrentAdapter()->refresh_hz = 60;
    RestorePosition();
    EXPECT_EQ(0x84, Crtc(0x04)) << "nothing stored for 60 Hz";
    CurrentAdapter()->refresh_hz = 75;
    EXPECT_EQ(1, RestorePosition());
    EXPECT_EQ(0x84 + 5, Crtc(0x04));
    EXPECT_EQ(771u + 4, VerticalRetrace());
    EXPECT_EQ(0x85, Crtc(0x11));
}

TEST_F(StepPictureTest, RestoreWithOnlyVTakesOnlyTheRetraceBits)
{
    // Stored retrace 0x205 with an overflow byte whose other bits differ
    // from the mode's: those stay as the mode set them.
    SaveSetting(SETTING_POSITION_V, 0x05 + 256 * 0x93);
    SetCrtc(0x07, 0x64);
    RestorePosition();
    EXPECT_EQ(0x05, Crtc(0x10));
    EXPECT_EQ(0xE0, Crtc(0x07));
    EXPECT_EQ(0x84, Crtc(0x04));
    SaveSetting(SETTING_POSITION_H, 256);  // out of range
    RestorePosition();
    EXPECT_EQ(0x84, Crtc(0x04));
}

TEST_F(StepPictureTest, NoRegisterAccessWithNothingStoredOrAdjustmentOff)
{
    SimResetCounters();
    RestorePosition();
    EXPECT_EQ(0u, SimGetCounters()->port_reads + SimGetCounters()->port_writes);
    SaveSetting(SETTING_POSITION_H, 0x90);
    CurrentAdapter()->flags |= ADAPTER_NO_ADJUST;
    RestorePosition();
    EXPECT_EQ(0, StepPicture(STEP_LEFT, 1));
    EXPECT_EQ(0u, SimGetCounters()->port_reads + SimGetCounters()->port_writes);
    EXPECT_EQ(0x84, Crtc(0x04));
}

TEST_F(StepPictureTest, WithoutTheKernelDeviceNothingIsStepped)
{
    SimMachineConfig config;
    SimDefaultMachine(&config);
    config.windows = SIM_WINDOWS_NT4;
    config.nt_device = false;
    SimBoot(&config);
    platform = PLATFORM_NT;
    int h = 0, v = 0;
    EXPECT_EQ(STEP_REFUSED, StepWithinLimit(STEP_UP, &h, &v));
    EXPECT_EQ(0, v);
    SaveSetting(SETTING_POSITION_H, 0x90);
    SavePosition(1, 0);
    int value = 0;
    EXPECT_TRUE(StoredValue("1024x768x16x75H", &value));
    EXPECT_EQ(0x90, value) << "unreadable registers must not replace a stored position";
}
