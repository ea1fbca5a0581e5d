// The Performance page: the graphics memory clock.
#include "base/resource_ids.h"
#include "pages/pages.h"
#include "pages/property_sheet.h"

enum { TEXT_SIZE = 50, WARNING_SIZE = 100 };

static HWND animation;

static const PageText performance_texts[] = {
    {IDC_PERF_GROUP, "MCLK", "Memory Clock Setting", TEXT_SIZE},
    {IDC_PERF_DEFAULT, "DefaultBtn", "Default", TEXT_SIZE},
    {IDC_PERF_APPLY, "APPLY", "Apply", TEXT_SIZE},
    {IDC_PERF_WARNING, "MCLKWARN", "Warning : Change this value will affect the stability of VGA card.", WARNING_SIZE},
    {IDC_PERF_VALUE, NULL, NULL, 0},
};

// Until the page reads the clock, nothing on it may look as if it could change it.
static const int clock_controls[] = {IDC_PERF_SLIDER, IDC_PERF_DEFAULT, IDC_PERF_APPLY};

INT_PTR CALLBACK PerformancePageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam)
{
    AnimatePage(page, message, lparam, IDC_PERF_FRAME, &animation);
    if (message != WM_INITDIALOG) return FALSE;
    SetPageTexts(page, performance_texts, sizeof performance_texts / sizeof performance_texts[0]);
    for (int id : clock_controls) EnableWindow(GetDlgItem(page, id), FALSE);
    return TRUE;
}
