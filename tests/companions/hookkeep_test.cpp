// HookKeep.dll as the program uses it: one window registered, timers armed
// with a timer minute of a few milliseconds, input made through the
// system's input queue.
#include <gtest/gtest.h>

#include "../../companions/hookkeep.h"
#include "../../companions/keep_call.h"
#include "power_window.h"
#include "shell/main_window.h"

namespace {

enum { UNIT_MS = 20, LATE_MS = 3000 };

class HookKeep : public testing::Test {
protected:
    void SetUp() override
    {
        window = CreatePowerWindow();
        ASSERT_TRUE(window != NULL);
    }
    void TearDown() override
    {
        SetKeepHook(NULL, KEEP_STATE_ALL, 0, 0);
        DestroyPowerWindow(window);
    }
    void Start()
    {
        start = GetTickCount();
        ASSERT_EQ(1u, SetKeepHook(window, KEEP_STATE_STANDBY, 1, MinuteLengthFor(UNIT_MS)));
    }
    // The keyboard goes to the window with the focus; make it ours.
    void TakeFocus()
    {
        ShowWindow(window, SW_SHOW);
        SetForegroundWindow(window);
        SetFocus(window);
        ASSERT_EQ(window, GetForegroundWindow());
    }
    bool PostedAtOnce(int state)
    {
        MSG message;
        return PeekMessageA(&message, window, MSG_POWER_STATE, MSG_POWER_STATE, PM_REMOVE) &&
               (int)message.wParam == state;
    }

    HWND window = NULL;
    DWORD start = 0;
};

TEST_F(HookKeep, IdleEntersEachArmedStateOnceInTheOrderTheyRunOut)
{
    Start();
    SetKeepHook(NULL, KEEP_STATE_OFF, 1, 6);
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 1, 2);
    SetKeepHook(NULL, KEEP_STATE_SUSPEND, 1, 4);
    std::vector<PowerPost> posts = CollectPowerPosts(window, 3, LATE_MS);
    ASSERT_EQ((std::vector<int>{1, 2, 4}), States(posts));
    EXPECT_GE(posts[0].at - start, 2u * UNIT_MS);
    EXPECT_GE(posts[1].at - start, 4u * UNIT_MS);
    EXPECT_GE(posts[2].at - start, 6u * UNIT_MS);
    EXPECT_TRUE(CollectPowerPosts(window, 1, 10 * UNIT_MS).empty());
}

TEST_F(HookKeep, LighterStateRunningOutAfterADeeperOneIsLeftOut)
{
    Start();
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 1, 6);
    SetKeepHook(NULL, KEEP_STATE_OFF, 1, 2);
    EXPECT_EQ((std::vector<int>{4}), States(CollectPowerPosts(window, 2, 15 * UNIT_MS)));
}

TEST_F(HookKeep, DisarmedTimerStaysQuiet)
{
    Start();
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 1, 2);
    SetKeepHook(NULL, KEEP_STATE_SUSPEND, 1, 4);
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 0, 0);
    EXPECT_EQ((std::vector<int>{2}), States(CollectPowerPosts(window, 2, 15 * UNIT_MS)));
}

TEST_F(HookKeep, InputBeforeAnyStateOnlyRestartsTheIdleTime)
{
    Start();
    TakeFocus();
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 1, 10);
    EXPECT_TRUE(CollectPowerPosts(window, 1, 5 * UNIT_MS).empty());
    DWORD pressed = GetTickCount();
    PressShift();
    std::vector<PowerPost> posts = CollectPowerPosts(window, 1, LATE_MS);
    ASSERT_EQ((std::vector<int>{1}), States(posts));
    EXPECT_GE(posts[0].at - pressed, 10u * UNIT_MS);
}

// The immediate entry posts before the call returns.
TEST_F(HookKeep, KeyPressWakesOnceFromAStateEnteredNow)
{
    Start();
    TakeFocus();
    SetKeepHook(NULL, KEEP_STATE_OFF, 1, 0);
    ASSERT_TRUE(PostedAtOnce(KEEP_STATE_OFF));
    PressShift();
    EXPECT_EQ((std::vector<int>{0}), States(CollectPowerPosts(window, 1, LATE_MS)));
    PressShift();
    EXPECT_TRUE(CollectPowerPosts(window, 1, 10 * UNIT_MS).empty());
}

TEST_F(HookKeep, MouseMoveWakesFromAStateRunOut)
{
    Start();
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 1, 1);
    ASSERT_EQ((std::vector<int>{1}), States(CollectPowerPosts(window, 1, LATE_MS)));
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 0, 0);
    NudgeMouse();
    EXPECT_EQ((std::vector<int>{0}), States(CollectPowerPosts(window, 1, LATE_MS)));
}

// Windows sends WM_MOUSEMOVE to a window that appears under a still cursor.
TEST_F(HookKeep, WindowAppearingUnderTheCursorDoesNotWake)
{
    SetCursorPos(700, 500);
    Start();
    SetKeepHook(NULL, KEEP_STATE_OFF, 1, 0);
    ASSERT_TRUE(PostedAtOnce(KEEP_STATE_OFF));
    HWND under = CreateWindowExA(WS_EX_TOPMOST, "STATIC", "under", WS_POPUP | WS_VISIBLE, 600, 400, 200, 200, NULL,
                                 NULL, NULL, NULL);
    ASSERT_TRUE(under != NULL);
    EXPECT_TRUE(CollectPowerPosts(window, 1, 10 * UNIT_MS).empty());
    DestroyWindow(under);
}

TEST_F(HookKeep, EnteringNowTurnsTheTimersOff)
{
    Start();
    TakeFocus();
    SetKeepHook(NULL, KEEP_STATE_STANDBY, 1, 3);
    SetKeepHook(NULL, KEEP_STATE_SUSPEND, 1, 0);
    ASSERT_TRUE(PostedAtOnce(KEEP_STATE_SUSPEND));
    PressShift();
    // A new idle period, in which the standby timer would have run out.
    EXPECT_EQ((std::vector<int>{0}), States(CollectPowerPosts(window, 2, 15 * UNIT_MS)));
}

// Input that never reaches this process: the key goes to a window of
// another one, where the hook has to run.
TEST_F(HookKeep, KeyPressInAnotherProcessWakes)
{
    Start();
    HANDLE ready = CreateEventA(NULL, TRUE, FALSE, "VistrelCompanionsInputReady");
    ASSERT_TRUE(ready != NULL);
    std::string command = "\"" + TestFolder() + "input-window.exe\" VistrelCompanionsInputReady";
    STARTUPINFOA startup = {};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION process;
    ASSERT_TRUE(CreateProcessA(NULL, &command[0], NULL, NULL, FALSE, 0, NULL, NULL, &startup, &process));
    EXPECT_EQ(WAIT_OBJECT_0, WaitForSingleObject(ready, 10000));
    HWND other = FindWindowA("CompanionsInputWindow", NULL);
    EXPECT_TRUE(other != NULL && GetForegroundWindow() == other);

    SetKeepHook(NULL, KEEP_STATE_STANDBY, 1, 0);
    EXPECT_TRUE(PostedAtOnce(KEEP_STATE_STANDBY));
    PressShift();
    EXPECT_EQ((std::vector<int>{0}), States(CollectPowerPosts(window, 1, LATE_MS)));

    PostMessageA(other, WM_CLOSE, 0, 0);
    WaitForSingleObject(process.hProcess, 10000);
    CloseHandle(process.hProcess);
    CloseHandle(process.hThread);
    CloseHandle(ready);
}

// The start call and a timer call look alike; after a start that failed, the
// program's timer calls for the same window must stay timer calls, or a
// "five-minute" timer call would start watching with a 4.6 ms minute.
TEST(KeepCalls, TheStartCallIsToldByThePhaseNotByTheWatcher)
{
    HWND w = (HWND)0x1234, other = (HWND)0x5678;
    static const struct {
        KeepPhase phase;
        HWND window;
        DWORD state, enable, minutes;
        KeepCall call;
    } cases[] = {
        {KEEP_STOPPED, w, 1, 1, 65536, KEEP_CALL_START},
        {KEEP_STARTED, w, 1, 1, 5, KEEP_CALL_ARM},
        {KEEP_STARTED, other, 1, 1, 65536, KEEP_CALL_START},
        {KEEP_STARTED, NULL, 2, 1, 10, KEEP_CALL_ARM},
        {KEEP_STARTED, NULL, 2, 0, 0, KEEP_CALL_ARM},
        {KEEP_STARTED, NULL, 4, 1, 0, KEEP_CALL_ENTER_NOW},
        {KEEP_STARTED, NULL, 0, 0, 0, KEEP_CALL_STOP},
        {KEEP_STARTED, NULL, 0, 1, 0, KEEP_CALL_REFUSED},
        {KEEP_STARTED, NULL, 0, 0, 3, KEEP_CALL_REFUSED},
        {KEEP_STARTED, NULL, 3, 1, 5, KEEP_CALL_REFUSED},
        {KEEP_STOPPED, NULL, 1, 1, 5, KEEP_CALL_REFUSED},
        {KEEP_STOPPED, NULL, 0, 0, 0, KEEP_CALL_REFUSED},
    };
    for (const auto& c : cases)
        EXPECT_EQ(c.call, ClassifyKeepCall(c.phase, w, c.window, c.state, c.enable, c.minutes))
            << c.phase << " " << c.window << " " << c.state << "," << c.enable << "," << c.minutes;
}

}  // namespace
