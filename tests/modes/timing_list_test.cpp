// The Permedia 2's timings installed into the display driver's timing list,
// which a failed write leaves as it was.
#include <gtest/gtest.h>

#include <string>

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

const char* const list_key = "\\DEFAULT\\TIMINGS\\1024,768";

// Values "1" to "5" as "rate:size" ("-" missing), from byte 0 and the length.
std::string List()
{
    std::string out;
    for (int n = 1; n <= 5; ++n) {
        BYTE data[64];
        DWORD size = sizeof data;
        HKEY key;
        char path[DRIVER_KEY_SIZE + 40];
        FindDriverKey(path);
        lstrcatA(path, list_key);
        bool read = RegOpenKeyExA(HKEY_LOCAL_MACHINE, path, 0, KEY_READ, &key) == ERROR_SUCCESS &&
                    RegQueryValueExA(key, std::to_string(n).c_str(), NULL, NULL, data, &size) == ERROR_SUCCESS;
        if (read) RegCloseKey(key);
        out += read ? std::to_string(data[0]) + ":" + std::to_string(size) + " " : "- ";
    }
    return out;
}

void Seed(std::initializer_list<BYTE> rates)
{
    HKEY key;
    ASSERT_EQ(1, OpenDriverSubkeyForUpdate(list_key, &key));
    for (int n = 1; n <= 5; ++n) RegDeleteValueA(key, std::to_string(n).c_str());
    int n = 1;
    for (BYTE rate : rates) {
        const BYTE value[3] = {rate, 1, 2};
        RegSetValueExA(key, std::to_string(n++).c_str(), 0, REG_BINARY, value, sizeof value);
    }
    RegCloseKey(key);
}

void BootPermedia2(int windows = SIM_WINDOWS_98)
{
    BootMachine(Machine(windows, {Card(0x3d3d, 0x0007)}));
    ASSERT_EQ(1, DetectAdapters());
    if (!real_set_value)
        real_set_value = (decltype(real_set_value))RedirectImport("advapi32.dll", "RegSetValueExA", (FARPROC)FailingSetValue);
    ASSERT_TRUE(real_set_value);
}

// The list moves down only when its first timing is slower than the width's
// slowest record; a rate without a record only asks for "RefreshRate".
TEST(TimingList, RecordsAndTheShift)
{
    ASSERT_NO_FATAL_FAILURE(BootPermedia2());
    const struct { uint16_t width; uint32_t rate; std::initializer_list<BYTE> before; uint32_t needs; std::string after; }
        cases[] = {
            {1024, 150, {60, 70}, 3, "150:14 60:3 70:3 - - "},
            {1024, 120, {120, 70}, 3, "120:14 70:3 - - - "},
            {1024, 150, {}, 3, "150:14 - - - - "},
            {1024, 85, {60}, 1, "60:3 - - - - "},
            {1000, 120, {60}, 1, "60:3 - - - - "},
        };
    for (const auto& c : cases) {
        ASSERT_NO_FATAL_FAILURE(Seed(c.before));
        ChipTiming timing = {};
        uint32_t needs = chip_prepare_mode(c.width, 768, 16, c.rate, &timing);
        EXPECT_EQ(c.needs, needs) << c.width << " " << c.rate;
        if (needs & PREPARE_TIMING) EXPECT_EQ(1, InstallTiming(1024, 768, &timing));
        EXPECT_EQ(c.after, List()) << c.width << " " << c.rate;
    }
    ChipTiming timing;
    ASSERT_EQ(3u, chip_prepare_mode(800, 600, 16, 160, &timing));
    const BYTE record_800_160[CHIP_TIMING_SIZE] = {0xa0, 0xc8, 0x86, 0, 6, 0x0b, 0x11, 1, 0x7c, 2, 1, 3, 0x20, 1};
    EXPECT_EQ(0, memcmp(record_800_160, timing.record, CHIP_TIMING_SIZE));
    EXPECT_EQ(120, timing.shift_above);
    ASSERT_NO_FATAL_FAILURE(BootPermedia2(SIM_WINDOWS_NT4));
    EXPECT_EQ(0u, chip_prepare_mode(800, 600, 16, 160));
}

// A shift of three values takes four writes; whichever fails, every value is
// back as it was and none is added.
TEST(TimingList, AFailedWriteLeavesTheListAsItWas)
{
    ASSERT_NO_FATAL_FAILURE(BootPermedia2());
    ChipTiming timing;
    ASSERT_EQ(3u, chip_prepare_mode(1024, 768, 16, 120, &timing));
    for (int failing = 0; failing < 4; ++failing) {
        ASSERT_NO_FATAL_FAILURE(Seed({60, 70, 75}));
        writes = 0;
        writes_before_failure = failing;
        EXPECT_EQ(0, InstallTiming(1024, 768, &timing)) << failing;
        writes_before_failure = -1;
        EXPECT_EQ("60:3 70:3 75:3 - - ", List()) << "write " << failing << " failed";
    }
    writes = 0;
    EXPECT_EQ(1, InstallTiming(1024, 768, &timing));
    EXPECT_EQ(4, writes);
}

}  // namespace
