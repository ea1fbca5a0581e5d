#include "pages/sheet_driver.h"

#include <gtest/gtest.h>

#include <commctrl.h>
#include <prsht.h>

#include "base/state.h"
#include "pages/property_sheet.h"

namespace {

const UINT MSG_NEXT_STEP = WM_APP + 9;
const int apply_button = 0x3021;  // the sheet's Apply button

const std::vector<SheetStep>* steps;
size_t next_step;
int settle_rounds;
HWND driver, sheet;
HHOOK cbt_hook;

LRESULT CALLBACK DriverProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    if (message != MSG_NEXT_STEP) return DefWindowProcA(window, message, wparam, lparam);
    if ((HIWORD(GetQueueStatus(QS_POSTMESSAGE)) & QS_POSTMESSAGE) && ++settle_rounds < 1000) {
        PostMessageA(window, MSG_NEXT_STEP, 0, 0);
        return 0;
    }
    settle_rounds = 0;
    if (next_step < steps->size()) {
        (*steps)[next_step++](sheet);
        PostMessageA(window, MSG_NEXT_STEP, 0, 0);
    } else if (IsWindow(sheet)) {
        PressSheetButton(sheet, PSBTN_CANCEL);
    }
    return 0;
}

// The sheet is activated once its pages are made: the steps start then.
LRESULT CALLBACK StartWhenActive(int code, WPARAM wparam, LPARAM lparam)
{
    if (code == HCBT_ACTIVATE && !sheet && PropSheet_GetTabControl((HWND)wparam)) {
        sheet = (HWND)wparam;
        PostMessageA(driver, MSG_NEXT_STEP, 0, 0);
    }
    return CallNextHookEx(cbt_hook, code, wparam, lparam);
}

}  // namespace

void RunSheet(int requested_page, const std::vector<SheetStep>& script)
{
    WNDCLASSA wc = {};
    wc.lpfnWndProc = DriverProc;
    wc.hInstance = GetModuleHandleA(NULL);
    wc.lpszClassName = "SheetTestDriver";
    RegisterClassA(&wc);
    driver = CreateWindowA(wc.lpszClassName, "", 0, 0, 0, 0, 0, HWND_MESSAGE, NULL, wc.hInstance, NULL);
    steps = &script;
    next_step = 0;
    settle_rounds = 0;
    sheet = NULL;
    cbt_hook = SetWindowsHookExA(WH_CBT, StartWhenActive, NULL, GetCurrentThreadId());
    OpenPropertySheet(instance, NULL, requested_page);
    UnhookWindowsHookEx(cbt_hook);
    DestroyWindow(driver);
    EXPECT_EQ(script.size(), next_step) << "steps taken inside the sheet";
}

HWND CurrentPage(HWND sheet) { return PropSheet_GetCurrentPageHwnd(sheet); }

void PressSheetButton(HWND sheet, int button) { SendMessageA(sheet, PSM_PRESSBUTTON, button, 0); }

bool ApplyEnabled(HWND sheet) { return IsWindowEnabled(GetDlgItem(sheet, apply_button)); }

std::vector<std::string> TabTitles(HWND sheet)
{
    HWND tab = PropSheet_GetTabControl(sheet);
    std::vector<std::string> titles;
    for (int i = 0; i < TabCtrl_GetItemCount(tab); ++i) {
        char text[128] = "";
        TCITEMA item = {};
        item.mask = TCIF_TEXT;
        item.pszText = text;
        item.cchTextMax = sizeof text;
        SendMessageA(tab, TCM_GETITEMA, i, (LPARAM)&item);
        titles.push_back(text);
    }
    return titles;
}

std::string ControlText(HWND page, int id)
{
    char text[256] = "";
    GetDlgItemTextA(page, id, text, sizeof text);
    return text;
}

std::vector<std::string> ListLines(HWND list)
{
    std::vector<std::string> lines;
    int count = (int)SendMessageA(list, LB_GETCOUNT, 0, 0);
    for (int i = 0; i < count; ++i) {
        char text[256] = "";
        SendMessageA(list, LB_GETTEXT, i, (LPARAM)text);
        lines.push_back(text);
    }
    return lines;
}
