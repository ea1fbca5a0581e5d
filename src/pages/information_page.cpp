// The Information page: the system, this program and the card.
#include "base/resource_ids.h"
#include "pages/pages.h"
#include "pages/property_sheet.h"

enum { TEXT_SIZE = 100 };

static HWND animation;

// The system and version lines stay empty until the page reads them.
static const PageText information_texts[] = {
    {IDC_INFO_AUTORUN, "Autorun", "Run this program each time Windows starts.", TEXT_SIZE},
    {IDC_INFO_SYSTEM, NULL, NULL, 0},
    {IDC_INFO_VERSION, NULL, NULL, 0},
};

INT_PTR CALLBACK InformationPageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam)
{
    AnimatePage(page, message, lparam, IDC_INFO_FRAME, &animation);
    if (message != WM_INITDIALOG) return FALSE;
    SetPageTexts(page, information_texts, sizeof information_texts / sizeof information_texts[0]);
    // Nothing writes the start-up entry yet: a box that seems to would mislead.
    EnableWindow(GetDlgItem(page, IDC_INFO_AUTORUN), FALSE);
    return TRUE;
}
