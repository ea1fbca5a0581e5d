// The i740 driver's synthesizer arithmetic and its registry answers on NT.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "chips/chips.h"
#include "chips/i740.h"
#include "modes/detect.h"
#include "support/machine.h"

namespace {

TEST(I740, SynthesizerArithmetic)
{
    EXPECT_DOUBLE_EQ(150000075.0, I740PllHz({.m = 25, .n = 10, .p = 2, .k = 4}));
    // M from N and P, cut to k's steps: 108 >> 2 and >> 4, less 2.
    const struct { uint16_t k, m; } fits[] = {{4, 25}, {16, 4}};
    for (const auto& c : fits) {
        I740Pll pll = {.m = 99, .n = 10, .p = 2, .k = c.k};
        ASSERT_EQ(1, I740SearchPll(150000075.0, &pll)) << c.k;
        EXPECT_EQ(c.m, pll.m) << c.k;
        EXPECT_EQ(10, pll.n);
        EXPECT_EQ(c.k, pll.k);
    }
    // Above 203 MHz the walk goes on down to a setting that stays below it.
    I740Pll pll = {.m = 7, .n = 10, .p = 2, .k = 4};
    ASSERT_EQ(1, I740SearchPll(250e6, &pll));
    EXPECT_DOUBLE_EQ(200000100.0, I740PllHz(pll));
    // A target of 0 wraps M around: too high until N and P run out; the setting stays.
    pll = {.m = 7, .n = 3, .p = 1, .k = 4};
    EXPECT_EQ(0, I740SearchPll(0, &pll));
    EXPECT_EQ(7, pll.m);
    EXPECT_EQ(3, pll.n);
    // Too low: N runs up, then P.
    pll = {.m = 7, .n = 126, .p = 0, .k = 4};
    ASSERT_EQ(1, I740SearchPll(5e6, &pll));
    EXPECT_EQ(127, pll.n);
    EXPECT_GT(pll.p, 0);
    EXPECT_LE(I740PllHz(pll), 203e6);
}

TEST(I740, NtMemorySizeAndAnswers)
{
    const struct { int mb; uint32_t answer; } cases[] = {{8, 8u << 16}, {4, 4u << 16}, {16, 0}};
    for (const auto& c : cases) {
        SimCardConfig card = Card(0x8086, 0x7800, 1, 0);
        card.memory_mb = c.mb;
        BootMachine(Machine(SIM_WINDOWS_NT4, {card}));
        ASSERT_EQ(1, DetectAdapters());
        EXPECT_EQ(c.answer, chip_get_mem_size()) << c.mb;
        EXPECT_EQ((uint32_t)CHIP_CAP_AGP, chip_init());
        EXPECT_EQ(2u, chip_get_agp_rate());
        EXPECT_EQ(0u, chip_get_mclk_max());
    }
}

}  // namespace
