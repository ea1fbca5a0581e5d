// The Performance page: the graphics memory clock.
#include "pages/performance_page.h"

#include <windows.h>

#include <commctrl.h>

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/resource_ids.h"
#include "base/settings.h"
#include "base/texts.h"
#include "chips/chips.h"
#include "pages/pages.h"
#include "pages/property_sheet.h"

enum { TEXT_SIZE = 50, WARNING_SIZE = 100, JAPANESE = 0x11, JAPANESE_FONT_HEIGHT = 14 };

static HWND animation;
static HFONT page_font;

static void ResetPerformancePage()
{
    animation = NULL;
    page_font = NULL;
}
VISTREL_MODULE_RESET(ResetPerformancePage);

static const PageText performance_texts[] = {
    {IDC_PERF_GROUP, "MCLK", "Memory Clock Setting", TEXT_SIZE},
    {IDC_PERF_DEFAULT, "DefaultBtn", "Default", TEXT_SIZE},
    {IDC_PERF_APPLY, "APPLY", "Apply", TEXT_SIZE},
    {IDC_PERF_WARNING, "MCLKWARN", "Warning : Change this value will affect the stability of VGA card.", WARNING_SIZE},
};

static const int japanese_font_controls[] = {IDC_PERF_DEFAULT, IDC_PERF_APPLY, IDC_PERF_GROUP, IDC_PERF_WARNING};

int MemoryClockTarget(int code, int thumb, int current, int lowest, int highest)
{
    int16_t d;
    switch (code) {
    case TB_LINEUP:
    case TB_PAGEUP: d = -1; break;
    case TB_LINEDOWN:
    case TB_PAGEDOWN: d = 1; break;
    case TB_THUMBPOSITION:
    case TB_THUMBTRACK: d = (int16_t)(thumb - current); break;
    case TB_TOP: d = (int16_t)(lowest - current); break;
    case TB_BOTTOM: d = (int16_t)(highest - current); break;
    default: d = 0;
    }
    int16_t down = (int16_t)(lowest - current), up = (int16_t)(highest - current);
    if (d < down) d = down;
    if (d > up) d = up;
    return d == 0 ? -1 : (int16_t)(current + d);
}

static HWND Slider(HWND page) { return GetDlgItem(page, IDC_PERF_SLIDER); }

static void ShowClock(HWND page, uint32_t mhz)
{
    SetDlgItemInt(page, IDC_PERF_VALUE, mhz, FALSE);
    SendMessageA(Slider(page), TBM_SETPOS, TRUE, (LPARAM)mhz);
}

static void UseJapaneseFont(HWND page)
{
    if (PRIMARYLANGID(GetSystemDefaultLangID()) != JAPANESE) return;
    page_font = CreateFontA(JAPANESE_FONT_HEIGHT, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, VARIABLE_PITCH, "Terminal");
    for (int id : japanese_font_controls) SendDlgItemMessageA(page, id, WM_SETFONT, (WPARAM)page_font, TRUE);
}

static void InitPage(HWND page, LPARAM lparam)
{
    SetWindowLongPtrA(page, DWLP_USER, lparam);
    UseJapaneseFont(page);
    uint32_t lowest = chip_get_mclk_min(), highest = chip_get_mclk_max();
    uint32_t current = chip_get_mclk();
    SetDlgItemInt(page, IDC_PERF_VALUE, current, FALSE);
    SendMessageA(Slider(page), TBM_SETRANGE, FALSE, MAKELPARAM(lowest & 0xFFFF, highest & 0xFFFF));
    SendMessageA(Slider(page), TBM_SETPOS, TRUE, (LPARAM)current);
    SetPageTexts(page, performance_texts, sizeof performance_texts / sizeof performance_texts[0]);
}

static void Slide(HWND page, WPARAM wparam)
{
    int current = (int)GetDlgItemInt(page, IDC_PERF_VALUE, NULL, FALSE);
    int lowest = (int)SendMessageA(Slider(page), TBM_GETRANGEMIN, 0, 0);
    int highest = (int)SendMessageA(Slider(page), TBM_GETRANGEMAX, 0, 0);
    int target = MemoryClockTarget(LOWORD(wparam), (int16_t)HIWORD(wparam), current, lowest, highest);
    if (target >= 0) ShowClock(page, (uint32_t)target);
}

static bool UserKeepsClock(HWND page)
{
    char text[PAGE_TEXT_SIZE], caption[TEXT_SIZE];
    LoadText("Confirm", "Do you want to keep this setting?", text, sizeof text);
    LoadText("MCLK", "Memory Clock Setting", caption, sizeof caption);
    return MessageBoxA(page, text, caption, MB_OKCANCEL | MB_ICONEXCLAMATION | MB_DEFBUTTON2) == IDOK;
}

// The new clock is stored only once the user has kept it: a clock that
// hangs the machine before the answer must not come back at the next start.
static void ApplyClock(HWND page)
{
    uint32_t old = chip_get_mclk();
    if (LoadSetting(SETTING_MCLK_DEFAULT) <= 0) SaveSetting(SETTING_MCLK_DEFAULT, (int32_t)old);
    uint32_t chosen = GetDlgItemInt(page, IDC_PERF_VALUE, NULL, FALSE);
    chip_set_mclk(chosen);
    ShowClock(page, chip_get_mclk());
    if (UserKeepsClock(page)) {
        SaveSetting(SETTING_MCLK, (int32_t)chosen);
        CurrentAdapter()->flags |= ADAPTER_INFO_STALE;
        return;
    }
    chip_set_mclk(old);
    SaveSetting(SETTING_MCLK, (int32_t)old);
    ShowClock(page, chip_get_mclk());
    InvalidateRect(NULL, NULL, TRUE);
}

static void RestoreDefaultClock(HWND page)
{
    int32_t card_default = LoadSetting(SETTING_MCLK_DEFAULT);
    if (card_default > 0) {
        chip_set_mclk((uint32_t)card_default);
        CurrentAdapter()->flags |= ADAPTER_INFO_STALE;
    }
    SaveSetting(SETTING_MCLK, 0);
    ShowClock(page, chip_get_mclk());
}

INT_PTR CALLBACK PerformancePageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam)
{
    AnimatePage(page, message, lparam, IDC_PERF_FRAME, &animation);
    switch (message) {
    case WM_INITDIALOG:
        InitPage(page, lparam);
        return TRUE;
    case WM_HSCROLL:
        if ((HWND)lparam == Slider(page)) Slide(page, wparam);
        return TRUE;
    case WM_COMMAND:
        if (HIWORD(wparam) != BN_CLICKED) return FALSE;
        if (LOWORD(wparam) == IDC_PERF_APPLY) ApplyClock(page);
        else if (LOWORD(wparam) == IDC_PERF_DEFAULT) RestoreDefaultClock(page);
        else return FALSE;
        return TRUE;
    case WM_DESTROY:
        CurrentAdapter()->flags &= ~(uint32_t)ADAPTER_INFO_STALE;
        if (page_font) DeleteObject(page_font);
        page_font = NULL;
        return FALSE;
    }
    return FALSE;
}
