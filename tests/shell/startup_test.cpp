#include <gtest/gtest.h>

#include "base/state.h"
#include "base/texts.h"
#include "shell/main_window.h"
#include "shell/startup.h"
#include "shell/tray.h"
#include "support/support.h"

TEST(StartupSwitch, SlashAInAnyCaseAnywhere)
{
    EXPECT_EQ((uint32_t)STARTUP_AUTORUN, ParseStartupSwitch("/A"));
    EXPECT_EQ((uint32_t)STARTUP_AUTORUN, ParseStartupSwitch("/a"));
    EXPECT_EQ((uint32_t)STARTUP_AUTORUN, ParseStartupSwitch("start with windows /A"));
    EXPECT_EQ(0u, ParseStartupSwitch("-A"));
    EXPECT_EQ(0u, ParseStartupSwitch("/x"));
    EXPECT_EQ(0u, ParseStartupSwitch("/x /A"));  // only the first switch counts
    EXPECT_EQ(0u, ParseStartupSwitch(""));
    EXPECT_EQ(0u, ParseStartupSwitch("/"));
}

TEST(StartupSwitch, WakeClickKeepsOffTheEdges)
{
    RECT near_corner = {5, 600, 6, 601};
    POINT p = WakePoint(&near_corner);
    EXPECT_EQ(15, p.x);
    EXPECT_EQ(590, p.y);
    RECT middle = {10, 500, 11, 501};
    p = WakePoint(&middle);
    EXPECT_EQ(10, p.x);
    EXPECT_EQ(500, p.y);
}

static SystemFacts Facts(int bits, DWORD platform_id, DWORD major, DWORD minor, DWORD build)
{
    SystemFacts f = {bits, platform_id, major, minor, build};
    return f;
}

TEST(DetectSystemFrom, ClassifiesEveryWindows)
{
    struct Case {
        SystemFacts facts;
        int result;
        uint16_t platform;
        int16_t os_class;
    } cases[] = {
        {Facts(16, VER_PLATFORM_WIN32_WINDOWS, 4, 0, 0x040003B6), 1, PLATFORM_9X, 0},   // 95 retail
        {Facts(16, VER_PLATFORM_WIN32_WINDOWS, 4, 0, 0x04000457), 1, PLATFORM_9X, 2},   // 95 OSR2, build 1111
        {Facts(16, VER_PLATFORM_WIN32_WINDOWS, 4, 0, 0x04030000), 1, PLATFORM_9X, 3},   // minor byte 3
        {Facts(16, VER_PLATFORM_WIN32_WINDOWS, 4, 10, 0x040A07CE), 1, PLATFORM_9X, 10}, // 98
        {Facts(16, VER_PLATFORM_WIN32_WINDOWS, 4, 90, 0x045A0BB8), 1, PLATFORM_9X, 10}, // Me counts as 98
        {Facts(16, VER_PLATFORM_WIN32_NT, 4, 0, 1381), 1, PLATFORM_NT, 3},
        {Facts(16, VER_PLATFORM_WIN32_NT, 4, 0, 1057), 1, PLATFORM_NT, 0},
        {Facts(16, VER_PLATFORM_WIN32_NT, 5, 0, 2195), 0, 0, 0},
        {Facts(16, VER_PLATFORM_WIN32_NT, 3, 51, 1057), 0, 0, 0},
        {Facts(16, VER_PLATFORM_WIN32s, 3, 10, 0), 0, 0, 0},
    };
    for (const Case& c : cases) {
        ResetProgramState();
        EXPECT_EQ(c.result, DetectSystemFrom(&c.facts)) << c.facts.build_number;
        EXPECT_EQ(c.platform, platform) << c.facts.build_number;
        EXPECT_EQ(c.os_class, os_class) << c.facts.build_number;
    }
}

TEST(DetectSystemFrom, SixteenColoursEraseTheSettings)
{
    ResetProgramState();
    ClearSettingsStore();
    WriteRegistryString(HKEY_LOCAL_MACHINE, "SOFTWARE\\QUORVEL\\PANEL\\53338901", "refresh", "85", false);
    WriteRegistryString(HKEY_LOCAL_MACHINE, "SOFTWARE\\QUORVEL\\PANEL", "Standby", "5", false);
    SystemFacts f = Facts(4, VER_PLATFORM_WIN32_WINDOWS, 4, 10, 0x040A07CE);
    EXPECT_EQ(0, DetectSystemFrom(&f));
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, "SOFTWARE\\QUORVEL\\PANEL\\53338901"));
    bool found = true;
    ReadRegistryRaw(HKEY_LOCAL_MACHINE, "SOFTWARE\\QUORVEL\\PANEL", "Standby", &found);
    EXPECT_FALSE(found);
    ClearSettingsStore();
}

TEST(IniPaths, BesideTheProgramAndCutToTheirBuffers)
{
    BuildIniPaths("C:\\Program Files\\Vistrel\\vistrel.exe");
    EXPECT_STREQ("C:\\Program Files\\Vistrel\\ZNTR2.INI", text_ini_path);
    EXPECT_STREQ("C:\\Program Files\\Vistrel\\ZNTR3.INI", chip_ini_path);

    // "C:\" + 114 letters + "\ZNTR2.INI" is 127 characters: the longest that fits.
    std::string longest = "C:\\" + std::string(114, 'd') + "\\vistrel.exe";
    BuildIniPaths(longest.c_str());
    EXPECT_EQ((size_t)INI_PATH_SIZE - 1, strlen(text_ini_path));
    EXPECT_STREQ("ZNTR3.INI", chip_ini_path + INI_PATH_SIZE - 10);
    // One more and no file is named at all: the texts fall back to their defaults.
    std::string deeper = "C:\\" + std::string(115, 'd') + "\\vistrel.exe";
    BuildIniPaths(deeper.c_str());
    EXPECT_STREQ("", text_ini_path);
    EXPECT_STREQ("", chip_ini_path);
    char text[20];
    memset(text, '#', sizeof text);
    LoadText("CAPTION", "Vistrel", text, sizeof text);
    EXPECT_STREQ("Vistrel", text);
}

// The test runs under the Windows version CTest asked Wine for.
TEST(DetectSystem, ReadsTheVersionWineReports)
{
    char expected[16] = "";
    if (!GetEnvironmentVariableA("VISTREL_EXPECT_WINDOWS", expected, sizeof expected)) GTEST_SKIP();
    ResetProgramState();
    int result = DetectSystem();
    std::string which = expected;
    if (which == "95") {
        EXPECT_EQ(1, result);
        EXPECT_EQ(PLATFORM_9X, platform);
        EXPECT_LT(os_class, OS_CLASS_WIN98);
    } else if (which == "98") {
        EXPECT_EQ(1, result);
        EXPECT_EQ(PLATFORM_9X, platform);
        EXPECT_EQ(OS_CLASS_WIN98, os_class);
    } else if (which == "NT4") {
        EXPECT_EQ(1, result);
        EXPECT_EQ(PLATFORM_NT, platform);
        EXPECT_EQ(3, os_class);
    } else {
        EXPECT_EQ(0, result);  // a modern NT is not supported
        return;
    }
    char module[MAX_PATH];
    GetModuleFileNameA(NULL, module, sizeof module);
    std::string folder(module, strrchr(module, '\\') + 1);
    EXPECT_EQ(folder + "ZNTR2.INI", text_ini_path);
    EXPECT_EQ(folder + "ZNTR3.INI", chip_ini_path);
}

// A stand-in for a running copy: it records the wake-up click.
static POINT cursor_at_click;
static int clicks;
static LRESULT CALLBACK RunningCopyProc(HWND w, UINT m, WPARAM wp, LPARAM lp)
{
    if (m == MSG_TRAY_CALLBACK && lp == WM_LBUTTONDOWN) {
        GetCursorPos(&cursor_at_click);
        ++clicks;
        return 0;
    }
    return DefWindowProcA(w, m, wp, lp);
}

TEST(SecondStart, WakesTheRunningCopyAndEnds)
{
    WNDCLASSA wc = {};
    wc.lpfnWndProc = RunningCopyProc;
    wc.hInstance = GetModuleHandleA(NULL);
    wc.lpszClassName = "zentra";
    ASSERT_TRUE(RegisterClassA(&wc));
    HWND running = CreateWindowExA(WS_EX_TOOLWINDOW, "zentra", "", WS_POPUP, 5, 700, 1, 1, NULL, NULL, wc.hInstance,
                                   NULL);
    ASSERT_TRUE(running);
    SetCursorPos(400, 300);
    POINT before;
    GetCursorPos(&before);

    std::string folder = CopySimBuild("second");
    ChildProcess second;
    ASSERT_TRUE(second.Start("\"" + folder + "vistrel-sim.exe\"", folder));
    struct Wait {
        ChildProcess* p;
        long code;
    } wait = {&second, -1};
    ASSERT_TRUE(PumpUntil(
        [](void* d) {
            Wait* w = (Wait*)d;
            w->code = w->p->WaitExit(0);
            return w->code != -1;
        },
        &wait, 30000));
    EXPECT_EQ(0, wait.code);
    EXPECT_EQ(1, clicks);
    EXPECT_EQ(15, cursor_at_click.x);
    EXPECT_EQ(690, cursor_at_click.y);
    POINT after;
    GetCursorPos(&after);
    EXPECT_EQ(before.x, after.x);
    EXPECT_EQ(before.y, after.y);
    DestroyWindow(running);
    UnregisterClassA("zentra", wc.hInstance);
}

TEST(MainWindowSpot, TheCornerAtTheFarEndOfTheTaskbar)
{
    TaskbarPlace place = {1024, 768, {0, 740, 1024, 768}};  // along the bottom
    POINT p = MainWindowSpot(&place);
    EXPECT_EQ(1023, p.x);
    EXPECT_EQ(767, p.y);
    place.taskbar = {994, 0, 1024, 768};  // at the right
    p = MainWindowSpot(&place);
    EXPECT_EQ(1023, p.x);
    EXPECT_EQ(767, p.y);
    place.taskbar = {0, 0, 30, 768};  // at the left: bottom-left pixel
    p = MainWindowSpot(&place);
    EXPECT_EQ(0, p.x);
    EXPECT_EQ(767, p.y);
    place.taskbar = {0, 0, 1024, 28};  // across the top: top-right pixel
    p = MainWindowSpot(&place);
    EXPECT_EQ(1023, p.x);
    EXPECT_EQ(0, p.y);
}
