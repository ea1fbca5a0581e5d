#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/state.h"
#include "modes/mode_list.h"
#include "modes/rate_list.h"
#include "support/support.h"

TEST(RateList, ItemsCountsAndInsertion)
{
    const struct {
        const char* text;
        int index, rate;
    } cases[] = {
        {"56,60,72", 0, 56}, {"56,60,72", 2, 72}, {"56,60,72", 3, 0}, {"56,60,72", RATE_LAST, 72},
        {"75", RATE_LAST, 75}, {"", 0, 0}, {"60,abc,75", 1, 0}, {"60, 72", 1, 72}, {"60,72,", RATE_LAST, 0},
        {"60,65596,85", 1, 0},  // beyond 16 bits: not 60 in disguise
        {"65535", 0, 65535}, {"60,72", -2, 0},
    };
    for (const auto& c : cases) EXPECT_EQ(c.rate, ParseRateList(c.text, c.index)) << c.text << " " << c.index;
    EXPECT_EQ(3, CountRateListItems("56,60,72"));
    EXPECT_EQ(0, CountRateListItems(""));

    uint16_t rates[5] = {};
    for (uint16_t r : {75, 60, 85, 60, 72, 100, 56}) InsertRate(rates, 5, r);
    EXPECT_EQ((std::vector<uint16_t>{56, 60, 72, 75, 85}), std::vector<uint16_t>(rates, rates + 5));
}

// Rate lists from the chip file alone: no card of this id has a driver key.
class ChipListedRates : public ::testing::Test {
protected:
    void SetUp() override
    {
        std::string ini = MakeScratchFolder("rates") + "ZNTR3.INI";
        WriteTextFile(ini, "[CHIP7777_95]\r\n640x480x8=60,72,75\r\n800x600x16=60,75\r\n1024x768x8=59,60,72\r\n"
                           "[CHIP7777_95E]\r\n800x600x16=85,100\r\n");
        ResetProgramState("", ini);
        platform = PLATFORM_9X;
        os_class = OS_CLASS_WIN98;
        adapter_count = 1;
        adapter_table[0] = AdapterRecord{0x5333, 0x7777};
        adapter_table[0].chip_row = 15;
        SetMode(640, 480, 8);
    }
    void SetMode(int w, int h, int bits)
    {
        adapter_table[0].width = (uint16_t)w;
        adapter_table[0].height = (uint16_t)h;
        adapter_table[0].bits_per_pixel = (uint16_t)bits;
    }
};

TEST_F(ChipListedRates, ExtendedRatesFollowTheBaseListUnlessTheDriverRules)
{
    int lo = -1, hi = -1;
    EXPECT_EQ((std::vector<int>{60, 75, 85, 100}), OfferedRates(800, 600, 16));
    EXPECT_EQ(75, MaxRefreshRate(800, 600, 16));
    EXPECT_EQ(1, CombinedRateRange(800, 600, 16, &lo, &hi));
    EXPECT_EQ(60, lo);
    EXPECT_EQ(100, hi);
    adapter_table[0].flags |= ADAPTER_NO_CLOCK_REFRESH;
    EXPECT_EQ((std::vector<int>{60, 75}), OfferedRates(800, 600, 16));
    // A mode without any list.
    EXPECT_EQ(0, RefreshRateAt(0, 1600, 1200, 8));
    EXPECT_EQ(NO_RATE_LIMIT, MaxRefreshRate(1600, 1200, 8));
    EXPECT_EQ(0, CombinedRateRange(1600, 1200, 8, &lo, &hi));
}

TEST_F(ChipListedRates, NearestListedRateWithinNineteenHertz)
{
    const struct {
        int width, height, target, nearest;
    } cases[] = {
        {640, 480, 73, 72}, {640, 480, 74, 75}, {640, 480, 100, 75},  // the list ends below the target
        {640, 480, 0, 0},   {640, 480, -5, 0},  {1024, 768, 60, 60},  // a listed target is found as itself
        {1024, 768, 59, 59}, {640, 480, 30, 0},  // 60 is more than 19 Hz away
        {640, 480, 41, 60}, {640, 480, 40, 0},
    };
    for (const auto& c : cases) {
        SetMode(c.width, c.height, 8);
        EXPECT_EQ(c.nearest, NearestListedRefresh(c.target)) << c.width << " " << c.target;
    }
}
