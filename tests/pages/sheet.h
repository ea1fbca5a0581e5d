// The real property sheet, driven from inside its modal loop.
#ifndef VISTREL_TESTS_SHEET_H
#define VISTREL_TESTS_SHEET_H

#include <windows.h>

#include <functional>

// Opens the sheet on the requested page, runs inside once the sheet has
// settled, then cancels it; whether a sheet was shown and inside ran.
bool RunSheet(int requested_page, std::function<void(HWND sheet)> inside, HWND owner = NULL);
HWND Page(HWND sheet);
bool Enabled(HWND window, int id);
// Clicks a button of the current page.
void Click(HWND sheet, int id);
extern const int apply_button;
// Presses Apply and lets the sheet handle the press before it returns.
void Apply(HWND sheet);

#endif
