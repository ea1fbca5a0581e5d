// The tray icon's popup menu: owner-drawn entries, each with an icon and a
// text of its own, offered as the chips answer.
#ifndef VISTREL_TRAY_MENU_H
#define VISTREL_TRAY_MENU_H

#include <windows.h>

// The command ids the menu and other processes send the main window.
enum MenuCommand {
    MENU_DISPLAY_PROPERTIES = 201,  // the system's display applet, settings tab
    MENU_DIRECTX_INFO = 202,
    MENU_PANNING = 203,             // no menu entry
    MENU_DISPLAY_TAB_0 = 204,       // 204..206: the display applet on tabs 0..2
    MENU_MINIMIZE = 207,
    MENU_READ_208 = 208,            // no menu entry
    MENU_CLOSE = 209,
    MENU_ZOOM = 210,
    MENU_STANDBY = 211,
    MENU_SUSPEND = 212,
    MENU_SHUTOFF = 213,
    // 220 + 4 * adapter + page (PAGE_DESKTOP ... PAGE_PERFORMANCE).
    MENU_FIRST_PAGE = 220,
    MENU_LAST_PAGE = 244,
    MENU_PAGES_PER_ADAPTER = 4,
};

enum {
    MENU_TEXT_SIZE = 52,
    MENU_RECORD_COUNT = 30,
    MENU_ICON_SIZE = 32,
};

// What an owner-drawn entry shows; its address is the entry's item data.
struct MenuItemRecord {
    char text[MENU_TEXT_SIZE];
    HICON icon;
};

// Builds the popup menu (again), asking every adapter's chip what to offer.
void BuildTrayMenu();
// Destroys the popup, its submenus and the entries' icons.
void DestroyTrayMenu();
// The popup menu; NULL before it is built.
HMENU TrayMenu();
// One of the submenus: the power-saving states, or an adapter's pages on a
// Windows 98 with several; NULL when the menu has none.
HMENU PowerMenu();
HMENU AdapterMenu(int adapter);

// The record behind an item's data, or NULL when the data is none of the
// records in use (any process can send the messages that carry it).
const MenuItemRecord* MenuRecordOf(ULONG_PTR item_data);
// The record of the entry with this command id, or NULL when there is none.
const MenuItemRecord* MenuRecordOfCommand(UINT command);

// WM_MEASUREITEM and WM_DRAWITEM of the main window.
void MeasureMenuItem(MEASUREITEMSTRUCT* item);
void DrawMenuItem(const DRAWITEMSTRUCT* item);

#endif
