// The tray icon, its menu as the chips shape it, its drawing and clicks, and
// the menu commands as any process can send them.
#include <gtest/gtest.h>

#include <windows.h>
#include <commctrl.h>
#include <prsht.h>
#include <shellapi.h>

#include <functional>

#include "base/adapters.h"
#include "base/protocol.h"
#include "base/settings.h"
#include "base/state.h"
#include "chips/chips.h"
#include "hardware/companions.h"
#include "modes/detect.h"
#include "shell/commands.h"
#include "shell/main_window.h"
#include "shell/startup.h"
#include "shell/tray.h"
#include "shell/tray_menu.h"
#include "support/machine.h"
#include "support/support.h"

namespace {

HWND stand_in;
HHOOK dialog_hook;
HWND dialog_up;  // the dialog the thread showed last
bool menu_fresh;
// Run once an opened menu waits for input, with its window; and with every
// WM_APP of the stand-in, which comes once a dialog has settled.
std::function<void(HWND menu)> on_menu_shown;
std::function<void(HWND dialog)> on_app;

// Stands in for the main window: the main window's procedure, but for
// creation and destruction, which would run the whole start-up.
LRESULT CALLBACK StandInProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    if (message == WM_ENTERMENULOOP) menu_fresh = true;
    if (message == WM_ENTERIDLE && wparam == MSGF_MENU && menu_fresh && on_menu_shown) {
        menu_fresh = false;
        on_menu_shown((HWND)lparam);
    }
    if (message == WM_APP && on_app) on_app(dialog_up);
    if (message == WM_CREATE || message == WM_DESTROY) return DefWindowProcA(window, message, wparam, lparam);
    return MainWindowProc(window, message, wparam, lparam);
}

// A dialog sets its focus after it is activated: it is looked at later.
LRESULT CALLBACK WatchDialogs(int code, WPARAM wparam, LPARAM lparam)
{
    char cls[32] = "";
    if (code == HCBT_ACTIVATE && GetClassNameA((HWND)wparam, cls, sizeof cls) && !strcmp(cls, "#32770")) {
        dialog_up = (HWND)wparam;
        PostMessageA(stand_in, WM_APP, 0, 0);
    }
    return CallNextHookEx(dialog_hook, code, wparam, lparam);
}

std::string started;
UINT WINAPI RecordStart(LPCSTR command_line, UINT show)
{
    started += (started.empty() ? "" : "; ") + std::string(command_line) + (show == SW_SHOW ? "" : " (hidden)");
    return 33;
}

bool IconShown(HWND window)
{
    NOTIFYICONDATAA data = {};
    data.cbSize = NOTIFYICONDATAA_V1_SIZE;
    data.hWnd = window;
    data.uID = TRAY_ICON_ID;
    return Shell_NotifyIconA(NIM_MODIFY, &data);
}

struct KeepCall {
    HWND window;
    DWORD state, enable, minutes;
    bool icon_shown;
};
std::vector<KeepCall> keep_calls;
DWORD WINAPI RecordKeepCall(HWND window, DWORD state, DWORD enable, DWORD minutes)
{
    keep_calls.push_back({window, state, enable, minutes, IconShown(main_window)});
    return 1;
}

// The wrappers dispatch through a family that answers three questions itself
// (bit n of hidden hides page n) and passes the rest to the card's own.
ChipRow test_rows[CHIP_TABLE_ROWS];
unsigned test_hidden;
uint32_t test_mclk_max, test_dpms;
uint32_t TestDispatch(uint32_t command, uintptr_t argument)
{
    if (command == CMD_HIDE_PAGE) return test_hidden >> argument & 1;
    if (command == CMD_GET_MCLK_MAX) return test_mclk_max;
    if (command == CMD_HAS_DPMS) return test_dpms;
    return chip_table[CurrentAdapter()->chip_row].Dispatch(command, argument);
}
void UseTestFamily(unsigned hidden, uint32_t mclk_max, uint32_t dpms)
{
    test_hidden = hidden, test_mclk_max = mclk_max, test_dpms = dpms;
    for (int i = 0; i < CHIP_TABLE_ROWS; ++i) test_rows[i] = chip_table[i], test_rows[i].Dispatch = TestDispatch;
    chip_rows = test_rows;
}

// Owner-drawn entries as "id text" (text from their record, which has an
// icon), plain ones as "id 'text'", submenus as "text[entries]".
std::string MenuText(HMENU menu)
{
    std::string text;
    for (int i = 0; i < GetMenuItemCount(menu); ++i) {
        char plain[64] = "";
        MENUITEMINFOA info = {};
        info.cbSize = sizeof info;
        info.fMask = MIIM_ID | MIIM_DATA | MIIM_FTYPE | MIIM_SUBMENU | MIIM_STRING;
        info.dwTypeData = plain;
        info.cch = sizeof plain;
        GetMenuItemInfoA(menu, i, TRUE, &info);
        const MenuItemRecord* record = MenuRecordOf(info.dwItemData);
        std::string label = "'" + std::string(plain) + "'";
        if (info.fType & MFT_OWNERDRAW) label = !record ? "<no record>" : !record->icon ? "<no icon>" : record->text;
        text += (i ? "|" : "") + (info.hSubMenu ? label + "[" + MenuText(info.hSubMenu) + "]"
                                                : std::to_string(info.wID) + " " + label);
    }
    return text;
}

// Wine's GetGuiResources answers 0: the handle table is walked instead. A
// handle value with a high word of 0 names the object at that index.
int CountGdiObjects()
{
    int count = 0;
    for (ULONG_PTR index = 0; index < 0x10000; ++index) count += GetObjectType((HGDIOBJ)index) != 0;
    return count;
}

class Tray : public ::testing::Test {
protected:
    void SetUp() override
    {
        ClearSettingsStore();
        dialog_hook = SetWindowsHookExA(WH_CBT, WatchDialogs, NULL, GetCurrentThreadId());
        WNDCLASSA wc = {};
        wc.lpfnWndProc = StandInProc;
        wc.hInstance = GetModuleHandleA(NULL);
        wc.lpszClassName = "TrayStandIn";
        RegisterClassA(&wc);
    }
    void TearDown() override
    {
        UnhookWindowsHookEx(dialog_hook);
        on_menu_shown = nullptr;
        on_app = nullptr;
        if (IsWindow(stand_in)) DestroyWindow(stand_in);
        ClearSettingsStore();
    }
    // S3 cards of distinct kinds, each with a display device of its own; the
    // menu, and a visible 1 x 1 stand-in for the main window.
    void Start(int windows, int cards)
    {
        static const uint16_t kinds[] = {0x8901, 0x8a01, 0x8811, 0x5631, 0x883d, 0x8a10, 0x8904, 0x8a13};
        SimMachineConfig config = Machine(windows, {});
        for (int i = 0; i < cards; ++i) config.cards[config.card_count++] = Card(0x5333, kinds[i], 0, (uint8_t)(9 + i));
        BootMachine(config);
        instance = GetModuleHandleA(NULL);
        ASSERT_EQ(1, DetectAdapters());
        ASSERT_EQ(cards, adapter_count);
        RefreshAdapterModes(REFRESH_AT_STARTUP);
        BuildTrayMenu();
        if (IsWindow(stand_in)) DestroyWindow(stand_in);
        stand_in = main_window = CreateWindowExA(WS_EX_TOOLWINDOW, "TrayStandIn", "", WS_POPUP | WS_VISIBLE, 0, 0, 1, 1,
                                                 NULL, NULL, instance, NULL);
        run_program = RecordStart;
        started.clear();
    }
};

const char power[] = "Power Saving[211 'Stand By'|212 'Suspend'|213 'Shutoff']";
const char fixed[] = "201 Display Properties|202 DirectX Info|210 Zoom In|207 Minimize|209 Close";

// A Windows 98 card's submenu with the pages of the mask (bit n: page n).
std::string Vga(int adapter, unsigned pages = 0xF)
{
    static const char* names[] = {" Desktop", " Information", " Monitor", " Performance Adjustment"};
    std::string entries;
    for (int page = 0; page < 4; ++page)
        if (pages >> page & 1) entries += (entries.empty() ? "" : "|") + std::to_string(220 + 4 * adapter + page) + names[page];
    return "VGA" + std::to_string(adapter + 1) + "[" + entries + "]|";
}

TEST_F(Tray, MenuOffersWhatTheChipsAllow)
{
    const std::string tail = std::string(power) + "|" + fixed;
    struct {
        const char* name;
        int windows, cards;
        unsigned hidden;
        uint32_t mclk_max, dpms;
        std::string menu;
    } rows[] = {
        {"chip hides Information", SIM_WINDOWS_98, 1, 0x2, 1, 1, "220 Desktop|222 Monitor|223 Performance|" + tail},
        {"no memory clock, no power saving", SIM_WINDOWS_98, 1, 0, 0, 0,
         "220 Desktop|221 Information|222 Monitor|" + std::string(fixed)},
        {"two on Windows 98", SIM_WINDOWS_98, 2, 0, 1, 1, Vga(0) + Vga(1) + tail},
        {"two on Windows 98, no power saving", SIM_WINDOWS_98, 2, 0, 1, 0, Vga(0) + Vga(1) + fixed},
        // Windows 95 serves the card it found last; the commands say which.
        {"two kinds on Windows 95", SIM_WINDOWS_95, 2, 0, 1, 1,
         "224 Desktop|225 Information|226 Monitor|227 Performance|" + tail},
        {"five: four fit the records", SIM_WINDOWS_98, 5, 0, 1, 1, Vga(0) + Vga(1) + Vga(2) + Vga(3) + tail},
        {"eight with three pages: six fill the records", SIM_WINDOWS_98, 8, 0x2, 1, 1,
         Vga(0, 0xD) + Vga(1, 0xD) + Vga(2, 0xD) + Vga(3, 0xD) + Vga(4, 0xD) + Vga(5, 0xD) + tail},
        {"eight with Desktop only: seven have commands", SIM_WINDOWS_98, 8, 0xE, 0, 1,
         Vga(0, 1) + Vga(1, 1) + Vga(2, 1) + Vga(3, 1) + Vga(4, 1) + Vga(5, 1) + Vga(6, 1) + tail},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.name);
        ASSERT_NO_FATAL_FAILURE(Start(row.windows, row.cards));
        UseTestFamily(row.hidden, row.mclk_max, row.dpms);
        int16_t current = current_adapter;
        BuildTrayMenu();
        EXPECT_EQ(row.menu, MenuText(TrayMenu()));
        EXPECT_EQ(current, current_adapter);
    }
}

TEST_F(Tray, MenuIconsAndDrawingKeepNoGdiObject)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 2));
    DestroyTrayMenu();
    int before = CountGdiObjects();
    BuildTrayMenu();
    int built = CountGdiObjects();
    EXPECT_GT(built, before + 20) << "the icons";
    BuildTrayMenu();
    EXPECT_EQ(built, CountGdiObjects());
    ULONG_PTR close = (ULONG_PTR)MenuRecordOfCommand(209);
    ASSERT_NE(0u, close);

    MEASUREITEMSTRUCT measure = {ODT_MENU, 0, 209, 0, 0, close};
    SendMessageA(stand_in, WM_MEASUREITEM, 0, (LPARAM)&measure);
    HDC screen = GetDC(NULL);
    SIZE text;
    GetTextExtentPoint32A(screen, "Close", 5, &text);
    EXPECT_EQ(text.cx + 39, (LONG)measure.itemWidth);
    EXPECT_EQ((text.cy > 32 ? text.cy : 32) + 4, (LONG)measure.itemHeight);

    BITMAPINFO bi = {{sizeof bi.bmiHeader, 200, -40, 1, 32, BI_RGB}};
    void* bits;
    HBITMAP bitmap = CreateDIBSection(screen, &bi, DIB_RGB_COLORS, &bits, NULL, 0);
    HDC dc = CreateCompatibleDC(screen);
    ReleaseDC(NULL, screen);
    HGDIOBJ old_bitmap = SelectObject(dc, bitmap), own_brush = GetCurrentObject(dc, OBJ_BRUSH);
    const COLORREF junk = RGB(1, 2, 3), menu = GetSysColor(COLOR_MENU), lit = GetSysColor(COLOR_ACTIVECAPTION);
    MenuItemRecord stranger = {"Stranger", NULL};
    struct {
        UINT action, state;
        ULONG_PTR data;
        COLORREF background;
    } rows[] = {
        {ODA_DRAWENTIRE, ODS_SELECTED, close, menu}, {ODA_SELECT, ODS_SELECTED, close, lit},
        {ODA_SELECT, 0, close, menu},                {ODA_FOCUS, ODS_FOCUS, close, lit},
        {ODA_DRAWENTIRE, 0, (ULONG_PTR)&stranger, junk},  // none of the menu's records
    };
    for (const auto& row : rows) {
        for (int i = 0; i < 200 * 40; ++i) ((DWORD*)bits)[i] = 0x010203;
        DRAWITEMSTRUCT draw = {ODT_MENU, 0, 209, row.action, row.state, NULL, dc, {10, 2, 150, 38}, row.data};
        SendMessageA(stand_in, WM_DRAWITEM, 0, (LPARAM)&draw);
        EXPECT_EQ(row.background, GetPixel(dc, 149, 37)) << row.action << " " << row.state;
        EXPECT_EQ(junk, GetPixel(dc, 150, 38));
        EXPECT_EQ(own_brush, GetCurrentObject(dc, OBJ_BRUSH));
    }
    int drawn = CountGdiObjects();
    for (int i = 0; i < 500; ++i) {
        DRAWITEMSTRUCT draw = {ODT_MENU, 0, 209, ODA_SELECT, (UINT)(i & 1), NULL, dc, {0, 0, 150, 38}, close};
        DrawMenuItem(&draw);
    }
    EXPECT_EQ(drawn, CountGdiObjects());
    SelectObject(dc, old_bitmap);
    DeleteDC(dc);
    DeleteObject(bitmap);
    DestroyTrayMenu();
    EXPECT_EQ(before, CountGdiObjects());
}

TEST_F(Tray, IconLivesFromCreationToDestructionOfTheMainWindow)
{
    SimMachineConfig config;
    SimDefaultMachine(&config);
    BootMachine(config);
    keep_hook = RecordKeepCall;
    keep_calls.clear();
    startup_flags = STARTUP_AUTORUN;
    WNDCLASSA wc = {};
    wc.lpfnWndProc = MainWindowProc;
    wc.hInstance = GetModuleHandleA(NULL);
    wc.lpszClassName = main_window_class;
    ASSERT_TRUE(RegisterClassA(&wc));
    ASSERT_EQ(1, CreateMainWindow(wc.hInstance));
    HWND window = main_window;
    EXPECT_TRUE(IconShown(window));
    EXPECT_NE(nullptr, TrayMenu());
    EXPECT_EQ(0u, startup_flags);
    RECT r;
    GetWindowRect(window, &r);
    EXPECT_EQ(GetSystemMetrics(SM_CXSCREEN) - 1, r.left);
    EXPECT_EQ(GetSystemMetrics(SM_CYSCREEN) - 1, r.top);
    ASSERT_FALSE(keep_calls.empty());
    EXPECT_EQ(window, keep_calls[0].window);
    EXPECT_TRUE(keep_calls[0].icon_shown) << "the power-saving library starts once the icon is there";

    // Explorer restarted: its new taskbar asks for the icons again.
    NOTIFYICONDATAA gone = {NOTIFYICONDATAA_V1_SIZE, window, TRAY_ICON_ID};
    Shell_NotifyIconA(NIM_DELETE, &gone);
    SendMessageA(window, RegisterWindowMessageA("TaskbarCreated"), 0, 0);
    EXPECT_TRUE(IconShown(window));

    HMENU menu = TrayMenu();
    keep_calls.clear();
    DestroyWindow(window);
    ASSERT_EQ(1u, keep_calls.size());
    EXPECT_EQ(0u, keep_calls[0].state | keep_calls[0].enable);
    EXPECT_TRUE(keep_calls[0].icon_shown) << "the library stops before the icon goes";
    EXPECT_FALSE(IconShown(window));
    EXPECT_FALSE(IsMenu(menu));
    MSG quit;
    EXPECT_TRUE(PeekMessageA(&quit, NULL, WM_QUIT, WM_QUIT, PM_REMOVE));
    UnregisterClassA(main_window_class, wc.hInstance);
}

// The menu opens from the queue once the shell's notification has returned;
// WM_CANCELMODE takes it away, and it comes back at the same place, once.
TEST_F(Tray, ClickOpensTheMenuFromTheQueueAndAgainAfterCancelMode)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    SetCursorPos(300, 200);
    std::vector<POINT> shown;
    on_menu_shown = [&](HWND menu) {
        RECT r;
        GetWindowRect(menu, &r);
        shown.push_back({r.left, r.top});
        // Sent, as by a window that goes modal: Wine's menu swallows a posted one.
        if (shown.size() <= 2) SendMessageA(stand_in, WM_CANCELMODE, 0, 0);
        else EndMenu();
    };
    for (LPARAM ignored : {WM_MOUSEMOVE, WM_LBUTTONUP, WM_LBUTTONDBLCLK, WM_RBUTTONUP}) {
        EXPECT_EQ(0, OnTrayCallback(stand_in, 0, ignored));
        EXPECT_EQ(0, shell_state);
    }
    EXPECT_EQ(0, SendMessageA(stand_in, MSG_TRAY_CALLBACK, 0, WM_LBUTTONDOWN));
    EXPECT_TRUE(shown.empty());
    EXPECT_EQ(STATE_TRAY_BUSY | STATE_MENU_PENDING, shell_state);
    EXPECT_TRUE(PumpUntil([](void*) { return shell_state == 0; }, NULL, 10000));
    ASSERT_EQ(2u, shown.size());
    for (POINT p : shown) EXPECT_EQ(300 * 1000 + 200, p.x * 1000 + p.y);
}

TEST_F(Tray, CommandsStartTheirProgramsOrNothing)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    std::string dialogs;
    on_app = [&](HWND dialog) {
        dialogs += GetWindowTextLengthA(dialog) ? "dialog " : "untitled ";
        char title[64] = "";
        GetWindowTextA(dialog, title, sizeof title);
        dialogs += title;
        PostMessageA(dialog, WM_COMMAND, IDCANCEL, 0);
    };
    struct {
        UINT command;
        int handled;
        std::string started;
    } rows[] = {
        {201, 1, "Control.exe desk.cpl @0,3"}, {204, 1, "Control.exe desk.cpl @0,0"},
        {205, 1, "Control.exe desk.cpl @0,1"}, {206, 1, "Control.exe desk.cpl @0,2"},
        {202, 1, "dxprobe.exe"},               {210, 1, "loupe.exe \"Zoom In\" " + std::string(text_ini_path)},
        {207, 0, ""},                          {208, 1, ""},
        {203, 1, ""},  // no entry 203: no title, no panning dialog
        {200, 0, ""},                          {214, 0, ""},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.command);
        started.clear();
        last_activity_tick = 0;
        EXPECT_EQ(row.handled, OnMenuCommand(stand_in, row.command));
        EXPECT_EQ(row.started, started);
        EXPECT_EQ(0, shell_state);
        EXPECT_NE(0u, last_activity_tick);
    }
    EXPECT_EQ("", dialogs);
    // Given an entry 203, its label is the panning dialog's title.
    AppendMenuA(TrayMenu(), MF_OWNERDRAW, 203, (LPCSTR)MenuRecordOfCommand(210));
    EXPECT_EQ(1, OnMenuCommand(stand_in, 203));
    EXPECT_EQ("dialog Zoom In", dialogs);

    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 2));
    WriteTextFile(text_ini_path, "[TASKBAR]\r\nMENUE=Lupe\r\n");
    BuildTrayMenu();
    EXPECT_EQ(1, OnMenuCommand(stand_in, 210));
    EXPECT_EQ("loupe.exe \"Lupe\" " + std::string(text_ini_path) + " 2", started);
}

std::string CurrentTab(HWND sheet)
{
    HWND tab = PropSheet_GetTabControl(sheet);
    char title[64] = "";
    TCITEMA item = {};
    item.mask = TCIF_TEXT;
    item.pszText = title;
    item.cchTextMax = sizeof title;
    SendMessageA(tab, TCM_GETITEMA, TabCtrl_GetCurSel(tab), (LPARAM)&item);
    return title;
}

TEST_F(Tray, PageCommandsOpenTheSheetOfTheirAdapter)
{
    struct {
        int cards;
        UINT command;
        int handled, adapter;  // -1: no sheet
        const char* page;
    } rows[] = {
        {2, 223, 1, 0, "Performance"}, {2, 225, 1, 1, "Information"}, {2, 226, 1, 1, "Monitor"},
        {2, 244, 0, -1, ""},  // a card beyond the table's
        {7, 244, 1, 6, "Desktop"},     {7, 245, 0, -1, ""},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.command);
        ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, row.cards));
        UseTestFamily(0, 80, 1);  // every card has a Performance page
        int adapter = -1;
        std::string page;
        on_app = [&](HWND sheet) {
            adapter = current_adapter;
            page = CurrentTab(sheet);
            PostMessageA(sheet, PSM_PRESSBUTTON, PSBTN_CANCEL, 0);
        };
        int16_t before = current_adapter;
        EXPECT_EQ(row.handled, OnMenuCommand(stand_in, row.command));
        EXPECT_EQ(row.adapter, adapter);
        EXPECT_EQ(row.page, page);
        if (row.adapter < 0) EXPECT_EQ(before, current_adapter);
    }
}

// While the sheet is open, a click on the icon opens no menu, commands from
// elsewhere open no second sheet, and the flag stays the sheet's.
TEST_F(Tray, WhileTheSheetIsOpenAClickOnlyBringsTheProgramForward)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    HWND other = CreateWindowExA(0, "STATIC", "", WS_POPUP | WS_VISIBLE, 50, 50, 100, 100, NULL, NULL, NULL, NULL);
    int sheets = 0;
    on_app = [&](HWND sheet) {
        ++sheets;
        EXPECT_EQ(0, OnMenuCommand(stand_in, 222));
        EXPECT_EQ(0, OnMenuCommand(stand_in, 245));
        SetForegroundWindow(other);
        EXPECT_EQ(0, SendMessageA(stand_in, MSG_TRAY_CALLBACK, 0, WM_LBUTTONDOWN));
        EXPECT_EQ(STATE_COMMAND_RUNNING, shell_state);
        MSG open;
        EXPECT_FALSE(PeekMessageA(&open, stand_in, MSG_TRAY_CALLBACK, MSG_TRAY_CALLBACK, PM_NOREMOVE));
        EXPECT_NE(other, GetForegroundWindow());
        PostMessageA(sheet, PSM_PRESSBUTTON, PSBTN_CANCEL, 0);
    };
    EXPECT_EQ(1, OnMenuCommand(stand_in, 222));
    EXPECT_EQ(1, sheets);
    EXPECT_EQ(0, shell_state);
    DestroyWindow(other);
}

TEST_F(Tray, CloseAsksWithNoAsTheDefault)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    for (int answer : {IDNO, IDYES}) {
        std::string texts;
        HICON icon = NULL;
        bool no_is_default = false;
        on_app = [&](HWND box) {
            for (HWND child = GetWindow(box, GW_CHILD); child; child = GetWindow(child, GW_HWNDNEXT)) {
                char cls[32] = "", text[256] = "";
                GetClassNameA(child, cls, sizeof cls);
                GetWindowTextA(child, text, sizeof text);
                if ((GetWindowLongA(child, GWL_STYLE) & SS_TYPEMASK) == SS_ICON && !lstrcmpiA(cls, "Static"))
                    icon = (HICON)SendMessageA(child, STM_GETICON, 0, 0);
                else texts += std::string(texts.empty() ? "" : "|") + text;
            }
            HWND no = GetDlgItem(box, IDNO);
            no_is_default = GetFocus() == no && (GetWindowLongA(no, GWL_STYLE) & BS_TYPEMASK) == BS_DEFPUSHBUTTON;
            char caption[64] = "";
            GetWindowTextA(box, caption, sizeof caption);
            texts += std::string("|") + caption;
            PostMessageA(box, WM_COMMAND, answer, 0);
        };
        EXPECT_EQ(1, OnMenuCommand(stand_in, 209));
        EXPECT_EQ("&Yes|&No|Close this application will disable all the functions it supports. Do you want to close it ?"
                  "|Vistrel",
                  texts);
        EXPECT_TRUE(no_is_default);
        EXPECT_EQ(LoadIconA(NULL, IDI_EXCLAMATION), icon);
        EXPECT_EQ(answer == IDNO, IsWindow(stand_in) != FALSE);
    }
}

TEST_F(Tray, PowerEntriesEndTheTimersAndEnterTheirStateOnceTheMenuHasGone)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    keep_hook = RecordKeepCall;
    bool dispatched = false;
    on_app = [&](HWND) { dispatched = true; };
    for (DWORD state : {1, 2, 4}) {
        SCOPED_TRACE(state);
        for (int setting : {SETTING_STANDBY, SETTING_SUSPEND, SETTING_SHUTOFF}) SaveSetting(setting, 5);
        keep_calls.clear();
        dispatched = false;
        PostMessageA(stand_in, WM_APP, 0, 0);
        DWORD start = GetTickCount();
        EXPECT_EQ(1, OnMenuCommand(stand_in, state == 4 ? 213 : 210 + state));
        EXPECT_GE(GetTickCount() - start, (DWORD)POWER_SETTLE_MS);
        EXPECT_TRUE(dispatched) << "what waited was dispatched first";
        ASSERT_EQ(1u, keep_calls.size());
        EXPECT_EQ(NULL, keep_calls[0].window);
        EXPECT_EQ(state, keep_calls[0].state);
        EXPECT_EQ(1u, keep_calls[0].enable);
        EXPECT_EQ(0u, keep_calls[0].minutes);
        for (int setting : {SETTING_STANDBY, SETTING_SUSPEND, SETTING_SHUTOFF}) EXPECT_EQ(-1, LoadSetting(setting));
    }
}

}  // namespace
