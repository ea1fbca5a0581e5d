// vistrel-sim.exe as its own process, seen only from outside: its windows, messages,
// registry, INI files and simstate.exe. Each start costs seconds: one serves many checks.
#include <gtest/gtest.h>

#include <math.h>
#include <stdlib.h>

#include <windows.h>
#include <prsht.h>
#include <shellapi.h>
#include <commctrl.h>

#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "support/support.h"

// The numbers other programs send; they never change.
static const UINT msg_query_refresh = 1126, msg_get_refresh = 1127, msg_set_refresh = 1128, msg_power_state = 1134,
                  msg_tray_callback = 1224;
static const char card_key[] = "SOFTWARE\\QUORVEL\\PANEL\\53338901";
static const int monitor_list_id = 1039, info_list_id = 1020, performance_slider_id = 1050, close_command = 209;

static std::string MachineIni(const std::string& windows, const std::string& card = "5333:8901")
{
    return "[Machine]\r\nWindows=" + windows + "\r\n[Card0]\r\nId=" + card + "\r\nBus=0\r\nDevice=10\r\n";
}

// The mode of the desktop, and its name in the chip file and the settings store.
static DEVMODEA Screen()
{
    DEVMODEA mode = {};
    mode.dmSize = sizeof mode;
    EnumDisplaySettingsA(NULL, ENUM_CURRENT_SETTINGS, &mode);
    return mode;
}

static std::string Name(const DEVMODEA& m)
{
    return std::to_string(m.dmPelsWidth) + "x" + std::to_string(m.dmPelsHeight) + "x" + std::to_string(m.dmBitsPerPel);
}

static bool IconShown(HWND window)
{
    NOTIFYICONDATAA data = {NOTIFYICONDATAA_V1_SIZE, window, 100};
    return Shell_NotifyIconA(NIM_MODIFY, &data);
}

// Keys to a menu window, as the keyboard gives them.
static void PressKeys(HWND menu, const std::vector<UINT>& keys)
{
    for (UINT key : keys) PostMessageA(menu, WM_KEYDOWN, key, 1), PostMessageA(menu, WM_KEYUP, key, 0xC0000001);
}

// The lines of a list box on the sheet's current page, each ended by "\n".
static std::wstring PageLines(HWND sheet, int list_id)
{
    HWND list = GetDlgItem((HWND)SendMessageA(sheet, PSM_GETCURRENTPAGEHWND, 0, 0), list_id);
    std::wstring lines;
    for (LRESULT i = 0, count = SendMessageW(list, LB_GETCOUNT, 0, 0); i < count; ++i) {
        wchar_t text[256] = L"";
        SendMessageW(list, LB_GETTEXT, i, (LPARAM)text);
        lines += text + std::wstring(L"\n");
    }
    return lines;
}

static void CancelSheet(HWND sheet)
{
    PostMessageA(sheet, PSM_PRESSBUTTON, PSBTN_CANCEL, 0);
    for (DWORD start = GetTickCount(); IsWindow(sheet) && GetTickCount() - start < 10000;) Sleep(20);
    ASSERT_FALSE(IsWindow(sheet));
}

// A private copy of build/sim with its own machine.
struct Panel {
    explicit Panel(const std::string& machine) : folder(CopySimBuild("panel")) { Describe(machine); }
    void Describe(const std::string& machine) { WriteTextFile(folder + "SIMMACHINE.INI", machine); }
    bool Start(const char* version, const std::string& arguments = "")
    {
        WriteRegistryString(HKEY_CURRENT_USER, "Software\\Wine\\AppDefaults\\vistrel-sim.exe", "Version", version);
        return process.Start("\"" + folder + "vistrel-sim.exe\" " + arguments, folder);
    }
    // The main window, a hidden 1 x 1 tool window, once its icon is in the taskbar after the start-up's work.
    HWND WaitWindow()
    {
        DWORD_PTR r;
        RECT box;
        for (DWORD start = GetTickCount(); GetTickCount() - start < 30000 && process.WaitExit(20) == -1;) {
            HWND w = FindWindowA("zentra", NULL);
            if (w && SendMessageTimeoutA(w, WM_NULL, 0, 0, SMTO_NORMAL, 30000, &r) && IconShown(w) &&
                GetWindowRect(w, &box) && box.right - box.left == 1 && box.bottom - box.top == 1 &&
                (GetWindowLongA(w, GWL_EXSTYLE) & WS_EX_TOOLWINDOW))
                return w;
        }
        return NULL;
    }
    // A top-level window of this process of that class other than not_this, once it is shown.
    HWND Shown(const char* cls, HWND not_this = NULL)
    {
        for (DWORD start = GetTickCount(); GetTickCount() - start < 10000; Sleep(20))
            for (HWND w = NULL; (w = FindWindowExA(NULL, w, cls, NULL));) {
                DWORD owner = 0;
                GetWindowThreadProcessId(w, &owner);
                if (w != not_this && owner == process.info.dwProcessId && IsWindowVisible(w)) return w;
            }
        return NULL;
    }
    LRESULT Send(UINT message, WPARAM wparam, LPARAM lparam = 0)
    {
        DWORD_PTR result = 0;
        HWND w = FindWindowA("zentra", NULL);  // none: the call fails
        return SendMessageTimeoutA(w, message, wparam, lparam, SMTO_NORMAL, 20000, &result) ? result : -12345;
    }
    // A value of simstate.exe's report, e.g. ("Card0", "RefreshHz"): of a new one, or of the last.
    std::string State(const char* section, const char* key, bool again = true)
    {
        std::string report = folder + "simstate.txt";
        char value[64] = "";
        if (again) {
            ChildProcess state;
            DeleteFileA(report.c_str());
            if (state.Start("cmd /c simstate.exe >simstate.txt", folder)) state.WaitExit(20000);
        }
        GetPrivateProfileStringA(section, key, "", value, sizeof value, report.c_str());
        return value;
    }
    double RefreshHz() { return atof(State("Card0", "RefreshHz").c_str()); }
    int Cr04() { return (int)strtol(State("Card0", "CR04").c_str(), NULL, 16); }
    std::vector<int> QueryRates(int width, int height, int bits)
    {
        std::vector<int> rates;
        for (LRESULT r; rates.size() < 40 &&
                        (r = Send(msg_query_refresh, MAKEWPARAM(rates.size(), bits), MAKELPARAM(width, height))) > 0;)
            rates.push_back((int)r);
        return rates;
    }
    // Sets a rate 15 Hz above all Windows lists for the running mode, which
    // only the pixel clock reaches, offered by the chip file; returns it.
    // The card's mode as simstate names it (Wine shows other processes 32 bits).
    int SetExtendedRate(const char* section, const char* key = card_key)
    {
        DEVMODEA m = {};
        m.dmPelsWidth = atoi(State("Card0", "Width").c_str());
        m.dmPelsHeight = atoi(State("Card0", "Height", false).c_str());
        m.dmBitsPerPel = atoi(State("Card0", "Bits", false).c_str());
        std::vector<int> os = QueryRates(m.dmPelsWidth, m.dmPelsHeight, m.dmBitsPerPel);
        int extended = os.empty() ? 0 : os.back() + 15;
        WritePrivateProfileStringA(section, Name(m).c_str(), std::to_string(extended).c_str(),
                                   (folder + "ZNTR3.INI").c_str());
        EXPECT_EQ(1, Send(msg_set_refresh, extended));
        EXPECT_NEAR(extended, RefreshHz(), 2.0);
        EXPECT_EQ(extended, (int)Send(msg_get_refresh, 0));
        EXPECT_EQ(std::to_string(extended), ReadRegistryRaw(HKEY_LOCAL_MACHINE, key, "refresh").c_str());
        return extended;
    }
    std::string folder;
    ChildProcess process;
};

struct SystemTest : ::testing::Test {
    void SetUp() override { ClearSettingsStore(); }
    void TearDown() override { ClearSettingsStore(); }
};

TEST_F(SystemTest, OnWindows98)
{
    Panel panel(MachineIni("98"));
    ASSERT_TRUE(panel.Start("win98"));
    HWND w = panel.WaitWindow();
    ASSERT_TRUE(w);

    // A second start opens this copy's menu and ends; keys as the keyboard: Desktop, Information, Monitor.
    ChildProcess second;
    ASSERT_TRUE(second.Start("\"" + panel.folder + "vistrel-sim.exe\"", panel.folder));
    EXPECT_EQ(0, second.WaitExit(30000));
    EXPECT_EQ(w, FindWindowA("zentra", NULL));
    HWND menu = panel.Shown("#32768");
    ASSERT_TRUE(menu != NULL) << "no menu";
    PressKeys(menu, {VK_DOWN, VK_DOWN, VK_DOWN, VK_RETURN});
    HWND sheet = panel.Shown("#32770");
    ASSERT_TRUE(sheet != NULL) << "no sheet";
    // The Monitor page, read from here: the default monitor's EDID lines.
    EXPECT_NE(std::wstring::npos,
              PageLines(sheet, monitor_list_id).find(L"Year of Manufacture :\n        1998\nMax H. Image Size(cm) :\n"
                                                     L"        30\nMax V. Image Size(cm) :\n        23\n"));
    ASSERT_NO_FATAL_FAILURE(CancelSheet(sheet));

    // Other programs read the driver's rates, then the chip file's, and the rate the card runs.
    const char* modes_key = "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\0000\\MODES\\8\\640,480";
    std::string modes = ReadRegistryRaw(HKEY_LOCAL_MACHINE, modes_key, "").c_str(), offered;
    for (int r : panel.QueryRates(640, 480, 8)) offered += (offered.empty() ? "" : ",") + std::to_string(r);
    ASSERT_FALSE(modes.empty());
    EXPECT_EQ(0u, offered.find(modes)) << offered << " does not start with the MODES list " << modes;
    EXPECT_NEAR(panel.RefreshHz(), (double)panel.Send(msg_get_refresh, 0), 1.0);
    LRESULT before = panel.Send(msg_get_refresh, 0);
    std::string clock = panel.State("Card0", "PixelClockHz");
    for (WPARAM rate : {65535, 400, 2, 0}) EXPECT_EQ(0, panel.Send(msg_set_refresh, rate)) << rate;
    EXPECT_EQ(before, panel.Send(msg_get_refresh, 0));
    EXPECT_EQ(clock, panel.State("Card0", "PixelClockHz"));
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key));

    int extended = panel.SetExtendedRate("CHIP8901_95E");
    // A picture position for this mode, as the adjustment window stores it.
    DEVMODEA mode = Screen(), other = mode;
    int position = panel.Cr04() + 2;
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, Name(mode) + "x" + std::to_string(extended) + "H",
                        std::to_string(position), false);

    // Another program changes the mode and back: the driver's own rate until a redraw after three quiet seconds.
    other.dmPelsWidth = 800, other.dmPelsHeight = 600;
    ChangeDisplaySettingsA(&other, 0);
    ChangeDisplaySettingsA(&mode, 0);
    panel.Send(WM_NULL, 0);
    EXPECT_GT(fabs(panel.RefreshHz() - extended), 2.0) << "the driver's own timing first";
    Sleep(3100);
    RedrawWindow(w, NULL, NULL, RDW_INVALIDATE | RDW_FRAME | RDW_ERASE);
    panel.Send(WM_NULL, 0);
    EXPECT_NEAR(extended, panel.RefreshHz(), 2.0);
    EXPECT_EQ(position, panel.Cr04());

    PostMessageA(w, WM_COMMAND, close_command, 0);
    HWND question = panel.Shown("#32770");
    ASSERT_TRUE(question != NULL && GetDlgItem(question, IDYES)) << "no exit question";
    PostMessageA(question, WM_COMMAND, IDYES, 0);
    EXPECT_EQ(0, panel.process.WaitExit(10000));
    EXPECT_FALSE(IconShown(w));

    // After a reboot only a start with "/A" brings back the rate and the position.
    panel.Describe(MachineIni("98") + "; rebooted\r\n");
    ASSERT_TRUE(panel.Start("win98"));
    ASSERT_TRUE(panel.WaitWindow());
    EXPECT_GT(fabs(panel.RefreshHz() - extended), 2.0);
    panel.process.Kill();
    ASSERT_TRUE(panel.Start("win98", "/A"));
    ASSERT_TRUE(panel.WaitWindow());
    EXPECT_NEAR(extended, panel.RefreshHz(), 2.0);
    EXPECT_EQ(position, panel.Cr04());
}

TEST_F(SystemTest, OnWindowsNTTheExtendedRateComesFromThePixelClock)
{
    Panel panel(MachineIni("NT4"));
    ASSERT_TRUE(panel.Start("nt40"));
    ASSERT_TRUE(panel.WaitWindow());
    EXPECT_NEAR(panel.RefreshHz(), (double)panel.Send(msg_get_refresh, 0), 1.0);
    panel.SetExtendedRate("CHIP8901_NT4E");
}

// The memory clock of simstate's report, in whole MHz.
static int CardMhz(Panel& panel) { return (int)(atof(panel.State("Card0", "MemoryClockHz").c_str()) / 1e6 + 0.5); }

// The Performance page sets the TNT's memory clock; only a kept clock is stored, and
// "/A" after a reboot brings it back. The refresh the card runs is the one reported.
TEST_F(SystemTest, RivaTntMemoryClockThroughThePerformancePage)
{
    const std::string machine = "[Machine]\r\nWindows=98\r\n[Card0]\r\nId=10de:0020\r\nBus=1\r\nDevice=0\r\nMemoryMB=16\r\n";
    const char* tnt_key = "SOFTWARE\\QUORVEL\\PANEL\\10de0020";
    const int performance_command = 223, apply_id = 1053;
    Panel panel(machine);
    ASSERT_TRUE(panel.Start("win98"));
    HWND w = panel.WaitWindow();
    ASSERT_TRUE(w);
    EXPECT_NEAR(panel.RefreshHz(), (double)panel.Send(msg_get_refresh, 0), 1.0);
    panel.SetExtendedRate("CHIP0020_95E", tnt_key);
    ClearSettingsStore();
    const int before = CardMhz(panel);

    PostMessageA(w, WM_COMMAND, performance_command, 0);
    HWND sheet = panel.Shown("#32770");
    ASSERT_TRUE(sheet != NULL) << "no sheet";
    HWND page = (HWND)SendMessageA(sheet, PSM_GETCURRENTPAGEHWND, 0, 0);
    // Chooses before + 10 MHz, applies it and answers the question.
    auto apply = [&](int answer) {
        SendMessageA(page, WM_HSCROLL, MAKEWPARAM(TB_THUMBTRACK, before + 10), (LPARAM)GetDlgItem(page, performance_slider_id));
        PostMessageA(page, WM_COMMAND, MAKEWPARAM(apply_id, BN_CLICKED), (LPARAM)GetDlgItem(page, apply_id));
        HWND question = panel.Shown("#32770", sheet);
        ASSERT_TRUE(question != NULL) << "no question";
        EXPECT_NEAR(before + 10, CardMhz(panel), 4);
        EXPECT_STREQ("", ReadRegistryRaw(HKEY_LOCAL_MACHINE, tnt_key, "mclk").c_str()) << "stored before the answer";
        PostMessageA(question, WM_COMMAND, answer, 0);
        for (DWORD start = GetTickCount(); IsWindow(question) && GetTickCount() - start < 10000;) Sleep(20);
        panel.Send(WM_NULL, 0);
    };
    apply(IDCANCEL);
    EXPECT_NEAR(before, CardMhz(panel), 1);
    EXPECT_EQ(std::to_string(before), ReadRegistryRaw(HKEY_LOCAL_MACHINE, tnt_key, "mclk").c_str());
    ClearSettingsStore();
    apply(IDOK);
    const int kept = CardMhz(panel);
    EXPECT_NEAR(before + 10, kept, 4);
    EXPECT_EQ(std::to_string(before + 10), ReadRegistryRaw(HKEY_LOCAL_MACHINE, tnt_key, "mclk").c_str());
    panel.process.Kill();

    // A reboot resets the card; only "/A" sets the stored clock again.
    panel.Describe(machine + "; rebooted\r\n");
    ASSERT_TRUE(panel.Start("win98"));
    ASSERT_TRUE(panel.WaitWindow());
    EXPECT_EQ(before, CardMhz(panel));
    panel.process.Kill();
    ASSERT_TRUE(panel.Start("win98", "/A"));
    ASSERT_TRUE(panel.WaitWindow());
    EXPECT_EQ(kept, CardMhz(panel));
}

// Each family on its machine of sim/machines, one start each: the menu's page
// entries (the last opens its page, on a sheet of as many), the memory the
// Information page shows, the rate the card runs, a rate above Windows' list
// where the program sets the pixel clock, and the power states.
TEST_F(SystemTest, FamiliesOnTheirMachines)
{
    const struct {
        const char *machine, *version;
        int pages, last_page_control;
        const wchar_t* memory;
        const char *extended, *key;  // the chip file's section of extended rates (none: the driver's rates only)
        bool power_menu, dpms;       // the menu's power-saving entry; the card's syncs follow MSG_POWER_STATE
    } families[] = {
        {"banshee.ini", "win98", 3, performance_slider_id, L"16.0MB", "CHIP0003_95E", "SOFTWARE\\QUORVEL\\PANEL\\121a0003", true, true},
        {"i740.ini", "win98", 3, monitor_list_id, L"8.0MB", "CHIP7800_95E", "SOFTWARE\\QUORVEL\\PANEL\\80867800", true, true},
        {"permedia2.ini", "win98", 2, info_list_id, L"8.0MB", NULL, NULL, false, false},
        {"trident.ini", "win98", 3, monitor_list_id, L"4.0MBSGRAM", NULL, NULL, false, true},
        {"et6000.ini", "win95", 3, monitor_list_id, L"2.256MB", "CHIP3208_95E", "SOFTWARE\\QUORVEL\\PANEL\\100c3208", false, false},
    };
    for (const auto& f : families) {
        SCOPED_TRACE(f.machine);
        std::ifstream file(std::string("Z:" VISTREL_MACHINES "/") + f.machine);
        Panel panel(std::string(std::istreambuf_iterator<char>(file), {}));
        ASSERT_TRUE(panel.Start(f.version));
        HWND w = panel.WaitWindow();
        ASSERT_TRUE(w);
        EXPECT_NEAR(panel.RefreshHz(), (double)panel.Send(msg_get_refresh, 0), 1.0);

        PostMessageA(w, msg_tray_callback, 0, WM_LBUTTONDOWN);
        HWND menu = panel.Shown("#32768");
        ASSERT_TRUE(menu) << "no menu";
        std::vector<UINT> keys(f.pages, VK_DOWN);
        keys.push_back(VK_RETURN);
        PressKeys(menu, keys);
        HWND sheet = panel.Shown("#32770");
        ASSERT_TRUE(sheet) << "no sheet";
        EXPECT_TRUE(GetDlgItem((HWND)SendMessageA(sheet, PSM_GETCURRENTPAGEHWND, 0, 0), f.last_page_control));
        EXPECT_EQ(f.pages, SendMessageA((HWND)SendMessageA(sheet, PSM_GETTABCONTROL, 0, 0), TCM_GETITEMCOUNT, 0, 0));
        SendMessageA(sheet, PSM_SETCURSEL, 1, 0);
        std::wstring information = PageLines(sheet, info_list_id);
        std::erase(information, L' ');
        EXPECT_NE(std::wstring::npos, information.find(L"VGAMemory:\n" + std::wstring(f.memory) + L"\n"));
        ASSERT_NO_FATAL_FAILURE(CancelSheet(sheet));
        if (f.power_menu) {
            PostMessageA(w, msg_tray_callback, 0, WM_LBUTTONDOWN);
            ASSERT_TRUE(menu = panel.Shown("#32768"));
            keys.back() = VK_DOWN;
            keys.push_back(VK_RIGHT);
            PressKeys(menu, keys);
            EXPECT_TRUE(panel.Shown("#32768", menu)) << "no power saving submenu";
            PressKeys(menu, {VK_ESCAPE, VK_ESCAPE});
        }

        if (f.extended) panel.SetExtendedRate(f.extended, f.key);
        const struct { WPARAM state; const char* seen; } steps[] = {{1, "Standby"}, {2, "Suspend"}, {4, "Off"}, {0, "On"}};
        for (const auto& s : steps) {
            EXPECT_EQ(1, panel.Send(msg_power_state, s.state));
            EXPECT_EQ(f.dpms ? s.seen : "On", panel.State("Card0", "DPMS")) << s.state;
        }
    }
}

TEST_F(SystemTest, NoSupportedCardShowsTheTextAndEnds)
{
    Panel panel(MachineIni("98", "1002:4742"));
    WritePrivateProfileStringA("Setup", "NoCard", "Nothing to drive here (test).", (panel.folder + "ZNTR2.INI").c_str());
    ASSERT_TRUE(panel.Start("win98"));
    HWND box = panel.Shown("#32770");
    ASSERT_TRUE(box) << "no message box";
    WCHAR text[128] = L"";  // only the wide forms cross processes intact
    GetDlgItemTextW(box, 0xFFFF, text, 128);  // a message box's text
    EXPECT_STREQ(L"Nothing to drive here (test).", text);
    PostMessageA(box, WM_COMMAND, IDOK, 0);
    EXPECT_EQ(0, panel.process.WaitExit(15000));
}
