// The Permedia 2's timings installed into the timing list its simulated
// display driver keeps, which a failed write leaves as it was.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "chips/chips.h"
#include "hardware/driver_key.h"
#include "modes/timing_list.h"
#include "support/import_slot.h"
#include "support/machine.h"

namespace {

LONG(WINAPI* real_set_value)(HKEY, LPCSTR, DWORD, DWORD, const BYTE*, DWORD);
int writes_before_failure = -1;  // -1: none fails
int writes;

LONG WINAPI FailingSetValue(HKEY key, LPCSTR name, DWORD reserved, DWORD type, const BYTE* data, DWORD size)
{
    ++writes;
    if (writes_before_failure >= 0 && writes_before_failure-- == 0) return ERROR_ACCESS_DENIED;
    return real_set_value(key, name, reserved, type, data, size);
}

// Values "1", "2", ... of a mode's list up to the first one missing.
std::vector<std::string> List(int width, int height)
{
    char path[DRIVER_KEY_SIZE + 40];
    FindDriverKey(path);
    std::string key = std::string(path) + "\\DEFAULT\\TIMINGS\\" + std::to_string(width) + "," + std::to_string(height);
    std::vector<std::string> list;
    for (bool found = true;;) {
        std::string value = ReadRegistryRaw(HKEY_LOCAL_MACHINE, key, std::to_string(list.size() + 1), &found);
        if (!found) return list;
        list.push_back(value);
    }
}

std::string Record(const ChipTiming& timing) { return std::string((const char*)timing.record, CHIP_TIMING_SIZE); }

void BootPermedia2(int windows = SIM_WINDOWS_98)
{
    BootMachine(Machine(windows, {Card(0x3d3d, 0x0007)}));
    ASSERT_EQ(1, DetectAdapters());
    if (!real_set_value)
        real_set_value = (decltype(real_set_value))RedirectImport("advapi32.dll", "RegSetValueExA", (FARPROC)FailingSetValue);
    ASSERT_TRUE(real_set_value);
}

// The driver's list starts at its 60 Hz timing, slower than any record: the
// first record moves it down; a list that starts at 120 Hz or more keeps
// its place and loses "1". A rate without a record only asks for "RefreshRate".
TEST(TimingList, RecordsGoFirstInTheDriversList)
{
    ASSERT_NO_FATAL_FAILURE(BootPermedia2());
    std::vector<std::string> before = List(800, 600);
    ASSERT_GE(before.size(), 2u);
    ASSERT_EQ(60, before[0][0]);
    // Byte 1 may name a higher rate, as the records' does: byte 0 decides.
    before[0][1] = (char)200;
    HKEY key;
    ASSERT_EQ(1, OpenDriverSubkeyForUpdate("\\DEFAULT\\TIMINGS\\800,600", &key));
    RegSetValueExA(key, "1", 0, REG_BINARY, (const BYTE*)before[0].data(), (DWORD)before[0].size());
    RegCloseKey(key);
    ChipTiming timing;
    ASSERT_EQ(3u, chip_prepare_mode(800, 600, 16, 160, &timing));
    const BYTE record_800_160[CHIP_TIMING_SIZE] = {0xa0, 0xc8, 0x86, 0, 6, 0x0b, 0x11, 1, 0x7c, 2, 1, 3, 0x20, 1};
    EXPECT_EQ(0, memcmp(record_800_160, timing.record, CHIP_TIMING_SIZE));
    EXPECT_EQ(120, timing.shift_above);
    ASSERT_EQ(1, InstallTiming(800, 600, &timing));
    std::vector<std::string> after = {Record(timing)};
    after.insert(after.end(), before.begin(), before.end());
    EXPECT_EQ(after, List(800, 600));
    ASSERT_EQ(3u, chip_prepare_mode(800, 600, 16, 120, &timing));
    ASSERT_EQ(1, InstallTiming(800, 600, &timing));
    after[0] = Record(timing);
    EXPECT_EQ(after, List(800, 600)) << "160 Hz first: no shift";

    const struct { uint16_t width; uint32_t rate; } without[] = {{800, 85}, {1000, 120}};
    for (const auto& c : without) EXPECT_EQ(1u, chip_prepare_mode(c.width, 600, 16, c.rate, &timing)) << c.width;
    ASSERT_NO_FATAL_FAILURE(BootPermedia2(SIM_WINDOWS_NT4));
    EXPECT_EQ(0u, chip_prepare_mode(800, 600, 16, 160, &timing));
}

// A shift of the driver's n timings takes n + 1 writes; whichever fails,
// every value is back as it was and none is added. So with no shift.
TEST(TimingList, AFailedWriteLeavesTheListAsItWas)
{
    ASSERT_NO_FATAL_FAILURE(BootPermedia2());
    const std::vector<std::string> before = List(1024, 768);
    const int n = (int)before.size();
    ASSERT_GE(n, 3);
    ChipTiming timing;
    ASSERT_EQ(3u, chip_prepare_mode(1024, 768, 16, 150, &timing));
    for (int failing = 0; failing <= n; ++failing) {
        writes = 0;
        writes_before_failure = failing;
        EXPECT_EQ(0, InstallTiming(1024, 768, &timing)) << failing;
        writes_before_failure = -1;
        EXPECT_EQ(before, List(1024, 768)) << "write " << failing << " failed";
    }
    writes = 0;
    ASSERT_EQ(1, InstallTiming(1024, 768, &timing));
    EXPECT_EQ(n + 1, writes);
    const std::vector<std::string> shifted = List(1024, 768);
    ASSERT_EQ(3u, chip_prepare_mode(1024, 768, 16, 120, &timing));
    writes_before_failure = 0;
    EXPECT_EQ(0, InstallTiming(1024, 768, &timing));
    writes_before_failure = -1;
    EXPECT_EQ(shifted, List(1024, 768));
}

}  // namespace
