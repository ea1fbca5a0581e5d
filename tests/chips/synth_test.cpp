#include <gtest/gtest.h>

#include "chips/synth.h"

// The S3 memory clock: M 1..127, N 1..31, R 0..3, VCO 135 to 270 MHz.
static const SynthLimits mclk = {.fref_hz = 14318180.0, .a = 2, .b = 2, .m_min = 1, .m_max = 127, .n_min = 1,
                                 .n_max = 31, .r_min = 0, .r_max = 3, .vco_min_hz = 135e6, .vco_max_hz = 270e6};
// The Trio64V2 pixel clock: R up to 4, VCO 140 to 340 MHz.
static const SynthLimits trio64v2_dclk = {.fref_hz = 14318180.0, .a = 2, .b = 2, .m_min = 1, .m_max = 127, .n_min = 1,
                                          .n_max = 31, .r_min = 0, .r_max = 4, .vco_min_hz = 140e6, .vco_max_hz = 340e6};

TEST(SynthesizerSearch, FitAfterStepsDownFromTheCurrentDivider)
{
    // From N = 12, R = 1: M = 134 is too high, N = 11 gives M = 125 with the
    // VCO at 127/13 x fref = 139.9 MHz, inside the window.
    SynthSetting s = {115, 12, 1};
    ASSERT_EQ(1, SearchSynthesizer(&mclk, 70e6, &s));
    EXPECT_EQ(125, s.m);
    EXPECT_EQ(11, s.n);
    EXPECT_EQ(1, s.r);
    EXPECT_NEAR(69.94e6, SynthFrequency(&mclk, s), 0.01e6);

    // 78.75 MHz = 5.5 x fref: N walks down from 12 to 9 before M fits in
    // seven bits, and lands on the frequency exactly.
    s = {0, 12, 1};
    ASSERT_EQ(1, SearchSynthesizer(&trio64v2_dclk, 78.75e6, &s));
    EXPECT_EQ(119, s.m);
    EXPECT_EQ(9, s.n);
    EXPECT_EQ(1, s.r);
    EXPECT_NEAR(78.75e6, SynthFrequency(&trio64v2_dclk, s), 10.0);
}

TEST(SynthesizerSearch, TwentyTriesAtMostAndNothingChangedWithoutAFit)
{
    // 20 MHz at R = 3 first fits at N = 9, M = 120: the 20th try from N = 28,
    // one too many from N = 29.
    SynthSetting s = {7, 28, 3};
    ASSERT_EQ(1, SearchSynthesizer(&mclk, 20e6, &s));
    EXPECT_EQ(120, s.m);
    EXPECT_EQ(9, s.n);
    EXPECT_EQ(3, s.r);
    s = {7, 29, 3};
    EXPECT_EQ(0, SearchSynthesizer(&mclk, 20e6, &s));
    EXPECT_EQ(7, s.m);
    EXPECT_EQ(29, s.n);
    EXPECT_EQ(3, s.r);
}

TEST(SynthesizerSearch, TooLowATargetWrapsToAHugeMultiplier)
{
    // trunc(...) = 0 and 0 - 2 wraps to 65534 in 16 bits: "too high" all the
    // way down to N = 1 and R = 0, where the search ends.
    SynthSetting s = {7, 12, 1};
    EXPECT_EQ(0, SearchSynthesizer(&mclk, 1000.0, &s));
    EXPECT_EQ(7, s.m);
    s = {7, 1, 0};
    EXPECT_EQ(0, SearchSynthesizer(&mclk, 1000.0, &s));
}

TEST(SynthesizerSearch, EveryFitLiesInTheWindowAndBelowTheTarget)
{
    for (double target = 25e6; target <= 135e6; target += 1.7e6) {
        for (uint16_t n = 1; n <= 31; n += 5) {
            for (uint16_t r = 0; r <= 4; ++r) {
                SynthSetting s = {1, n, r};
                if (!SearchSynthesizer(&trio64v2_dclk, target, &s)) continue;
                double vco = trio64v2_dclk.fref_hz * (s.m + 2) / (s.n + 2);
                EXPECT_GE(vco, 140e6);
                EXPECT_LE(vco, 340e6);
                double f = SynthFrequency(&trio64v2_dclk, s);
                EXPECT_LE(f, target);  // M is truncated
                EXPECT_GT(f, target - trio64v2_dclk.fref_hz / ((s.n + 2) << s.r) - 1);
            }
        }
    }
}
