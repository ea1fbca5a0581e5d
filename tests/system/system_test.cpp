// vistrel-sim.exe as its own process under Wine, seen only from outside: its
// window, its messages, the registry, its INI files and simstate.exe. Each
// start costs seconds, so one start serves many checks.
#include <gtest/gtest.h>

#include <math.h>
#include <stdlib.h>

#include <windows.h>
#include <commctrl.h>
#include <prsht.h>
#include <shellapi.h>

#include <algorithm>
#include <string>
#include <vector>

#include "support/support.h"

// The numbers other programs send; they never change.
static const UINT msg_query_refresh = 1126, msg_get_refresh = 1127, msg_set_refresh = 1128;
static const char card_key[] = "SOFTWARE\\QUORVEL\\PANEL\\53338901";

static std::string MachineIni(const std::string& windows, const std::string& card = "5333:8901")
{
    return "[Machine]\r\nWindows=" + windows + "\r\n[Card0]\r\nId=" + card + "\r\nBus=0\r\nDevice=10\r\n";
}

// The mode of the desktop, and its name in the chip file and the settings store.
static DEVMODEA Screen()
{
    DEVMODEA mode = {};
    HDC dc = GetDC(NULL);
    mode.dmSize = sizeof mode;
    mode.dmFields = DM_PELSWIDTH | DM_PELSHEIGHT | DM_BITSPERPEL;
    mode.dmPelsWidth = GetDeviceCaps(dc, HORZRES);
    mode.dmPelsHeight = GetDeviceCaps(dc, VERTRES);
    mode.dmBitsPerPel = GetDeviceCaps(dc, BITSPIXEL);
    ReleaseDC(NULL, dc);
    return mode;
}

static std::string Name(const DEVMODEA& m)
{
    return std::to_string(m.dmPelsWidth) + "x" + std::to_string(m.dmPelsHeight) + "x" + std::to_string(m.dmBitsPerPel);
}

static const int icon_id = 100;

static bool IconShown(HWND window)
{
    NOTIFYICONDATAA data = {};
    data.cbSize = NOTIFYICONDATAA_V1_SIZE;
    data.hWnd = window;
    data.uID = icon_id;
    return Shell_NotifyIconA(NIM_MODIFY, &data);
}

// A private copy of build/sim with its own machine.
struct Panel {
    explicit Panel(const std::string& machine) : folder(CopySimBuild("panel")) { Describe(machine); }
    void Describe(const std::string& machine) { WriteTextFile(folder + "SIMMACHINE.INI", machine); }
    bool Start(const char* version, const std::string& arguments = "")
    {
        // The Windows Wine reports to this executable: "win95", "win98" or "nt40".
        WriteRegistryString(HKEY_CURRENT_USER, "Software\\Wine\\AppDefaults\\vistrel-sim.exe", "Version", version);
        return process.Start("\"" + folder + "vistrel-sim.exe\" " + arguments, folder);
    }
    // The main window once its icon is in the taskbar, which is after the
    // start-up's work; NULL when the process ended or 30 s passed.
    HWND WaitWindow()
    {
        DWORD_PTR r;
        for (DWORD start = GetTickCount(); GetTickCount() - start < 30000 && process.WaitExit(20) == -1;) {
            HWND w = FindWindowA("zentra", NULL);
            if (w && SendMessageTimeoutA(w, WM_NULL, 0, 0, SMTO_NORMAL, 30000, &r) && IconShown(w)) return w;
        }
        return NULL;
    }
    LRESULT Send(UINT message, WPARAM wparam, LPARAM lparam = 0)
    {
        DWORD_PTR result = 0;
        HWND w = FindWindowA("zentra", NULL);
        return w && SendMessageTimeoutA(w, message, wparam, lparam, SMTO_NORMAL, 20000, &result) ? result : -12345;
    }
    // A value of simstate.exe's report, e.g. ("Card0", "RefreshHz").
    std::string State(const char* section, const char* key)
    {
        std::string report = folder + "simstate.txt";
        SECURITY_ATTRIBUTES inherit = {sizeof inherit, NULL, TRUE};
        HANDLE out = CreateFileA(report.c_str(), GENERIC_WRITE, FILE_SHARE_READ, &inherit, CREATE_ALWAYS, 0, NULL);
        STARTUPINFOA si = {sizeof si};
        si.dwFlags = STARTF_USESTDHANDLES;
        si.hStdOutput = si.hStdError = out;
        PROCESS_INFORMATION pi;
        std::string line = "\"" + folder + "simstate.exe\"";
        if (CreateProcessA(NULL, &line[0], NULL, NULL, TRUE, 0, NULL, folder.c_str(), &si, &pi)) {
            WaitForSingleObject(pi.hProcess, 20000);
            CloseHandle(pi.hProcess);
            CloseHandle(pi.hThread);
        }
        CloseHandle(out);
        char value[64] = "";
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
    // A rate 15 Hz above all that Windows lists for the running mode, which
    // only the pixel clock reaches, offered by the chip file.
    int AddExtendedRate(const char* section)
    {
        DEVMODEA m = Screen();
        std::vector<int> os = QueryRates(m.dmPelsWidth, m.dmPelsHeight, m.dmBitsPerPel);
        int extended = os.empty() ? 0 : os.back() + 15;
        std::string ini = folder + "ZNTR3.INI";
        WritePrivateProfileStringA(section, Name(m).c_str(), std::to_string(extended).c_str(), ini.c_str());
        return extended;
    }
    std::string folder;
    ChildProcess process;
};

class SystemTest : public ::testing::Test {
protected:
    void SetUp() override { ClearSettingsStore(); }
    void TearDown() override { ClearSettingsStore(); }
    // The running copy is a hidden 1 x 1 tool window that keeps running.
    void ExpectHidden(HWND w)
    {
        RECT r;
        ASSERT_TRUE(w);
        GetWindowRect(w, &r);
        EXPECT_EQ(1, r.right - r.left);
        EXPECT_EQ(1, r.bottom - r.top);
        EXPECT_TRUE(GetWindowLongA(w, GWL_EXSTYLE) & WS_EX_TOOLWINDOW);
    }
};

static const int monitor_list_id = 1039, close_command = 209;

struct Search {
    DWORD process;
    const char* cls;
    HWND found;
};

static BOOL CALLBACK FindShown(HWND window, LPARAM data)
{
    Search* s = (Search*)data;
    char cls[32] = "";
    DWORD process = 0;
    GetWindowThreadProcessId(window, &process);
    GetClassNameA(window, cls, sizeof cls);
    if (process != s->process || strcmp(cls, s->cls) || !IsWindowVisible(window)) return TRUE;
    s->found = window;
    return FALSE;
}

// A shown top-level window of the panel's process, once it is there.
static HWND WaitShown(Panel& panel, const char* cls, DWORD ms = 10000)
{
    Search s = {panel.process.info.dwProcessId, cls, NULL};
    for (DWORD start = GetTickCount(); GetTickCount() - start < ms; Sleep(20)) {
        EnumWindows(FindShown, (LPARAM)&s);
        if (s.found) return s.found;
    }
    return NULL;
}

static bool WaitGoneWindow(HWND window, DWORD ms = 10000)
{
    for (DWORD start = GetTickCount(); GetTickCount() - start < ms; Sleep(20))
        if (!IsWindow(window)) return true;
    return false;
}

// Key presses posted to a window of another process, as the keyboard would
// bring them to its queue.
static void PressKeys(HWND window, std::initializer_list<UINT> keys)
{
    for (UINT key : keys) {
        PostMessageA(window, WM_KEYDOWN, key, 1);
        PostMessageA(window, WM_KEYUP, key, 0xC0000001);
    }
}

// Another process's list box: only the wide form crosses processes intact.
static std::vector<std::string> ListLines(HWND list)
{
    std::vector<std::string> lines;
    LRESULT count = SendMessageW(list, LB_GETCOUNT, 0, 0);
    for (LRESULT i = 0; i < count; ++i) {
        wchar_t text[256] = L"";
        SendMessageW(list, LB_GETTEXT, i, (LPARAM)text);
        std::string line;
        for (const wchar_t* c = text; *c; ++c) line += (char)*c;
        lines.push_back(line);
    }
    return lines;
}


TEST_F(SystemTest, OnWindows98)
{
    Panel panel(MachineIni("98"));
    ASSERT_TRUE(panel.Start("win98"));
    HWND w = panel.WaitWindow();
    ASSERT_NO_FATAL_FAILURE(ExpectHidden(w));

    // A second start opens this copy's menu and ends; from the menu, with the
    // keyboard: Desktop, Information, Monitor.
    ChildProcess second;
    ASSERT_TRUE(second.Start("\"" + panel.folder + "vistrel-sim.exe\"", panel.folder));
    EXPECT_EQ(0, second.WaitExit(30000));
    EXPECT_EQ(w, FindWindowA("zentra", NULL));
    HWND menu = WaitShown(panel, "#32768");
    ASSERT_TRUE(menu != NULL) << "no menu";
    PressKeys(menu, {VK_DOWN, VK_DOWN, VK_DOWN, VK_RETURN});
    HWND sheet = WaitShown(panel, "#32770");
    ASSERT_TRUE(sheet != NULL) << "no sheet";
    HWND list = GetDlgItem((HWND)SendMessageA(sheet, PSM_GETCURRENTPAGEHWND, 0, 0), monitor_list_id);
    std::vector<std::string> lines = ListLines(list);
    const std::vector<std::string> edid = {"Year of Manufacture :", "        1998", "Max H. Image Size(cm) :",
                                           "        30", "Max V. Image Size(cm) :", "        23"};
    auto year = std::find(lines.begin(), lines.end(), edid[0]);
    ASSERT_TRUE(lines.end() - year >= (long)edid.size()) << "no EDID lines among " << lines.size();
    EXPECT_EQ(edid, std::vector<std::string>(year, year + edid.size()));
    PostMessageA(sheet, PSM_PRESSBUTTON, PSBTN_CANCEL, 0);
    ASSERT_TRUE(WaitGoneWindow(sheet));

    // Other programs read the driver's rates, then the chip file's, and the rate the card runs.
    const char* modes_key = "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\0000\\MODES\\8\\640,480";
    std::string modes = ReadRegistryRaw(HKEY_LOCAL_MACHINE, modes_key, "").c_str();
    std::string offered;
    for (int r : panel.QueryRates(640, 480, 8)) offered += (offered.empty() ? "" : ",") + std::to_string(r);
    ASSERT_FALSE(modes.empty());
    EXPECT_EQ(0u, offered.find(modes)) << offered << " does not start with the MODES list " << modes;
    EXPECT_NEAR(panel.RefreshHz(), (double)panel.Send(msg_get_refresh, 0), 1.0);

    // Rates the mode does not offer change nothing.
    LRESULT before = panel.Send(msg_get_refresh, 0);
    std::string clock = panel.State("Card0", "PixelClockHz");
    for (WPARAM rate : {65535, 400, 2, 0}) EXPECT_EQ(0, panel.Send(msg_set_refresh, rate)) << rate;
    EXPECT_EQ(before, panel.Send(msg_get_refresh, 0));
    EXPECT_EQ(clock, panel.State("Card0", "PixelClockHz"));
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key));

    int extended = panel.AddExtendedRate("CHIP8901_95E");
    ASSERT_GT(extended, 15);
    ASSERT_EQ(1, panel.Send(msg_set_refresh, extended));
    EXPECT_NEAR(extended, panel.RefreshHz(), 2.0);
    EXPECT_EQ(extended, (int)panel.Send(msg_get_refresh, 0));
    EXPECT_EQ(std::to_string(extended), ReadRegistryRaw(HKEY_LOCAL_MACHINE, card_key, "refresh").c_str());
    // A picture position for this mode, as the adjustment window stores it.
    DEVMODEA mode = Screen(), other = mode;
    int position = panel.Cr04() + 2;
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, Name(mode) + "x" + std::to_string(extended) + "H",
                        std::to_string(position), false);

    // Another program changes the mode and back: the driver runs its own rate
    // until the first redraw after three quiet seconds of the program's clock.
    other.dmPelsWidth = 800;
    other.dmPelsHeight = 600;
    ChangeDisplaySettingsA(&other, 0);
    ChangeDisplaySettingsA(&mode, 0);
    panel.Send(WM_NULL, 0);
    EXPECT_GT(fabs(panel.RefreshHz() - extended), 2.0) << "the driver's own timing first";
    Sleep(3100);
    RedrawWindow(w, NULL, NULL, RDW_INVALIDATE | RDW_FRAME | RDW_ERASE);
    panel.Send(WM_NULL, 0);
    EXPECT_NEAR(extended, panel.RefreshHz(), 2.0);
    EXPECT_EQ(position, panel.Cr04());

    // The way out: the exit question, and the icon goes with the program.
    PostMessageA(w, WM_COMMAND, close_command, 0);
    HWND question = WaitShown(panel, "#32770");
    ASSERT_TRUE(question != NULL && GetDlgItem(question, IDYES)) << "no question";
    PostMessageA(question, WM_COMMAND, IDYES, 0);
    EXPECT_EQ(0, panel.process.WaitExit(10000));
    EXPECT_FALSE(IconShown(w));

    // Windows restarts (the machine boots afresh): only a start with "/A"
    // brings back the rate and the position.
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
    ASSERT_NO_FATAL_FAILURE(ExpectHidden(panel.WaitWindow()));
    EXPECT_NEAR(panel.RefreshHz(), (double)panel.Send(msg_get_refresh, 0), 1.0);
    int extended = panel.AddExtendedRate("CHIP8901_NT4E");
    ASSERT_GT(extended, 15);
    EXPECT_EQ(1, panel.Send(msg_set_refresh, extended));
    EXPECT_NEAR(extended, panel.RefreshHz(), 2.0);
    EXPECT_EQ(extended, (int)panel.Send(msg_get_refresh, 0));
    EXPECT_EQ(std::to_string(extended), ReadRegistryRaw(HKEY_LOCAL_MACHINE, card_key, "refresh").c_str());
}

TEST_F(SystemTest, NoSupportedCardShowsTheTextAndEnds)
{
    Panel panel(MachineIni("98", "1002:4742"));
    std::string texts = panel.folder + "ZNTR2.INI";
    WritePrivateProfileStringA("Setup", "NoCard", "Nothing to drive here (test).", texts.c_str());
    ASSERT_TRUE(panel.Start("win98"));
    HWND box = WaitShown(panel, "#32770");
    ASSERT_TRUE(box) << "no message box";
    WCHAR text[128];
    std::string all;
    for (HWND c = GetWindow(box, GW_CHILD); c; c = GetWindow(c, GW_HWNDNEXT)) {
        GetWindowTextW(c, text, 128);
        all += std::string(text, text + lstrlenW(text)) + "\n";
    }
    EXPECT_NE(std::string::npos, all.find("Nothing to drive here (test).")) << all;
    PostMessageA(box, WM_COMMAND, IDOK, 0);
    EXPECT_EQ(0, panel.process.WaitExit(15000));
}
