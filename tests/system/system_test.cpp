// vistrel-sim.exe as its own process under Wine, seen only from outside.
#include <gtest/gtest.h>

#include <math.h>
#include <stdlib.h>

#include <vector>

#include "system/panel.h"

static const UINT msg_query_refresh = 1126, msg_get_refresh = 1127, msg_set_refresh = 1128;
static const char card_key[] = "SOFTWARE\\QUORVEL\\PANEL\\53338901";

struct Screen {
    int width, height, bits;
};

static Screen CurrentScreen()
{
    HDC dc = GetDC(NULL);
    Screen s = {GetDeviceCaps(dc, HORZRES), GetDeviceCaps(dc, VERTRES), GetDeviceCaps(dc, BITSPIXEL)};
    ReleaseDC(NULL, dc);
    return s;
}

// The rates the panel offers for a mode, asked as other programs ask.
static std::vector<int> QueryRates(Panel& panel, int width, int height, int bits)
{
    std::vector<int> rates;
    for (int i = 0; i < 40; ++i) {
        LRESULT r = panel.Send(msg_query_refresh, MAKEWPARAM(i, bits), MAKELPARAM(width, height));
        if (r <= 0) break;
        rates.push_back((int)r);
    }
    return rates;
}

static std::string Join(const std::vector<int>& v)
{
    std::string s;
    for (int r : v) s += (s.empty() ? "" : ",") + std::to_string(r);
    return s;
}

// The display class key of the first card, as a 9x installation has it.
static std::string DisplayClassKey()
{
    std::string base = "System\\CurrentControlSet\\Services\\Class\\DISPLAY";
    HKEY key;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, base.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS) return "";
    char name[64];
    std::string found;
    for (DWORD i = 0; found.empty(); ++i) {
        DWORD size = sizeof name;
        if (RegEnumKeyExA(key, i, name, &size, NULL, NULL, NULL, NULL) != ERROR_SUCCESS) break;
        if (RegistryKeyExists(HKEY_LOCAL_MACHINE, base + "\\" + name + "\\MODES")) found = base + "\\" + name;
    }
    RegCloseKey(key);
    return found;
}

static std::string ModesList(int width, int height, int bits)
{
    std::string key = DisplayClassKey() + "\\MODES\\" + std::to_string(bits) + "\\" + std::to_string(width) + "," +
                      std::to_string(height);
    return ReadRegistryRaw(HKEY_LOCAL_MACHINE, key, "").c_str();
}

class SystemTest : public ::testing::Test {
protected:
    void SetUp() override { ClearSettingsStore(); }
    void TearDown() override { ClearSettingsStore(); }
};

TEST_F(SystemTest, RunsHiddenOnWindows98AndNT)
{
    for (const char* windows : {"98", "NT4"}) {
        Panel panel(DefaultMachine(windows));
        ASSERT_TRUE(panel.Start(std::string(windows) == "98" ? "win98" : "nt40"));
        HWND w = panel.WaitWindow();
        ASSERT_TRUE(w) << windows;
        RECT r;
        GetWindowRect(w, &r);
        EXPECT_EQ(1, r.right - r.left);
        EXPECT_EQ(1, r.bottom - r.top);
        EXPECT_TRUE(GetWindowLongA(w, GWL_EXSTYLE) & WS_EX_TOOLWINDOW);
        EXPECT_EQ(-1, panel.process.WaitExit(500)) << windows << ": it must keep running";
        EXPECT_GT(panel.Send(msg_get_refresh, 0, 0), 0) << windows;
    }
}

static BOOL CALLBACK FindProcessDialog(HWND w, LPARAM data)
{
    std::pair<DWORD, HWND>* find = (std::pair<DWORD, HWND>*)data;
    DWORD pid = 0;
    GetWindowThreadProcessId(w, &pid);
    char cls[16];
    GetClassNameA(w, cls, sizeof cls);
    if (pid == find->first && IsWindowVisible(w) && strcmp(cls, "#32770") == 0) {
        find->second = w;
        return FALSE;
    }
    return TRUE;
}

static std::string DialogText(HWND box)
{
    std::string text;
    for (HWND c = GetWindow(box, GW_CHILD); c; c = GetWindow(c, GW_HWNDNEXT)) {
        WCHAR wide[512] = L"";
        GetWindowTextW(c, wide, 512);
        char line[1024];
        WideCharToMultiByte(CP_ACP, 0, wide, -1, line, sizeof line, NULL, NULL);
        text += line;
        text += "\n";
    }
    return text;
}

TEST_F(SystemTest, NoSupportedCardShowsTheTextAndEnds)
{
    Panel panel("[Machine]\r\nWindows=98\r\n[Card0]\r\nId=1002:4742\r\nBus=1\r\nDevice=0\r\nMemoryMB=8\r\n");
    panel.SetTextIni("Setup", "NoCard", "Nothing to drive here (test).");
    ASSERT_TRUE(panel.Start("win98"));
    std::pair<DWORD, HWND> find = {panel.process.info.dwProcessId, NULL};
    for (int i = 0; i < 600 && !find.second; ++i) {
        EnumWindows(FindProcessDialog, (LPARAM)&find);
        if (!find.second) Sleep(50);
    }
    ASSERT_TRUE(find.second) << "no message box";
    EXPECT_NE(std::string::npos, DialogText(find.second).find("Nothing to drive here (test)."));
    PostMessageA(find.second, WM_COMMAND, IDOK, 0);
    EXPECT_TRUE(panel.WaitGone(15000));
    EXPECT_EQ(0, panel.process.WaitExit(0));
}

TEST_F(SystemTest, OtherProgramsReadTheRatesAndTheMeasuredRate)
{
    Panel panel;  // the default machine
    ASSERT_TRUE(panel.Start("win98"));
    ASSERT_TRUE(panel.WaitWindow());
    std::string modes = ModesList(640, 480, 8);
    ASSERT_FALSE(modes.empty());
    std::string offered = Join(QueryRates(panel, 640, 480, 8));
    EXPECT_EQ(0u, offered.find(modes)) << offered << " does not start with the MODES list " << modes;

    double card_hz = panel.StateNumber("Card0.RefreshHz");
    LRESULT believed = panel.Send(msg_get_refresh, 0, 0);
    EXPECT_NEAR(card_hz, (double)believed, 1.0);
}

// The highest rate Windows lists for the current mode, and a rate 15 Hz
// above it that only the pixel clock can reach.
static int ExtendedRateFor(Panel& panel, const Screen& s, const char* section)
{
    std::vector<int> os = QueryRates(panel, s.width, s.height, s.bits);
    if (os.empty()) return 0;
    int extended = os.back() + 15;
    panel.SetChipIni(section, std::to_string(s.width) + "x" + std::to_string(s.height) + "x" + std::to_string(s.bits),
                     std::to_string(extended));
    return extended;
}

TEST_F(SystemTest, SetRefreshReachesAnExtendedRateThroughThePixelClock)
{
    struct Case {
        const char* windows;
        const char* version;
        const char* section;
    } cases[] = {{"98", "win98", "CHIP8901_95E"}, {"NT4", "nt40", "CHIP8901_NT4E"}};
    for (const Case& c : cases) {
        ClearSettingsStore();
        Panel panel(DefaultMachine(c.windows));
        ASSERT_TRUE(panel.Start(c.version));
        ASSERT_TRUE(panel.WaitWindow());
        Screen screen = CurrentScreen();
        int extended = ExtendedRateFor(panel, screen, c.section);
        ASSERT_GT(extended, 15) << c.windows << " " << screen.width << "x" << screen.height << "x" << screen.bits
                                << " offers " << Join(QueryRates(panel, screen.width, screen.height, screen.bits));
        EXPECT_EQ(1, panel.Send(msg_set_refresh, extended, 0))
            << c.windows << " " << screen.width << "x" << screen.height << "x" << screen.bits << " offers "
            << Join(QueryRates(panel, screen.width, screen.height, screen.bits));
        EXPECT_NEAR(extended, panel.StateNumber("Card0.RefreshHz"), 2.0) << c.windows;
        EXPECT_EQ(extended, (int)panel.Send(msg_get_refresh, 0, 0)) << c.windows;
        EXPECT_STREQ(std::to_string(extended).c_str(), ReadRegistryRaw(HKEY_LOCAL_MACHINE, card_key, "refresh").c_str());
    }
}

TEST_F(SystemTest, HostileRatesAreRefused)
{
    Panel panel;
    ASSERT_TRUE(panel.Start("win98"));
    ASSERT_TRUE(panel.WaitWindow());
    LRESULT before = panel.Send(msg_get_refresh, 0, 0);
    double clock = panel.StateNumber("Card0.PixelClockHz");
    for (WPARAM rate : {(WPARAM)65535, (WPARAM)400, (WPARAM)2, (WPARAM)0}) EXPECT_EQ(0, panel.Send(msg_set_refresh, rate, 0));
    EXPECT_EQ(before, panel.Send(msg_get_refresh, 0, 0));
    EXPECT_EQ(clock, panel.StateNumber("Card0.PixelClockHz"));
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key));
}

static void ChangeScreen(int width, int height, int bits)
{
    DEVMODEA mode = {};
    mode.dmSize = sizeof mode;
    mode.dmPelsWidth = width;
    mode.dmPelsHeight = height;
    mode.dmBitsPerPel = bits;
    mode.dmFields = DM_PELSWIDTH | DM_PELSHEIGHT | DM_BITSPERPEL;
    ChangeDisplaySettingsA(&mode, 0);
}

// Stores a picture position for the mode the panel is in, as the adjustment
// window would: the horizontal retrace start two character clocks later.
static int StorePositionNow(Panel& panel, const Screen& s, int rate)
{
    int cr04 = (int)strtol(panel.State()["Card0.CR04"].c_str(), NULL, 16);
    std::string name = std::to_string(s.width) + "x" + std::to_string(s.height) + "x" + std::to_string(s.bits) + "x" +
                       std::to_string(rate) + "H";
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, name, std::to_string(cr04 + 2), false);
    return cr04 + 2;
}

TEST_F(SystemTest, StartWithSwitchABringsBackRateAndPosition)
{
    Panel panel(DefaultMachine("98"));
    ASSERT_TRUE(panel.Start("win98"));
    ASSERT_TRUE(panel.WaitWindow());
    Screen s = CurrentScreen();
    int extended = ExtendedRateFor(panel, s, "CHIP8901_95E");
    ASSERT_EQ(1, panel.Send(msg_set_refresh, extended, 0));
    int position = StorePositionNow(panel, s, extended);
    panel.Kill();

    // A reboot (the description changed) brings the card up in the display
    // driver's own timing.
    panel.Describe(DefaultMachine("98") + "; rebooted\r\n");
    ASSERT_TRUE(panel.Start("win98"));
    ASSERT_TRUE(panel.WaitWindow());
    EXPECT_GT(fabs(panel.StateNumber("Card0.RefreshHz") - extended), 2.0);
    panel.Kill();

    ASSERT_TRUE(panel.Start("win98", "/A"));
    ASSERT_TRUE(panel.WaitWindow());
    EXPECT_NEAR(extended, panel.StateNumber("Card0.RefreshHz"), 2.0);
    EXPECT_EQ(position, (int)strtol(panel.State()["Card0.CR04"].c_str(), NULL, 16));
}

TEST_F(SystemTest, ForeignModeChangeIsFollowedByTheReapplication)
{
    Panel panel(DefaultMachine("98"));
    ASSERT_TRUE(panel.Start("win98"));
    HWND w = panel.WaitWindow();
    ASSERT_TRUE(w);
    Screen s = CurrentScreen();
    int extended = ExtendedRateFor(panel, s, "CHIP8901_95E");
    ASSERT_EQ(1, panel.Send(msg_set_refresh, extended, 0));
    int position = StorePositionNow(panel, s, extended);

    ChangeScreen(800, 600, s.bits);
    ChangeScreen(s.width, s.height, s.bits);
    panel.Send(WM_NULL, 0, 0);
    EXPECT_GT(fabs(panel.StateNumber("Card0.RefreshHz") - extended), 2.0) << "the driver's own timing first";

    // The next redraw after three quiet seconds puts rate and position back.
    Sleep(3100);
    RedrawWindow(w, NULL, NULL, RDW_INVALIDATE | RDW_FRAME | RDW_ERASE);
    panel.Send(WM_NULL, 0, 0);
    EXPECT_NEAR(extended, panel.StateNumber("Card0.RefreshHz"), 2.0);
    EXPECT_EQ(position, (int)strtol(panel.State()["Card0.CR04"].c_str(), NULL, 16));
}
