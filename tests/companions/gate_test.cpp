// gatectl.exe: its command lines and restart in-process, its memory answer
// from the real program. The real program is never given "2": a restart
// would end the whole Wine session.
#include <gtest/gtest.h>

#include <string.h>

#include "../../companions/gate.h"
#include "power_window.h"
#include "shell/main_window.h"

namespace {

struct ParseCase {
    const char* arguments;
    int command;
    const char* window_class;
};

const ParseCase parse_cases[] = {
    {"2 restart", GATE_RESTART, ""},
    {"  2\trestart  ", GATE_RESTART, ""},
    {"2", GATE_NONE, ""},
    {"2 restarts", GATE_NONE, ""},
    {"2 restart now", GATE_NONE, ""},
    {"22 restart", GATE_NONE, ""},
    {"3 zentra", GATE_MEMORY, "zentra"},
    {"3 \"two words\"", GATE_MEMORY, "two words"},
    {"3", GATE_NONE, ""},
    {"3 \"\"", GATE_NONE, ""},
    {"1 zentra", GATE_NONE, ""},
    {"", GATE_NONE, ""},
};

TEST(ParseGateCommand, KnowsOnlyItsTwoCommands)
{
    for (const ParseCase& c : parse_cases) {
        GateRequest request;
        memset(&request, 0x55, sizeof request);
        EXPECT_EQ(c.command, ParseGateCommand(c.arguments, &request)) << '"' << c.arguments << '"';
        EXPECT_EQ(c.command, request.command) << '"' << c.arguments << '"';
        EXPECT_STREQ(c.window_class, request.window_class) << '"' << c.arguments << '"';
    }
    GateRequest request;
    EXPECT_EQ(GATE_NONE, ParseGateCommand(NULL, &request));
}

TEST(PackMemorySize, WholeMegabytesAndKilobytesInStepsOf64)
{
    EXPECT_EQ(0x40000u, PackMemorySize(4u << 20));
    EXPECT_EQ((8u << 16) | 512, PackMemorySize((8u << 20) + (512u << 10)));
    EXPECT_EQ((7u << 16) | 960, PackMemorySize((8u << 20) - (40u << 10)));
    EXPECT_EQ(0u, PackMemorySize(63u << 10));
}

// Stands in for ExitWindowsEx and notes what the restart had done by then.
struct ExitRecord {
    int calls;
    UINT flags;
    DWORD reason;
    bool privilege_enabled;
    BOOL answer;
};
ExitRecord exit_record;

bool ShutdownPrivilegeEnabled()
{
    HANDLE token;
    if (!OpenProcessToken(GetCurrentProcess(), TOKEN_QUERY, &token)) return false;
    PRIVILEGE_SET wanted = {};
    wanted.PrivilegeCount = 1;
    wanted.Control = PRIVILEGE_SET_ALL_NECESSARY;
    LookupPrivilegeValueA(NULL, SE_SHUTDOWN_NAME, &wanted.Privilege[0].Luid);
    BOOL held = FALSE;
    PrivilegeCheck(token, &wanted, &held);
    CloseHandle(token);
    return held != FALSE;
}

void DisableShutdownPrivilege()
{
    HANDLE token;
    ASSERT_TRUE(OpenProcessToken(GetCurrentProcess(), TOKEN_ADJUST_PRIVILEGES, &token));
    TOKEN_PRIVILEGES privileges = {};
    privileges.PrivilegeCount = 1;
    LookupPrivilegeValueA(NULL, SE_SHUTDOWN_NAME, &privileges.Privileges[0].Luid);
    AdjustTokenPrivileges(token, FALSE, &privileges, 0, NULL, NULL);
    CloseHandle(token);
}

BOOL WINAPI RecordExit(UINT flags, DWORD reason)
{
    ++exit_record.calls;
    exit_record.flags = flags;
    exit_record.reason = reason;
    exit_record.privilege_enabled = ShutdownPrivilegeEnabled();
    return exit_record.answer;
}

// NT refuses the restart without the privilege; Windows 9x has none to take.
TEST(RestartWindows, RebootsWithTheShutdownPrivilegeWhereThereIsOne)
{
    OSVERSIONINFOA version = {};
    version.dwOSVersionInfoSize = sizeof version;
    GetVersionExA(&version);
    bool nt = version.dwPlatformId == VER_PLATFORM_WIN32_NT;
    DisableShutdownPrivilege();
    ASSERT_FALSE(ShutdownPrivilegeEnabled());
    exit_record = {0, 0, 1, false, TRUE};
    EXPECT_EQ(1, RestartWindows(RecordExit));
    EXPECT_EQ(1, exit_record.calls);
    EXPECT_EQ((UINT)EWX_REBOOT, exit_record.flags);
    EXPECT_EQ(0u, exit_record.reason);
    EXPECT_EQ(nt, exit_record.privilege_enabled);

    exit_record = {0, 0, 1, false, FALSE};
    EXPECT_EQ(0, RestartWindows(RecordExit));
    EXPECT_EQ(1, exit_record.calls);
}

std::string RealGatectl()
{
    std::string path = "Z:" VISTREL_SIM_DIR "/gatectl.exe";
    for (char& c : path)
        if (c == '/') c = '\\';
    return path;
}

// Runs the real gatectl.exe with these arguments to its end; its exit code.
// Its answer, a post, waits in this thread's queue.
DWORD RunGatectl(const char* arguments)
{
    std::string program = RealGatectl();
    std::string command = std::string("gatectl.exe ") + arguments;
    STARTUPINFOA startup = {};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION process;
    if (!CreateProcessA(program.c_str(), &command[0], NULL, NULL, FALSE, 0, NULL, NULL, &startup, &process))
        return (DWORD)-1;
    WaitForSingleObject(process.hProcess, 20000);
    DWORD code = (DWORD)-1;
    GetExitCodeProcess(process.hProcess, &code);
    CloseHandle(process.hProcess);
    CloseHandle(process.hThread);
    return code;
}

TEST(Gatectl, AnswersTheMemoryQueryToTheNamedWindow)
{
    WNDCLASSA type = {};
    type.lpfnWndProc = DefWindowProcA;
    type.hInstance = GetModuleHandleA(NULL);
    type.lpszClassName = "CompanionsGateReply";
    RegisterClassA(&type);
    HWND window = CreateWindowExA(0, type.lpszClassName, "", 0, 0, 0, 1, 1, NULL, NULL, type.hInstance, NULL);
    ASSERT_TRUE(window != NULL);

    EXPECT_EQ(0u, RunGatectl("3 CompanionsGateReply"));
    MSG reply;
    ASSERT_TRUE(PeekMessageA(&reply, window, MSG_GATE_REPLY, MSG_GATE_REPLY, PM_REMOVE));
    uint32_t size = (uint32_t)reply.lParam;
    EXPECT_EQ(PackMemorySize(MeasureVideoMemory()), size);
    if (size == 0) {
        printf("DirectDraw reports no video memory here: the answer is 0\n");
    } else {
        EXPECT_GE(size >> 16, 1u);
        EXPECT_LE(size >> 16, 4096u);
        EXPECT_EQ(0u, (size & 0xFFFF) % 64);
        EXPECT_LT(size & 0xFFFF, 1024u);
    }

    EXPECT_EQ(1u, RunGatectl("3 NoSuchCompanionsWindow"));
    EXPECT_FALSE(PeekMessageA(&reply, window, MSG_GATE_REPLY, MSG_GATE_REPLY, PM_REMOVE));
    DestroyWindow(window);
}

}  // namespace
