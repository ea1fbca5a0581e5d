// Opens the real property sheet and acts inside its modal loop.
#ifndef VISTREL_SHEET_DRIVER_H
#define VISTREL_SHEET_DRIVER_H

#include <windows.h>

#include <functional>
#include <string>
#include <vector>

typedef std::function<void(HWND sheet)> SheetStep;

// OpenPropertySheet on the requested page; each step runs once the sheet has
// handled everything posted before it. The sheet is cancelled after the last;
// a step the sheet did not live to see fails the test.
void RunSheet(int requested_page, const std::vector<SheetStep>& steps);

HWND CurrentPage(HWND sheet);
void PressSheetButton(HWND sheet, int button);  // PSBTN_*
bool ApplyEnabled(HWND sheet);
std::vector<std::string> TabTitles(HWND sheet);
std::string ControlText(HWND page, int id);
// The lines of a list box.
std::vector<std::string> ListLines(HWND list);

#endif
