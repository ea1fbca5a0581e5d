// The mode table and the refresh-rate model against the simulated display driver.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/settings.h"
#include "base/state.h"
#include "hardware/driver_key.h"
#include "hardware/machine.h"
#include "modes/detect.h"
#include "modes/display_settings.h"
#include "modes/mode_keys.h"
#include "modes/mode_list.h"
#include "modes/rate_list.h"
#include "shell/main_window.h"
#include "support/machine.h"
#include "support/support.h"

static std::vector<int> Parse(const std::string& text)
{
    std::vector<int> rates;
    for (int i = 0; ParseRateList(text.c_str(), i) > 0; ++i) rates.push_back(ParseRateList(text.c_str(), i));
    return rates;
}

TEST(ModeList, Windows9xRatesFromTheDriversModeKeys)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_98));
    char driver_key[DRIVER_KEY_SIZE];
    ASSERT_EQ(1, FindDriverKey(driver_key));
    std::string modes = std::string(driver_key) + "\\MODES\\";
    std::vector<int> list8 = Parse(ReadRegistryRaw(HKEY_LOCAL_MACHINE, modes + "8\\800,600", "").c_str());
    ASSERT_FALSE(list8.empty());
    EXPECT_EQ(list8, OfferedRates(800, 600, 8));
    // Without a key of its own a deeper mode takes the 8-bit list.
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, modes + "16\\800,600");
    EXPECT_EQ(list8, OfferedRates(800, 600, 16));
    EXPECT_EQ(list8.back(), MaxRefreshRate(800, 600, 16));

    EXPECT_EQ(1, ModeKeyRefresh(800, 600, 8, 1, 72));
    EXPECT_EQ(72, ModeKeyRefresh(800, 600, 8, 0, 0));
    EXPECT_EQ(1, ModeKeyRefresh(800, 600, 8, 1, 0));
    EXPECT_EQ(0, ModeKeyRefresh(800, 600, 8, 0, 0));
    EXPECT_EQ(-1, ModeKeyRefresh(1601, 1200, 8, 1, 60));  // no such mode key
}

TEST(ModeList, NTTableIsSortedWithoutVgaModesOrRepeats)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_NT4));
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
    // The display driver's own frequencies, in its order; the VGA driver's
    // modes and "default" frequencies give none.
    struct Collect {
        std::vector<int> rates;
        int vga_modes;
    } collect = {{}, 0};
    ForEachListedMode(
        [](const ListedMode* m, void* data) {
            Collect* c = (Collect*)data;
            if (m->width == 640 && m->height == 480 && m->bits_per_pixel == 8) {
                if (m->vga_device) ++c->vga_modes;
                else if (m->frequency >= 5) c->rates.push_back(m->frequency);
            }
            return true;
        },
        &collect);
    EXPECT_GT(collect.vga_modes, 0) << "the machine should list VGA modes";
    EXPECT_EQ(collect.rates, OfferedRates(640, 480, 8));
    EXPECT_EQ(collect.rates.back(), MaxRefreshRate(640, 480, 8));
}

TEST(ModeList, MeasuredRateIsWhatTheDriverSet)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_NT4));
    const int modes[][4] = {{640, 480, 8, 60},   {640, 480, 8, 72},   {640, 480, 16, 85},   {800, 600, 8, 56},
                            {800, 600, 16, 72},  {1024, 768, 8, 70},  {1024, 768, 16, 85},  {1280, 1024, 8, 60},
                            {800, 600, 8, 100},  {640, 480, 8, 120}};
    int changed = 0;
    for (const auto& m : modes) {
        DEVMODEA request = {};
        request.dmSize = sizeof request;
        request.dmFields = DM_PELSWIDTH | DM_PELSHEIGHT | DM_BITSPERPEL | DM_DISPLAYFREQUENCY;
        request.dmPelsWidth = m[0];
        request.dmPelsHeight = m[1];
        request.dmBitsPerPel = m[2];
        request.dmDisplayFrequency = m[3];
        if (MachineChangeDisplaySettings(&request, 0) != DISP_CHANGE_SUCCESSFUL) continue;
        ++changed;
        RefreshAdapterModes(REFRESH_LATER);
        EXPECT_EQ(m[3], CurrentAdapter()->refresh_hz) << m[0] << "x" << m[1] << "x" << m[2];
        EXPECT_NEAR(m[3], SimRefreshHz(0), 1.0);
    }
    EXPECT_GE(changed, 7) << "most of these modes are the card's own";
}

TEST(ModeList, SavedRateBelongsToItsMode)
{
    ClearSettingsStore();
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_98));
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

TEST(ModeList, AHundredModesFillTheTableAndEndTheEnumeration)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_98));
    static SimListedMode modes[120];
    for (int i = 0; i < 120; ++i) modes[i] = SimListedMode{(uint16_t)(640 + 8 * i), 480, 8, 1, {60}};
    modes[119].width = 600;  // would sort first, were it taken
    SimSetModeList(modes, 120);
    ForgetDisplaySettings();
    BuildModeTable(0);
    int entries = 0;
    while (entries < MODE_TABLE_SIZE && mode_table[entries].bits_per_pixel) ++entries;
    EXPECT_EQ(MODE_TABLE_SIZE, entries);
    EXPECT_EQ(640, mode_table[0].width);
    EXPECT_EQ(640 + 8 * 99, mode_table[99].width);
    EXPECT_EQ(60, mode_table[99].rates[0]);
    SimSetModeList(NULL, 0);
}

TEST(ModeList, NTListsAreWalkedOnceUntilTheDisplayChanges)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_NT4));
    ForgetDisplaySettings();
    SimResetCounters();
    for (int i = 0; i < 5; ++i) RefreshRateAt(i, 800, 600, 8);
    MaxRefreshRate(1024, 768, 8);
    EXPECT_EQ(1u, SimGetCounters()->enum_settings_walks);

    HWND window = CreateWindowExA(WS_EX_TOOLWINDOW, "STATIC", "", WS_POPUP, 0, 0, 1, 1, NULL, NULL, NULL, NULL);
    CurrentAdapter()->refresh_hz = REFRESH_CHANGE_MARKER;  // re-read nothing else
    MainWindowProc(window, WM_DISPLAYCHANGE, 8, MAKELPARAM(1024, 768));
    RefreshRateAt(0, 800, 600, 8);
    EXPECT_EQ(2u, SimGetCounters()->enum_settings_walks);
    DestroyWindow(window);
}
