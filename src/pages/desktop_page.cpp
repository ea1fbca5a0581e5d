// The Desktop page: resolution, colour depth, font size and refresh rate.
#include "pages/desktop_page.h"

#include <commctrl.h>
#include <prsht.h>

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/resource_ids.h"
#include "base/runtime.h"
#include "base/state.h"
#include "base/texts.h"
#include "hardware/driver_key.h"
#include "modes/mode_list.h"
#include "pages/desktop_apply.h"
#include "pages/desktop_steps.h"
#include "pages/pages.h"
#include "pages/property_sheet.h"

enum { TEXT_SIZE = 50, COLOUR_TEXT_SIZE = 40, INTERLACE_TEXT_SIZE = 30, LABEL_SIZE = 64, RATE_STEP_DOWN = 10 };

struct Slider {
    int position, maximum;
};

static HWND animation;
static DesktopSelection selection;
static Slider resolution, colour, refresh;

static void ResetDesktopPage()
{
    animation = NULL;
    selection = {};
    resolution = colour = refresh = {};
}
VISTREL_MODULE_RESET(ResetDesktopPage);

// The labels stay empty until the page knows the mode.
static const PageText desktop_texts[] = {
    {IDC_DESKTOP_RES_GROUP, "ResGrp", "Resolution", TEXT_SIZE},
    {IDC_DESKTOP_COLOUR_GROUP, "ColorGrp", "Color", TEXT_SIZE},
    {IDC_DESKTOP_FONT_GROUP, "FontGrp", "Font Size", TEXT_SIZE},
    {IDC_DESKTOP_REFRESH_GROUP, "RefreshGrp", "Refresh Rate", TEXT_SIZE},
    {IDC_DESKTOP_RES_LABEL, NULL, NULL, 0},
    {IDC_DESKTOP_COLOUR_LABEL, NULL, NULL, 0},
    {IDC_DESKTOP_FONT_LABEL, NULL, NULL, 0},
    {IDC_DESKTOP_REFRESH_LABEL, NULL, NULL, 0},
};

struct ColourText {
    int bits;
    const char* key;
    const char* fallback;
};
static const ColourText colour_texts[] = {
    {.bits = 8, .key = "Color8", .fallback = "256 Color (8 bit)"},
    {.bits = 15, .key = "Color15", .fallback = "High Color (15 bit)"},
    {.bits = 16, .key = "Color16", .fallback = "High Color (16 bit)"},
    {.bits = 24, .key = "Color24", .fallback = "True Color (24 bit)"},
    {.bits = 32, .key = "Color32", .fallback = "True Color (32 bit)"},
};

// The entries of the mode table alike to the selection: in depth for the
// resolution slider, in size for the colour slider.
static bool Alike(const ModeEntry* e, bool by_depth)
{
    if (by_depth) return e->bits_per_pixel == selection.bits;
    return e->width == selection.width && e->height == selection.height;
}

static bool Selected(const ModeEntry* e) { return Alike(e, true) && Alike(e, false); }

static int TableSize()
{
    int n = 0;
    while (mode_table && n < MODE_TABLE_SIZE && mode_table[n].bits_per_pixel) ++n;
    return n;
}

// The n-th alike entry, or NULL.
static const ModeEntry* AlikeEntry(bool by_depth, int n)
{
    for (int i = 0, size = TableSize(); i < size; ++i)
        if (Alike(&mode_table[i], by_depth) && n-- == 0) return &mode_table[i];
    return NULL;
}

static const ModeEntry* SelectedEntry()
{
    for (int i = 0, size = TableSize(); i < size; ++i)
        if (Selected(&mode_table[i])) return &mode_table[i];
    return NULL;
}

static void MoveSlider(HWND page, int id, int position)
{
    SendDlgItemMessageA(page, id, TBM_SETPOS, TRUE, position);
}

static void SetSlider(HWND page, int id, const Slider& slider)
{
    SendDlgItemMessageA(page, id, TBM_SETRANGE, TRUE, MAKELPARAM(0, slider.maximum));
    MoveSlider(page, id, slider.position);
}

// The range of the alike entries and the selected mode's place among them.
static void SetupAlikeSlider(HWND page, int id, Slider* slider, bool by_depth)
{
    int count = 0;
    slider->position = 0;
    for (int i = 0, size = TableSize(); i < size; ++i) {
        if (!Alike(&mode_table[i], by_depth)) continue;
        if (Selected(&mode_table[i])) slider->position = count;
        ++count;
    }
    slider->maximum = count ? count - 1 : 0;
    SetSlider(page, id, *slider);
}

static void ShowResolution(HWND page)
{
    char text[LABEL_SIZE];
    FormatText(text, sizeof text, "%4d x %d", selection.width, selection.height);
    SetDlgItemTextA(page, IDC_DESKTOP_RES_LABEL, text);
}

// A depth without a text of its own shows none rather than another's.
static void ShowColour(HWND page)
{
    char text[COLOUR_TEXT_SIZE] = "";
    for (const ColourText& c : colour_texts)
        if (c.bits == selection.bits) LoadText(c.key, c.fallback, text, sizeof text);
    SetDlgItemTextA(page, IDC_DESKTOP_COLOUR_LABEL, text);
}

static void ShowFont(HWND page)
{
    char text[LABEL_SIZE];
    int dpi = selection.dpi_x;
    FormatText(text, sizeof text, "%ddpi%s", dpi,
               dpi == SMALL_FONT_DPI ? " (Small Fonts)" : dpi == LARGE_FONT_DPI ? " (Large Fonts)" : "");
    SetDlgItemTextA(page, IDC_DESKTOP_FONT_LABEL, text);
}

static void ShowRefresh(HWND page)
{
    char text[LABEL_SIZE];
    if (selection.refresh < 1) CopyText(text, sizeof text, "BIOS Default");
    else if (selection.refresh < 50) LoadText("Interlace", "Interlace", text, INTERLACE_TEXT_SIZE);
    else FormatText(text, sizeof text, "%d Hz", selection.refresh);
    SetDlgItemTextA(page, IDC_DESKTOP_REFRESH_LABEL, text);
}

static void SetupRefreshSlider(HWND page, int wanted)
{
    const ModeEntry* e = SelectedEntry();
    refresh = {};
    selection.refresh = e ? ChooseRefresh(e->rates, MODE_RATES, wanted, &refresh.position, &refresh.maximum) : 0;
    SetSlider(page, IDC_DESKTOP_REFRESH_SLIDER, refresh);
    ShowRefresh(page);
}

void SetupDesktopSliders(HWND page)
{
    SetupAlikeSlider(page, IDC_DESKTOP_RES_SLIDER, &resolution, true);
    ShowResolution(page);
    SetupAlikeSlider(page, IDC_DESKTOP_COLOUR_SLIDER, &colour, false);
    ShowColour(page);
    SendDlgItemMessageA(page, IDC_DESKTOP_FONT_SLIDER, TBM_SETRANGE, TRUE, MAKELPARAM(FONT_DPI_MIN, FONT_DPI_MAX));
    MoveSlider(page, IDC_DESKTOP_FONT_SLIDER, selection.dpi_x);
    ShowFont(page);
    SetupRefreshSlider(page, selection.refresh);
}

static int ClampDpi(int dpi) { return dpi < FONT_DPI_MIN ? FONT_DPI_MIN : dpi > FONT_DPI_MAX ? FONT_DPI_MAX : dpi; }

static void ScreenDpi(HWND page, int* x, int* y)
{
    HDC dc = GetDC(page);
    *x = GetDeviceCaps(dc, LOGPIXELSX);
    *y = GetDeviceCaps(dc, LOGPIXELSY);
    ReleaseDC(page, dc);
}

static void ShowDriverTitle(HWND page)
{
    // The driver key's value may come without its terminator.
    char title[PAGE_TEXT_SIZE + 1] = {};
    const char* name = platform == PLATFORM_NT ? "Device Description" : "DriverDesc";
    if (DriverKeyValue("", name, title, PAGE_TEXT_SIZE, REG_SZ, 1) != 1)
        LoadSetupText("product", "Vistrel", title, PAGE_TEXT_SIZE);
    SetDlgItemTextA(page, IDC_DESKTOP_TITLE, title);
}

static void InitDesktopPage(HWND page)
{
    SetPageTexts(page, desktop_texts, sizeof desktop_texts / sizeof desktop_texts[0]);
    ShowDriverTitle(page);
    HCURSOR before = SetCursor(LoadCursorA(NULL, (LPCSTR)IDC_WAIT));
    const AdapterRecord* a = CurrentAdapter();
    int dpi_x, dpi_y;
    ScreenDpi(page, &dpi_x, &dpi_y);
    selection = {.width = a->width, .height = a->height, .bits = a->bits_per_pixel, .dpi_x = ClampDpi(dpi_x),
                 .dpi_y = ClampDpi(dpi_y), .refresh = a->refresh_hz};
    int include_15bit = 1;
    if (platform == PLATFORM_NT) {
        int bits = NtDefaultBits();
        include_15bit = bits != 0;
        if (bits == 15 && selection.bits == 16) selection.bits = 15;
    }
    BuildModeTable(include_15bit);
    SetupDesktopSliders(page);
    SetCursor(before);
}

static void OnResolution(HWND page, int code, int thumb)
{
    int target = SliderTarget(code, thumb, resolution.position, resolution.maximum, true);
    if (target < 0) return;
    int delta = target - resolution.position;
    resolution.position = target;
    MoveSlider(page, IDC_DESKTOP_RES_SLIDER, target);
    if (const ModeEntry* e = AlikeEntry(true, target)) {
        selection.width = e->width;
        selection.height = e->height;
    }
    ShowResolution(page);
    if (code == TB_THUMBTRACK) return;
    SetupAlikeSlider(page, IDC_DESKTOP_COLOUR_SLIDER, &colour, false);
    int screen_x, screen_y;
    ScreenDpi(page, &screen_x, &screen_y);
    if (FollowScreenFont(selection.height, screen_x, screen_y, &selection.dpi_x, &selection.dpi_y)) {
        MoveSlider(page, IDC_DESKTOP_FONT_SLIDER, selection.dpi_x);
        ShowFont(page);
    }
    if (delta > 0) selection.refresh -= RATE_STEP_DOWN;
    SetupRefreshSlider(page, selection.refresh);
}

static void OnColour(HWND page, int code, int thumb)
{
    int target = SliderTarget(code, thumb, colour.position, colour.maximum, true);
    if (target < 0) return;
    colour.position = target;
    MoveSlider(page, IDC_DESKTOP_COLOUR_SLIDER, target);
    if (const ModeEntry* e = AlikeEntry(false, target)) selection.bits = e->bits_per_pixel;
    ShowColour(page);
    if (code == TB_THUMBTRACK) return;
    SetupAlikeSlider(page, IDC_DESKTOP_RES_SLIDER, &resolution, true);
    SetupRefreshSlider(page, selection.refresh);
}

static void OnFont(HWND page, int code, int thumb)
{
    int target = FontTarget(code, thumb, selection.dpi_x);
    if (target < 0) return;
    selection.dpi_x = selection.dpi_y = target;
    MoveSlider(page, IDC_DESKTOP_FONT_SLIDER, target);
    ShowFont(page);
}

static void OnRefresh(HWND page, int code, int thumb)
{
    int target = SliderTarget(code, thumb, refresh.position, refresh.maximum, false);
    if (target < 0) return;
    refresh.position = target;
    MoveSlider(page, IDC_DESKTOP_REFRESH_SLIDER, target);
    const ModeEntry* e = SelectedEntry();
    selection.refresh = e ? e->rates[target] : 0;
    ShowRefresh(page);
}

static void OnSlider(HWND page, HWND slider, int code, int thumb)
{
    if (slider == GetDlgItem(page, IDC_DESKTOP_RES_SLIDER)) OnResolution(page, code, thumb);
    else if (slider == GetDlgItem(page, IDC_DESKTOP_COLOUR_SLIDER)) OnColour(page, code, thumb);
    else if (slider == GetDlgItem(page, IDC_DESKTOP_FONT_SLIDER)) OnFont(page, code, thumb);
    else if (slider == GetDlgItem(page, IDC_DESKTOP_REFRESH_SLIDER)) OnRefresh(page, code, thumb);
}

INT_PTR CALLBACK DesktopPageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam)
{
    AnimatePage(page, message, lparam, IDC_DESKTOP_FRAME, &animation);
    switch (message) {
    case WM_INITDIALOG: InitDesktopPage(page); return TRUE;
    case WM_HSCROLL:
        OnSlider(page, (HWND)lparam, LOWORD(wparam), HIWORD(wparam));
        PropSheet_Changed(GetParent(page), page);
        return TRUE;
    case WM_COMMAND: return TRUE;
    case WM_NOTIFY:
        if (((const NMHDR*)lparam)->code == (UINT)PSN_APPLY) {
            DesktopSelection asked = selection;
            ApplyDesktopPage(page, &selection);
            // A refused mode came back: the sliders show it again.
            if (memcmp(&asked, &selection, sizeof asked) != 0) SetupDesktopSliders(page);
            PropSheet_UnChanged(GetParent(page), page);
            SetWindowLongPtrA(page, DWLP_MSGRESULT, PSNRET_NOERROR);
        }
        return TRUE;
    case WM_DESTROY: FreeModeTable(); return TRUE;
    }
    return FALSE;
}
