// The i740 driver against the simulated chip: the synthesizer set MISC
// chooses, the search, power states; its registry answers on NT.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "chips/chips.h"
#include "chips/i740.h"
#include "modes/detect.h"
#include "support/machine.h"

namespace {

void BootI740(int windows, int memory_mb = 8)
{
    SimCardConfig card = Card(0x8086, 0x7800, 1, 0);
    card.memory_mb = memory_mb;
    BootMachine(Machine(windows, {card}));
    ASSERT_EQ(1, DetectAdapters());
}

uint8_t Xr(uint8_t index) { return SimReadRegister(0, SIM_REG_FAMILY, index); }
void SetXr(uint8_t index, uint8_t value) { SimWriteRegister(0, SIM_REG_FAMILY, index, value); }

// M = 25, N = 10, P = 2 with the loop by 4: 66 666 700 x 4 x 27 / (12 x 4) Hz.
// Clock select 0 runs from XRC0-XRC3, any other from XRC8-XRCB; the write
// leaves the other set and the high bits of M and N alone.
TEST(I740, PixelClockOfTheSetMiscSelects)
{
    ASSERT_NO_FATAL_FAILURE(BootI740(SIM_WINDOWS_98));
    for (uint8_t select : {0, 1, 2, 3}) {
        uint8_t base = select ? 0xC8 : 0xC0, other = select ? 0xC0 : 0xC8;
        SimWriteRegister(0, SIM_REG_MISC, 0, (uint8_t)(0x23 | select << 2));
        for (uint8_t set : {base, other}) {
            SetXr(set, 25), SetXr(set + 1, 10), SetXr(set + 2, set == base ? 0x00 : 0x11), SetXr(set + 3, 0xA9);
        }
        EXPECT_DOUBLE_EQ(150000075.0, chip_get_pixel_clock()) << +select;
        EXPECT_NEAR(150000075.0, SimPixelClockHz(0), 1.0) << +select;
        ASSERT_EQ(1u, chip_set_pixel_clock(108e6)) << +select;
        EXPECT_NEAR(108e6, SimPixelClockHz(0), 108e6 * 0.03) << +select;
        EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0);
        EXPECT_EQ(0x89, Xr(base + 3) & 0x8F) << "the control bits beside P stay";
        EXPECT_TRUE(Xr(other) == 25 && Xr(other + 1) == 10 && Xr(other + 2) == 0x11 && Xr(other + 3) == 0xA9) << +select;
        SetXr(base + 2, 0x01);
        ASSERT_EQ(1u, chip_set_pixel_clock(108e6));
        EXPECT_EQ(0x01, Xr(base + 2)) << "M bit 8 is read, never written";
        EXPECT_GT(chip_get_pixel_clock(), 203e6);
    }
    EXPECT_EQ((uint32_t)SimHTotal(0), chip_get_htotal());
    EXPECT_EQ((uint32_t)SimVTotal(0), chip_get_vtotal());
}

TEST(I740, SearchStaysInTheChipsSteps)
{
    // Above 203 MHz the walk goes on down to a setting that stays below it.
    I740Pll pll = {.m = 7, .n = 10, .p = 2, .k = 4};
    ASSERT_EQ(1, I740SearchPll(250e6, &pll));
    EXPECT_DOUBLE_EQ(200000100.0, I740PllHz(pll));
    // M in 16-bit arithmetic, cut to k's steps: 108 >> 4, less 2.
    pll = {.m = 99, .n = 10, .p = 2, .k = 16};
    ASSERT_EQ(1, I740SearchPll(150000075.0, &pll));
    EXPECT_TRUE(pll.m == 4 && pll.n == 10 && pll.k == 16) << pll.m;
    // A target of 0 wraps M around: too high until N and P run out; the setting stays.
    pll = {.m = 7, .n = 3, .p = 1, .k = 4};
    EXPECT_EQ(0, I740SearchPll(0, &pll));
    EXPECT_TRUE(pll.m == 7 && pll.n == 3);
    // Too low: N runs up, then P.
    pll = {.m = 7, .n = 126, .p = 0, .k = 4};
    ASSERT_EQ(1, I740SearchPll(5e6, &pll));
    EXPECT_TRUE(pll.n == 127 && pll.p > 0 && I740PllHz(pll) <= 203e6);
}

TEST(I740, PowerStatesAndNtAnswers)
{
    ASSERT_NO_FATAL_FAILURE(BootI740(SIM_WINDOWS_98));
    const struct { uint32_t command; SimDpms state; } steps[] = {
        {CMD_DPMS_STANDBY, SIM_DPMS_STANDBY}, {CMD_DPMS_SUSPEND, SIM_DPMS_SUSPEND}, {CMD_DPMS_OFF, SIM_DPMS_OFF},
        {CMD_DPMS_ON, SIM_DPMS_ON}};
    for (const auto& s : steps) {
        SetXr(0x1B, 0x5A);
        EXPECT_EQ(1, chip_set_dpms_all(s.command));
        EXPECT_EQ(s.state, SimDpmsState(0)) << s.command;
        EXPECT_EQ(0, Xr(0x1B));
    }
    const struct { int mb; uint32_t answer; } cases[] = {{8, 8u << 16}, {4, 4u << 16}, {16, 0}};
    for (const auto& c : cases) {
        ASSERT_NO_FATAL_FAILURE(BootI740(SIM_WINDOWS_NT4, c.mb));
        EXPECT_EQ(c.answer, chip_get_mem_size()) << c.mb;
        EXPECT_EQ((uint32_t)CHIP_CAP_AGP, chip_init());
        EXPECT_EQ(2u, chip_get_agp_rate());
        EXPECT_EQ(0u, chip_get_mclk_max());
    }
}

}  // namespace
