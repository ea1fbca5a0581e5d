// Refresh and mode changes against the simulated display driver and card.
// tests/system holds the end-to-end rate change, "/A" and the re-application.
#include <gtest/gtest.h>

#include <math.h>

#include "base/adapters.h"
#include "base/settings.h"
#include "base/state.h"
#include "hardware/companions.h"
#include "modes/mode_change.h"
#include "modes/mode_keys.h"
#include "modes/mode_list.h"
#include "pages/desktop_apply.h"
#include "shell/main_window.h"
#include "shell/tray.h"
#include "support/machine.h"
#include "support/support.h"

TEST(RefreshCloseEnough, ThreeHertzFiveAboveNinetyAndInterlaced)
{
    const int cases[][3] = {{72, 70, 1}, {72, 75, 1}, {72, 76, 0}, {100, 95, 1}, {100, 94, 0},
                            {90, 95, 0}, {91, 96, 1}, {30, 43, 1}, {60, 43, 0}, {50, 43, 0}};
    for (const auto& c : cases) EXPECT_EQ(c[2] != 0, RefreshCloseEnough(c[0], c[1])) << c[0] << " " << c[1];
}

class ModeChange : public ::testing::Test {
protected:
    void SetUp() override { ClearSettingsStore(); }
    void TearDown() override { ClearSettingsStore(); }
    // Boots; the chip file offers the rate given, or else one 15 Hz above
    // all that Windows lists for the mode.
    void Boot(int windows, int rate = 0)
    {
        ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(windows));
        std::string ini = MakeScratchFolder("modechange") + "ZNTR3.INI", mode = std::to_string(a->width) + "x" +
                          std::to_string(a->height) + "x" + std::to_string(a->bits_per_pixel);
        extended = rate ? rate : MaxRefreshRate(a->width, a->height, a->bits_per_pixel) + 15;
        WritePrivateProfileStringA(windows == SIM_WINDOWS_NT4 ? "CHIP8901_NT4E" : "CHIP8901_95E", mode.c_str(),
                                   std::to_string(extended).c_str(), ini.c_str());
        lstrcpynA(chip_ini_path, ini.c_str(), sizeof chip_ini_path);
    }
    AdapterRecord* a = &adapter_table[0];
    int extended = 0;
};

// A rate close to the running one changes nothing. A rate the synthesizer
// cannot reach is not running: it is neither stored nor believed in effect.
TEST_F(ModeChange, RatesThatChangeNothing)
{
    ASSERT_NO_FATAL_FAILURE(Boot(SIM_WINDOWS_98, 400));
    int running = MeasuredRefreshRate();
    double clock = SimPixelClockHz(0);
    ASSERT_GT(running, 50);
    SimResetCounters();
    EXPECT_EQ(1, SetRefreshRate(running + 2));
    EXPECT_EQ(running + 2, a->refresh_hz);
    EXPECT_EQ(0u, SimGetCounters()->mode_changes);
    EXPECT_EQ(clock, SimPixelClockHz(0));
    for (int rate : {400, 65536 + running, 1}) {  // beyond 16 bits a number is no rate
        EXPECT_EQ(0, SetRefreshRate(rate));
        EXPECT_NE(rate, a->refresh_hz);
        EXPECT_EQ(-1, LoadSetting(SETTING_REFRESH)) << rate;
    }
    EXPECT_NEAR(MaxRefreshRate(a->width, a->height, a->bits_per_pixel), SimRefreshHz(0), 1.0);
}

// NT lends its kernel device per change: a handle kept would be one more
// each time the rate is set.
TEST_F(ModeChange, TheKernelDeviceOpenedForARateIsClosedAgain)
{
    ASSERT_NO_FATAL_FAILURE(Boot(SIM_WINDOWS_NT4));
    SimResetCounters();
    ASSERT_EQ(1, SetRefreshRate(extended));
    EXPECT_GE(SimGetCounters()->device_opens, 1u);
    EXPECT_EQ(SimGetCounters()->device_opens, SimGetCounters()->device_closes);
}

// Through the rate alone or a whole mode change, the chosen rate runs and is stored.
TEST_F(ModeChange, TheModeKeyHoldsTheListsMaximumUnlessTheChipIsUnclamped)
{
    const struct { uint32_t flag; bool whole_mode; } ways[] = {{0, false}, {ADAPTER_UNCLAMPED_RATE, false}, {0, true}};
    for (const auto& w : ways) {
        ASSERT_NO_FATAL_FAILURE(Boot(SIM_WINDOWS_98));
        a->flags |= w.flag;
        if (w.whole_mode)
            ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, ApplyDisplayMode(NULL, DM_PELSWIDTH | DM_PELSHEIGHT, a->width, a->height,
                                                               a->bits_per_pixel, 96, 96, extended));
        else
            ASSERT_EQ(1, SetRefreshRate(extended));
        EXPECT_EQ(w.flag ? extended : extended - 15, ModeKeyRefresh(a->width, a->height, a->bits_per_pixel, 0, 0));
        EXPECT_NEAR(extended, SimRefreshHz(0), 2.0);
        EXPECT_EQ(extended, MeasuredRefreshRate());
        const int stored[][2] = {{SETTING_REFRESH, extended}, {SETTING_WIDTH, a->width}, {SETTING_HEIGHT, a->height},
                                 {SETTING_BITS, a->bits_per_pixel}};
        for (const auto& s : stored) EXPECT_EQ(s[1], LoadSetting(s[0])) << "setting " << s[0];
    }
}

// Windows 95 changes the depth only at its next start: the record keeps the
// running mode, the store what the user chose.
TEST_F(ModeChange, AChangeWindowsMakesOnlyAfterARestartStoresTheChoice)
{
    ASSERT_NO_FATAL_FAILURE(Boot(SIM_WINDOWS_95));
    AdapterRecord before = *a;
    int bits = before.bits_per_pixel == 8 ? 16 : 8, chosen = MaxRefreshRate(before.width, before.height, bits) + 15;
    ASSERT_EQ(DISP_CHANGE_RESTART, ApplyDisplayMode(NULL, DM_BITSPERPEL, a->width, a->height, bits, 96, 96, chosen));
    EXPECT_EQ(before.bits_per_pixel, a->bits_per_pixel);
    EXPECT_EQ(before.refresh_hz, a->refresh_hz);
    const int stored[][2] = {{SETTING_BITS, bits}, {SETTING_REFRESH, chosen}, {SETTING_WIDTH, before.width},
                             {SETTING_HEIGHT, before.height}};
    for (const auto& s : stored) EXPECT_EQ(s[1], LoadSetting(s[0])) << "setting " << s[0];
}

// The second display device's mode, and its rate, go to the second card alone.
TEST_F(ModeChange, TheSecondDisplayDeviceChangesOnlyTheSecondCard)
{
    ASSERT_NO_FATAL_FAILURE(BootTwoDisplayDevicesOn98());
    const SimCardMode primary = SimGetCardMode(0);
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, ApplyDisplayMode(NULL, DM_PELSWIDTH | DM_PELSHEIGHT | DM_BITSPERPEL, 800, 600,
                                                       32, 96, 96, 85));
    const SimCardMode second = SimGetCardMode(1), first = SimGetCardMode(0);
    EXPECT_TRUE(second.width == 800 && second.height == 600 && second.bits == 32) << second.width;
    EXPECT_NEAR(85, SimRefreshHz(1), 1.0);
    EXPECT_TRUE(first.width == primary.width && first.bits == primary.bits && first.refresh == primary.refresh)
        << first.width << "x" << first.height << "x" << first.bits << "@" << first.refresh;
}

static int restarts;

// Cancel goes back, and is what Enter presses on a screen one may not see;
// a font size change goes straight to the offer to restart.
TEST_F(ModeChange, TheDesktopPagesQuestions)
{
    ASSERT_NO_FATAL_FAILURE(Boot(SIM_WINDOWS_98));
    AdapterRecord before = *a;
    HDC dc = GetDC(NULL);
    int dpi = GetDeviceCaps(dc, LOGPIXELSX);
    ReleaseDC(NULL, dc);
    DesktopSelection selection = {800, 600, a->bits_per_pixel, dpi, dpi, 75};
    {
        DialogAnswerer cancel(IDCANCEL);
        EXPECT_EQ(0, ApplyDesktopPage(NULL, &selection));
        EXPECT_NE(std::string::npos, cancel.text.find("Do you want to keep this settings?"));
        EXPECT_EQ("Change Display Mode", cancel.caption);
        EXPECT_EQ(IDCANCEL, cancel.default_button);
    }
    EXPECT_TRUE(selection.width == before.width && selection.height == before.height);
    EXPECT_TRUE(SimGetCardMode(0).width == before.width && SimGetCardMode(0).height == before.height);
    EXPECT_EQ(before.width, a->width);
    EXPECT_EQ(before.width, GetSystemMetrics(SM_CXSCREEN));

    ASSERT_NO_FATAL_FAILURE(Boot(SIM_WINDOWS_NT4));
    restart_windows = [](UINT, DWORD) -> BOOL { return ++restarts; };
    dpi = dpi == 120 ? 96 : 120;
    selection = {a->width, a->height, a->bits_per_pixel, dpi, dpi, a->refresh_hz};
    // A system font of neither set keeps Wine's own DPI as it is.
    std::string fonts = ReadRegistryRaw(HKEY_CURRENT_CONFIG, "Software\\Fonts", "FONTS.FON").c_str();
    WriteRegistryString(HKEY_CURRENT_CONFIG, "Software\\Fonts", "FONTS.FON", "other.fon");
    {
        DialogAnswerer ok(IDOK);
        ApplyDesktopPage(NULL, &selection);
        EXPECT_NE(std::string::npos, ok.text.find("You need to restart windows"));
    }
    EXPECT_EQ(1, restarts);
    restart_windows = ExitWindowsEx;
    WriteRegistryString(HKEY_CURRENT_CONFIG, "Software\\Fonts", "FONTS.FON", fonts);
}

TEST_F(ModeChange, RedrawsReapplyAfterThreeQuietSeconds)
{
    ASSERT_NO_FATAL_FAILURE(Boot(SIM_WINDOWS_98));
    HWND window = CreateWindowExA(WS_EX_TOOLWINDOW, "STATIC", "", WS_POPUP, 0, 0, 1, 1, NULL, NULL, NULL, NULL);
    PlaceMainWindow(window);
    ASSERT_EQ(1, SetRefreshRate(extended));
    SimRestartWindows();  // something else put the card back to the driver's timing
    for (DWORD quiet : {2999, 3000}) {
        last_activity_tick = GetTickCount() - quiet;
        ReapplyAfterRedraw(window);
        EXPECT_EQ(quiet == 3000, fabs(SimRefreshHz(0) - extended) < 2.0) << quiet;
        EXPECT_LE(GetTickCount() - last_activity_tick, 100u);
    }
    DestroyWindow(window);
}

// Every rate the shipped chip file offers beyond Windows' lists runs on its family's card.
TEST_F(ModeChange, ShippedExtendedRatesRunOnTheirCards)
{
    const struct { uint16_t vendor_id, device_id; uint8_t bus; } cards[] = {
        {0x12d2, 0x0018, 0}, {0x10de, 0x0020, 1}, {0x121a, 0x0003, 0}, {0x8086, 0x7800, 1}, {0x100c, 0x3208, 0}};
    lstrcpynA(chip_ini_path, "Z:" VISTREL_RESOURCES "/ZNTR3.INI", sizeof chip_ini_path);
    for (const auto& c : cards) {
        SimCardConfig card = Card(c.vendor_id, c.device_id, c.bus, c.bus ? 0 : 10);
        card.memory_mb = 4;
        BootMachine(Machine(SIM_WINDOWS_98, {card}));
        lstrcpynA(chip_ini_path, "Z:" VISTREL_RESOURCES "/ZNTR3.INI", sizeof chip_ini_path);
        ASSERT_EQ(1, DetectAdapters());
        RefreshAdapterModes(REFRESH_AT_STARTUP);
        char section[32], keys[2048] = "";
        snprintf(section, sizeof section, "CHIP%04x_95E", c.device_id);
        ASSERT_GT(GetPrivateProfileSectionA(section, keys, sizeof keys, chip_ini_path), 0u) << section;
        for (const char* line = keys; *line; line += strlen(line) + 1) {
            int width, height, bits, consumed = 0;
            ASSERT_EQ(3, sscanf(line, "%dx%dx%d=%n", &width, &height, &bits, &consumed)) << line;
            ASSERT_EQ(DISP_CHANGE_SUCCESSFUL,
                      ApplyDisplayMode(NULL, DM_PELSWIDTH | DM_PELSHEIGHT | DM_BITSPERPEL, width, height, bits, 96, 96, 0))
                << section << " " << line;
            for (const char* rate = line + consumed; *rate; rate += strcspn(rate, ",") + (rate[strcspn(rate, ",")] != 0)) {
                EXPECT_EQ(1, SetRefreshRate(atoi(rate))) << section << " " << line;
                EXPECT_NEAR(atoi(rate), SimRefreshHz(0), 1.5) << section << " " << line;
            }
        }
    }
}

// The i740's synthesizer takes 71 MHz for the 80 MHz of 800x600 at 120 Hz: that rate is
// refused and not stored, and the card runs the display driver's own top rate, as the program believes.
TEST_F(ModeChange, ASettingFarFromTheRateIsTakenBack)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x8086, 0x7800, 1, 0)}));
    ASSERT_EQ(1, DetectAdapters());
    RefreshAdapterModes(REFRESH_AT_STARTUP);
    std::string ini = MakeScratchFolder("modechange") + "ZNTR3.INI";
    WritePrivateProfileStringA("CHIP7800_95E", "800x600x8", "120", ini.c_str());
    lstrcpynA(chip_ini_path, ini.c_str(), sizeof chip_ini_path);
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, ApplyDisplayMode(NULL, DM_PELSWIDTH | DM_PELSHEIGHT | DM_BITSPERPEL, 800, 600, 8, 96, 96, 0));
    ClearSettingsStore();
    EXPECT_EQ(0, SetRefreshRate(120));
    EXPECT_EQ(-1, LoadSetting(SETTING_REFRESH));
    EXPECT_NEAR(MaxRefreshRate(800, 600, 8), SimRefreshHz(0), 1.0);
    EXPECT_NEAR(MeasuredRefreshRate(), SimRefreshHz(0), 1.0);
}
