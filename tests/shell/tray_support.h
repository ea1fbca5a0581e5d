// What the tray and command tests share: a stand-in main window, a chip
// family of the test's own, the menu as text, and the count of GDI objects.
#ifndef VISTREL_TEST_TRAY_SUPPORT_H
#define VISTREL_TEST_TRAY_SUPPORT_H

#include <windows.h>

#include <functional>
#include <string>
#include <vector>

// A visible 1 x 1 tool window whose messages go to the main window's
// procedure, except creation and destruction (which would run the whole
// start-up). on_menu_shown runs once per opened menu, when it first waits
// for input, with the menu's window; on_app_message with every WM_APP.
HWND CreateStandIn();
void DestroyStandIn(HWND window);
extern std::function<void(HWND menu_window)> on_menu_shown;
extern std::function<void()> on_app_message;

// The wrappers dispatch through a family that answers these three questions
// itself (bit n of hidden_pages hides page n) and passes every other command
// to the adapter's own family.
void UseTestFamily(unsigned hidden_pages, uint32_t mclk_max, uint32_t has_dpms);

// A menu as text: owner-drawn entries as "id text" (text from their record,
// which must have an icon), plain ones as "id 'text'", submenus as
// "text[entries]", separated by "|".
std::string MenuText(HMENU menu);

// The process's live GDI objects. Wine's GetGuiResources answers 0, so the
// handle table is walked: a handle value whose high word is 0 names the
// object at that index whatever its generation.
int CountGdiObjects();

#endif
