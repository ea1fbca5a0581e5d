#include <gtest/gtest.h>

#include "chips/synth.h"

// M 1..127 and N 1..31 of the S3 chips.
static constexpr SynthLimits S3(uint16_t r_max, double vco_min_hz, double vco_max_hz)
{
    return {.fref_hz = 14318180.0, .a = 2, .b = 2, .m_min = 1, .m_max = 127, .n_min = 1, .n_max = 31,
            .r_min = 0, .r_max = r_max, .vco_min_hz = vco_min_hz, .vco_max_hz = vco_max_hz};
}
static constexpr SynthLimits mclk = S3(3, 135e6, 270e6), trio64v2_dclk = S3(4, 140e6, 340e6);

// Each search starts from the N and R of the setting; without a fit the
// setting comes back unchanged.
TEST(SynthesizerSearch, StepsFromTheCurrentDividerForTwentyTriesAtMost)
{
    const struct {
        const char* what;
        const SynthLimits* limits;
        double target_hz;
        SynthSetting start;
        int fits;
        SynthSetting end;
    } cases[] = {
        {"M = 134 too high at N = 12; N = 11 puts the VCO at 139.9 MHz", &mclk, 70e6, {115, 12, 1}, 1, {125, 11, 1}},
        {"5.5 x fref: N walks down to 9 until M fits in 7 bits", &trio64v2_dclk, 78.75e6, {0, 12, 1}, 1, {119, 9, 1}},
        {"the 20th try fits", &mclk, 20e6, {7, 28, 3}, 1, {120, 9, 3}},
        {"the 21st try is not made", &mclk, 20e6, {7, 29, 3}, 0, {7, 29, 3}},
        // trunc(...) - 2 wraps to 65534 in 16 bits: too high down to N = 1, R = 0.
        {"too low a target", &mclk, 1000.0, {7, 12, 1}, 0, {7, 12, 1}},
        {"too low a target at the lowest dividers", &mclk, 1000.0, {7, 1, 0}, 0, {7, 1, 0}},
    };
    for (const auto& c : cases) {
        SynthSetting s = c.start;
        EXPECT_EQ(c.fits, SearchSynthesizer(c.limits, c.target_hz, &s)) << c.what;
        EXPECT_TRUE(s.m == c.end.m && s.n == c.end.n && s.r == c.end.r)
            << c.what << ": " << s.m << " " << s.n << " " << s.r;
    }
}

// M is truncated: a fit lies below the target by less than one step of M.
TEST(SynthesizerSearch, EveryFitLiesInTheWindowAndBelowTheTarget)
{
    for (double target = 25e6; target <= 135e6; target += 1.7e6)
        for (uint16_t n = 1; n <= 31; n += 5)
            for (uint16_t r = 0; r <= 4; ++r) {
                SynthSetting s = {1, n, r};
                if (!SearchSynthesizer(&trio64v2_dclk, target, &s)) continue;
                double vco = trio64v2_dclk.fref_hz * (s.m + 2) / (s.n + 2), f = SynthFrequency(&trio64v2_dclk, s);
                EXPECT_TRUE(vco >= 140e6 && vco <= 340e6) << vco;
                EXPECT_TRUE(f <= target && f > target - trio64v2_dclk.fref_hz / ((s.n + 2) << s.r) - 1) << f;
            }
}
