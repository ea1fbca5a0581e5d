#include <gtest/gtest.h>

#include <math.h>

#include "base/adapters.h"
#include "base/settings.h"
#include "base/state.h"
#include "hardware/companions.h"
#include "hardware/driver_key.h"
#include "modes/detect.h"
#include "modes/mode_change.h"
#include "modes/mode_keys.h"
#include "modes/mode_list.h"
#include "modes/rate_list.h"
#include "pages/desktop_apply.h"
#include "shell/main_window.h"
#include "shell/tray.h"
#include "support/machine.h"
#include "support/support.h"

static const char card_key[] = "SOFTWARE\\QUORVEL\\PANEL\\53338901";

TEST(RefreshCloseEnough, ThreeHertzFiveAboveNinetyAndInterlaced)
{
    EXPECT_TRUE(RefreshCloseEnough(72, 70));
    EXPECT_TRUE(RefreshCloseEnough(72, 75));
    EXPECT_FALSE(RefreshCloseEnough(72, 76));
    EXPECT_TRUE(RefreshCloseEnough(100, 96));
    EXPECT_TRUE(RefreshCloseEnough(100, 95));
    EXPECT_FALSE(RefreshCloseEnough(100, 94));
    EXPECT_FALSE(RefreshCloseEnough(90, 95));
    EXPECT_TRUE(RefreshCloseEnough(30, 43));  // both interlaced
    EXPECT_FALSE(RefreshCloseEnough(60, 43));
}

class ModeChange : public ::testing::Test {
protected:
    void SetUp() override
    {
        ClearSettingsStore();
        folder = MakeScratchFolder("modechange");
        chip_ini = folder + "ZNTR3.INI";
    }
    void TearDown() override { ClearSettingsStore(); }
    void Boot(int windows)
    {
        SimMachineConfig config;
        SimDefaultMachine(&config);
        config.windows = windows;
        BootMachine(config);
        lstrcpynA(chip_ini_path, chip_ini.c_str(), sizeof chip_ini_path);
        ASSERT_EQ(1, DetectAdapters());
        RefreshAdapterModes(REFRESH_AT_STARTUP);
    }
    // A rate 15 Hz above everything the system lists for the current mode.
    int AddExtendedRate()
    {
        const AdapterRecord* a = CurrentAdapter();
        int max = MaxRefreshRate(a->width, a->height, a->bits_per_pixel);
        char key[32], value[16];
        snprintf(key, sizeof key, "%dx%dx%d", a->width, a->height, a->bits_per_pixel);
        snprintf(value, sizeof value, "%d", max + 15);
        WritePrivateProfileStringA(platform == PLATFORM_NT ? "CHIP8901_NT4E" : "CHIP8901_95E", key, value,
                                   chip_ini.c_str());
        return max + 15;
    }
    std::string folder, chip_ini;
};

TEST_F(ModeChange, AnExtendedRateIsReachedThroughThePixelClock)
{
    for (int windows : {SIM_WINDOWS_98, SIM_WINDOWS_NT4}) {
        ClearSettingsStore();
        Boot(windows);
        int extended = AddExtendedRate();
        ASSERT_EQ(1, SetRefreshRate(extended)) << windows;
        EXPECT_NEAR(extended, SimRefreshHz(0), 2.0) << windows;
        EXPECT_EQ(extended, CurrentAdapter()->refresh_hz);
        EXPECT_EQ(extended, LoadSetting(SETTING_REFRESH));
        EXPECT_EQ(CurrentAdapter()->width, LoadSetting(SETTING_WIDTH));
        EXPECT_EQ(CurrentAdapter()->height, LoadSetting(SETTING_HEIGHT));
        EXPECT_EQ(CurrentAdapter()->bits_per_pixel, LoadSetting(SETTING_BITS));
        EXPECT_EQ(extended, MeasuredRefreshRate());
    }
}

// A rate the synthesizer cannot reach is not running: it must not be
// stored for the next start, nor believed in effect.
TEST_F(ModeChange, ARateTheClockCannotReachIsNeitherStoredNorBelieved)
{
    Boot(SIM_WINDOWS_98);
    const AdapterRecord* a = CurrentAdapter();
    char key[32];
    snprintf(key, sizeof key, "%dx%dx%d", a->width, a->height, a->bits_per_pixel);
    WritePrivateProfileStringA("CHIP8901_95E", key, "400", chip_ini.c_str());
    int before = a->refresh_hz;
    EXPECT_EQ(0, SetRefreshRate(400));
    EXPECT_NE(400, a->refresh_hz);
    EXPECT_EQ(-1, LoadSetting(SETTING_REFRESH));
    EXPECT_NEAR(MaxRefreshRate(a->width, a->height, a->bits_per_pixel), SimRefreshHz(0), 1.0);
    // Beyond 16 bits a number is no rate at all.
    EXPECT_EQ(0, SetRefreshRate(65536 + before));
    EXPECT_EQ(-1, LoadSetting(SETTING_REFRESH));
}

TEST_F(ModeChange, AnUnclampedChipAsksWindowsForTheRateItself)
{
    Boot(SIM_WINDOWS_98);
    int extended = AddExtendedRate();
    const AdapterRecord* a = CurrentAdapter();
    int max = MaxRefreshRate(a->width, a->height, a->bits_per_pixel);
    ASSERT_EQ(1, SetRefreshRate(extended));
    EXPECT_EQ(max, ModeKeyRefresh(a->width, a->height, a->bits_per_pixel, 0, 0));  // clamped to the list

    Boot(SIM_WINDOWS_98);
    CurrentAdapter()->flags |= ADAPTER_UNCLAMPED_RATE;
    ASSERT_EQ(1, SetRefreshRate(extended));
    EXPECT_EQ(extended, ModeKeyRefresh(a->width, a->height, a->bits_per_pixel, 0, 0));
    EXPECT_NEAR(extended, SimRefreshHz(0), 2.0);
}

TEST_F(ModeChange, ARateCloseToTheRunningOneChangesNothing)
{
    Boot(SIM_WINDOWS_98);
    int running = MeasuredRefreshRate();
    ASSERT_GT(running, 50);
    double clock = SimPixelClockHz(0);
    SimResetCounters();
    EXPECT_EQ(1, SetRefreshRate(running + 2));
    EXPECT_EQ(running + 2, CurrentAdapter()->refresh_hz);
    EXPECT_EQ(0u, SimGetCounters()->mode_changes);
    EXPECT_EQ(clock, SimPixelClockHz(0));
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key));
    EXPECT_EQ(0, SetRefreshRate(1));
    EXPECT_EQ(0, SetRefreshRate(0));
}

TEST_F(ModeChange, TheMessageTakesOnlyRatesTheModeOffers)
{
    Boot(SIM_WINDOWS_98);
    const AdapterRecord* a = CurrentAdapter();
    int lowest = 0, highest = 0;
    ASSERT_EQ(1, CombinedRateRange(a->width, a->height, a->bits_per_pixel, &lowest, &highest));
    uint16_t before = a->refresh_hz;
    double clock = SimPixelClockHz(0);
    for (WPARAM rate : {(WPARAM)65535, (WPARAM)(highest + 1), (WPARAM)(lowest - 1), (WPARAM)2, (WPARAM)0})
        EXPECT_EQ(0, OnSetRefreshMessage(rate)) << rate;
    EXPECT_EQ(before, a->refresh_hz);
    EXPECT_EQ(clock, SimPixelClockHz(0));
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key));
    EXPECT_EQ(1, OnSetRefreshMessage(highest));
    EXPECT_EQ(highest, a->refresh_hz);
}

TEST_F(ModeChange, StartUpWithSwitchARestoresTheSavedRate)
{
    Boot(SIM_WINDOWS_98);
    int extended = AddExtendedRate();
    ASSERT_EQ(1, SetRefreshRate(extended));
    // A fresh start on a machine whose card runs the driver's timing again.
    SimRestartWindows();
    ResetProgramState("", chip_ini);
    platform = PLATFORM_9X;
    os_class = OS_CLASS_WIN98;
    startup_flags = STARTUP_AUTORUN;
    ASSERT_GT(fabs(SimRefreshHz(0) - extended), 2.0);
    ASSERT_EQ(1, DetectAdapters());
    RefreshAdapterModes(REFRESH_AT_STARTUP);
    EXPECT_EQ(extended, CurrentAdapter()->refresh_hz);
    EXPECT_NEAR(extended, SimRefreshHz(0), 2.0);
}

TEST_F(ModeChange, AChangeWindowsMakesOnlyAfterARestartLeavesTheRecord)
{
    Boot(SIM_WINDOWS_95);
    AdapterRecord before = *CurrentAdapter();
    int bits = before.bits_per_pixel == 8 ? 16 : 8;
    LONG r = ApplyDisplayMode(NULL, DM_BITSPERPEL, before.width, before.height, bits, 96, 96, before.refresh_hz);
    ASSERT_EQ(DISP_CHANGE_RESTART, r);
    EXPECT_EQ(before.bits_per_pixel, CurrentAdapter()->bits_per_pixel);
    EXPECT_EQ(before.refresh_hz, CurrentAdapter()->refresh_hz);
    EXPECT_EQ(bits, LoadSetting(SETTING_BITS));  // what Windows will start with
}

TEST_F(ModeChange, CancelOnTheQuestionGoesBack)
{
    Boot(SIM_WINDOWS_98);
    AdapterRecord before = *CurrentAdapter();
    DesktopSelection selection = {800, 600, before.bits_per_pixel, 96, 96, 75};
    HDC dc = GetDC(NULL);
    selection.dpi_x = GetDeviceCaps(dc, LOGPIXELSX);
    selection.dpi_y = GetDeviceCaps(dc, LOGPIXELSY);
    ReleaseDC(NULL, dc);
    {
        DialogAnswerer cancel(IDCANCEL);
        ApplyDesktopPage(NULL, &selection);
        EXPECT_EQ(1, cancel.answered);
        EXPECT_NE(std::string::npos, cancel.text.find("Do you want to keep this settings?"));
        EXPECT_EQ("Change Display Mode", cancel.caption);
    }
    EXPECT_EQ(before.width, selection.width);
    EXPECT_EQ(before.height, selection.height);
    EXPECT_EQ(before.width, CurrentAdapter()->width);
    SimCardMode mode = SimGetCardMode(0);
    EXPECT_EQ(before.width, mode.width);
    EXPECT_EQ(before.height, mode.height);
    HDC screen = GetDC(NULL);
    EXPECT_EQ(before.width, GetDeviceCaps(screen, HORZRES));
    ReleaseDC(NULL, screen);
}

static UINT restarts;
static BOOL WINAPI RecordRestart(UINT flags, DWORD reason)
{
    ++restarts;
    return TRUE;
}

TEST_F(ModeChange, AFontSizeChangeGoesStraightToTheRestartOffer)
{
    Boot(SIM_WINDOWS_NT4);
    restart_windows = RecordRestart;
    restarts = 0;
    AdapterRecord before = *CurrentAdapter();
    HDC dc = GetDC(NULL);
    int dpi = GetDeviceCaps(dc, LOGPIXELSX);
    ReleaseDC(NULL, dc);
    DesktopSelection selection = {before.width, before.height, before.bits_per_pixel, dpi == 120 ? 96 : 120,
                                  dpi == 120 ? 96 : 120, before.refresh_hz};
    {
        DialogAnswerer ok(IDOK);
        ApplyDesktopPage(NULL, &selection);
        EXPECT_EQ(1, ok.answered);
        EXPECT_NE(std::string::npos, ok.text.find("You need to restart windows"));
    }
    EXPECT_EQ(1u, restarts);
    restart_windows = ExitWindowsEx;
}

TEST_F(ModeChange, RedrawsReapplyAfterThreeQuietSeconds)
{
    Boot(SIM_WINDOWS_98);
    HWND window = CreateWindowExA(WS_EX_TOOLWINDOW, "STATIC", "", WS_POPUP, 0, 0, 1, 1, NULL, NULL, NULL, NULL);
    main_window = window;
    PlaceMainWindow(window);
    int extended = AddExtendedRate();
    ASSERT_EQ(1, SetRefreshRate(extended));
    // Something else put the card back to the driver's timing.
    SimRestartWindows();
    ASSERT_GT(fabs(SimRefreshHz(0) - extended), 2.0);

    last_activity_tick = GetTickCount() - 2999;
    ReapplyAfterRedraw(window);
    EXPECT_GT(fabs(SimRefreshHz(0) - extended), 2.0);
    EXPECT_LE(GetTickCount() - last_activity_tick, 100u);

    last_activity_tick = GetTickCount() - 3000;
    ReapplyAfterRedraw(window);
    EXPECT_NEAR(extended, SimRefreshHz(0), 2.0);

    // While the program changes the mode itself, a display change re-reads nothing.
    CurrentAdapter()->refresh_hz = REFRESH_CHANGE_MARKER;
    CurrentAdapter()->width = 1;
    OnDisplayChange(window);
    EXPECT_EQ(1, CurrentAdapter()->width);
    DestroyWindow(window);
}
