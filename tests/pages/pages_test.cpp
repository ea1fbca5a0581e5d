// The property sheet driven from inside its modal loop: the pages a chip gets,
// the Monitor page's buttons and power-saving timers; and what that page lists,
// from the EDIDs of 44 real monitors and from the registry.
#include <gtest/gtest.h>
#include <windows.h>

#include <commctrl.h>
#include <prsht.h>

#include <fstream>
#include <functional>
#include <sstream>

#include "adjust/adjust_window.h"
#include "base/adapters.h"
#include "base/protocol.h"
#include "base/resource_ids.h"
#include "base/settings.h"
#include "base/texts.h"
#include "chips/chips.h"
#include "hardware/companions.h"
#include "modes/position.h"
#include "pages/edid.h"
#include "pages/monitor_info.h"
#include "pages/property_sheet.h"
#include "pages/sheet.h"
#include "support/gui_handles.h"
#include "support/import_slot.h"
#include "support/machine.h"

static std::function<void(HWND sheet)> step;
static int seen;  // timer ticks that found the sheet
static bool busy;

// WM_TIMER comes only when no posted message waits: the step finds the sheet
// settled. The next tick cancels the sheet.
static void CALLBACK Tick(HWND, UINT, UINT_PTR, DWORD)
{
    HWND sheet = GetActiveWindow();
    if (busy || !sheet || !PropSheet_GetTabControl(sheet)) return;
    busy = true;
    if (seen++ == 0) step(sheet);
    else PropSheet_PressButton(sheet, PSBTN_CANCEL);
    busy = false;
}

// Whether a sheet was shown and the step run in it.
bool RunSheet(int requested_page, std::function<void(HWND sheet)> inside, HWND owner)
{
    step = inside;
    seen = 0;
    UINT_PTR timer = SetTimer(NULL, 0, 10, Tick);
    OpenPropertySheet(instance, owner, requested_page);
    KillTimer(NULL, timer);
    return seen > 0;
}

HWND Page(HWND sheet) { return PropSheet_GetCurrentPageHwnd(sheet); }
bool Enabled(HWND window, int id) { return IsWindowEnabled(GetDlgItem(window, id)); }
bool Shown(HWND window, int id) { return IsWindowVisible(GetDlgItem(window, id)); }
const int apply_button = 0x3021;  // the sheet's own
void Click(HWND sheet, int id) { SendMessageA(GetDlgItem(Page(sheet), id), BM_CLICK, 0, 0); }
// The sheet posts the press to itself.
void Apply(HWND sheet)
{
    PropSheet_PressButton(sheet, PSBTN_APPLYNOW);
    for (MSG message; PeekMessageA(&message, NULL, 0, 0, PM_REMOVE);) DispatchMessageA(&message);
}

namespace {

// A chip family hiding the pages of hidden_pages (bit n: page n), its memory clock up to mclk_max.
unsigned hidden_pages;
uint32_t mclk_max;
uint32_t HidingDispatch(uint32_t command, uintptr_t argument)
{
    return command == CMD_HIDE_PAGE ? (hidden_pages >> argument) & 1 : command == CMD_GET_MCLK_MAX ? mclk_max : 0;
}
const ChipRow hiding_rows[] = {{.vendor_id = 0x5333, .device_id = 0x8901, .Dispatch = HidingDispatch}};

// The caption, then the tabs' titles, the current one marked with '*'.
std::string SheetTexts(HWND sheet)
{
    char text[256] = "";
    GetWindowTextA(sheet, text, sizeof text);
    std::string all = text;
    HWND tab = PropSheet_GetTabControl(sheet);
    for (int i = 0; i < TabCtrl_GetItemCount(tab); ++i) {
        TCITEMA item = {.mask = TCIF_TEXT, .pszText = text, .cchTextMax = sizeof text};
        SendMessageA(tab, TCM_GETITEMA, i, (LPARAM)&item);
        all += (i == TabCtrl_GetCurSel(tab) ? "|*" : "|") + std::string(text);
    }
    return all;
}

// The sources the animation controls of this thread are asked to open, each
// after a blank: "~" for the program's folder, "#149" for the built-in clip.
std::string program_folder, opened;
HHOOK open_hook;
LRESULT CALLBACK RecordOpen(int code, WPARAM wparam, LPARAM lparam)
{
    const CWPSTRUCT* call = (const CWPSTRUCT*)lparam;
    if (code == HC_ACTION && call->message == ACM_OPENA && call->lParam) {
        const char* source = (const char*)call->lParam;
        opened += IS_INTRESOURCE(source) ? " #" + std::to_string((uintptr_t)source)
                                         : " " + std::string(source).replace(0, program_folder.size(), "~");
    }
    return CallNextHookEx(open_hook, code, wparam, lparam);
}

// The sheet a chip gets: its pages, their titles, the start page, and in the page's frame
// the animation the chip file names beside the program if that plays.
TEST(Sheet, PagesTitlesStartPageAndAnimation)
{
    char path[MAX_PATH];
    GetModuleFileNameA(NULL, path, sizeof path);
    program_folder.assign(path, strrchr(path, '\\') + 1);
    std::string caption(150, 'c'), folder = MakeScratchFolder("sheet");
    WriteTextFile(folder + "ZNTR2.INI", "[TASKBAR]\nCAPTION=" + caption + "\nMenuA=\nMenuC=Screen\n");
    // titles NULL: no sheet. Beside the program clip.avi plays, broken.avi does not.
    const struct { unsigned hidden, mclk_max; int requested; const char *titles, *clip, *opened; } cases[] = {
        {0x1, 0, PAGE_MONITOR, "|Information|*Screen", "", " #149"},
        {0x1, 125, PAGE_MONITOR, "|Information|*Screen|Performance", "absent.avi", " #149"},
        {0x0, 0, PAGE_PERFORMANCE, "||Information|*Screen", "clip.avi", " ~clip.avi"},
        {0x0, 125, PAGE_PERFORMANCE, "||Information|Screen|*Performance", "broken.avi", " ~broken.avi #149"},
        {0x4, 125, PAGE_MONITOR, "||*Information|Performance", "", " #149"},
        {0x1, 0, PAGE_DESKTOP, "|*Information|Screen", "", " #149"},
        {0xF, 0, PAGE_MONITOR, NULL, "", ""},
    };
    for (const auto& c : cases) {
        std::string clip = program_folder + c.clip;
        WriteTextFile(folder + "ZNTR3.INI", std::string("[AVIFile]\nAVIFile=") + c.clip + "\n");
        if (!strcmp(c.clip, "clip.avi")) ASSERT_TRUE(CopyFileA("Z:" VISTREL_RESOURCES "/pages.avi", clip.c_str(), 0));
        if (!strcmp(c.clip, "broken.avi")) WriteTextFile(clip, "not an AVI");
        ResetProgramState(folder + "ZNTR2.INI", folder + "ZNTR3.INI");
        adapter_count = 1;
        chip_rows = hiding_rows;
        hidden_pages = c.hidden;
        mclk_max = c.mclk_max;
        opened.clear();
        open_hook = SetWindowsHookExA(WH_CALLWNDPROC, RecordOpen, NULL, GetCurrentThreadId());
        EXPECT_EQ(c.titles != NULL, RunSheet(c.requested, [&](HWND sheet) {
            EXPECT_EQ(caption.substr(0, 99) + c.titles, SheetTexts(sheet)) << "requested " << c.requested;
            HWND page = Page(sheet), animation = GetDlgItem(page, IDC_PAGE_ANIMATION);
            EXPECT_TRUE(IsWindowVisible(animation)) << "the one control, the one that plays";
            RECT frame = {}, placed;  // the inside of the page's frame
            for (HWND w : {GetDlgItem(page, IDC_DESKTOP_FRAME), GetDlgItem(page, IDC_INFO_FRAME),
                           GetDlgItem(page, IDC_MONITOR_FRAME), GetDlgItem(page, IDC_PERF_FRAME)})
                if (w) GetClientRect(w, &frame), MapWindowPoints(w, NULL, (POINT*)&frame, 2);
            GetWindowRect(animation, &placed);
            EXPECT_TRUE(EqualRect(&frame, &placed)) << c.titles;
        }));
        UnhookWindowsHookEx(open_hook);
        DeleteFileA(clip.c_str());
        EXPECT_EQ(c.opened, opened) << c.clip;
    }
}

// Opened by the 1 x 1 window in the tray's corner, the sheet still shows whole.
TEST(Sheet, StaysInsideTheWorkArea)
{
    const RECT area = {0, 0, 1024, 740};
    const struct { RECT window; LONG x, y; } cases[] = {
        {{1023, 767, 1493, 1214}, 554, 293}, {{-30, -5, 440, 442}, 0, 0}, {{10, 20, 480, 467}, 10, 20},
        {{500, 0, 1600, 900}, 0, 0}};
    for (const auto& c : cases) {
        POINT at = PlaceInside(&c.window, &area);
        EXPECT_TRUE(at.x == c.x && at.y == c.y) << c.window.left << " -> " << at.x << "," << at.y;
    }
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect());
    RECT work, placed = {};
    SystemParametersInfoA(SPI_GETWORKAREA, 0, &work, 0);
    HWND corner = CreateWindowExA(WS_EX_TOOLWINDOW, "STATIC", "", WS_POPUP | WS_VISIBLE, work.right - 1,
                                  work.bottom - 1, 1, 1, NULL, NULL, NULL, NULL);
    EXPECT_TRUE(RunSheet(PAGE_MONITOR, [&](HWND sheet) { GetWindowRect(sheet, &placed); }, corner));
    DestroyWindow(corner);
    RECT inside;
    EXPECT_TRUE(IntersectRect(&inside, &placed, &work) && EqualRect(&inside, &placed));
}

// Every other opening is as on a Japanese system: its templates, and the Performance page's own font.
bool japanese;
LANGID(WINAPI* real_language)();
LANGID WINAPI JapaneseOrReal() { return japanese ? MAKELANGID(LANG_JAPANESE, SUBLANG_DEFAULT) : real_language(); }

// Once the sheet first shows, its queue gets a visit to every page and then Cancel: no timer to wait on.
bool visit_posted;
LRESULT CALLBACK VisitAndCancel(int code, WPARAM wparam, LPARAM lparam)
{
    HWND sheet = (HWND)wparam;
    if (code == HCBT_ACTIVATE && !visit_posted && PropSheet_GetTabControl(sheet)) {
        visit_posted = true;
        for (int page = PAGE_INFORMATION; page <= PAGE_PERFORMANCE; ++page) PostMessageA(sheet, PSM_SETCURSEL, page, 0);
        PostMessageA(sheet, PSM_PRESSBUTTON, PSBTN_CANCEL, 0);
    }
    return CallNextHookEx(NULL, code, wparam, lparam);
}

// 200 openings and closings, all four pages visited, leave the handles as they were.
TEST(Sheet, OpeningsKeepNoHandle)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x10de, 0x0020, 1, 0)}));
    ASSERT_EQ(1, DetectAdapters());
    RefreshAdapterModes(REFRESH_AT_STARTUP);
    if (!real_language)
        real_language = (decltype(real_language))RedirectImport("kernel32.dll", "GetSystemDefaultLangID", (FARPROC)JapaneseOrReal);
    ASSERT_TRUE(real_language);
    int tabs = 0;
    ASSERT_TRUE(RunSheet(PAGE_DESKTOP, [&](HWND sheet) { tabs = TabCtrl_GetItemCount(PropSheet_GetTabControl(sheet)); }));
    ASSERT_EQ(4, tabs);
    HHOOK hook = SetWindowsHookExA(WH_CBT, VisitAndCancel, NULL, GetCurrentThreadId());
    std::string before;
    for (int i = -6; i < 200; ++i) {
        if (i == 0) before = GuiHandles();  // the first openings load what stays: controls' classes, caches
        japanese = i & 1;
        visit_posted = false;
        OpenPropertySheet(instance, NULL, PAGE_DESKTOP);
        ASSERT_TRUE(visit_posted) << i;
    }
    UnhookWindowsHookEx(hook);
    japanese = false;
    EXPECT_EQ(before, GuiHandles());
}

std::string keep_calls;  // the hook library's calls, "state,enable,minutes;" each
DWORD WINAPI RecordKeepCall(HWND, DWORD state, DWORD enable, DWORD minutes)
{
    keep_calls += std::to_string(state) + "," + std::to_string(enable) + "," + std::to_string(minutes) + ";";
    return 1;
}

// Stand by, suspend and shutoff: + or - for the check box checked, the edit and
// the up-down enabled, minutes shown = stored. "+++1=1|..." is stand by on at 1.
std::string Timers(HWND sheet)
{
    const int controls[][4] = {
        {IDC_MONITOR_STANDBY_CHECK, IDC_MONITOR_STANDBY_EDIT, IDC_MONITOR_STANDBY_SPIN, SETTING_STANDBY},
        {IDC_MONITOR_SUSPEND_CHECK, IDC_MONITOR_SUSPEND_EDIT, IDC_MONITOR_SUSPEND_SPIN, SETTING_SUSPEND},
        {IDC_MONITOR_SHUTOFF_CHECK, IDC_MONITOR_SHUTOFF_EDIT, IDC_MONITOR_SHUTOFF_SPIN, SETTING_SHUTOFF}};
    std::string all;
    for (const auto& c : controls) {
        char minutes[16] = "";
        GetDlgItemTextA(Page(sheet), c[1], minutes, sizeof minutes);
        all += std::string(all.empty() ? "" : "|") + (IsDlgButtonChecked(Page(sheet), c[0]) ? "+" : "-") +
               (Enabled(Page(sheet), c[1]) ? "+" : "-") + (Enabled(Page(sheet), c[2]) ? "+" : "-") + minutes + "=" +
               std::to_string(LoadSetting(c[3]));
    }
    return all;
}

// On Windows 98 the page lists the monitor, Adjust opens the adjustment window over the sheet,
// Default forgets the mode's position, and Apply hands changed timers to the store and the hook
// library. Windows NT keeps nothing about the monitor: a picture stands in for the list.
TEST(MonitorPage, ButtonsAndTimers)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect());
    ClearSettingsStore();
    keep_hook = RecordKeepCall;
    WNDCLASSA wc = {.lpfnWndProc = AdjustWindowProc, .hInstance = instance, .lpszClassName = adjust_window_class};
    RegisterClassA(&wc);
    SaveSetting(SETTING_POSITION_H, 0x90);
    SaveSetting(SETTING_SUSPEND, 100);
    adjust_offset_h = 3;
    EXPECT_TRUE(RunSheet(PAGE_MONITOR, [](HWND sheet) {
        EXPECT_EQ(0, adjust_offset_h) << "offsets of an earlier visit are not undone again";
        HWND page = Page(sheet);
        EXPECT_TRUE(Shown(page, IDC_MONITOR_LIST) && !Shown(page, IDC_MONITOR_NT_PICTURE) &&
                    SendDlgItemMessageA(page, IDC_MONITOR_LIST, LB_GETCOUNT, 0, 0) > 0);
        Click(sheet, IDC_MONITOR_ADJUST);
        HWND adjust = FindWindowA(adjust_window_class, NULL);
        EXPECT_TRUE(adjust && GetWindow(adjust, GW_OWNER) == sheet);
        DestroyWindow(adjust);
        Click(sheet, IDC_MONITOR_DEFAULT);
        EXPECT_EQ(-1, LoadSetting(SETTING_POSITION_H));

        EXPECT_EQ("---1=-1|+++100=100|---1=-1", Timers(sheet));
        Click(sheet, IDC_MONITOR_STANDBY_CHECK);
        EXPECT_TRUE(Enabled(sheet, apply_button));
        // Leaving the page and coming back applies nothing.
        PropSheet_SetCurSel(sheet, NULL, PAGE_DESKTOP);
        PropSheet_SetCurSel(sheet, NULL, PAGE_MONITOR);
        EXPECT_EQ("+++1=-1|+++100=100|---1=-1", Timers(sheet));
        Apply(sheet);
        EXPECT_EQ("+++1=1|+++100=100|---1=-1", Timers(sheet));
        EXPECT_FALSE(Enabled(sheet, apply_button));
        Apply(sheet);  // changes nothing

        // The up-down's arrow key changes the number, up to the longest timer, not the page.
        SendDlgItemMessageA(Page(sheet), IDC_MONITOR_STANDBY_EDIT, WM_KEYDOWN, VK_UP, 0);
        SendDlgItemMessageA(Page(sheet), IDC_MONITOR_SUSPEND_EDIT, WM_KEYDOWN, VK_UP, 0);
        Click(sheet, IDC_MONITOR_SUSPEND_CHECK);
        EXPECT_EQ("+++2=1|---100=100|---1=-1", Timers(sheet));
        Apply(sheet);
        EXPECT_EQ("+++2=2|---100=-1|---1=-1", Timers(sheet));
        EXPECT_EQ("1,1,1;1,1,2;2,0,0;", keep_calls);
    }));

    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_NT4));
    CurrentAdapter()->flags |= ADAPTER_NO_ADJUST;  // without picture moving both buttons are off
    EXPECT_TRUE(RunSheet(PAGE_MONITOR, [](HWND sheet) {
        HWND page = Page(sheet);
        EXPECT_TRUE(Shown(page, IDC_MONITOR_NT_PICTURE) && !Shown(page, IDC_MONITOR_LIST));
        EXPECT_FALSE(Shown(page, IDC_MONITOR_INFO_GROUP));
        EXPECT_FALSE(Enabled(page, IDC_MONITOR_ADJUST) || Enabled(page, IDC_MONITOR_DEFAULT));
    }));
    ClearSettingsStore();
}

const EdidTexts texts = {"Year:", "H:", "V:", "DPMS:", "Stand By", "Suspend", "Shutoff", "Resolutions:"};

void Append(std::string* all, const char* line) { AppendLine(all, line, monitor_list_indent); }

TEST(Edid, RealMonitorsDecodeAsTheirTableSays)
{
    std::ifstream table("Z:" VISTREL_TEST_DATA "/edid/expected.tsv");
    std::string line;
    std::getline(table, line);
    int blocks = 0;
    for (; std::getline(table, line); ++blocks) {
        std::vector<std::string> row;
        std::stringstream fields(line);
        for (std::string field; std::getline(fields, field, '\t');) row.push_back(field);
        row.resize(10);
        std::string expected = "Year:|~" + row[2] + "|H:|~" + row[3] + "|V:|~" + row[4], got;
        if (row[5] + row[6] + row[7] != "000") expected += "|DPMS:";
        const char* states[] = {"|~Stand By", "|~Suspend", "|~Shutoff"};
        for (int i = 0; i < 3; ++i) expected += row[5 + i] == "1" ? states[i] : "";
        expected += "|Resolutions:";
        for (std::string timings : {row[8], row[9]}) {
            for (size_t at; (at = timings.find(';')) != std::string::npos;) timings.replace(at, 1, "|~");
            if (!timings.empty()) expected += "|~" + timings;
        }
        std::ifstream in("Z:" VISTREL_TEST_DATA "/" + row[0], std::ios::binary);
        std::vector<uint8_t> block(std::istreambuf_iterator<char>(in), {});
        EdidLines out;
        memset(&out, '#', sizeof out);
        ASSERT_EQ(1, DecodeEdidLines(block.data(), block.size(), &texts, &out)) << row[0];
        for (int i = 0; i < out.count; ++i) Append(&got, out.line[i]);
        EXPECT_EQ(expected, got) << row[0];
    }
    EXPECT_EQ(44, blocks);
}

TEST(Edid, WhatIsNoEdidAddsNothing)
{
    std::ifstream in("Z:" VISTREL_TEST_DATA "/edid/001.bin", std::ios::binary);
    std::vector<uint8_t> block(std::istreambuf_iterator<char>(in), {}), no_header = block;
    no_header[7] = 0x01;
    EdidLines out;
    const std::pair<uint8_t*, size_t> cases[] = {{NULL, 0}, {&block[0], 53}, {&no_header[0], 128}, {&block[0], 54}};
    for (auto [data, length] : cases) {
        out.count = 7;
        std::string result = std::to_string(DecodeEdidLines(data, length, &texts, &out));
        EXPECT_EQ(length == 54 ? "1 28" : "0 0", result + " " + std::to_string(out.count)) << length;
    }
}

std::string MonitorNode()
{
    char key[HARDWARE_KEY_SIZE];
    FindMonitorKey(key);
    return std::string("Enum\\") + key;
}
void CutEdid() { WriteRegistryString(HKEY_LOCAL_MACHINE, MonitorNode(), "EDID", "short"); }
void DropNode() { DeleteRegistryTree(HKEY_LOCAL_MACHINE, MonitorNode()); }
void DropModes()
{
    std::string driver = ReadRegistryRaw(HKEY_LOCAL_MACHINE, MonitorNode(), "Driver").c_str();
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, "System\\CurrentControlSet\\Services\\Class\\" + driver + "\\MODES");
}

// The default machine's monitor, a Dell D1028L, its EDID read by hand.
const std::string dell = "Monitor Type|~DELL D1028L|Manufacturer|~Dell";
const std::string edid =
    "|Year of Manufacture :|~1998|Max H. Image Size(cm) :|~30|Max V. Image Size(cm) :|~23|DPMS Support :|~Stand By"
    "|~Suspend|~Shutoff|Resolution Support :|~640 x 480 60Hz|~640 x 480 75Hz|~800 x 600 60Hz|~800 x 600 75Hz"
    "|~1024 x 768 60Hz|~1024 x 768 75Hz|~1024 x 768 85Hz|~800 x 600 85Hz|~1280 x 1024 60Hz|~640 x 480 85Hz";
const std::string max_resolution = "|Max Resolution|~1280,1024";
const std::string sync = "|Horizontal Sync|~30.0-69.0 kHz|Vertical Sync|~48.0-120.0 Hz";

TEST(MonitorInfo, ListFromTheRegistry)
{
    SimCardConfig trio = Card(0x5333, 0x8901), without_monitor = trio;
    without_monitor.display_device = false;
    const struct { int windows; SimCardConfig card; void (*change)(); std::string lines; int result; const char* name; }
    cases[] = {
        {SIM_WINDOWS_98, trio, NULL, dell + edid + max_resolution + sync, 1, "DELL D1028L"},
        {SIM_WINDOWS_95, trio, NULL, dell + edid + max_resolution + sync, 1, "DELL D1028L"},  // after no adapter
        {SIM_WINDOWS_98, trio, CutEdid, dell + max_resolution + sync, 1, "DELL D1028L"},
        {SIM_WINDOWS_98, trio, DropModes, dell + edid + max_resolution, 0, "DELL D1028L"},
        {SIM_WINDOWS_98, trio, DropNode, "", 0, NULL},  // NULL: no name to be had
        {SIM_WINDOWS_98, without_monitor, NULL, "Monitor Type|~Unknown|Manufacturer|~Unknown", 0, "Unknown"},
    };
    HWND list = CreateWindowA("LISTBOX", "", WS_POPUP, 0, 0, 200, 200, NULL, NULL, NULL, NULL);
    for (const auto& c : cases) {
        BootMachine(Machine(c.windows, {c.card}));
        ASSERT_EQ(1, DetectAdapters()) << c.lines;
        if (c.change) c.change();
        char label[MONITOR_LABEL_SIZE], name[MONITOR_NAME_SIZE];
        memset(label, '#', sizeof label);
        memset(name, '#', sizeof name);
        SendMessageA(list, LB_RESETCONTENT, 0, 0);
        ASSERT_EQ(c.name != NULL, FillMonitorInfo(list, label, name)) << c.lines;
        if (c.name) EXPECT_EQ(std::string("Monitor Type") + c.name, std::string(label) + name);
        EXPECT_EQ(0, SendMessageA(list, LB_GETCOUNT, 0, 0)) << "a name alone adds no line";
        EXPECT_EQ(c.result, FillMonitorInfo(list, NULL, NULL)) << c.lines;
        std::string lines;
        for (int i = 0; i < SendMessageA(list, LB_GETCOUNT, 0, 0); ++i) {
            char text[256] = "";
            SendMessageA(list, LB_GETTEXT, i, (LPARAM)text);
            Append(&lines, text);
        }
        EXPECT_EQ(c.lines, lines);
    }
    DestroyWindow(list);
}

// Of two identical cards each finds its own monitor by bus and device.
TEST(MonitorInfo, TwinCardsFindTheirOwnMonitors)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 0, 10), Card(0x5333, 0x8901, 0, 11)}));
    adapter_count = 2;
    for (int16_t adapter : {0, 1})
        adapter_table[adapter] = {.vendor_id = 0x5333, .device_id = 0x8901, .devfn = (uint8_t)((10 + adapter) << 3),
                                  .flags = ADAPTER_TWIN};
    for (current_adapter = 0; current_adapter < 2; ++current_adapter) {
        char key[HARDWARE_KEY_SIZE];
        memset(key, '#', sizeof key);
        ASSERT_EQ(1, FindMonitorKey(key));
        EXPECT_TRUE(strstr(key, current_adapter ? "BUS_00&DEV_0B" : "BUS_00&DEV_0A")) << key;
    }
}

TEST(MonitorKeys, OfOtherAdaptersAndSystems)
{
    MonitorOwner owner = {.windows98 = true, .twin = false, .ids = "PCI_VEN_5333&DEV_8901", .slot = "BUS_00&DEV_0A"};
    const char ours[] = "MONITOR\\DEL730B\\PCI_VEN_5333&DEV_8901&SUBSYS_00000000&REV_16_BUS_00&DEV_0A&FUNC_00";
    const struct { const char* key; bool windows98, have_candidate; MonitorKeyVerdict verdict; } cases[] = {
        {ours, true, true, MONITOR_KEY_FOUND},
        {ours, false, true, MONITOR_KEY_PASS},
        {"MONITOR\\DEL730B\\PCI_VEN_10DE&DEV_0020&SUBSYS_00000000&REV_04_BUS_01&DEV_00", true, true, MONITOR_KEY_PASS},
        {"ROOT\\MONITOR\\0000", true, true, MONITOR_KEY_CANDIDATE},
    };
    for (const auto& c : cases) {
        owner.windows98 = c.windows98;
        EXPECT_EQ(c.verdict, JudgeMonitorKey(c.key, &owner, c.have_candidate)) << c.key << " " << c.windows98;
    }
}

TEST(MonitorKeys, SyncRangesOfMode1)  // "Mode1|horizontal|vertical"
{
    for (std::string c : {"30.0-70.0,50.0-120.0,+,+|30.0-70.0 kHz|50.0-120.0 Hz", "31.5,60|31.5 kHz|60 Hz",
                          ",60| kHz|60 Hz", "31.5|31.5 kHz| Hz"}) {
        std::string mode1 = c.substr(0, c.find('|'));
        char horizontal[32], vertical[32];
        memset(horizontal, '#', sizeof horizontal);
        memset(vertical, '#', sizeof vertical);
        SplitSyncRanges(mode1.c_str(), horizontal, vertical, sizeof horizontal);
        EXPECT_EQ(c, mode1 + "|" + horizontal + "|" + vertical);
    }
}

}  // namespace
