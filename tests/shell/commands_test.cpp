// The menu commands, sent as any process can send them.
#include <gtest/gtest.h>

#include <windows.h>
#include <commctrl.h>
#include <prsht.h>

#include "base/adapters.h"
#include "base/protocol.h"
#include "base/settings.h"
#include "base/state.h"
#include "hardware/companions.h"
#include "modes/detect.h"
#include "shell/commands.h"
#include "shell/tray.h"
#include "shell/tray_menu.h"
#include "shell/tray_support.h"
#include "support/machine.h"
#include "support/support.h"

namespace {

std::string started;

UINT WINAPI RecordStart(LPCSTR command_line, UINT show)
{
    started += (started.empty() ? "" : "; ") + std::string(command_line) + (show == SW_SHOW ? "" : " (hidden)");
    return 33;
}

// Looks at every dialog this thread opens once it is up, and lets the test
// answer it.
HHOOK dialog_hook;
std::function<void(HWND dialog)> on_dialog;

LRESULT CALLBACK WatchDialogs(int code, WPARAM wparam, LPARAM lparam)
{
    if (code == HCBT_ACTIVATE && on_dialog) {
        char cls[32] = "";
        GetClassNameA((HWND)wparam, cls, sizeof cls);
        if (!strcmp(cls, "#32770")) on_dialog((HWND)wparam);
    }
    return CallNextHookEx(dialog_hook, code, wparam, lparam);
}

std::string Text(HWND window)
{
    char text[256] = "";
    GetWindowTextA(window, text, sizeof text);
    return text;
}

class MenuCommands : public ::testing::Test {
protected:
    void SetUp() override
    {
        ClearSettingsStore();
        dialog_hook = SetWindowsHookExA(WH_CBT, WatchDialogs, NULL, GetCurrentThreadId());
    }
    void TearDown() override
    {
        UnhookWindowsHookEx(dialog_hook);
        on_dialog = nullptr;
        if (IsWindow(window)) DestroyStandIn(window);
        ClearSettingsStore();
    }
    // The machine, its menu, and a main window for the commands.
    void Start(int windows, int cards)
    {
        static const uint16_t kinds[] = {0x8901, 0x8a01, 0x8811, 0x5631, 0x883d, 0x8a10, 0x8904};
        SimMachineConfig config = Machine(windows, {});
        for (int i = 0; i < cards; ++i) config.cards[config.card_count++] = Card(0x5333, kinds[i], 0, (uint8_t)(9 + i));
        BootMachine(config);
        instance = GetModuleHandleA(NULL);
        ASSERT_EQ(1, DetectAdapters());
        ASSERT_EQ(cards, adapter_count);
        RefreshAdapterModes(REFRESH_AT_STARTUP);
        BuildTrayMenu();
        window = CreateStandIn();
        run_program = RecordStart;
        started.clear();
    }
    HWND window = NULL;
};

TEST_F(MenuCommands, StartTheirProgramsOrNothing)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    std::string dialogs;
    on_dialog = [&](HWND dialog) {
        dialogs += Text(dialog);
        PostMessageA(dialog, WM_COMMAND, IDCANCEL, 0);
    };
    const std::string zoom = "loupe.exe \"Zoom In\" " + std::string(text_ini_path);
    struct {
        UINT command;
        int handled;
        std::string started;
    } rows[] = {
        {201, 1, "Control.exe desk.cpl @0,3"}, {204, 1, "Control.exe desk.cpl @0,0"},
        {205, 1, "Control.exe desk.cpl @0,1"}, {206, 1, "Control.exe desk.cpl @0,2"},
        {202, 1, "dxprobe.exe"},               {210, 1, zoom},
        {207, 0, ""},                          {208, 1, ""},
        {203, 1, ""},  // no entry 203: no panning dialog without a title
        {200, 0, ""},  {214, 0, ""},           {219, 0, ""},
        {245, 0, ""},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.command);
        started.clear();
        last_activity_tick = 0;
        EXPECT_EQ(row.handled, OnMenuCommand(window, row.command));
        EXPECT_EQ(row.started, started);
        EXPECT_EQ(0, shell_state);
        EXPECT_NE(0u, last_activity_tick);
    }
    EXPECT_EQ("", dialogs);

    // Given an entry 203, its label is the panning dialog's title.
    MENUITEMINFOA zoom_entry = {};
    zoom_entry.cbSize = sizeof zoom_entry;
    zoom_entry.fMask = MIIM_DATA;
    ASSERT_TRUE(GetMenuItemInfoA(TrayMenu(), 210, FALSE, &zoom_entry));
    AppendMenuA(TrayMenu(), MF_OWNERDRAW, 203, (LPCSTR)zoom_entry.dwItemData);
    EXPECT_EQ(1, OnMenuCommand(window, 203));
    EXPECT_EQ("Zoom In", dialogs);
}

TEST_F(MenuCommands, ZoomToolLearnsOfTheSecondMonitor)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 2));
    WriteTextFile(text_ini_path, "[TASKBAR]\r\nMENUE=Lupe\r\n");
    BuildTrayMenu();
    EXPECT_EQ(2, monitor_count);
    EXPECT_EQ(1, OnMenuCommand(window, 210));
    EXPECT_EQ("loupe.exe \"Lupe\" " + std::string(text_ini_path) + " 2", started);
}

TEST_F(MenuCommands, PageEntriesOpenTheSheetOfTheirAdapter)
{
    struct {
        int cards;
        UINT command;
        int handled;
        int adapter;  // -1: no sheet
        const char* page;
    } rows[] = {
        {2, 223, 1, 0, "Performance"}, {2, 225, 1, 1, "Information"}, {2, 226, 1, 1, "Monitor"},
        {2, 244, 0, -1, ""},  // an adapter beyond the table's
        {7, 244, 1, 6, "Desktop"},     {7, 245, 0, -1, ""},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.command);
        ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, row.cards));
        UseTestFamily(0, 80, 1);  // a Performance page on every card
        int adapter = -1;
        std::string page;
        HWND sheet = NULL;
        on_dialog = [&](HWND dialog) {
            sheet = dialog;
            PostMessageA(window, WM_APP, 0, 0);
        };
        // Once the sheet has settled on its start page.
        on_app_message = [&] {
            HWND tab = PropSheet_GetTabControl(sheet);
            char title[64] = "";
            TCITEMA item = {};
            item.mask = TCIF_TEXT;
            item.pszText = title;
            item.cchTextMax = sizeof title;
            SendMessageA(tab, TCM_GETITEMA, TabCtrl_GetCurSel(tab), (LPARAM)&item);
            adapter = current_adapter;
            page = title;
            PostMessageA(sheet, PSM_PRESSBUTTON, PSBTN_CANCEL, 0);
        };
        int16_t before = current_adapter;
        EXPECT_EQ(row.handled, OnMenuCommand(window, row.command));
        EXPECT_EQ(row.adapter, adapter);
        EXPECT_EQ(row.page, page);
        if (row.adapter < 0) EXPECT_EQ(before, current_adapter);
        DestroyStandIn(window);
    }
}

// While the sheet is open, clicks on the icon and commands from elsewhere
// leave it alone: no menu opens, no second sheet, and the flag stays the
// sheet's until it closes.
TEST_F(MenuCommands, WhileTheSheetIsOpenAClickOnlyBringsTheProgramForward)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    HWND other = CreateWindowExA(0, "STATIC", "other", WS_POPUP | WS_VISIBLE, 50, 50, 100, 100, NULL, NULL, NULL, NULL);
    int sheets = 0, steps = 0;
    HWND sheet = NULL;
    on_dialog = [&](HWND dialog) {
        ++sheets;
        sheet = dialog;
        PostMessageA(window, WM_APP, 0, 0);
    };
    on_app_message = [&] {
        ++steps;
        EXPECT_EQ(STATE_COMMAND_RUNNING, shell_state);
        EXPECT_EQ(0, OnMenuCommand(window, 222));
        EXPECT_EQ(0, OnMenuCommand(window, 245));
        SetForegroundWindow(other);
        EXPECT_EQ(0, SendMessageA(window, MSG_TRAY_CALLBACK, 0, WM_LBUTTONDOWN));
        EXPECT_EQ(STATE_COMMAND_RUNNING, shell_state);
        MSG open;
        EXPECT_FALSE(PeekMessageA(&open, window, MSG_TRAY_CALLBACK, MSG_TRAY_CALLBACK, PM_NOREMOVE));
        EXPECT_NE(other, GetForegroundWindow());
        PostMessageA(sheet, PSM_PRESSBUTTON, PSBTN_CANCEL, 0);
    };
    EXPECT_EQ(1, OnMenuCommand(window, 222));
    EXPECT_EQ(1, sheets);
    EXPECT_EQ(1, steps);
    EXPECT_EQ(0, shell_state);
    DestroyWindow(other);
}

TEST_F(MenuCommands, CloseAsksWithNoAsTheDefault)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    for (int answer : {IDNO, IDYES}) {
        SCOPED_TRACE(answer);
        std::string caption, question;
        bool yes_no = false;
        bool no_is_default = false;
        HICON icon = NULL;
        HWND box = NULL;
        on_dialog = [&](HWND dialog) {
            box = dialog;
            PostMessageA(window, WM_APP, 0, 0);
        };
        // Once the box has set its focus.
        on_app_message = [&] {
            caption = Text(box);
            for (HWND child = GetWindow(box, GW_CHILD); child; child = GetWindow(child, GW_HWNDNEXT)) {
                char cls[32] = "";
                GetClassNameA(child, cls, sizeof cls);
                if (lstrcmpiA(cls, "Static")) continue;
                if ((GetWindowLongA(child, GWL_STYLE) & SS_TYPEMASK) == SS_ICON)
                    icon = (HICON)SendMessageA(child, STM_GETICON, 0, 0);
                else question = Text(child);
            }
            yes_no = GetDlgItem(box, IDYES) && GetDlgItem(box, IDNO) && !GetDlgItem(box, IDCANCEL);
            HWND no = GetDlgItem(box, IDNO);
            no_is_default = GetFocus() == no && (GetWindowLongA(no, GWL_STYLE) & BS_TYPEMASK) == BS_DEFPUSHBUTTON;
            PostMessageA(box, WM_COMMAND, answer, 0);
        };
        EXPECT_EQ(1, OnMenuCommand(window, 209));
        EXPECT_EQ("Vistrel", caption);
        EXPECT_EQ("Close this application will disable all the functions it supports. Do you want to close it ?",
                  question);
        EXPECT_TRUE(yes_no);
        EXPECT_TRUE(no_is_default);
        EXPECT_EQ(LoadIconA(NULL, IDI_EXCLAMATION), icon);
        EXPECT_EQ(answer == IDNO, IsWindow(window) != FALSE);
    }
}

struct KeepCall {
    HWND window;
    DWORD state, enable, minutes;
    bool menu_gone;  // what was waiting had been dispatched
};
std::vector<KeepCall> keep_calls;
bool posted_dispatched;

DWORD WINAPI RecordKeepCall(HWND window, DWORD state, DWORD enable, DWORD minutes)
{
    keep_calls.push_back({window, state, enable, minutes, posted_dispatched});
    return 1;
}

TEST_F(MenuCommands, PowerEntriesEndTheTimersAndEnterTheirStateOnceTheMenuHasGone)
{
    ASSERT_NO_FATAL_FAILURE(Start(SIM_WINDOWS_98, 1));
    keep_hook = RecordKeepCall;
    on_app_message = [] { posted_dispatched = true; };
    struct {
        UINT command;
        DWORD state;
    } rows[] = {{211, 1}, {212, 2}, {213, 4}};
    for (const auto& row : rows) {
        SCOPED_TRACE(row.command);
        for (int setting : {SETTING_STANDBY, SETTING_SUSPEND, SETTING_SHUTOFF}) SaveSetting(setting, 5);
        keep_calls.clear();
        posted_dispatched = false;
        PostMessageA(window, WM_APP, 0, 0);
        DWORD start = GetTickCount();
        EXPECT_EQ(1, OnMenuCommand(window, row.command));
        EXPECT_GE(GetTickCount() - start, (DWORD)POWER_SETTLE_MS);
        ASSERT_EQ(1u, keep_calls.size());
        const KeepCall& call = keep_calls[0];
        EXPECT_EQ(NULL, call.window);
        EXPECT_EQ(row.state, call.state);
        EXPECT_EQ(1u, call.enable);
        EXPECT_EQ(0u, call.minutes);
        EXPECT_TRUE(call.menu_gone);
        for (int setting : {SETTING_STANDBY, SETTING_SUSPEND, SETTING_SHUTOFF}) EXPECT_EQ(-1, LoadSetting(setting));
    }
}

}  // namespace
