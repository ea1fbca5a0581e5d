// The Banshee driver against the simulated chip: clocks, totals, memory and
// power states in the register window; NT's registry; no window, no clock.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/state.h"
#include "chips/banshee.h"
#include "chips/chips.h"
#include "modes/detect.h"
#include "support/machine.h"

namespace {

enum : uint32_t { DRAM_INIT0 = 0x18, PLL_CTRL2 = 0x48, DAC_MODE = 0x4C, VID_PROC_CFG = 0x5C };

void BootBanshee(int windows, int memory_mb = 16)
{
    SimCardConfig card = Card(0x121a, 0x0003, 1, 0);
    card.memory_mb = memory_mb;
    BootMachine(Machine(windows, {card}));
    ASSERT_EQ(1, DetectAdapters());
}

// 0x3A1C is multiplier 58, divider 7, K 0: 60 / 9 x 14.31818 MHz.
TEST(Banshee, ClocksAndTotalsAsTheChipRunsThem)
{
    ASSERT_NO_FATAL_FAILURE(BootBanshee(SIM_WINDOWS_98));
    ASSERT_NE(0u, CurrentAdapter()->mapped_registers);
    SimWriteInternal32(0, PLL_CTRL2, 0x3A1C);
    EXPECT_EQ(95u, chip_get_mclk());
    EXPECT_NEAR(95.45e6, SimMemoryClockHz(0), 1e4);
    for (uint32_t mhz : {100u, 117u, 133u}) {
        uint32_t set = chip_set_mclk(mhz);
        EXPECT_NEAR(mhz, set, 1) << mhz;
        EXPECT_EQ(set, (uint32_t)(SimMemoryClockHz(0) / 1e6 + 0.5)) << mhz;
    }
    EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0);
    ASSERT_EQ(1u, chip_set_pixel_clock(SimPixelClockHz(0) * 1.2));
    EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0);
    EXPECT_EQ((uint32_t)SimHTotal(0), chip_get_htotal());
    EXPECT_EQ((uint32_t)SimVTotal(0), chip_get_vtotal());
    // From 1600 pixels in 2X mode each unit of CR00 counts two characters.
    CurrentAdapter()->width = 1600;
    SimWriteRegister(0, SIM_REG_CRTC, 0x00, 0x9F);
    SimWriteRegister(0, SIM_REG_CRTC, 0x1A, 0x00);
    SimWriteInternal32(0, VID_PROC_CFG, SimReadInternal32(0, VID_PROC_CFG) | 1u << 26);
    EXPECT_EQ(323u, chip_get_htotal());
    EXPECT_EQ(323, SimHTotal(0));
    const struct { uint8_t cr1a; uint16_t width; uint32_t total; } pure[] = {{1, 1600, 420}, {0, 1280, 164}, {1, 1280, 420}};
    for (const auto& c : pure) EXPECT_EQ(c.total, BansheeHorizontalTotal(0x9F, c.cr1a, c.width)) << c.width;
}

// Each state replaces the one before, and the DAC's other bits stay.
TEST(Banshee, MemorySizeAndPowerStatesInTheWindow)
{
    const struct { int mb; uint32_t size; } sizes[] = {{8, 8u << 16}, {32, 32u << 16}, {4, 0}, {16, 16u << 16}};
    for (const auto& c : sizes) {
        ASSERT_NO_FATAL_FAILURE(BootBanshee(SIM_WINDOWS_98, c.mb));
        EXPECT_EQ(c.size, chip_get_mem_size()) << c.mb;
    }
    SimWriteInternal32(0, DAC_MODE, 0x80000101);
    const struct { uint32_t command; SimDpms state; } steps[] = {
        {CMD_DPMS_STANDBY, SIM_DPMS_STANDBY}, {CMD_DPMS_SUSPEND, SIM_DPMS_SUSPEND}, {CMD_DPMS_STANDBY, SIM_DPMS_STANDBY},
        {CMD_DPMS_OFF, SIM_DPMS_OFF},         {CMD_DPMS_ON, SIM_DPMS_ON}};
    for (const auto& s : steps) {
        EXPECT_EQ(1, chip_set_dpms_all(s.command));
        EXPECT_EQ(s.state, SimDpmsState(0)) << s.command;
        EXPECT_EQ(0x80000101u, SimReadInternal32(0, DAC_MODE) & ~0x1Eu) << s.command;
    }
}

TEST(Banshee, NtAnswersFromTheRegistry)
{
    const struct { uint8_t bytes[4]; uint32_t mb; } cases[] = {
        {{0, 0, 0x00, 1}, 16}, {{0, 0, 0x80, 1}, 24}, {{0, 0, 0xC0, 0}, 12}, {{0, 0, 0x40, 2}, 36}, {{0, 0, 0, 3}, 0}};
    for (const auto& c : cases) EXPECT_EQ(c.mb << 16, BansheeNtMemorySize(c.bytes)) << c.mb;
    ASSERT_NO_FATAL_FAILURE(BootBanshee(SIM_WINDOWS_NT4, 16));
    EXPECT_EQ(16u << 16, chip_get_mem_size());
    EXPECT_EQ((uint32_t)CHIP_CAP_NO_CLOCK_REFRESH, chip_init());
    EXPECT_EQ(0u, chip_has_dpms());
    EXPECT_EQ(0u, chip_get_mclk_max());
    EXPECT_EQ(0u, chip_get_mclk());
    EXPECT_EQ(0u, BansheeDispatch(CMD_DPMS_OFF, 0)) << "no window on NT";
}

// Without a window a setting can neither be read nor written: no clock,
// and a fit that cannot be written is no success.
TEST(Banshee, NineXWithoutAWindow)
{
    ASSERT_NO_FATAL_FAILURE(BootBanshee(SIM_WINDOWS_98));
    monitor_count = 2;
    EXPECT_EQ(0x0009u, chip_init());
    monitor_count = 1;
    EXPECT_EQ(0u, chip_init());
    EXPECT_EQ(133u, chip_get_mclk_max());
    CurrentAdapter()->mapped_registers = 0;
    EXPECT_EQ(0u, chip_get_mem_size());
    EXPECT_EQ(0.0, BansheeGetPixelClock());
    EXPECT_EQ(0u, BansheeSetPixelClock(65e6));
    EXPECT_EQ(0u, BansheeDispatch(CMD_DPMS_OFF, 0));
    EXPECT_EQ(1u, chip_hide_page(2));
    EXPECT_EQ(0u, chip_hide_page(1));
}

}  // namespace
