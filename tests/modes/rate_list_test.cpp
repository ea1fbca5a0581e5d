#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/state.h"
#include "hardware/driver_key.h"
#include "modes/mode_keys.h"
#include "modes/mode_list.h"
#include "modes/rate_list.h"
#include "support/support.h"

TEST(ParseRateList, PositionsAndTheLastItem)
{
    EXPECT_EQ(56, ParseRateList("56,60,72", 0));
    EXPECT_EQ(72, ParseRateList("56,60,72", 2));
    EXPECT_EQ(0, ParseRateList("56,60,72", 3));
    EXPECT_EQ(72, ParseRateList("56,60,72", RATE_LAST));
    EXPECT_EQ(75, ParseRateList("75", RATE_LAST));
    EXPECT_EQ(0, ParseRateList("", 0));
    EXPECT_EQ(0, ParseRateList("60,abc,75", 1));  // not a number: no item
    EXPECT_EQ(72, ParseRateList("60, 72", 1));    // leading blanks as atoi takes them
    EXPECT_EQ(0, ParseRateList("60,72,", RATE_LAST));
    EXPECT_EQ(0, ParseRateList("60,65596,85", 1));  // beyond 16 bits: not 60 in disguise
    EXPECT_EQ(65535, ParseRateList("65535", 0));
    EXPECT_EQ(3, CountRateListItems("56,60,72"));
    EXPECT_EQ(0, CountRateListItems(""));
}

TEST(InsertRate, AscendingWithoutRepeats)
{
    uint16_t rates[5] = {};
    for (uint16_t r : {75, 60, 85, 60, 72, 100, 56}) InsertRate(rates, 5, r);
    EXPECT_EQ((std::vector<uint16_t>{56, 60, 72, 75, 85}), std::vector<uint16_t>(rates, rates + 5));
}

// Rate lists from the chip file alone: no machine has a card with this id,
// so there is no display driver key to list rates.
class ChipListedRates : public ::testing::Test {
protected:
    void SetUp() override
    {
        folder = MakeScratchFolder("rates");
        WriteTextFile(folder + "ZNTR3.INI",
                      "[CHIP7777_95]\r\n640x480x8=60,72,75\r\n800x600x16=60,75\r\n1024x768x8=59,60,72\r\n"
                      "[CHIP7777_95E]\r\n800x600x16=85,100\r\n");
        ResetProgramState("", folder + "ZNTR3.INI");
        platform = PLATFORM_9X;
        os_class = OS_CLASS_WIN98;
        adapter_count = 1;
        AdapterRecord* a = &adapter_table[0];
        a->vendor_id = 0x5333;
        a->device_id = 0x7777;
        a->chip_row = 15;
        SetMode(640, 480, 8);
    }
    void SetMode(int w, int h, int bits)
    {
        adapter_table[0].width = (uint16_t)w;
        adapter_table[0].height = (uint16_t)h;
        adapter_table[0].bits_per_pixel = (uint16_t)bits;
    }
    std::string folder;
};

TEST_F(ChipListedRates, ExtendedRatesFollowTheBaseListUnlessTheDriverRules)
{
    EXPECT_EQ((std::vector<int>{60, 75, 85, 100}), OfferedRates(800, 600, 16));
    EXPECT_EQ(75, MaxRefreshRate(800, 600, 16));
    adapter_table[0].flags |= ADAPTER_NO_CLOCK_REFRESH;
    EXPECT_EQ((std::vector<int>{60, 75}), OfferedRates(800, 600, 16));
}

TEST_F(ChipListedRates, AModeWithoutAnyList)
{
    EXPECT_EQ(0, RefreshRateAt(0, 1600, 1200, 8));
    EXPECT_EQ(NO_RATE_LIMIT, MaxRefreshRate(1600, 1200, 8));
    int lo = -1, hi = -1;
    EXPECT_EQ(0, CombinedRateRange(1600, 1200, 8, &lo, &hi));
    EXPECT_EQ(1, CombinedRateRange(800, 600, 16, &lo, &hi));
    EXPECT_EQ(60, lo);
    EXPECT_EQ(100, hi);
}

TEST_F(ChipListedRates, NearestListedRateWithinNineteenHertz)
{
    EXPECT_EQ(72, NearestListedRefresh(73));
    EXPECT_EQ(75, NearestListedRefresh(74));
    EXPECT_EQ(75, NearestListedRefresh(100));  // the list ends below the target
    EXPECT_EQ(0, NearestListedRefresh(0));
    EXPECT_EQ(0, NearestListedRefresh(-5));
    SetMode(1024, 768, 8);  // 59,60,72: a listed target is found as itself
    EXPECT_EQ(60, NearestListedRefresh(60));
    EXPECT_EQ(59, NearestListedRefresh(59));
    SetMode(640, 480, 8);
    EXPECT_EQ(0, NearestListedRefresh(30));  // 60 is more than 19 Hz away
    EXPECT_EQ(60, NearestListedRefresh(41));
    EXPECT_EQ(0, NearestListedRefresh(40));
}
