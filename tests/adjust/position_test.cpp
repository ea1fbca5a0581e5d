// Stepping, undoing, storing and restoring the picture position against the
// simulated card's CRT controller.
#include "adjust/adjust_test.h"
#include "adjust/position.h"
#include "hardware/adapters.h"
#include "shell/globals.h"
#include "shell/settings.h"

TEST(StepRule, RetraceStartBounds)
{
    EXPECT_EQ(0x85, SteppedRetraceStart(0x84, 0x80, +1, 0xFF));
    EXPECT_EQ(0x80, SteppedRetraceStart(0x81, 0x80, -1, 0xFF)) << "down to the blank start";
    EXPECT_EQ(-1, SteppedRetraceStart(0x80, 0x80, -1, 0xFF)) << "before the blank start";
    EXPECT_EQ(-1, SteppedRetraceStart(0xFF, 0x80, +1, 0xFF)) << "carried past the 8-bit register";
    EXPECT_EQ(-1, SteppedRetraceStart(0, 0, -1, 0xFF)) << "wrapped below 0";
    EXPECT_EQ(0x3FF, SteppedRetraceStart(0x3FE, 0x300, +1, 0x3FF));
    EXPECT_EQ(-1, SteppedRetraceStart(0x3FF, 0x300, +1, 0x3FF));
}

TEST(StepRule, OffsetsEndAtTwentyOne)
{
    int offset = 0, taken = 0;
    while (OffsetMayStep(offset, +1) && taken < 100) ++offset, ++taken;
    EXPECT_EQ(OFFSET_LIMIT, offset);
    while (OffsetMayStep(offset, -1) && taken < 200) --offset, ++taken;
    EXPECT_EQ(-OFFSET_LIMIT, offset);
    EXPECT_TRUE(OffsetMayStep(-OFFSET_LIMIT, +1));
    EXPECT_TRUE(OffsetMayStep(OFFSET_LIMIT, -1));
}

typedef AdjustTest StepPictureTest;

TEST_F(StepPictureTest, HorizontalStepsUnlockAndRelockCr11)
{
    EXPECT_EQ(3, StepPicture(STEP_LEFT, 3));
    EXPECT_EQ(0x84 + 3, Crtc(0x04));
    EXPECT_EQ(0x85, Crtc(0x11)) << "CR11 back as it was, protection on";
    EXPECT_EQ(0x80, Crtc(0x02));
    EXPECT_EQ(2, StepPicture(STEP_RIGHT, 2));
    EXPECT_EQ(0x84 + 1, Crtc(0x04));
}

TEST_F(StepPictureTest, RightStopsAtBlankStart)
{
    EXPECT_EQ(4, StepPicture(STEP_RIGHT, 10));
    EXPECT_EQ(0x80, Crtc(0x04));
    EXPECT_EQ(0, StepPicture(STEP_RIGHT, 1));
    EXPECT_EQ(0x80, Crtc(0x04));
    EXPECT_EQ(0x85, Crtc(0x11));
}

TEST_F(StepPictureTest, LeftStopsAt255)
{
    SetCrtc(0x04, 0xFD);
    EXPECT_EQ(2, StepPicture(STEP_LEFT, 5));
    EXPECT_EQ(0xFF, Crtc(0x04));
    EXPECT_EQ(0, StepPicture(STEP_LEFT, 1));
    EXPECT_EQ(0xFF, Crtc(0x04));
}

TEST_F(StepPictureTest, VerticalStepsCarryOverflowBits)
{
    SetCrt(RoomyCrt());  // retrace start 0x1FF
    uint8_t others = Crtc(0x07) & 0x7B;
    EXPECT_EQ(1, StepPicture(STEP_UP, 1));
    EXPECT_EQ(0x200u, VerticalRetrace());
    EXPECT_EQ(0x00, Crtc(0x10));
    EXPECT_EQ(others, Crtc(0x07) & 0x7B) << "only the retrace bits of CR07 change";
    EXPECT_EQ(0x85, Crtc(0x11));
    EXPECT_EQ(2, StepPicture(STEP_DOWN, 2));
    EXPECT_EQ(0x1FEu, VerticalRetrace());
    EXPECT_EQ(others, Crtc(0x07) & 0x7B);
}

TEST_F(StepPictureTest, DownStopsAtBlankStartOfTenBits)
{
    // Blank start 768 needs CR07 bit 3 and CR09 bit 5; retrace starts at 771.
    EXPECT_EQ(3, StepPicture(STEP_DOWN, 21));
    EXPECT_EQ(768u, VerticalRetrace());
    EXPECT_EQ(768u, VerticalBlank());
}

TEST_F(StepPictureTest, NothingOnAChipWithoutAdjustment)
{
    CurrentAdapter()->flags |= ADAPTER_NO_ADJUST;
    SimResetCounters();
    EXPECT_EQ(0, StepPicture(STEP_LEFT, 1));
    EXPECT_EQ(0x84, Crtc(0x04));
    EXPECT_EQ(0u, SimGetCounters()->port_writes);
}

TEST_F(StepPictureTest, UndoReturnsMixedOffsets)
{
    SetCrt(RoomyCrt());
    int h = 0, v = 0;
    for (int i = 0; i < 3; ++i) ASSERT_EQ(STEP_TAKEN, StepWithinLimit(STEP_DOWN, &h, &v));
    for (int i = 0; i < 2; ++i) ASSERT_EQ(STEP_TAKEN, StepWithinLimit(STEP_LEFT, &h, &v));
    EXPECT_EQ(2, h);
    EXPECT_EQ(-3, v);
    EXPECT_EQ(0x1FCu, VerticalRetrace());
    EXPECT_EQ(0x9A, Crtc(0x04));
    UndoOffsets(h, v);
    EXPECT_EQ(0x1FFu, VerticalRetrace());
    EXPECT_EQ(0x98, Crtc(0x04));
}

TEST_F(StepPictureTest, WithinLimitKeepsOffsetOnRefusal)
{
    int h = 0, v = 0;
    SetCrtc(0x04, 0x80);  // at the blank start
    EXPECT_EQ(STEP_REFUSED, StepWithinLimit(STEP_RIGHT, &h, &v));
    EXPECT_EQ(0, h);
    h = OFFSET_LIMIT;
    EXPECT_EQ(STEP_AT_LIMIT, StepWithinLimit(STEP_LEFT, &h, &v));
    EXPECT_EQ(0x80, Crtc(0x04)) << "no step at the limit";
}

typedef AdjustTest StoredPositionTest;

TEST_F(StoredPositionTest, SaveStoresRegisterContentsOfMovedAxes)
{
    int value = 0;
    StepPicture(STEP_RIGHT, 1);
    SavePosition(-1, 0);
    ASSERT_TRUE(StoredValue("1024x768x16x75H", &value));
    EXPECT_EQ(0x83, value);
    EXPECT_FALSE(StoredValue("1024x768x16x75V", &value));

    StepPicture(STEP_DOWN, 1);
    SavePosition(0, -1);
    ASSERT_TRUE(StoredValue("1024x768x16x75V", &value));
    EXPECT_EQ(Crtc(0x10) + 256 * Crtc(0x07), value);
    EXPECT_EQ(770u, VerticalRetrace());
}

TEST_F(StoredPositionTest, SaveWithNoOffsetStoresNothing)
{
    SavePosition(0, 0);
    int value;
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value));
    EXPECT_FALSE(StoredValue("1024x768x16x75V", &value));
}

TEST_F(StoredPositionTest, RestoreWritesWhatIsStored)
{
    StepPicture(STEP_LEFT, 5);
    StepPicture(STEP_UP, 4);
    SavePosition(5, 4);
    uint8_t moved_cr07 = Crtc(0x07);
    SetCrt(UsualCrt());  // a mode change programs the timing afresh
    EXPECT_EQ(1, RestorePosition());
    EXPECT_EQ(0x84 + 5, Crtc(0x04));
    EXPECT_EQ(771u + 4, VerticalRetrace());
    EXPECT_EQ(moved_cr07, Crtc(0x07));
    EXPECT_EQ(0x85, Crtc(0x11));
}

TEST_F(StoredPositionTest, RestoreWithOnlyVTouchesOnlyVerticalRegisters)
{
    // Retrace start 0x205 (bit 9 set, bit 8 clear) stored with an overflow
    // byte whose other bits differ from the mode's: only the retrace bits
    // are taken from it, the rest stay as the mode set them.
    SaveSetting(SETTING_POSITION_V, 0x05 + 256 * 0x93);
    SetCrtc(0x07, 0x64);
    EXPECT_EQ(1, RestorePosition());
    EXPECT_EQ(0x05, Crtc(0x10));
    EXPECT_EQ(0xE0, Crtc(0x07));
    EXPECT_EQ(0x84, Crtc(0x04));
    EXPECT_EQ(0x85, Crtc(0x11));
}

TEST_F(StoredPositionTest, RestoreWithNothingStoredLeavesRegistersAlone)
{
    SimResetCounters();
    EXPECT_EQ(1, RestorePosition());
    EXPECT_EQ(0u, SimGetCounters()->port_reads);
    EXPECT_EQ(0u, SimGetCounters()->port_writes);
}

TEST_F(StoredPositionTest, RestoreDoesNothingOnAChipWithoutAdjustment)
{
    SaveSetting(SETTING_POSITION_H, 0x90);
    SaveSetting(SETTING_POSITION_V, 0x10 + 256 * 0x84);
    CurrentAdapter()->flags |= ADAPTER_NO_ADJUST;
    SimResetCounters();
    EXPECT_EQ(1, RestorePosition());
    EXPECT_EQ(0u, SimGetCounters()->port_writes);
    EXPECT_EQ(0x84, Crtc(0x04));
    EXPECT_EQ(771u, VerticalRetrace());
}

TEST_F(StoredPositionTest, RestoreIgnoresValuesOutOfRange)
{
    SaveSetting(SETTING_POSITION_H, 256);
    SaveSetting(SETTING_POSITION_V, 65536 + 0x10);
    RestorePosition();
    EXPECT_EQ(0x84, Crtc(0x04));
    EXPECT_EQ(771u, VerticalRetrace());
}

TEST_F(StoredPositionTest, PositionBelongsToOneMode)
{
    StepPicture(STEP_LEFT, 2);
    SavePosition(2, 0);
    SetCrtc(0x04, 0x84);
    CurrentAdapter()->refresh_hz = 60;
    RestorePosition();
    EXPECT_EQ(0x84, Crtc(0x04)) << "1024x768x16x60 has nothing stored";
    CurrentAdapter()->refresh_hz = 75;
    RestorePosition();
    EXPECT_EQ(0x86, Crtc(0x04));
}

TEST_F(StoredPositionTest, ResetUndoesWindowOffsetsAndForgets)
{
    SetCrt(RoomyCrt());
    StepWithinLimit(STEP_RIGHT, &adjust_offset_h, &adjust_offset_v);
    StepWithinLimit(STEP_UP, &adjust_offset_h, &adjust_offset_v);
    SavePosition(adjust_offset_h, adjust_offset_v);
    ResetPosition();
    EXPECT_EQ(0, adjust_offset_h);
    EXPECT_EQ(0, adjust_offset_v);
    EXPECT_EQ(0x98, Crtc(0x04));
    EXPECT_EQ(0x1FFu, VerticalRetrace());
    int value;
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value));
    EXPECT_FALSE(StoredValue("1024x768x16x75V", &value));
}

// NT without the kernel device: no register can be read or written.
class NoRegisterAccessTest : public AdjustTest {
protected:
    void SetUp() override
    {
        AdjustTest::SetUp();
        SimMachineConfig config;
        SimDefaultMachine(&config);
        config.windows = SIM_WINDOWS_NT4;
        config.nt_device = false;
        SimBoot(&config);
        platform = PLATFORM_NT;
        os_class = 3;
        monitor_count = 0;
    }
};

TEST_F(NoRegisterAccessTest, StepReportsNothingDone)
{
    int h = 0, v = 0;
    EXPECT_EQ(0, StepPicture(STEP_LEFT, 3));
    EXPECT_EQ(STEP_REFUSED, StepWithinLimit(STEP_UP, &h, &v));
    EXPECT_EQ(0, v);
}

TEST_F(NoRegisterAccessTest, SaveKeepsTheStoredPosition)
{
    SaveSetting(SETTING_POSITION_H, 0x90);
    SavePosition(1, 0);
    int value = 0;
    ASSERT_TRUE(StoredValue("1024x768x16x75H", &value));
    EXPECT_EQ(0x90, value);
}
