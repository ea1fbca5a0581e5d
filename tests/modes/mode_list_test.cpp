// The mode table and the refresh-rate model against the simulated display driver.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/settings.h"
#include "hardware/machine.h"
#include "modes/display_settings.h"
#include "modes/mode_keys.h"
#include "modes/mode_list.h"
#include "modes/rate_list.h"
#include "shell/main_window.h"
#include "support/machine.h"
#include "support/registry_opens.h"
#include "support/support.h"

static std::vector<int> Parse(const std::string& text)
{
    std::vector<int> rates;
    for (int i = 0; ParseRateList(text.c_str(), i) > 0; ++i) rates.push_back(ParseRateList(text.c_str(), i));
    return rates;
}

TEST(ModeList, Windows9xRatesFromTheDriversModeKeysAndTheSavedRate)
{
    ClearSettingsStore();
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_98));
    std::string modes = "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\0000\\MODES\\";
    std::vector<int> list8 = Parse(ReadRegistryRaw(HKEY_LOCAL_MACHINE, modes + "8\\800,600", "").c_str());
    ASSERT_FALSE(list8.empty());
    EXPECT_EQ(list8, OfferedRates(800, 600, 8));
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, modes + "16\\800,600");  // a deeper mode takes the 8-bit list
    EXPECT_EQ(list8, OfferedRates(800, 600, 16));
    EXPECT_EQ(list8.back(), MaxRefreshRate(800, 600, 16));
    const int refresh[][3] = {{1, 72, 1}, {0, 0, 72}, {1, 0, 1}, {0, 0, 0}};  // write, value, result
    for (const auto& r : refresh) EXPECT_EQ(r[2], ModeKeyRefresh(800, 600, 8, r[0], r[1]));
    EXPECT_EQ(-1, ModeKeyRefresh(1601, 1200, 8, 1, 60));  // no such mode key

    AdapterRecord* a = CurrentAdapter();
    const int saved[][2] = {{SETTING_REFRESH, 85}, {SETTING_BITS, a->bits_per_pixel}, {SETTING_WIDTH, a->width},
                            {SETTING_HEIGHT, a->height}};
    for (const auto& s : saved) SaveSetting(s[0], s[1]);
    a->refresh_hz = 0;
    EXPECT_EQ(85, SavedRefreshRate());
    SaveSetting(SETTING_WIDTH, a->width + 1);
    EXPECT_EQ(OsRefreshRate(), SavedRefreshRate());
    EXPECT_EQ(0, LoadSetting(SETTING_REFRESH));  // another mode's rate is dropped
    a->refresh_hz = 72;
    EXPECT_EQ(72, SavedRefreshRate());
    ClearSettingsStore();
}

TEST(ModeList, NTTableAndListsWalkedOnceUntilTheDisplayChanges)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_NT4));
    // The display driver's own frequencies in its order; the VGA driver's
    // modes and "default" frequencies give none.
    std::vector<int> rates;
    int vga_modes = 0;
    for (DWORD n = 0;; ++n) {
        DEVMODEA m = {};
        m.dmSize = sizeof m;
        if (!MachineEnumDisplaySettings(NULL, n, &m)) break;
        if (m.dmPelsWidth != 640 || m.dmPelsHeight != 480 || m.dmBitsPerPel != 8) continue;
        if (!_strnicmp((const char*)m.dmDeviceName, "vga", 3)) ++vga_modes;
        else if (m.dmDisplayFrequency >= 5) rates.push_back((int)m.dmDisplayFrequency);
    }
    EXPECT_GT(vga_modes, 0) << "the machine should list VGA modes";
    ForgetDisplaySettings();
    SimResetCounters();
    BuildModeTable(0);
    ASSERT_TRUE(mode_table);
    int entries = 0;
    for (; entries < MODE_TABLE_SIZE && mode_table[entries].bits_per_pixel; ++entries) {
        const ModeEntry& e = mode_table[entries];
        const ModeEntry* before = entries ? &mode_table[entries - 1] : nullptr;
        EXPECT_GE(e.width, 640);
        EXPECT_NE(15, e.bits_per_pixel);
        EXPECT_GT(e.rates[0], 0);
        for (int k = 1; k < MODE_RATES && e.rates[k]; ++k) EXPECT_LT(e.rates[k - 1], e.rates[k]);
        if (before && before->bits_per_pixel == e.bits_per_pixel)
            EXPECT_TRUE(before->width < e.width || (before->width == e.width && before->height < e.height));
    }
    EXPECT_GT(entries, 5);
    EXPECT_EQ(rates, OfferedRates(640, 480, 8));
    EXPECT_EQ(rates.back(), MaxRefreshRate(640, 480, 8));
    EXPECT_EQ(1u, SimGetCounters()->enum_settings_walks);
    SimResetCounters();
    OfferedRates(640, 480, 8);
    EXPECT_EQ(0u, SimGetCounters()->enum_settings_calls) << "a list kept whole is not read on";

    // While the program changes the mode itself, a display change re-reads
    // no mode, but the list all the same.
    HWND window = CreateWindowExA(WS_EX_TOOLWINDOW, "STATIC", "", WS_POPUP, 0, 0, 1, 1, NULL, NULL, NULL, NULL);
    CurrentAdapter()->refresh_hz = REFRESH_CHANGE_MARKER;
    CurrentAdapter()->width = 1;
    MainWindowProc(window, WM_DISPLAYCHANGE, 8, MAKELPARAM(1024, 768));
    EXPECT_EQ(1, CurrentAdapter()->width);
    RefreshRateAt(0, 800, 600, 8);
    EXPECT_EQ(1u, SimGetCounters()->enum_settings_walks);
    DestroyWindow(window);
}

TEST(ModeList, MeasuredRateIsWhatTheDriverSet)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_NT4));
    AdapterRecord* a = CurrentAdapter();
    const int modes[][4] = {{640, 480, 8, 60},  {640, 480, 8, 72},  {640, 480, 16, 85},  {800, 600, 8, 56},
                            {800, 600, 16, 72}, {1024, 768, 8, 70}, {1024, 768, 16, 85}, {1280, 1024, 8, 60},
                            {800, 600, 8, 100}, {640, 480, 8, 120}};
    int changed = 0;
    for (const auto& m : modes) {
        if (!SimSetCardMode(0, m[0], m[1], m[2], m[3])) continue;
        ++changed;
        a->width = (uint16_t)m[0], a->height = (uint16_t)m[1], a->bits_per_pixel = (uint16_t)m[2];
        EXPECT_EQ(m[3], MeasuredRefreshRate()) << m[0] << "x" << m[1] << "x" << m[2];
        EXPECT_NEAR(m[3], SimRefreshHz(0), 1.0);
    }
    EXPECT_GE(changed, 7) << "most of these modes are the card's own";
}

TEST(ModeList, AHundredModesFillTheTableAndEndTheEnumeration)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_98));
    static SimListedMode modes[120];
    // The driver lists them widest first; beyond the hundredth, a mode that
    // would sort first, were it taken.
    for (int i = 0; i < 120; ++i)
        modes[i] = SimListedMode{(uint16_t)(i < 100 ? 640 + 8 * (99 - i) : 600), 480, 8, 1, {60}};
    SimSetModeList(modes, 120);
    ForgetDisplaySettings();
    ASSERT_TRUE(CountRegistryOpens());
    char text[RATE_LIST_TEXT_SIZE];
    registry_opens = 0;
    ModeKeyRates(640, 480, 8, text, sizeof text);
    const unsigned one_mode = registry_opens;  // finding the driver key, then the mode's key
    registry_opens = 0;
    BuildModeTable(0);
    EXPECT_LE(registry_opens, MODE_TABLE_SIZE + one_mode) << "the driver key found once, each mode's key opened once";
    registry_opens = 0;
    ModeKeyRates(640, 480, 8, text, sizeof text);
    EXPECT_EQ(one_mode, registry_opens) << "a key held past the table would be the wrong adapter's after a switch";
    int entries = 0;
    while (entries < MODE_TABLE_SIZE && mode_table[entries].bits_per_pixel) ++entries;
    EXPECT_EQ(MODE_TABLE_SIZE, entries);
    EXPECT_EQ(640, mode_table[0].width);
    EXPECT_EQ(640 + 8 * 99, mode_table[99].width);
    EXPECT_EQ(60, mode_table[99].rates[0]);
}

// Each Windows 98 display device has its own list, whichever was read before.
TEST(ModeList, EachDisplayDeviceListsItsOwnModes)
{
    ASSERT_NO_FATAL_FAILURE(BootTwoDisplayDevicesOn98());
    for (int16_t adapter : {1, 0, 1}) {
        current_adapter = adapter;
        BuildModeTable(0);
        bool deep = false;
        for (int i = 0; i < MODE_TABLE_SIZE && mode_table[i].bits_per_pixel; ++i)
            deep |= mode_table[i].width == 1024 && mode_table[i].bits_per_pixel == 32 && mode_table[i].rates[0];
        EXPECT_EQ(adapter == 1, deep) << "adapter " << adapter;
    }
    FreeModeTable();
}
