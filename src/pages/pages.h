// The four page procedures the property sheet puts together, and what they
// share.
#ifndef VISTREL_PAGES_H
#define VISTREL_PAGES_H

#include <windows.h>

INT_PTR CALLBACK DesktopPageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam);
INT_PTR CALLBACK InformationPageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam);
INT_PTR CALLBACK MonitorPageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam);
INT_PTR CALLBACK PerformancePageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam);

// A control's text from the text file, read into size characters (at most
// PAGE_TEXT_SIZE); a fallback of NULL empties a placeholder of the template.
struct PageText {
    int control;
    const char* key;
    const char* fallback;
    int size;
};
enum { PAGE_TEXT_SIZE = 100 };
void SetPageTexts(HWND page, const PageText* texts, int count);

#endif
