// Start-up: the switch, the system check, the INI paths, a second start waking the running copy.
#include <gtest/gtest.h>

#include "base/state.h"
#include "shell/main_window.h"
#include "shell/startup.h"
#include "support/support.h"

TEST(Startup, SlashAInAnyCaseIsTheFirstSwitch)
{
    static const struct { const char* line; uint32_t flags; } cases[] = {
        {"/A", STARTUP_AUTORUN}, {"run /a", STARTUP_AUTORUN}, {"-A", 0}, {"/x /A", 0}, {"/", 0}, {NULL, 0}};
    for (const auto& c : cases) EXPECT_EQ(c.flags, ParseStartupSwitch(c.line)) << (c.line ? c.line : "NULL");
}

TEST(Startup, DetectSystemFromClassifiesEveryWindows)
{
    static const struct { SystemFacts facts; int result; uint16_t platform; int16_t os_class; } cases[] = {
        {{16, VER_PLATFORM_WIN32_WINDOWS, 4, 0, 0x040003B6}, 1, PLATFORM_9X, 0},   // 95 retail
        {{8, VER_PLATFORM_WIN32_WINDOWS, 4, 0, 0x04000457}, 1, PLATFORM_9X, 2},    // 95 OSR2, build 1111
        {{16, VER_PLATFORM_WIN32_WINDOWS, 4, 0, 0x04030000}, 1, PLATFORM_9X, 3},   // minor byte 3
        {{16, VER_PLATFORM_WIN32_WINDOWS, 4, 9, 0x04020000}, 1, PLATFORM_9X, 0},
        {{16, VER_PLATFORM_WIN32_WINDOWS, 4, 10, 0x040A07CE}, 1, PLATFORM_9X, 10}, // 98
        {{16, VER_PLATFORM_WIN32_NT, 4, 0, 1381}, 1, PLATFORM_NT, 3},
        {{16, VER_PLATFORM_WIN32_NT, 4, 0, 1380}, 1, PLATFORM_NT, 0},
        {{16, VER_PLATFORM_WIN32_NT, 5, 0, 2195}, 0, 0, 0}, {{16, VER_PLATFORM_WIN32s, 3, 10, 0}, 0, 0, 0},
        {{4, VER_PLATFORM_WIN32_WINDOWS, 4, 10, 0x040A07CE}, 0, 0, 0},  // 16 colours: no settings that caused it
    };
    ClearSettingsStore();
    WriteRegistryString(HKEY_LOCAL_MACHINE, "SOFTWARE\\QUORVEL\\PANEL\\53338901", "refresh", "85");
    for (const auto& c : cases) {
        ResetProgramState();
        EXPECT_TRUE(DetectSystemFrom(&c.facts) == c.result && platform == c.platform && os_class == c.os_class)
            << c.facts.build_number;
    }
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, "SOFTWARE\\QUORVEL\\PANEL\\53338901"));
}

TEST(Startup, IniPathsBesideTheProgramOrNone)
{
    // "C:\" + 114 letters + "\ZNTR2.INI" is 127 characters: the longest that fits.
    std::string folder = "C:\\" + std::string(114, 'd') + "\\";
    BuildIniPaths((folder + "vistrel.exe").c_str());
    EXPECT_EQ(folder + "ZNTR2.INI|" + folder + "ZNTR3.INI", std::string(text_ini_path) + "|" + chip_ini_path);
    // One more and a cut path could name another file: none at all.
    BuildIniPaths(("C:\\" + std::string(115, 'd') + "\\vistrel.exe").c_str());
    EXPECT_EQ("|", std::string(text_ini_path) + "|" + chip_ini_path);
}

// Stands in for the running copy and notes where the wake-up click was.
static POINT click;
static LRESULT CALLBACK RunningCopyProc(HWND w, UINT m, WPARAM wp, LPARAM lp)
{
    if (m == MSG_TRAY_CALLBACK && lp == WM_LBUTTONDOWN) GetCursorPos(&click);
    return DefWindowProcA(w, m, wp, lp);
}

// A second start clicks the running copy's icon near its window but off the screen's edges, and ends.
TEST(Startup, SecondStartWakesTheRunningCopyAndEnds)
{
    WNDCLASSA wc = {0, RunningCopyProc, 0, 0, GetModuleHandleA(NULL), NULL, NULL, NULL, NULL, main_window_class};
    ASSERT_TRUE(RegisterClassA(&wc));
    static const struct { LONG left, top, x, y; } cases[] = {
        {9, 501, 19, 491}, {10, 500, 10, 500}, {500, 10, 500, 10}, {501, 9, 491, 19}};
    for (const auto& c : cases) {
        HWND running = CreateWindowExA(0, main_window_class, "", WS_POPUP, c.left, c.top, 1, 1, 0, 0, wc.hInstance, 0);
        SetCursorPos(400, 300);
        EXPECT_EQ(0, InitApplication(wc.hInstance));
        POINT now;
        GetCursorPos(&now);
        EXPECT_TRUE(click.x == c.x && click.y == c.y && now.x == 400 && now.y == 300) << c.left << "," << c.top;
        DestroyWindow(running);
    }
    UnregisterClassA(main_window_class, wc.hInstance);
}
