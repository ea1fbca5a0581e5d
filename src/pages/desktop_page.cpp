// The Desktop page: resolution, colour depth, font size and refresh rate.
#include "base/resource_ids.h"
#include "pages/pages.h"
#include "pages/property_sheet.h"

enum { TEXT_SIZE = 50 };

static HWND animation;

// The labels and the driver line stay empty until the page knows the mode.
static const PageText desktop_texts[] = {
    {IDC_DESKTOP_RES_GROUP, "ResGrp", "Resolution", TEXT_SIZE},
    {IDC_DESKTOP_COLOUR_GROUP, "ColorGrp", "Color", TEXT_SIZE},
    {IDC_DESKTOP_FONT_GROUP, "FontGrp", "Font Size", TEXT_SIZE},
    {IDC_DESKTOP_REFRESH_GROUP, "RefreshGrp", "Refresh Rate", TEXT_SIZE},
    {IDC_DESKTOP_RES_LABEL, NULL, NULL, 0},
    {IDC_DESKTOP_COLOUR_LABEL, NULL, NULL, 0},
    {IDC_DESKTOP_FONT_LABEL, NULL, NULL, 0},
    {IDC_DESKTOP_REFRESH_LABEL, NULL, NULL, 0},
    {IDC_DESKTOP_TITLE, NULL, NULL, 0},
};

// Until the page holds the mode table, no slider may look as if it could change the mode.
static const int mode_sliders[] = {IDC_DESKTOP_RES_SLIDER, IDC_DESKTOP_COLOUR_SLIDER, IDC_DESKTOP_FONT_SLIDER,
                                   IDC_DESKTOP_REFRESH_SLIDER};

INT_PTR CALLBACK DesktopPageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam)
{
    AnimatePage(page, message, lparam, IDC_DESKTOP_FRAME, &animation);
    if (message != WM_INITDIALOG) return FALSE;
    SetPageTexts(page, desktop_texts, sizeof desktop_texts / sizeof desktop_texts[0]);
    for (int id : mode_sliders) EnableWindow(GetDlgItem(page, id), FALSE);
    return TRUE;
}
