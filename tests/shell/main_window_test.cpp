// The hidden main window: its place, its tray icon, the menu as the chips shape it, its drawing and clicks,
// the commands as any process can send them, and what redraws and display changes re-apply.
#include <gtest/gtest.h>

#include <windows.h>
#include <commctrl.h>
#include <shellapi.h>

#include "base/adapters.h"
#include "base/settings.h"
#include "chips/chips.h"
#include "hardware/companions.h"
#include "shell/commands.h"
#include "shell/main_window.h"
#include "shell/startup.h"
#include "shell/tray.h"
#include "shell/tray_menu.h"
#include "support/gui_handles.h"
#include "support/machine.h"

namespace {

HWND stand_in;
bool menu_fresh;
std::vector<POINT> menus_at;     // where the opened menus showed
void (*on_dialog)(HWND dialog);  // once a dialog has settled

// The main window's procedure but for creation and destruction, which would run the whole start-up. An
// opened menu is cancelled twice, as by a window that goes modal (sent: Wine's menu swallows a posted one).
LRESULT CALLBACK StandInProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    RECT r;
    if (message == WM_ENTERMENULOOP) menu_fresh = true;
    if (message == WM_ENTERIDLE && wparam == MSGF_MENU && menu_fresh && GetWindowRect((HWND)lparam, &r)) {
        menu_fresh = false, menus_at.push_back({r.left, r.top});
        if (menus_at.size() <= 2) SendMessageA(window, WM_CANCELMODE, 0, 0);
        else EndMenu();
    }
    if (message == WM_APP && on_dialog) on_dialog((HWND)wparam);
    if (message == WM_CREATE || message == WM_DESTROY) return DefWindowProcA(window, message, wparam, lparam);
    return MainWindowProc(window, message, wparam, lparam);
}

// A dialog sets its focus after it is activated: it is looked at from the queue.
LRESULT CALLBACK WatchDialogs(int code, WPARAM wparam, LPARAM lparam)
{
    char cls[32] = "";
    if (code == HCBT_ACTIVATE && GetClassNameA((HWND)wparam, cls, sizeof cls) && !strcmp(cls, "#32770"))
        PostMessageA(stand_in, WM_APP, wparam, 0);
    return CallNextHookEx(NULL, code, wparam, lparam);
}
HHOOK dialog_hook = SetWindowsHookExA(WH_CBT, WatchDialogs, NULL, GetCurrentThreadId());

std::string seen;  // the programs started, the dialogs shown and the power-saving library's calls
void See(const std::string& what) { seen += (seen.empty() ? "" : "; ") + what; }
UINT WINAPI RecordStart(LPCSTR line, UINT show) { return See(line + std::string(show == SW_SHOW ? "" : " hid")), 33; }
DWORD WINAPI RecordKeepCall(HWND window, DWORD state, DWORD enable, DWORD minutes)
{
    NOTIFYICONDATAA icon = {NOTIFYICONDATAA_V1_SIZE, main_window, TRAY_ICON_ID};
    See("keep " + std::string(window == main_window ? "main " : window ? "other " : "") + std::to_string(state) + " " +
        std::to_string(enable) + " " + std::to_string(minutes) + (Shell_NotifyIconA(NIM_MODIFY, &icon) ? " icon" : ""));
    return 1;
}
// A sheet as "sheet <adapter> <tab>", another dialog as "dialog <title>[, default <button>]"; each closed
// with Cancel or No. While a sheet is open, commands from elsewhere open no second one, and a click on the
// icon opens no menu but brings the program forward; the flag stays the sheet's.
void SeeAndCancel(HWND dialog)
{
    char text[64] = "";
    HWND tab = FindWindowExA(dialog, NULL, WC_TABCONTROLA, NULL), no = GetDlgItem(dialog, IDNO);
    TCITEMA item = {TCIF_TEXT, 0, 0, text, sizeof text};
    if (tab) SendMessageA(tab, TCM_GETITEMA, SendMessageA(tab, TCM_GETCURSEL, 0, 0), (LPARAM)&item);
    else GetWindowTextA(dialog, text, sizeof text);
    if (no) sprintf(text + strlen(text), ", default %d", GetDlgCtrlID(GetFocus()));
    const bool first_sheet = tab && seen.find("sheet") == std::string::npos;
    See((tab ? "sheet " + std::to_string(current_adapter) + " " : std::string("dialog ")) + text);
    if (first_sheet) {
        EXPECT_EQ(0, OnMenuCommand(stand_in, MENU_FIRST_PAGE));
        EXPECT_TRUE(GetForegroundWindow() != stand_in && !OnTrayCallback(stand_in, 0, WM_LBUTTONDOWN));
        EXPECT_TRUE(GetForegroundWindow() == stand_in && shell_state == STATE_COMMAND_RUNNING);
    }
    PostMessageA(dialog, WM_COMMAND, no ? IDNO : IDCANCEL, 0);
}

// A family that hides pages itself (bit n: page n; 8: no memory clock) and passes the rest to the card's own.
ChipRow test_rows[CHIP_TABLE_ROWS];
unsigned test_hidden, test_dpms;
uint32_t TestDispatch(uint32_t command, uintptr_t argument)
{
    if (command == CMD_HIDE_PAGE) return test_hidden >> argument & 1;
    if (command == CMD_GET_MCLK_MAX) return test_hidden & 8 ? 0 : 80;
    if (command == CMD_HAS_DPMS) return test_dpms;
    return chip_table[CurrentAdapter()->chip_row].Dispatch(command, argument);
}

// Owner-drawn entries as "id text" from their record, with an icon; plain ones as "id 'text'"; submenus as "text[...]".
std::string MenuText(HMENU menu)
{
    std::string text;
    for (int i = 0; i < GetMenuItemCount(menu); ++i) {
        char plain[64] = "";
        MENUITEMINFOA info = {sizeof info, MIIM_ID | MIIM_DATA | MIIM_FTYPE | MIIM_SUBMENU | MIIM_STRING};
        info.dwTypeData = plain, info.cch = sizeof plain;
        GetMenuItemInfoA(menu, i, TRUE, &info);
        const MenuItemRecord* record = MenuRecordOf(info.dwItemData);
        std::string label = !(info.fType & MFT_OWNERDRAW) ? "'" + std::string(plain) + "'"
                            : record && record->icon        ? record->text : "<no record or icon>";
        text += (i ? "|" : "") + (info.hSubMenu ? label + "[" + MenuText(info.hSubMenu) + "]"
                                                : std::to_string(info.wID) + " " + label);
    }
    return text;
}

class MainWindow : public ::testing::Test {
protected:
    void TearDown() override { DestroyWindow(stand_in), ClearSettingsStore(); }
    // S3 cards of distinct kinds and display devices, of the test family; the menu; a 1 x 1 stand-in window.
    void Start(int windows, int cards, unsigned hidden = 0, unsigned dpms = 1)
    {
        static const uint16_t kinds[] = {0x8901, 0x8a01, 0x8811, 0x5631, 0x883d, 0x8a10, 0x8904, 0x8a13};
        SimMachineConfig config = Machine(windows, {});
        for (int i = 0; i < cards; ++i) config.cards[config.card_count++] = Card(0x5333, kinds[i], 0, (uint8_t)(9 + i));
        BootMachine(config);
        ClearSettingsStore();
        strcpy(text_ini_path, "X:\\T.INI");  // none: every text its default
        WNDCLASSA wc = {0, StandInProc, 0, 0, instance = GetModuleHandleA(NULL), NULL, NULL, NULL, NULL, "TrayStandIn"};
        RegisterClassA(&wc);
        ASSERT_TRUE(DetectAdapters() == 1 && adapter_count == cards);
        RefreshAdapterModes(REFRESH_AT_STARTUP);
        test_hidden = hidden, test_dpms = dpms, chip_rows = test_rows;
        for (int i = 0; i < CHIP_TABLE_ROWS; ++i) test_rows[i] = chip_table[i], test_rows[i].Dispatch = TestDispatch;
        BuildTrayMenu();
        DestroyWindow(stand_in);
        stand_in = main_window = CreateWindowExA(WS_EX_TOOLWINDOW, "TrayStandIn", "", WS_POPUP | WS_VISIBLE, 0, 0, 1, 1,
                                                 NULL, NULL, instance, NULL);
        run_program = RecordStart, keep_hook = RecordKeepCall, on_dialog = SeeAndCancel;
        seen.clear(), menus_at.clear(), last_activity_tick = 0;
    }
};

// The submenus of the first cards on Windows 98, with the pages of the mask (bit n: page n).
std::string Vgas(int cards, unsigned pages = 0xF)
{
    static const char* names[] = {" Desktop", " Information", " Monitor", " Performance Adjustment"};
    std::string menus;
    for (int card = 0; card < cards; ++card) {
        std::string entries;
        for (int page = 0; page < 4; ++page)
            if (pages >> page & 1) entries += "|" + std::to_string(220 + 4 * card + page) + names[page];
        menus += "VGA" + std::to_string(card + 1) + "[" + entries.substr(1) + "]|";
    }
    return menus;
}

TEST_F(MainWindow, MenuOffersWhatTheChipsAllow)
{
    const std::string fixed = "201 Display Properties|202 DirectX Info|210 Zoom In|207 Minimize|209 Close";
    const std::string tail = "Power Saving[211 'Stand By'|212 'Suspend'|213 'Shutoff']|" + fixed;
    const struct { const char* name; int windows, cards; unsigned hidden, dpms; std::string menu; } rows[] = {
        {"chip hides Information", SIM_WINDOWS_98, 1, 0x2, 1, "220 Desktop|222 Monitor|223 Performance|" + tail},
        {"no memory clock, no DPMS", SIM_WINDOWS_98, 1, 0x8, 0, "220 Desktop|221 Information|222 Monitor|" + fixed},
        {"two on Windows 98", SIM_WINDOWS_98, 2, 0, 1, Vgas(2) + tail},
        // Windows 95 serves the card it found last; the commands say which.
        {"two on 95", SIM_WINDOWS_95, 2, 0, 1, "224 Desktop|225 Information|226 Monitor|227 Performance|" + tail},
        {"five: four fit the records", SIM_WINDOWS_98, 5, 0, 1, Vgas(4) + tail},
        {"eight with three pages: six fit", SIM_WINDOWS_98, 8, 0x2, 1, Vgas(6, 0xD) + tail},
        {"eight with Desktop only: seven have commands", SIM_WINDOWS_98, 8, 0xE, 1, Vgas(7, 1) + tail},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.name);
        ASSERT_NO_FATAL_FAILURE(Start(row.windows, row.cards, row.hidden, row.dpms));
        EXPECT_EQ(row.menu, MenuText(TrayMenu()));
        EXPECT_EQ(row.windows == SIM_WINDOWS_95 ? 1 : 0, current_adapter);
    }
}

TEST_F(MainWindow, MenuIconsAndDrawingKeepNoHandle)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 2));
    const ULONG_PTR close = (ULONG_PTR)MenuRecordOfCommand(MENU_CLOSE);
    MEASUREITEMSTRUCT measure = {ODT_MENU, 0, MENU_CLOSE, 0, 0, close};
    SendMessageA(stand_in, WM_MEASUREITEM, 0, (LPARAM)&measure);  // the screen's DC stays from the first
    const std::string built = GuiHandles();
    BuildTrayMenu();
    EXPECT_EQ(built, GuiHandles()) << "the menus and icons of the menu before go";
    HDC dc = CreateCompatibleDC(NULL);
    SIZE text = {};
    GetTextExtentPoint32A(dc, "Close", 5, &text);
    EXPECT_TRUE(measure.itemWidth == text.cx + 39u && measure.itemHeight == std::max(text.cy, 32L) + 4u)
        << measure.itemWidth << "x" << measure.itemHeight;
    BITMAPINFO bi = {{sizeof bi.bmiHeader, 200, -40, 1, 32, BI_RGB}};
    DWORD* bits;
    HGDIOBJ old_bitmap = SelectObject(dc, CreateDIBSection(dc, &bi, DIB_RGB_COLORS, (void**)&bits, NULL, 0));
    const HGDIOBJ own_brush = GetCurrentObject(dc, OBJ_BRUSH);
    const COLORREF junk = RGB(1, 2, 3), menu = GetSysColor(COLOR_MENU), lit = GetSysColor(COLOR_ACTIVECAPTION);
    const COLORREF ink = GetSysColor(COLOR_MENUTEXT), lit_ink = GetSysColor(COLOR_HIGHLIGHTTEXT);
    MenuItemRecord stranger = {"Stranger", NULL};  // none of the menu's records: nothing drawn, nothing set
    const struct { UINT action, state; ULONG_PTR data; COLORREF background, text; } rows[] = {
        {ODA_DRAWENTIRE, ODS_SELECTED, close, menu, ink}, {ODA_SELECT, ODS_SELECTED, close, lit, lit_ink},
        {ODA_SELECT, 0, close, menu, ink}, {ODA_FOCUS, ODS_FOCUS, close, lit, lit_ink},
        {ODA_DRAWENTIRE, 0, (ULONG_PTR)&stranger, junk, lit_ink}};
    for (int i = 0; i < 1000; ++i) {  // and again, for a leak to add up
        const auto& row = rows[i % 5];
        std::fill(bits, bits + 200 * 40, 0x010203u);
        DRAWITEMSTRUCT draw = {ODT_MENU, 0, MENU_CLOSE, row.action, row.state, NULL, dc, {10, 2, 150, 38}, row.data};
        SendMessageA(stand_in, WM_MEASUREITEM, 0, (LPARAM)&measure);
        SendMessageA(stand_in, WM_DRAWITEM, 0, (LPARAM)&draw);
        ASSERT_TRUE(GetPixel(dc, 149, 37) == row.background && GetPixel(dc, 150, 38) == junk &&
                    GetTextColor(dc) == row.text && GetCurrentObject(dc, OBJ_BRUSH) == own_brush) << "row " << i % 5;
    }
    DeleteObject(SelectObject(dc, old_bitmap));
    DeleteDC(dc);
    EXPECT_EQ(built, GuiHandles());
}

TEST(TaskbarCorner, MainWindowSpotIsTheCornerAtTheFarEndOfTheTaskbar)
{
    static const struct { RECT taskbar; LONG x, y; } cases[] = {  // bottom, right, left, top, off both edges
        {{0, 740, 1024, 768}, 1023, 767}, {{994, 0, 1024, 768}, 1023, 767}, {{0, 0, 30, 768}, 0, 767},
        {{-2, -2, 1026, 28}, 1023, 0}, {{1, 0, 1024, 28}, 1023, 767}, {{0, 1, 30, 768}, 1023, 767}};
    for (const auto& c : cases) {
        TaskbarPlace place = {1024, 768, c.taskbar};
        EXPECT_TRUE(MainWindowSpot(&place).x == c.x && MainWindowSpot(&place).y == c.y) << &c - cases;
    }
}

TEST_F(MainWindow, RedrawReappliesAfterQuietTimeWithTheTrayFree)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    ASSERT_EQ(0, PlaceMainWindow(stand_in)) << "the first redraw put it at its spot";
    auto cr04 = [] { return SimReadRegister(0, SIM_REG_CRTC, 0x04); };  // where a stored position shows
    const uint8_t driver = cr04();
    SaveSetting(SETTING_POSITION_H, driver + 2);
    static const struct { uint16_t state; DWORD quiet_ms; bool off_spot, applied; } cases[] = {
        {STATE_TRAY_BUSY, 10000, false, false},  // the redraw that the taskbar query causes
        {0, 1000, false, false}, {0, 10000, true, false}, {0, 10000, false, true}};  // a move first, then its redraw
    for (const auto& c : cases) {
        SimWriteRegister(0, SIM_REG_CRTC, 0x04, driver);
        if (c.off_spot) MoveWindow(stand_in, 0, 0, 1, 1, FALSE);
        shell_state = c.state;
        last_activity_tick = GetTickCount() - c.quiet_ms;
        ReapplyAfterRedraw(stand_in);
        EXPECT_EQ(c.applied ? driver + 2 : driver, cr04()) << c.state << " " << c.quiet_ms << " " << c.off_spot;
        EXPECT_LE(GetTickCount() - last_activity_tick, 100u) << "activity, or the re-application, is new";
        EXPECT_EQ(0, PlaceMainWindow(stand_in)) << "back at its spot";
    }
}

TEST_F(MainWindow, DisplayChangeRereadsTheModesButOnNTInPlace)
{
    // On NT in place the next redraw re-applies at once; the marker is the program's own mode change.
    static const struct { int windows; bool marker, off_spot, reread, at_once; } cases[] = {
        {SIM_WINDOWS_98, false, false, true, false}, {SIM_WINDOWS_NT4, false, false, false, true},
        {SIM_WINDOWS_NT4, false, true, true, false}, {SIM_WINDOWS_NT4, true, false, false, false}};
    for (const auto& c : cases) {
        ASSERT_NO_FATAL_FAILURE(Start(c.windows, 1));
        const uint16_t width = CurrentAdapter()->width;
        CurrentAdapter()->width = 1;
        if (c.marker) CurrentAdapter()->refresh_hz = REFRESH_CHANGE_MARKER;
        if (c.off_spot) MoveWindow(stand_in, 0, 0, 1, 1, FALSE);
        last_activity_tick = 1;
        OnDisplayChange(stand_in);
        EXPECT_EQ(c.reread ? width : 1, CurrentAdapter()->width) << c.windows << " " << c.marker << c.off_spot;
        EXPECT_EQ(c.at_once, last_activity_tick == 0) << c.windows << " " << c.marker << c.off_spot;
    }
}

// Created, the window parks at its spot, shows the icon, then starts the power timers and uses up "/A"; a new
// taskbar gets the icon again; destroyed, it stops the timers while the icon is there, and ends with 0.
TEST_F(MainWindow, IconLivesFromCreationToDestruction)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901)}));
    startup_flags = STARTUP_AUTORUN, keep_hook = RecordKeepCall;
    WNDCLASSA wc = {0, MainWindowProc, 0, 0, GetModuleHandleA(NULL), NULL, NULL, NULL, NULL, main_window_class};
    ASSERT_TRUE(RegisterClassA(&wc));
    ASSERT_EQ(1, CreateMainWindow(wc.hInstance));
    EXPECT_TRUE(PlaceMainWindow(main_window) == 0 && TrayMenu() && startup_flags == 0);
    EXPECT_EQ("keep main 1 1 65536 icon", seen);
    EXPECT_TRUE(SendMessageA(main_window, MSG_POWER_STATE, 4, 0) == 1 && SimDpmsState(0) == SIM_DPMS_OFF);
    // Explorer restarted: its new taskbar asks for the icons again.
    NOTIFYICONDATAA icon = {NOTIFYICONDATAA_V1_SIZE, main_window, TRAY_ICON_ID};
    Shell_NotifyIconA(NIM_DELETE, &icon);
    SendMessageA(main_window, RegisterWindowMessageA("TaskbarCreated"), 0, 0);
    seen.clear();
    DestroyWindow(main_window);
    EXPECT_EQ("keep 0 0 0 icon", seen) << "the library stops before the icon goes";
    EXPECT_FALSE(Shell_NotifyIconA(NIM_MODIFY, &icon) || TrayMenu());
    MSG quit;
    EXPECT_TRUE(PeekMessageA(&quit, NULL, WM_QUIT, WM_QUIT, PM_REMOVE) && quit.wParam == 0);
    UnregisterClassA(main_window_class, wc.hInstance);
}

// A click asks for the menu, which opens from the queue once the shell's notification has returned;
// WM_CANCELMODE takes it away, and it comes back at the same place, once.
TEST_F(MainWindow, ClickOpensTheMenuFromTheQueueAndAgainAfterCancelMode)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    SetCursorPos(300, 200);
    for (LPARAM ignored : {WM_MOUSEMOVE, WM_LBUTTONUP, WM_LBUTTONDBLCLK, WM_RBUTTONUP})
        EXPECT_TRUE(OnTrayCallback(stand_in, 0, ignored) == 0 && shell_state == 0) << ignored;
    EXPECT_EQ(0, SendMessageA(stand_in, MSG_TRAY_CALLBACK, 0, WM_RBUTTONDOWN));
    EXPECT_TRUE(menus_at.empty() && shell_state == (STATE_TRAY_BUSY | STATE_MENU_PENDING));
    for (DWORD start = GetTickCount(); shell_state && GetTickCount() - start < 10000;) {
        for (MSG m; PeekMessageA(&m, NULL, 0, 0, PM_REMOVE);) DispatchMessageA(&m);
        MsgWaitForMultipleObjects(0, NULL, FALSE, 20, QS_ALLINPUT);
    }
    EXPECT_EQ(0, shell_state);
    ASSERT_EQ(2u, menus_at.size());
    for (POINT p : menus_at) EXPECT_EQ(300 * 1000 + 200, p.x * 1000 + p.y);
}

// The power entries wait for the menu to go (dispatching what waited) and end the timers for the Monitor page.
TEST_F(MainWindow, CommandsStartTheirProgramsOpenTheirAdaptersSheetOrEnterAPowerState)
{
    const struct { int cards; UINT command; int handled; std::string seen; } rows[] = {
        {1, 201, 1, "Control.exe desk.cpl @0,3"}, {1, 204, 1, "Control.exe desk.cpl @0,0"},
        {1, 205, 1, "Control.exe desk.cpl @0,1"}, {1, 206, 1, "Control.exe desk.cpl @0,2"},
        {1, 202, 1, "dxprobe.exe"}, {1, 210, 1, "loupe.exe \"Zoom In\" X:\\T.INI"},
        {2, 210, 1, "loupe.exe \"Zoom In\" X:\\T.INI 2"}, {1, 209, 1, "dialog Vistrel, default 7"} /* No (7) */,
        {1, 207, 0, ""}, {1, 208, 1, ""}, {1, 203, 1, ""} /* no entry 203: no title, no panning dialog */,
        {1, 200, 0, ""}, {1, 214, 0, ""}, {1, 211, 1, "dxprobe.exe; keep 1 1 0"},
        {1, 212, 1, "dxprobe.exe; keep 2 1 0"}, {1, 213, 1, "dxprobe.exe; keep 4 1 0"},
        {2, 223, 1, "sheet 0 Performance"}, {2, 225, 1, "sheet 1 Information"}, {2, 226, 1, "sheet 1 Monitor"},
        {2, 228, 0, ""} /* a card beyond the table's */, {7, 244, 1, "sheet 6 Desktop"}, {7, 245, 0, ""},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.command);
        ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, row.cards));
        const bool power = row.command >= MENU_STANDBY && row.command <= MENU_SHUTOFF;
        for (int setting : {SETTING_STANDBY, SETTING_SUSPEND, SETTING_SHUTOFF}) SaveSetting(setting, 5);
        if (power) PostMessageA(stand_in, WM_COMMAND, MENU_DIRECTX_INFO, 0);
        const DWORD start = GetTickCount();
        EXPECT_EQ(row.handled, OnMenuCommand(stand_in, row.command));
        EXPECT_EQ(row.seen, seen);
        EXPECT_TRUE(shell_state == 0 && last_activity_tick != 0 && (!row.seen.empty() || current_adapter == 0));
        for (int setting : {SETTING_STANDBY, SETTING_SUSPEND, SETTING_SHUTOFF})
            EXPECT_EQ(power ? -1 : 5, LoadSetting(setting));
        if (power) EXPECT_GE(GetTickCount() - start, (DWORD)POWER_SETTLE_MS);
    }
    // Yes closes. Given an entry 203, its label is the panning dialog's title.
    on_dialog = nullptr;
    { DialogAnswerer yes(IDYES); EXPECT_TRUE(OnMenuCommand(stand_in, MENU_CLOSE) && !IsWindow(stand_in)); }
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    AppendMenuA(TrayMenu(), MF_OWNERDRAW, MENU_PANNING, (LPCSTR)MenuRecordOfCommand(MENU_ZOOM));
    EXPECT_EQ(1, OnMenuCommand(stand_in, MENU_PANNING));
    EXPECT_EQ("dialog Zoom In", seen);
}

}  // namespace
