// gatectl.exe, whose work is linked in here, and the program's calls of it, with
// a stand-in beside the test program. Nothing may restart the Wine session: the
// real gatectl.exe is never given "2", and every restart goes to a recorder.
#include <gtest/gtest.h>

#include "../../companions/gate.h"
#include "base/protocol.h"
#include "hardware/companions.h"
#include "power_window.h"
#include "support/support.h"

namespace {

// The shutdown privilege is enabled; disable_all first turns every privilege off.
bool ShutdownPrivilege(bool disable_all = false)
{
    HANDLE token;
    if (!OpenProcessToken(GetCurrentProcess(), TOKEN_QUERY | TOKEN_ADJUST_PRIVILEGES, &token)) return false;
    if (disable_all) AdjustTokenPrivileges(token, TRUE, NULL, 0, NULL, NULL);
    PRIVILEGE_SET wanted = {1, PRIVILEGE_SET_ALL_NECESSARY, {}};
    LookupPrivilegeValueA(NULL, SE_SHUTDOWN_NAME, &wanted.Privilege[0].Luid);
    BOOL held = FALSE;
    PrivilegeCheck(token, &wanted, &held);
    CloseHandle(token);
    return held;
}

struct { int calls; UINT flags; DWORD reason; bool privilege; BOOL answer; } restart;

BOOL WINAPI RecordRestart(UINT flags, DWORD reason)
{
    restart = {restart.calls + 1, flags, reason, ShutdownPrivilege(), restart.answer};
    return restart.answer;
}

const bool no_real_restart = (restart_windows = RecordRestart) != NULL;  // from the start of this program

TEST(Gatectl, ParsesOnlyItsTwoCommands)
{
    std::string long_class(GATE_CLASS_SIZE, 'c'), long_line = "3 " + long_class;  // one more than fits
    const struct { const char* arguments; int command; std::string window_class; } cases[] = {
        {"2 restart", GATE_RESTART, ""},   {"  2\tRESTART  ", GATE_RESTART, ""}, {"2", GATE_NONE, ""},
        {"2 restarts", GATE_NONE, ""},     {"2 restart now", GATE_NONE, ""},     {"22 restart", GATE_NONE, ""},
        {"3 zentra \t", GATE_MEMORY, "zentra"}, {"3 \"two words\"", GATE_MEMORY, "two words"},
        {"3 \"", GATE_MEMORY, "\""},       {"3 \"\"", GATE_NONE, ""},            {"3", GATE_NONE, ""},
        {"1 zentra", GATE_NONE, ""},       {"", GATE_NONE, ""},                  {NULL, GATE_NONE, ""},
        {long_line.c_str(), GATE_MEMORY, long_class.substr(0, GATE_CLASS_SIZE - 1)},
    };
    for (const auto& c : cases) {
        GateRequest request;
        memset(&request, 0x55, sizeof request);
        EXPECT_EQ(c.command, ParseGateCommand(c.arguments, &request)) << (c.arguments ? c.arguments : "NULL");
        EXPECT_EQ(c.command, request.command) << (c.arguments ? c.arguments : "NULL");
        EXPECT_EQ(c.window_class, request.window_class) << (c.arguments ? c.arguments : "NULL");
    }
    EXPECT_EQ((8u << 16) | 512, PackMemorySize((8u << 20) + (575u << 10))) << "megabytes, and kilobytes by 64";
    EXPECT_EQ((7u << 16) | 960, PackMemorySize((8u << 20) - (40u << 10)));
}

// NT refuses the restart without the privilege; Windows 9x has none to take.
TEST(Gatectl, RestartRebootsWithTheShutdownPrivilegeWhereThereIsOne)
{
    OSVERSIONINFOA version = {sizeof version};
    GetVersionExA(&version);
    for (BOOL answer : {TRUE, FALSE}) {
        ASSERT_FALSE(ShutdownPrivilege(true));
        restart = {0, 0, 1, false, answer};
        EXPECT_EQ(answer, RestartWindows(RecordRestart));
        EXPECT_TRUE(restart.calls == 1 && restart.flags == EWX_REBOOT && restart.reason == 0);
        EXPECT_EQ(version.dwPlatformId == VER_PLATFORM_WIN32_NT, restart.privilege);
    }
}

class GateCompanion : public testing::Test {
protected:
    void SetUp() override
    {
        SetEnvironmentVariableA("FAKE_GATECTL_REPLY", NULL);
        restart = {0, 0, 1, false, TRUE};
        ForgetGateMemorySize();
        main = CreatePowerWindow(main_window_class);
        ASSERT_TRUE(CopyFileA((TestFolder() + "fake-gatectl.exe").c_str(), companion.c_str(), FALSE));
    }
    void TearDown() override
    {
        gate_reply_timeout = GATE_REPLY_TIMEOUT_MS;
        ForgetGateMemorySize();
        DestroyPowerWindow(main);
        DeleteFileA(companion.c_str());
    }
    // The command line of the stand-in's next start, once it has done its work and ended.
    std::string NextStart()
    {
        MSG m;
        DWORD start = GetTickCount();
        while (!PeekMessageA(&m, main, WM_APP, WM_APP, PM_REMOVE)) {
            if (GetTickCount() - start > 10000) return "(no start)";
            MsgWaitForMultipleObjects(0, NULL, FALSE, 100, QS_POSTMESSAGE);
        }
        char line[256] = "";
        GlobalGetAtomNameA((ATOM)m.lParam, line, sizeof line);
        GlobalDeleteAtom((ATOM)m.lParam);
        HANDLE process = OpenProcess(SYNCHRONIZE, FALSE, (DWORD)m.wParam);
        WaitForSingleObject(process, 10000);
        CloseHandle(process);
        return line;
    }

    std::string companion = TestFolder() + "gatectl.exe";
    HWND main = NULL;
};

TEST_F(GateCompanion, RestartGoesThroughTheCompanionElseStraightToWindows)
{
    EXPECT_EQ(1, GateRestart());
    EXPECT_EQ("gatectl.exe 2 restart", NextStart());
    EXPECT_EQ(0, restart.calls);
    ASSERT_TRUE(DeleteFileA(companion.c_str()));
    for (BOOL answer : {TRUE, FALSE}) {
        restart.answer = answer;
        EXPECT_EQ(answer, GateRestart());
    }
    EXPECT_TRUE(restart.calls == 2 && restart.flags == EWX_REBOOT && restart.reason == 0);
}

// The wait takes the answer and leaves every other message where it was.
TEST_F(GateCompanion, MemorySizeIsAskedUntilAnsweredThenKept)
{
    gate_reply_timeout = 300;
    DWORD start = GetTickCount();
    EXPECT_EQ(0u, GateMemorySize()) << "a silent companion";
    EXPECT_GE(GetTickCount() - start, 300u);
    EXPECT_EQ("gatectl.exe 3 zentra", NextStart());

    gate_reply_timeout = GATE_REPLY_TIMEOUT_MS;
    SetEnvironmentVariableA("FAKE_GATECTL_REPLY", "0x40000");
    PostMessageA(main, WM_USER + 5, 0, 0);
    EXPECT_EQ(0x40000u, GateMemorySize());
    MSG message;
    EXPECT_TRUE(PeekMessageA(&message, main, WM_USER + 5, WM_USER + 5, PM_REMOVE));
    EXPECT_EQ("gatectl.exe 3 zentra", NextStart());

    ASSERT_TRUE(DeleteFileA(companion.c_str()));
    EXPECT_EQ(0x40000u, GateMemorySize()) << "kept";
    ForgetGateMemorySize();
    start = GetTickCount();
    EXPECT_EQ(0u, GateMemorySize()) << "no companion";
    EXPECT_LT(GetTickCount() - start, GATE_REPLY_TIMEOUT_MS / 2u) << "no wait for what did not start";
}

// The simulated gatectl.exe answers the window it is named with the memory
// of its folder's machine: 8 MB and 192 KB.
TEST_F(GateCompanion, RealCompanionAnswersTheNamedWindow)
{
    std::string folder = CopySimBuild("gate");
    WriteTextFile(folder + "SIMMACHINE.INI", "[Machine]\r\nWindows=98\r\n[Card0]\r\nId=8086:7800\r\nBus=1\r\n"
                                             "Device=0\r\nMemoryMB=8\r\nMemoryExtraKB=200\r\n");
    for (std::string to : {"zentra", "NoSuchCompanionsWindow"}) {
        ChildProcess gatectl;
        ASSERT_TRUE(gatectl.Start("\"" + folder + "gatectl.exe\" 3 " + to, folder));
        EXPECT_EQ(to == "zentra" ? 0 : 1, gatectl.WaitExit(20000)) << to;
        MSG reply;
        EXPECT_EQ(to == "zentra", PeekMessageA(&reply, main, MSG_GATE_REPLY, MSG_GATE_REPLY, PM_REMOVE)) << to;
        if (to == "zentra") EXPECT_EQ((8u << 16) | 192, (uint32_t)reply.lParam);
    }
}

}  // namespace
