#include "shell/tray_menu.h"

#include <stddef.h>

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/resource_ids.h"
#include "base/runtime.h"
#include "base/state.h"
#include "base/texts.h"
#include "chips/chips.h"
#include "pages/property_sheet.h"

// Windows 95 and NT 4.0 know the item information without hbmpItem.
static const UINT menu_item_info_size = offsetof(MENUITEMINFOA, hbmpItem);
#if defined(__i386__)
static_assert(offsetof(MENUITEMINFOA, hbmpItem) == 44, "the 44-byte MENUITEMINFOA");
#endif

// Entries that fit in the records besides the power-saving entry and the
// five fixed ones, which every menu keeps.
static const int adapter_records = MENU_RECORD_COUNT - 6;

enum {
    ENTRY_TEXT_SIZE = 50,
    ADAPTER_TEXT_SIZE = 20,
    ADAPTER_KEY_SIZE = 12,
    TEXT_MARGIN = 39,  // icon, its margin and a gap
    ICON_MARGIN = 2,
    ITEM_PADDING = 4,
};

struct MenuEntry {
    UINT command;
    const char* key;
    const char* fallback;
    int icon;
};

// The Performance entry in an adapter's submenu.
static const MenuEntry adapter_performance_entry = {
    .command = 223, .key = "MenuMem", .fallback = "Performance Adjustment", .icon = IDI_PERFORMANCE_PAGE};

static const MenuEntry power_group_entry = {.command = 0, .key = "PowerGrp", .fallback = "Power Saving", .icon = IDI_POWER};
// Plain string entries of the power-saving submenu.
static const MenuEntry power_entries[] = {
    {.command = MENU_STANDBY, .key = "DPMSStandby", .fallback = "Stand By", .icon = 0},
    {.command = MENU_SUSPEND, .key = "DPMSSuspend", .fallback = "Suspend", .icon = 0},
    {.command = MENU_SHUTOFF, .key = "DPMSShutoff", .fallback = "Shutoff", .icon = 0},
};

static const MenuEntry fixed_entries[] = {
    {.command = MENU_DISPLAY_PROPERTIES, .key = "MENUH", .fallback = "Display Properties", .icon = IDI_DISPLAY_PROPERTIES},
    {.command = MENU_DIRECTX_INFO, .key = "MENUD", .fallback = "DirectX Info", .icon = IDI_DIRECTX},
    {.command = MENU_ZOOM, .key = "MENUE", .fallback = "Zoom In", .icon = IDI_ZOOM},
    {.command = MENU_MINIMIZE, .key = "MENUF", .fallback = "Minimize", .icon = IDI_MINIMIZE},
    {.command = MENU_CLOSE, .key = "MENUG", .fallback = "Close", .icon = IDI_CLOSE},
};
static_assert(MENU_RECORD_COUNT - adapter_records == 1 + sizeof fixed_entries / sizeof fixed_entries[0],
              "the entries every menu keeps");

static HMENU popup_menu, power_menu, adapter_menus[MAX_ADAPTERS];
static MenuItemRecord records[MENU_RECORD_COUNT];
static int records_used;

HMENU TrayMenu() { return popup_menu; }
HMENU PowerMenu() { return power_menu; }
HMENU AdapterMenu(int adapter) { return adapter >= 0 && adapter < MAX_ADAPTERS ? adapter_menus[adapter] : NULL; }

void DestroyTrayMenu()
{
    for (HMENU& menu : adapter_menus) {
        if (menu) DestroyMenu(menu);
        menu = NULL;
    }
    if (power_menu) DestroyMenu(power_menu);
    if (popup_menu) DestroyMenu(popup_menu);
    power_menu = popup_menu = NULL;
    for (int i = 0; i < records_used; ++i)
        if (records[i].icon) DestroyIcon(records[i].icon);
    records_used = 0;
}
VISTREL_MODULE_RESET(DestroyTrayMenu);

// The next record, with its text and icon; NULL when the table is full.
static MenuItemRecord* NewRecord(const char* key, const char* fallback, int text_size, int icon)
{
    if (records_used >= MENU_RECORD_COUNT) return NULL;
    MenuItemRecord* record = &records[records_used++];
    LoadText(key, fallback, record->text, text_size);
    // A copy of its own, not the shared one, so that it can be destroyed with the menu.
    record->icon = (HICON)LoadImageA(instance, MAKEINTRESOURCEA(icon), IMAGE_ICON, MENU_ICON_SIZE, MENU_ICON_SIZE, 0);
    return record;
}

static void AppendOwnerDrawn(HMENU menu, UINT flags, UINT_PTR id, const char* key, const char* fallback, int text_size,
                             int icon)
{
    MenuItemRecord* record = NewRecord(key, fallback, text_size, icon);
    if (record) AppendMenuA(menu, flags | MF_OWNERDRAW, id, (LPCSTR)record);
}

static int CountBits(unsigned bits)
{
    int count = 0;
    for (; bits; bits &= bits - 1) ++count;
    return count;
}

static UINT PageCommand(int adapter, int page)
{
    return (UINT)(MENU_FIRST_PAGE + page + MENU_PAGES_PER_ADAPTER * adapter);
}

// The pages of the adapter at current_adapter that get an entry: those its
// chip allows whose command the command handler knows.
static unsigned OfferedPages(int adapter)
{
    unsigned offered = IncludedPages();
    for (int page = 0; page < MENU_PAGES_PER_ADAPTER; ++page)
        if (PageCommand(adapter, page) > MENU_LAST_PAGE) offered &= ~(1u << page);
    return offered;
}

static void AppendPageEntries(HMENU menu, int adapter, unsigned offered, bool in_adapter_menu)
{
    for (int page = 0; page < MENU_PAGES_PER_ADAPTER; ++page) {
        if (!(offered >> page & 1)) continue;
        const PageLabel* label = PageLabelOf(page);
        MenuEntry entry = {.command = 0, .key = label->key, .fallback = label->fallback, .icon = label->icon};
        if (in_adapter_menu && page == PAGE_PERFORMANCE) entry = adapter_performance_entry;
        AppendOwnerDrawn(menu, MF_STRING, PageCommand(adapter, page), entry.key, entry.fallback, ENTRY_TEXT_SIZE, entry.icon);
    }
}

// One submenu per adapter, in table order, as long as the records hold its
// entries and it has page commands: up to four adapters always fit, more
// when their chips hide pages, and never more than seven.
static void AppendAdapterMenus()
{
    int16_t saved = current_adapter;
    for (int16_t i = 0; i < adapter_count && PageCommand(i, 0) <= MENU_LAST_PAGE; ++i) {
        current_adapter = i;
        unsigned offered = OfferedPages(i);
        if (records_used + 1 + CountBits(offered) > adapter_records) break;
        adapter_menus[i] = CreatePopupMenu();
        AppendPageEntries(adapter_menus[i], i, offered, true);
        char key[ADAPTER_KEY_SIZE];
        FormatText(key, sizeof key, "%s%d", "VGA", adapter_table[i].display_index + 1);
        AppendOwnerDrawn(popup_menu, MF_POPUP, (UINT_PTR)adapter_menus[i], key, key, ADAPTER_TEXT_SIZE, IDI_ADAPTER);
    }
    current_adapter = saved;
}

static void AppendPowerMenu()
{
    power_menu = CreatePopupMenu();
    char text[ENTRY_TEXT_SIZE];
    for (const MenuEntry& entry : power_entries) {
        LoadText(entry.key, entry.fallback, text, sizeof text);
        AppendMenuA(power_menu, MF_STRING, entry.command, text);
    }
    const MenuEntry& group = power_group_entry;
    AppendOwnerDrawn(popup_menu, MF_POPUP, (UINT_PTR)power_menu, group.key, group.fallback, ENTRY_TEXT_SIZE, group.icon);
}

void BuildTrayMenu()
{
    DestroyTrayMenu();
    popup_menu = CreatePopupMenu();
    if (IsWindows98() && adapter_count >= 2) {
        AppendAdapterMenus();
    } else if (adapter_count > 0) {
        // Commands carry the adapter they were offered for.
        AppendPageEntries(popup_menu, current_adapter, OfferedPages(current_adapter), false);
    }
    if (any_chip_has_dpms()) AppendPowerMenu();
    for (const MenuEntry& entry : fixed_entries)
        AppendOwnerDrawn(popup_menu, MF_STRING, entry.command, entry.key, entry.fallback, ENTRY_TEXT_SIZE, entry.icon);
}

const MenuItemRecord* MenuRecordOf(ULONG_PTR item_data)
{
    for (int i = 0; i < records_used; ++i)
        if (item_data == (ULONG_PTR)&records[i]) return &records[i];
    return NULL;
}

const MenuItemRecord* MenuRecordOfCommand(UINT command)
{
    if (!popup_menu) return NULL;
    MENUITEMINFOA info;
    memset(&info, 0, sizeof info);
    info.cbSize = menu_item_info_size;
    info.fMask = MIIM_DATA;
    if (!GetMenuItemInfoA(popup_menu, command, FALSE, &info)) return NULL;
    return MenuRecordOf(info.dwItemData);
}

static SIZE TextSize(HDC dc, const char* text)
{
    SIZE size = {0, 0};
    GetTextExtentExPointA(dc, text, (int)TextLength(text), 0, NULL, NULL, &size);
    return size;
}

void MeasureMenuItem(MEASUREITEMSTRUCT* item)
{
    const MenuItemRecord* record = item->CtlType == ODT_MENU ? MenuRecordOf(item->itemData) : NULL;
    if (!record) return;
    HDC screen = GetDC(NULL);
    SIZE text = TextSize(screen, record->text);
    ReleaseDC(NULL, screen);
    item->itemWidth = (UINT)(text.cx + TEXT_MARGIN);
    int height = text.cy > (int)MENU_ICON_SIZE ? text.cy : (int)MENU_ICON_SIZE;
    item->itemHeight = (UINT)(height + ITEM_PADDING);
}

void DrawMenuItem(const DRAWITEMSTRUCT* item)
{
    const MenuItemRecord* record = item->CtlType == ODT_MENU ? MenuRecordOf(item->itemData) : NULL;
    if (!record) return;
    HDC dc = item->hDC;
    RECT r = item->rcItem;
    int height = r.bottom - r.top;
    SIZE text = TextSize(dc, record->text);

    bool lit = item->itemAction != ODA_DRAWENTIRE && (item->itemState & (ODS_SELECTED | ODS_FOCUS));
    HBRUSH brush = CreateSolidBrush(GetSysColor(lit ? COLOR_ACTIVECAPTION : COLOR_MENU));
    HGDIOBJ old_brush = SelectObject(dc, brush);
    PatBlt(dc, r.left, r.top, r.right - r.left, height, PATCOPY);
    SelectObject(dc, old_brush);
    DeleteObject(brush);
    SetTextColor(dc, GetSysColor(lit ? COLOR_HIGHLIGHTTEXT : COLOR_MENUTEXT));

    if (record->icon) DrawIcon(dc, r.left + ICON_MARGIN, r.top + (height - MENU_ICON_SIZE) / 2, record->icon);
    SetBkMode(dc, TRANSPARENT);
    TextOutA(dc, r.left + TEXT_MARGIN, r.top + (height - text.cy) / 2, record->text, (int)TextLength(record->text));
}
