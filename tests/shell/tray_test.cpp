// The tray icon, its menu as the chips shape it, its drawing and its clicks.
#include <gtest/gtest.h>

#include <windows.h>
#include <shellapi.h>

#include "base/adapters.h"
#include "base/protocol.h"
#include "base/state.h"
#include "hardware/companions.h"
#include "modes/detect.h"
#include "shell/main_window.h"
#include "shell/startup.h"
#include "shell/tray.h"
#include "shell/tray_menu.h"
#include "shell/tray_support.h"
#include "support/machine.h"
#include "support/support.h"

namespace {

// S3 chips of distinct kinds, so that each finds its own display device.
const uint16_t s3_kinds[] = {0x8901, 0x8a01, 0x8811, 0x5631, 0x883d, 0x8a10, 0x8904, 0x8a13};

void BootCards(int windows, int count)
{
    SimMachineConfig config = Machine(windows, {});
    for (int i = 0; i < count; ++i) config.cards[config.card_count++] = Card(0x5333, s3_kinds[i], 0, (uint8_t)(9 + i));
    BootMachine(config);
    instance = GetModuleHandleA(NULL);
    ASSERT_EQ(1, DetectAdapters());
    ASSERT_EQ(count, adapter_count);
    RefreshAdapterModes(REFRESH_AT_STARTUP);
}

const char power[] = "Power Saving[211 'Stand By'|212 'Suspend'|213 'Shutoff']";
const char fixed[] = "201 Display Properties|202 DirectX Info|210 Zoom In|207 Minimize|209 Close";

// The submenu of a Windows 98 adapter that offers every page.
std::string AllPages(int adapter)
{
    int id = 220 + 4 * adapter;
    return "VGA" + std::to_string(adapter + 1) + "[" + std::to_string(id) + " Desktop|" + std::to_string(id + 1) +
           " Information|" + std::to_string(id + 2) + " Monitor|" + std::to_string(id + 3) + " Performance Adjustment]";
}

std::string Join(std::initializer_list<std::string> parts)
{
    std::string s;
    for (const std::string& p : parts) s += (s.empty() ? "" : "|") + p;
    return s;
}

TEST(TrayMenu, OffersWhatTheChipsAllow)
{
    struct {
        const char* name;
        int windows, cards;
        unsigned hidden_pages;
        uint32_t mclk_max, dpms;
        std::string menu;
    } rows[] = {
        {"chip hides Information", SIM_WINDOWS_98, 1, 0x2, 1, 1,
         Join({"220 Desktop|222 Monitor|223 Performance", power, fixed})},
        {"no memory clock, no power saving", SIM_WINDOWS_98, 1, 0x0, 0, 0,
         Join({"220 Desktop|221 Information|222 Monitor", fixed})},
        {"two on Windows 98", SIM_WINDOWS_98, 2, 0x0, 1, 1, Join({AllPages(0), AllPages(1), power, fixed})},
        {"two on Windows 98, no power saving", SIM_WINDOWS_98, 2, 0x0, 1, 0, Join({AllPages(0), AllPages(1), fixed})},
        // Windows 95 serves the adapter it found last; the commands say which.
        {"two kinds on Windows 95", SIM_WINDOWS_95, 2, 0x0, 1, 1,
         Join({"224 Desktop|225 Information|226 Monitor|227 Performance", power, fixed})},
        {"five: four fit the records", SIM_WINDOWS_98, 5, 0x0, 1, 1,
         Join({AllPages(0), AllPages(1), AllPages(2), AllPages(3), power, fixed})},
        {"eight with three pages: six fit exactly", SIM_WINDOWS_98, 8, 0x2, 1, 1,
         Join({"VGA1[220 Desktop|222 Monitor|223 Performance Adjustment]",
               "VGA2[224 Desktop|226 Monitor|227 Performance Adjustment]",
               "VGA3[228 Desktop|230 Monitor|231 Performance Adjustment]",
               "VGA4[232 Desktop|234 Monitor|235 Performance Adjustment]",
               "VGA5[236 Desktop|238 Monitor|239 Performance Adjustment]",
               "VGA6[240 Desktop|242 Monitor|243 Performance Adjustment]", power, fixed})},
        {"eight with Desktop only: seven have commands", SIM_WINDOWS_98, 8, 0xE, 0, 1,
         Join({"VGA1[220 Desktop]|VGA2[224 Desktop]|VGA3[228 Desktop]|VGA4[232 Desktop]|VGA5[236 Desktop]",
               "VGA6[240 Desktop]|VGA7[244 Desktop]", power, fixed})},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.name);
        ASSERT_NO_FATAL_FAILURE(BootCards(row.windows, row.cards));
        UseTestFamily(row.hidden_pages, row.mclk_max, row.dpms);
        int16_t current = current_adapter;
        BuildTrayMenu();
        EXPECT_EQ(row.menu, MenuText(TrayMenu()));
        EXPECT_EQ(current, current_adapter);
    }
}

// The icons of the entries live as long as the menu.
TEST(TrayMenu, IconsGoWithTheMenu)
{
    ASSERT_NO_FATAL_FAILURE(BootCards(SIM_WINDOWS_98, 2));
    BuildTrayMenu();  // whatever the first use of the calls keeps for good
    DestroyTrayMenu();
    int before = CountGdiObjects();
    BuildTrayMenu();
    int built = CountGdiObjects();
    EXPECT_GT(built, before + 20);
    BuildTrayMenu();
    EXPECT_EQ(built, CountGdiObjects());
    DestroyTrayMenu();
    EXPECT_EQ(before, CountGdiObjects());
    EXPECT_EQ(nullptr, TrayMenu());
}

TEST(TrayMenu, EntriesAreDrawnInTheMenuColoursAndKeepNoGdiObject)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect());
    instance = GetModuleHandleA(NULL);
    BuildTrayMenu();
    ULONG_PTR close = (ULONG_PTR)MenuRecordOfCommand(209);
    ASSERT_NE(0u, close);

    MEASUREITEMSTRUCT measure = {ODT_MENU, 0, 209, 0xDEAD, 0xBEEF, close};
    MeasureMenuItem(&measure);
    HDC screen = GetDC(NULL);
    SIZE text;
    GetTextExtentPoint32A(screen, "Close", 5, &text);
    EXPECT_EQ(text.cx + 39, (LONG)measure.itemWidth);
    EXPECT_EQ((text.cy > 32 ? text.cy : 32) + 4, (LONG)measure.itemHeight);

    BITMAPINFO bi = {};
    bi.bmiHeader = {sizeof bi.bmiHeader, 200, -40, 1, 32, BI_RGB};
    void* bits;
    HBITMAP bitmap = CreateDIBSection(screen, &bi, DIB_RGB_COLORS, &bits, NULL, 0);
    HDC dc = CreateCompatibleDC(screen);
    ReleaseDC(NULL, screen);
    HGDIOBJ old_bitmap = SelectObject(dc, bitmap);
    HGDIOBJ own_brush = GetCurrentObject(dc, OBJ_BRUSH);
    const COLORREF junk = RGB(1, 2, 3);
    MenuItemRecord stranger = {"Stranger", NULL};
    struct {
        UINT action, state;
        ULONG_PTR data;
        COLORREF background;
    } rows[] = {
        {ODA_DRAWENTIRE, ODS_SELECTED, close, GetSysColor(COLOR_MENU)},
        {ODA_SELECT, ODS_SELECTED, close, GetSysColor(COLOR_ACTIVECAPTION)},
        {ODA_SELECT, 0, close, GetSysColor(COLOR_MENU)},
        {ODA_FOCUS, ODS_FOCUS, close, GetSysColor(COLOR_ACTIVECAPTION)},
        {ODA_DRAWENTIRE, 0, (ULONG_PTR)&stranger, junk},  // not one of the menu's records
    };
    for (const auto& row : rows) {
        RECT all = {0, 0, 200, 40};
        HBRUSH fill = CreateSolidBrush(junk);
        FillRect(dc, &all, fill);
        DeleteObject(fill);
        DRAWITEMSTRUCT draw = {ODT_MENU, 0, 209, row.action, row.state, NULL, dc, {10, 2, 150, 38}, row.data};
        DrawMenuItem(&draw);
        EXPECT_EQ(row.background, GetPixel(dc, 149, 37) & 0xFFFFFF) << row.action << " " << row.state;
        EXPECT_EQ(junk, GetPixel(dc, 150, 38) & 0xFFFFFF);
        EXPECT_EQ(own_brush, GetCurrentObject(dc, OBJ_BRUSH));
    }
    int before = CountGdiObjects();
    for (int i = 0; i < 500; ++i) {
        DRAWITEMSTRUCT draw = {ODT_MENU, 0, 209, ODA_SELECT, (UINT)(i & 1 ? ODS_SELECTED : 0), NULL, dc, {0, 0, 150, 38}, close};
        DrawMenuItem(&draw);
    }
    EXPECT_EQ(before, CountGdiObjects());
    SelectObject(dc, old_bitmap);
    DeleteDC(dc);
    DeleteObject(bitmap);
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

TEST(TrayIcon, LivesFromCreationToDestructionOfTheMainWindow)
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
    EXPECT_EQ(1u, keep_calls[0].state);
    EXPECT_TRUE(keep_calls[0].icon_shown) << "the library starts once the icon is there";

    // Explorer restarted: the new taskbar asks for the icons again.
    NOTIFYICONDATAA gone = {};
    gone.cbSize = NOTIFYICONDATAA_V1_SIZE;
    gone.hWnd = window;
    gone.uID = TRAY_ICON_ID;
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
    EXPECT_EQ(nullptr, TrayMenu());
    MSG quit;
    EXPECT_TRUE(PeekMessageA(&quit, NULL, WM_QUIT, WM_QUIT, PM_REMOVE));
    UnregisterClassA(main_window_class, wc.hInstance);
}

// A click opens the menu from the queue, once the shell's notification has
// returned; WM_CANCELMODE takes it away, and it comes back at the same place
// once.
TEST(TrayClick, OpensTheMenuFromTheQueueAndAgainAfterCancelMode)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect());
    instance = GetModuleHandleA(NULL);
    BuildTrayMenu();
    HWND window = CreateStandIn();
    SetCursorPos(300, 200);
    std::vector<POINT> shown;
    on_menu_shown = [&](HWND menu) {
        RECT r;
        GetWindowRect(menu, &r);
        shown.push_back({r.left, r.top});
        // As a window that goes modal sends it (Wine's menu loop swallows a posted one).
        if (shown.size() <= 2) SendMessageA(window, WM_CANCELMODE, 0, 0);
        else EndMenu();
    };
    EXPECT_EQ(0, SendMessageA(window, MSG_TRAY_CALLBACK, 0, WM_LBUTTONDOWN));
    EXPECT_TRUE(shown.empty());
    EXPECT_EQ(STATE_TRAY_BUSY | STATE_MENU_PENDING, shell_state);
    EXPECT_TRUE(PumpUntil([](void*) { return shell_state == 0; }, NULL, 10000));
    ASSERT_EQ(2u, shown.size());
    for (POINT p : shown) EXPECT_EQ(300 * 1000 + 200, p.x * 1000 + p.y);

    // Moves, button-up and double clicks open nothing.
    for (LPARAM mouse : {WM_MOUSEMOVE, WM_LBUTTONUP, WM_LBUTTONDBLCLK, WM_RBUTTONUP}) {
        EXPECT_EQ(0, OnTrayCallback(window, 0, mouse));
        EXPECT_EQ(0, shell_state);
    }
    DestroyStandIn(window);
}

}  // namespace
