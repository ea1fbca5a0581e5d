// The Banshee driver's arithmetic and the answers it gives without a
// register window: NT's registry, the capability bits, the 9x fallbacks.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/state.h"
#include "chips/banshee.h"
#include "chips/chips.h"
#include "modes/detect.h"
#include "support/machine.h"

namespace {

void BootBanshee(int windows, int memory_mb = 16)
{
    SimCardConfig card = Card(0x121a, 0x0003, 1, 0);
    card.memory_mb = memory_mb;
    BootMachine(Machine(windows, {card}));
    ASSERT_EQ(1, DetectAdapters());
}

TEST(Banshee, SynthesizerAndTotalArithmetic)
{
    EXPECT_EQ(95u, BansheeSynthMhz(0x3A1C));  // multiplier 58, divider 7, K 0
    EXPECT_EQ(48u, BansheeSynthMhz(0x3A1D));  // K 1
    EXPECT_EQ(0u, BansheeSynthMhz(0x3A00));   // divider 0
    const struct { uint8_t cr00, cr1a; uint16_t width; uint32_t total; } cases[] = {
        {0x9F, 0x00, 1600, 323}, {0x9F, 0x01, 1600, 420}, {0x9F, 0x00, 1280, 164}, {0x9F, 0x01, 1280, 420}};
    for (const auto& c : cases)
        EXPECT_EQ(c.total, BansheeHorizontalTotal(c.cr00, c.cr1a, c.width)) << c.width << " " << (int)c.cr1a;
}

TEST(Banshee, NtMemorySizeFromTheRegistry)
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
    EXPECT_EQ(1u, chip_hide_page(2));
    EXPECT_EQ(0u, chip_hide_page(1));
}

}  // namespace
