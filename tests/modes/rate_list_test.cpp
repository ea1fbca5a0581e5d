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
        {"65535", 0, 65535}, {"60,72", -2, 0}, {NULL, 0, 0},
        {"60,-1", RATE_LAST, 0}, {"-5,60", 0, 0},  // negative: neither a rate nor "no list"
    };
    for (const auto& c : cases) EXPECT_EQ(c.rate, ParseRateList(c.text, c.index)) << (c.text ? c.text : "NULL") << " " << c.index;
    EXPECT_EQ(3, CountRateListItems("56,60,72"));
    EXPECT_EQ(0, CountRateListItems(""));

    uint16_t rates[5] = {};
    for (uint16_t r : {75, 60, 85, 60, 72, 100, 56}) InsertRate(rates, 5, r);
    EXPECT_EQ((std::vector<uint16_t>{56, 60, 72, 75, 85}), std::vector<uint16_t>(rates, rates + 5));
}

// Lists from the chip file alone: no card of this id has a driver key.
TEST(ChipListedRates, ExtendedListsAndTheNearestRate)
{
    std::string ini = MakeScratchFolder("rates") + "ZNTR3.INI";
    WriteTextFile(ini, "[CHIP7777_95]\r\n640x480x8=60,72,75\r\n800x600x16=60,75\r\n1024x768x8=59,60,72\r\n"
                       "[CHIP7777_95E]\r\n800x600x16=85,100\r\n");
    ResetProgramState("", ini);
    platform = PLATFORM_9X;
    adapter_count = 1;
    AdapterRecord* a = &adapter_table[0];
    *a = AdapterRecord{0x5333, 0x7777, 0, 0, 8, 640, 480, 0, 15};
    int lo = -1, hi = -1;
    EXPECT_EQ((std::vector<int>{60, 75, 85, 100}), OfferedRates(800, 600, 16));
    EXPECT_EQ(75, MaxRefreshRate(800, 600, 16));
    EXPECT_EQ(1, CombinedRateRange(800, 600, 16, &lo, &hi));
    EXPECT_EQ(60, lo);
    EXPECT_EQ(100, hi);
    EXPECT_EQ(0, RefreshRateAt(0, 1600, 1200, 8));  // a mode without any list
    EXPECT_EQ(NO_RATE_LIMIT, MaxRefreshRate(1600, 1200, 8));
    EXPECT_EQ(0, CombinedRateRange(1600, 1200, 8, &lo, &hi));

    // Within 19 Hz of the target, the nearer of the listed rates around it.
    const int nearest[][4] = {{640, 480, 73, 72}, {640, 480, 74, 75}, {640, 480, 100, 75}, {640, 480, 0, 0},
                              {640, 480, -5, 0},  {1024, 768, 60, 60}, {1024, 768, 59, 59}, {640, 480, 30, 0},
                              {640, 480, 41, 60}, {640, 480, 40, 0}};
    for (const auto& n : nearest) {
        a->width = (uint16_t)n[0];
        a->height = (uint16_t)n[1];
        EXPECT_EQ(n[3], NearestListedRefresh(n[2])) << n[0] << " " << n[2];
    }
    a->flags |= ADAPTER_NO_CLOCK_REFRESH;  // the driver rules: no extended rates
    EXPECT_EQ((std::vector<int>{60, 75}), OfferedRates(800, 600, 16));
}
