// The hidden main window: its place, what redraws and display changes re-apply, the power states.
#include <gtest/gtest.h>

#include "../../companions/hookkeep.h"
#include "base/adapters.h"
#include "base/settings.h"
#include "base/state.h"
#include "modes/detect.h"
#include "shell/main_window.h"
#include "shell/tray.h"
#include "support/machine.h"
#include "support/support.h"

TEST(TaskbarCorner, MainWindowSpotIsTheCornerAtTheFarEndOfTheTaskbar)
{
    static const struct { RECT taskbar; LONG x, y; } cases[] = {
        {{0, 740, 1024, 768}, 1023, 767}, {{994, 0, 1024, 768}, 1023, 767},  // bottom, right
        {{0, 0, 30, 768}, 0, 767}, {{-2, -2, 1026, 28}, 1023, 0}};           // left, top
    for (const auto& c : cases) {
        TaskbarPlace place = {1024, 768, c.taskbar};
        EXPECT_TRUE(MainWindowSpot(&place).x == c.x && MainWindowSpot(&place).y == c.y) << &c - cases;
    }
}

// The machine detected, and the main window already at its spot.
static HWND window;
static void Boot(int windows)
{
    DestroyWindow(window);
    BootMachine(Machine(windows, {Card(0x5333, 0x8901)}));
    ASSERT_EQ(1, DetectAdapters());
    RefreshAdapterModes(REFRESH_AT_STARTUP);
    window = CreateWindowExA(WS_EX_TOOLWINDOW, "STATIC", "", WS_POPUP, 0, 0, 1, 1, NULL, NULL, NULL, NULL);
    ASSERT_EQ(1, PlaceMainWindow(window));
    ASSERT_EQ(0, PlaceMainWindow(window));
}

TEST(MainWindow, RedrawReappliesAfterQuietTimeWithTheTrayFree)
{
    ASSERT_NO_FATAL_FAILURE(Boot(SIM_WINDOWS_98));
    auto cr04 = [] { return SimReadRegister(0, SIM_REG_CRTC, 0x04); };  // where a stored position shows
    const uint8_t driver = cr04();
    SaveSetting(SETTING_POSITION_H, driver + 2);
    static const struct { uint16_t state; DWORD quiet_ms; bool off_spot, applied; } cases[] = {
        {STATE_TRAY_BUSY, 10000, false, false},  // the redraw that the taskbar query causes
        {0, 1000, false, false}, {0, 10000, true, false}, {0, 10000, false, true}};  // a move first, then its redraw
    for (const auto& c : cases) {
        SimWriteRegister(0, SIM_REG_CRTC, 0x04, driver);
        if (c.off_spot) MoveWindow(window, 0, 0, 1, 1, FALSE);
        shell_state = c.state;
        last_activity_tick = GetTickCount() - c.quiet_ms;
        ReapplyAfterRedraw(window);
        EXPECT_EQ(c.applied ? driver + 2 : driver, cr04()) << c.state << " " << c.quiet_ms << " " << c.off_spot;
        EXPECT_LE(GetTickCount() - last_activity_tick, 100u) << "activity, or the re-application, is new";
        EXPECT_EQ(0, PlaceMainWindow(window)) << "back at its spot";
    }
    ClearSettingsStore();
}

TEST(MainWindow, DisplayChangeRereadsTheModesButOnNTInPlace)
{
    // On NT in place the next redraw re-applies at once; the marker is the program's own mode change.
    static const struct { int windows; bool marker, off_spot, reread, at_once; } cases[] = {
        {SIM_WINDOWS_98, false, false, true, false}, {SIM_WINDOWS_NT4, false, false, false, true},
        {SIM_WINDOWS_NT4, false, true, true, false}, {SIM_WINDOWS_NT4, true, false, false, false}};
    for (const auto& c : cases) {
        ASSERT_NO_FATAL_FAILURE(Boot(c.windows));
        const uint16_t width = CurrentAdapter()->width;
        CurrentAdapter()->width = 1;
        if (c.marker) CurrentAdapter()->refresh_hz = REFRESH_CHANGE_MARKER;
        if (c.off_spot) MoveWindow(window, 0, 0, 1, 1, FALSE);
        last_activity_tick = 1;
        OnDisplayChange(window);
        EXPECT_EQ(c.reread ? width : 1, CurrentAdapter()->width) << c.windows << " " << c.marker << c.off_spot;
        EXPECT_EQ(c.at_once, last_activity_tick == 0) << c.windows << " " << c.marker << c.off_spot;
    }
}

// Created, the window starts the power timers and uses up "/A"; only the four DPMS states that any process
// may ask for reach the cards; destroyed, it stops the timers and ends the program with 0.
TEST(MainWindow, FromCreationToTheEndOnlyDpmsStatesReachTheCards)
{
    ASSERT_NO_FATAL_FAILURE(Boot(SIM_WINDOWS_98));
    startup_flags = STARTUP_AUTORUN;
    MainWindowProc(window, WM_CREATE, 0, 0);
    EXPECT_TRUE(startup_flags == 0 && SetKeepHook(NULL, KEEP_STATE_SUSPEND, 0, 0) == 1);
    static const struct { WPARAM state; SimDpms dpms; } cases[] = {
        {1, SIM_DPMS_STANDBY}, {3, SIM_DPMS_STANDBY}, {2, SIM_DPMS_SUSPEND},
        {(WPARAM)0x100000004ull, SIM_DPMS_SUSPEND}, {4, SIM_DPMS_OFF}, {0, SIM_DPMS_ON}};
    for (const auto& c : cases) {
        EXPECT_EQ(1, MainWindowProc(window, MSG_POWER_STATE, c.state, 0)) << c.state;
        EXPECT_EQ(c.dpms, SimDpmsState(0)) << c.state;
    }
    MainWindowProc(window, WM_DESTROY, 0, 0);
    EXPECT_EQ(0u, SetKeepHook(NULL, KEEP_STATE_SUSPEND, 0, 0));
    MSG quit;
    EXPECT_TRUE(PeekMessageA(&quit, NULL, WM_QUIT, WM_QUIT, PM_REMOVE) && quit.wParam == 0);
}
