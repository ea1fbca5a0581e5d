// The program's side of the companions: gatectl.exe started by command
// line (a stand-in that records how it was started takes its place beside
// the test program) and the hook library armed from the settings store.
#include <gtest/gtest.h>

#include <stdio.h>

#include <string>
#include <vector>

#include "../../companions/hookkeep.h"
#include "base/settings.h"
#include "hardware/companions.h"
#include "power_window.h"
#include "shell/main_window.h"
#include "shell/startup.h"

namespace {

struct RestartRecord {
    int calls;
    UINT flags;
    DWORD reason;
    BOOL answer;
};
RestartRecord restart_record;

BOOL WINAPI RecordRestart(UINT flags, DWORD reason)
{
    ++restart_record.calls;
    restart_record.flags = flags;
    restart_record.reason = reason;
    return restart_record.answer;
}

BOOL WINAPI RefuseRestart(UINT, DWORD) { return FALSE; }

// No test of this program may restart the Wine session, whatever it calls.
class NoRealRestart : public testing::Environment {
    void SetUp() override { restart_windows = RefuseRestart; }
};
testing::Environment* const no_real_restart = testing::AddGlobalTestEnvironment(new NoRealRestart);

const char done_semaphore[] = "VistrelFakeGatectlDone";

struct Start {
    DWORD process_id;
    std::string command_line;
};

class GateCompanion : public testing::Test {
protected:
    void SetUp() override
    {
        companion = TestFolder() + "gatectl.exe";
        log = TestFolder() + "fake-gatectl.log";
        DeleteFileA(companion.c_str());
        DeleteFileA(log.c_str());
        SetEnvironmentVariableA("FAKE_GATECTL_LOG", log.c_str());
        SetEnvironmentVariableA("FAKE_GATECTL_REPLY", NULL);
        SetEnvironmentVariableA("FAKE_GATECTL_DONE", done_semaphore);
        done = CreateSemaphoreA(NULL, 0, 100, done_semaphore);
        ASSERT_TRUE(done != NULL);

        restart_record = {0, 0, 1, TRUE};
        restart_windows = RecordRestart;
        gate_reply_timeout = GATE_REPLY_TIMEOUT_MS;
        ForgetGateMemorySize();

        // The companion answers the window of the program's class.
        WNDCLASSA type = {};
        type.lpfnWndProc = DefWindowProcA;
        type.hInstance = GetModuleHandleA(NULL);
        type.lpszClassName = main_window_class;
        RegisterClassA(&type);
        main = CreateWindowExA(0, main_window_class, "", WS_POPUP, 0, 0, 1, 1, NULL, NULL, type.hInstance, NULL);
        ASSERT_TRUE(main != NULL);
    }
    void TearDown() override
    {
        restart_windows = RefuseRestart;
        gate_reply_timeout = GATE_REPLY_TIMEOUT_MS;
        ForgetGateMemorySize();
        DestroyWindow(main);
        UnregisterClassA(main_window_class, GetModuleHandleA(NULL));
        DeleteFileA(companion.c_str());
        DeleteFileA(log.c_str());
        CloseHandle(done);
        SetEnvironmentVariableA("FAKE_GATECTL_DONE", NULL);
        SetEnvironmentVariableA("FAKE_GATECTL_LOG", NULL);
        SetEnvironmentVariableA("FAKE_GATECTL_REPLY", NULL);
    }

    void InstallCompanion() { ASSERT_TRUE(CopyFileA((TestFolder() + "fake-gatectl.exe").c_str(), companion.c_str(), FALSE)); }
    void RemoveCompanion() { ASSERT_TRUE(DeleteFileA(companion.c_str())); }
    void Answer(const char* size) { SetEnvironmentVariableA("FAKE_GATECTL_REPLY", size); }

    // Waits until `count` more starts of the stand-in have done their work
    // and ended; every start so far, in order.
    std::vector<Start> WaitForStarts(int count)
    {
        for (int i = 0; i < count; ++i) EXPECT_EQ(WAIT_OBJECT_0, WaitForSingleObject(done, 10000));
        std::vector<Start> starts;
        FILE* file = fopen(log.c_str(), "r");
        char line[512];
        while (file && fgets(line, sizeof line, file)) {
            Start start;
            char* rest;
            start.process_id = strtoul(line, &rest, 10);
            start.command_line = std::string(rest + 1);
            if (!start.command_line.empty() && start.command_line.back() == '\n') start.command_line.pop_back();
            starts.push_back(start);
        }
        if (file) fclose(file);
        for (const Start& start : starts) {
            HANDLE process = OpenProcess(SYNCHRONIZE, FALSE, start.process_id);
            if (process) {
                WaitForSingleObject(process, 10000);
                CloseHandle(process);
            }
        }
        return starts;
    }

    std::string companion;
    std::string log;
    HANDLE done = NULL;
    HWND main = NULL;
};

TEST_F(GateCompanion, RestartStartsTheCompanionByItsBareName)
{
    InstallCompanion();
    EXPECT_EQ(1, GateRestart());
    std::vector<Start> starts = WaitForStarts(1);
    ASSERT_EQ(1u, starts.size());
    EXPECT_EQ("gatectl.exe 2 restart", starts[0].command_line);
    EXPECT_EQ(0, restart_record.calls);
}

TEST_F(GateCompanion, RestartWithoutTheCompanionRestartsDirectly)
{
    EXPECT_EQ(1, GateRestart());
    EXPECT_EQ(1, restart_record.calls);
    EXPECT_EQ((UINT)EWX_REBOOT, restart_record.flags);
    EXPECT_EQ(0u, restart_record.reason);

    restart_record.answer = FALSE;
    EXPECT_EQ(0, GateRestart());
    EXPECT_EQ(2, restart_record.calls);
}

// The wait takes the answer and leaves every other message where it is.
TEST_F(GateCompanion, MemoryAnswerIsKeptForLaterQueries)
{
    InstallCompanion();
    Answer("0x40000");
    PostMessageA(main, WM_USER + 5, 0, 0);
    EXPECT_EQ(0x40000u, GateMemorySize());
    MSG message;
    EXPECT_TRUE(PeekMessageA(&message, main, WM_USER + 5, WM_USER + 5, PM_REMOVE));
    std::vector<Start> starts = WaitForStarts(1);
    ASSERT_EQ(1u, starts.size());
    EXPECT_EQ("gatectl.exe 3 zentra", starts[0].command_line);
    // Another start would now fail and answer 0.
    RemoveCompanion();
    EXPECT_EQ(0x40000u, GateMemorySize());
}

TEST_F(GateCompanion, MemoryQueryWithoutTheCompanionAnswersZeroAtOnce)
{
    DWORD start = GetTickCount();
    EXPECT_EQ(0u, GateMemorySize());
    EXPECT_LT(GetTickCount() - start, GATE_REPLY_TIMEOUT_MS / 2u);
}

TEST_F(GateCompanion, SilentCompanionIsAskedAgainNextTime)
{
    gate_reply_timeout = 500;
    InstallCompanion();
    DWORD start = GetTickCount();
    EXPECT_EQ(0u, GateMemorySize());
    EXPECT_GE(GetTickCount() - start, 500u);
    WaitForStarts(1);

    Answer("0x20000");
    EXPECT_EQ(0x20000u, GateMemorySize());
    EXPECT_EQ(2u, WaitForStarts(1).size());
}

// The one wait of the real length: the program gives up after ten seconds.
TEST_F(GateCompanion, MemoryWaitGivesUpAfterTenSeconds)
{
    InstallCompanion();
    DWORD start = GetTickCount();
    EXPECT_EQ(0u, GateMemorySize());
    DWORD waited = GetTickCount() - start;
    EXPECT_GE(waited, 10000u);
    EXPECT_LT(waited, 12000u);
    WaitForStarts(1);
}

enum { UNIT_MS = 20 };

class PowerTimers : public testing::Test {
protected:
    void SetUp() override
    {
        window = CreatePowerWindow();
        ASSERT_TRUE(window != NULL);
        power_minute_length = MinuteLengthFor(UNIT_MS);
    }
    void TearDown() override
    {
        SetKeepHook(NULL, KEEP_STATE_ALL, 0, 0);
        DestroyPowerWindow(window);
        power_minute_length = KEEP_REAL_MINUTE;
        HKEY key;
        if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, settings_program_key, 0, KEY_ALL_ACCESS, &key) == ERROR_SUCCESS) {
            for (const char* name : {"Standby", "Suspend", "Shutoff"}) RegDeleteValueA(key, name);
            RegCloseKey(key);
        }
    }
    HWND window = NULL;
};

// A stored 0 is off too; arming it would enter standby at once.
TEST_F(PowerTimers, StartArmsTheTimersStoredAboveZero)
{
    SaveSetting(SETTING_STANDBY, 0);
    SaveSetting(SETTING_SUSPEND, 1);
    SaveSetting(SETTING_SHUTOFF, 3);
    DWORD start = GetTickCount();
    EXPECT_EQ(1, StartPowerTimers(window, 1));
    std::vector<PowerPost> posts = CollectPowerPosts(window, 3, 20 * UNIT_MS);
    ASSERT_EQ((std::vector<int>{2, 4}), States(posts));
    EXPECT_GE(posts[0].at - start, 1u * UNIT_MS);
    EXPECT_GE(posts[1].at - start, 3u * UNIT_MS);
}

TEST_F(PowerTimers, StopEndsWatching)
{
    SaveSetting(SETTING_SUSPEND, 2);
    EXPECT_EQ(1, StartPowerTimers(window, 1));
    EXPECT_EQ(1, StartPowerTimers(window, 0));
    EXPECT_TRUE(CollectPowerPosts(window, 1, 10 * UNIT_MS).empty());
    EXPECT_EQ(0u, SetKeepHook(NULL, KEEP_STATE_SUSPEND, 1, 0));
}

}  // namespace
