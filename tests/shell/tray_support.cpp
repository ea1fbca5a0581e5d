#include "shell/tray_support.h"

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chips.h"
#include "shell/main_window.h"
#include "shell/tray_menu.h"

std::function<void(HWND menu_window)> on_menu_shown;
std::function<void()> on_app_message;
static bool menu_fresh;

static LRESULT CALLBACK StandInProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    if (message == WM_ENTERMENULOOP) menu_fresh = true;
    if (message == WM_ENTERIDLE && wparam == MSGF_MENU && menu_fresh) {
        menu_fresh = false;
        if (on_menu_shown) on_menu_shown((HWND)lparam);
    }
    if (message == WM_APP && on_app_message) on_app_message();
    if (message == WM_CREATE || message == WM_DESTROY) return DefWindowProcA(window, message, wparam, lparam);
    return MainWindowProc(window, message, wparam, lparam);
}

HWND CreateStandIn()
{
    WNDCLASSA wc = {};
    wc.lpfnWndProc = StandInProc;
    wc.hInstance = GetModuleHandleA(NULL);
    wc.lpszClassName = "TrayStandIn";
    RegisterClassA(&wc);
    HWND window = CreateWindowExA(WS_EX_TOOLWINDOW, wc.lpszClassName, "", WS_POPUP | WS_VISIBLE, 0, 0, 1, 1, NULL,
                                  NULL, wc.hInstance, NULL);
    main_window = window;
    return window;
}

void DestroyStandIn(HWND window)
{
    on_menu_shown = nullptr;
    on_app_message = nullptr;
    DestroyWindow(window);
}

static ChipRow test_rows[CHIP_TABLE_ROWS];
static unsigned test_hidden_pages;
static uint32_t test_mclk_max, test_has_dpms;

static uint32_t TestDispatch(uint32_t command, uintptr_t argument)
{
    switch (command) {
    case CMD_HIDE_PAGE: return test_hidden_pages >> argument & 1;
    case CMD_GET_MCLK_MAX: return test_mclk_max;
    case CMD_HAS_DPMS: return test_has_dpms;
    }
    return chip_table[CurrentAdapter()->chip_row].Dispatch(command, argument);
}

void UseTestFamily(unsigned hidden_pages, uint32_t mclk_max, uint32_t has_dpms)
{
    test_hidden_pages = hidden_pages;
    test_mclk_max = mclk_max;
    test_has_dpms = has_dpms;
    for (int i = 0; i < CHIP_TABLE_ROWS; ++i) {
        test_rows[i] = chip_table[i];
        test_rows[i].Dispatch = TestDispatch;
    }
    chip_rows = test_rows;
}

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
        if (!GetMenuItemInfoA(menu, i, TRUE, &info)) return text + "<unreadable>";
        if (i) text += "|";
        std::string label = "'" + std::string(plain) + "'";
        if (info.fType & MFT_OWNERDRAW) {
            const MenuItemRecord* record = MenuRecordOf(info.dwItemData);
            label = !record ? "<no record>" : !record->icon ? "<no icon>" : record->text;
        }
        if (info.hSubMenu) text += label + "[" + MenuText(info.hSubMenu) + "]";
        else text += std::to_string(info.wID) + " " + label;
    }
    return text;
}

int CountGdiObjects()
{
    int count = 0;
    for (ULONG_PTR index = 0; index < 0x10000; ++index)
        if (GetObjectType((HGDIOBJ)index)) ++count;
    return count;
}
