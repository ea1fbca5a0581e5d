// HookKeep.dll as the program uses it. Only lower bounds of time are checked: a loaded machine is late.
#include <gtest/gtest.h>

#include "../../companions/hookkeep.h"
#include "../../companions/keep_call.h"
#include "base/settings.h"
#include "hardware/companions.h"
#include "power_window.h"
#include "support/support.h"

namespace {

// A stored 0 is off too: armed, it would enter standby at once. First, before any test makes input.
TEST(PowerTimers, StartArmsTheTimersStoredAboveZeroAndStopEndsWatching)
{
    HWND window = CreatePowerWindow();
    power_minute_length = UNIT_MINUTE;
    ClearSettingsStore();
    SaveSetting(SETTING_STANDBY, 0);
    SaveSetting(SETTING_SUSPEND, 1);
    SaveSetting(SETTING_SHUTOFF, 3);
    DWORD start = GetTickCount();
    EXPECT_EQ(1, StartPowerTimers(window, 1));
    std::vector<DWORD> at;
    EXPECT_EQ((std::vector<int>{2, 4}), CollectPowerPosts(window, 2, LATE_MS, &at));
    EXPECT_TRUE(at.size() == 2 && at[0] - start >= 1u * UNIT_MS && at[1] - start >= 3u * UNIT_MS);
    EXPECT_EQ(1, StartPowerTimers(window, 0));
    EXPECT_EQ(0u, SetKeepHook(NULL, KEEP_STATE_SUSPEND, 1, 0)) << "the library is stopped";
    DestroyPowerWindow(window);
    power_minute_length = KEEP_REAL_MINUTE;
    ClearSettingsStore();
}

class HookKeep : public testing::Test {
protected:
    // Started for a window that has the keyboard, the cursor still where NudgeMouse may move it.
    void SetUp() override
    {
        SetCursorPos(700, 500);
        window = CreatePowerWindow();
        SetForegroundWindow(window);
        SetFocus(window);
        ASSERT_EQ(window, GetForegroundWindow());
        start = GetTickCount();
        ASSERT_EQ(1u, SetKeepHook(window, KEEP_STATE_STANDBY, 1, UNIT_MINUTE));
    }
    void TearDown() override
    {
        SetKeepHook(NULL, KEEP_STATE_ALL, 0, 0);
        DestroyPowerWindow(window);
    }
    bool Quiet(DWORD units) { return CollectPowerPosts(window, 1, units * UNIT_MS).empty(); }

    HWND window = NULL;
    DWORD start = 0;
};

TEST_F(HookKeep, IdleEntersEachArmedStateOnceInTheOrderTheyRunOutButNeverALighterOne)
{
    static const struct {
        DWORD arm[3][3];  // state, enable, minutes; wide apart where a call must come before a timer runs out
        std::vector<int> states;
        DWORD after[3];  // in timer minutes
    } cases[] = {
        {{{4, 1, 30}, {2, 1, 20}, {1, 1, 10}}, {1, 2, 4}, {10, 20, 30}},
        {{{4, 1, 2}, {1, 1, 6}, {2, 1, 4}}, {4}, {2}},     // lighter states after a deeper one
        {{{1, 1, 10}, {2, 1, 15}, {1, 0, 0}}, {2}, {15}},  // disarmed again
    };
    for (const auto& c : cases) {
        if (&c != cases) ASSERT_NO_FATAL_FAILURE(SetUp());
        for (const auto& arm : c.arm) SetKeepHook(NULL, arm[0], arm[1], arm[2]);
        std::vector<DWORD> at;
        ASSERT_EQ(c.states, CollectPowerPosts(window, c.states.size(), LATE_MS, &at)) << c.arm[0][2];
        for (size_t i = 0; i < at.size(); ++i) EXPECT_GE(at[i] - start, c.after[i] * UNIT_MS) << c.arm[0][2];
        EXPECT_TRUE(Quiet(10)) << c.arm[0][2];
        TearDown();
    }
}

TEST_F(HookKeep, InputBeforeAnyStateOnlyRestartsTheIdleTime)
{
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 1, 25);
    EXPECT_TRUE(Quiet(5));
    DWORD pressed = GetTickCount();
    PressShift();
    std::vector<DWORD> at;
    ASSERT_EQ((std::vector<int>{1}), CollectPowerPosts(window, 1, LATE_MS, &at));
    EXPECT_GE(at[0] - pressed, 25u * UNIT_MS);
}

// The program turns its stored timers off when the user picks a state. Windows
// sends WM_MOUSEMOVE to a window that appears under a still cursor.
TEST_F(HookKeep, AStateEnteredNowStopsTheTimersAndOnlyRealInputWakesOnce)
{
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 1, 10);
    SetKeepHook(NULL, KEEP_STATE_SUSPEND, 1, 0);
    ASSERT_EQ((std::vector<int>{KEEP_STATE_SUSPEND}), CollectPowerPosts(window, 1, 0)) << "at once";
    HWND under = CreateWindowExA(WS_EX_TOPMOST, "STATIC", "", WS_POPUP | WS_VISIBLE, 600, 400, 200, 200, NULL, NULL,
                                 NULL, NULL);
    EXPECT_TRUE(Quiet(10));
    DestroyWindow(under);
    NudgeMouse();
    EXPECT_EQ((std::vector<int>{0}), CollectPowerPosts(window, 1, LATE_MS));
    PressShift();
    EXPECT_TRUE(Quiet(20)) << "no second wake-up, no standby";
}

// The key goes to a window of another process, where the hook has to run.
TEST_F(HookKeep, KeyPressInAnotherProcessWakes)
{
    HANDLE ready = CreateEventA(NULL, TRUE, FALSE, "VistrelCompanionsInputReady");
    ChildProcess other;
    ASSERT_TRUE(other.Start("\"" + TestFolder() + "input-window.exe\" VistrelCompanionsInputReady"));
    EXPECT_EQ(WAIT_OBJECT_0, WaitForSingleObject(ready, 10000));
    CloseHandle(ready);
    HWND input = FindWindowA("CompanionsInputWindow", NULL);
    EXPECT_TRUE(input != NULL && GetForegroundWindow() == input);
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 1, 0);
    EXPECT_EQ((std::vector<int>{KEEP_STATE_STANDBY}), CollectPowerPosts(window, 1, 0)) << "at once";
    PressShift();
    EXPECT_EQ((std::vector<int>{0}), CollectPowerPosts(window, 1, LATE_MS));
    EXPECT_TRUE(Quiet(10)) << "once, and the key's release is heard before the next test";
}

// After a start that failed, the program's timer calls for the same window must
// stay timer calls, or a "five-minute" one would start with a 4.6 ms minute.
TEST(KeepCalls, TheStartCallIsToldByThePhaseNotByTheWatcher)
{
    HWND w = (HWND)0x1234, other = (HWND)0x5678;
    static const struct { KeepPhase phase; HWND window; DWORD state, enable, minutes; KeepCall call; } cases[] = {
        {KEEP_STOPPED, w, 1, 1, 65536, KEEP_CALL_START},      {KEEP_STARTED, w, 1, 1, 5, KEEP_CALL_ARM},
        {KEEP_STARTED, other, 1, 1, 65536, KEEP_CALL_START},  {KEEP_STARTED, NULL, 2, 1, 10, KEEP_CALL_ARM},
        {KEEP_STARTED, NULL, 2, 0, 0, KEEP_CALL_ARM},         {KEEP_STARTED, NULL, 4, 1, 0, KEEP_CALL_ENTER_NOW},
        {KEEP_STARTED, NULL, 0, 0, 0, KEEP_CALL_STOP},        {KEEP_STARTED, NULL, 0, 1, 0, KEEP_CALL_REFUSED},
        {KEEP_STARTED, NULL, 0, 0, 3, KEEP_CALL_REFUSED},     {KEEP_STARTED, NULL, 3, 1, 5, KEEP_CALL_REFUSED},
        {KEEP_STOPPED, NULL, 1, 1, 5, KEEP_CALL_REFUSED},     {KEEP_STOPPED, NULL, 0, 0, 0, KEEP_CALL_REFUSED},
    };
    for (const auto& c : cases)
        EXPECT_EQ(c.call, ClassifyKeepCall(c.phase, w, c.window, c.state, c.enable, c.minutes))
            << c.phase << " " << c.window << " " << c.state << "," << c.enable << "," << c.minutes;
}

}  // namespace
