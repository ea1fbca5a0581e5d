// The sheet of one adapter's pages, and the animation in each page's corner.
#include "pages/property_sheet.h"

#include <commctrl.h>
#include <prsht.h>
#include <stddef.h>

#include "base/resource_ids.h"
#include "base/runtime.h"
#include "base/state.h"
#include "base/texts.h"
#include "chips/chips.h"
#include "pages/pages.h"

// Windows 95 and NT 4.0 know only the first form of both structures
// (PROPSHEETPAGEA_V1_SIZE, PROPSHEETHEADERA_V1_SIZE); the sheet steps
// through the pages by their size.
static_assert(sizeof(PROPSHEETPAGEA_V1) == offsetof(PROPSHEETPAGEA, pcRefParent) + sizeof(UINT*), "pages side by side");
#if defined(__i386__)
static_assert(sizeof(PROPSHEETPAGEA_V1) == 40, "the 40-byte PROPSHEETPAGEA");
static_assert(offsetof(PROPSHEETHEADERA, pfnCallback) + sizeof(PFNPROPSHEETCALLBACK) == 40,
              "the 40-byte PROPSHEETHEADERA");
#endif

enum {
    PAGE_COUNT = 4,
    TITLE_SIZE = 30,
    CAPTION_SIZE = 100,
    ANIMATION_NAME_SIZE = 40,
    PROGRAM_PATH_SIZE = 160,
};

// In sheet order, by page number; the tray menu names its page entries alike.
static const PageLabel page_labels[PAGE_COUNT] = {
    {.icon = IDI_DESKTOP_PAGE, .key = "MenuA", .fallback = "Desktop"},
    {.icon = IDI_INFORMATION_PAGE, .key = "MenuB", .fallback = "Information"},
    {.icon = IDI_MONITOR_PAGE, .key = "MenuC", .fallback = "Monitor"},
    {.icon = IDI_PERFORMANCE_PAGE, .key = "MenuSpeed", .fallback = "Performance"},
};
static const DLGPROC page_procedures[PAGE_COUNT] = {DesktopPageProc, InformationPageProc, MonitorPageProc,
                                                    PerformancePageProc};

const PageLabel* PageLabelOf(int page) { return &page_labels[page]; }

// The sheet keeps pointers to the titles.
static char page_titles[PAGE_COUNT][TITLE_SIZE];

static bool PageIncluded(int page)
{
    if (page == PAGE_PERFORMANCE) return chip_get_mclk_max() != 0;
    return chip_hide_page((uint32_t)page) == 0;
}

unsigned IncludedPages()
{
    unsigned included = 0;
    for (int page = 0; page < PAGE_COUNT; ++page)
        if (PageIncluded(page)) included |= 1u << page;
    return included;
}

int StartPosition(unsigned included, int requested_page)
{
    int before = 0;
    for (int page = 0; page < requested_page && page < PAGE_COUNT; ++page) before += (included >> page) & 1;
    if (requested_page >= 0 && requested_page < PAGE_COUNT && (included >> requested_page) & 1) return before;
    return before > 0 ? before - 1 : 0;
}

// The sheet takes copies of the icons it is handed; what it loads itself
// from icon ids it never frees, so every opening would keep them.
static HICON SmallIcon(HINSTANCE inst, int id)
{
    return (HICON)LoadImageA(inst, MAKEINTRESOURCEA(id), IMAGE_ICON, GetSystemMetrics(SM_CXSMICON),
                             GetSystemMetrics(SM_CYSMICON), 0);
}

void OpenPropertySheet(HINSTANCE inst, HWND owner, int requested_page)
{
    char caption[CAPTION_SIZE];
    LoadText("CAPTION", "Vistrel", caption, sizeof caption);

    PROPSHEETPAGEA_V1 pages[PAGE_COUNT];
    HICON icons[PAGE_COUNT + 1] = {};  // the pages' and the sheet's
    unsigned included = 0;
    int count = 0;
    for (int page = 0; page < PAGE_COUNT; ++page) {
        if (!PageIncluded(page)) continue;
        included |= 1u << page;
        const PageLabel& label = page_labels[page];
        LoadText(label.key, label.fallback, page_titles[page], TITLE_SIZE);
        PROPSHEETPAGEA_V1& p = pages[count++];
        memset(&p, 0, sizeof p);
        p.dwSize = PROPSHEETPAGEA_V1_SIZE;
        p.hInstance = inst;
        p.pszTemplate = MAKEINTRESOURCEA(ChoosePageTemplate(page));
        p.hIcon = icons[count - 1] = SmallIcon(inst, label.icon);
        p.dwFlags = PSP_USETITLE | (p.hIcon ? PSP_USEHICON : 0);
        p.pszTitle = page_titles[page];
        p.pfnDlgProc = page_procedures[page];
    }
    if (!count) return;

    PROPSHEETHEADERA header;
    memset(&header, 0, sizeof header);
    header.dwSize = PROPSHEETHEADERA_V1_SIZE;
    header.hwndParent = owner;
    header.hInstance = inst;
    header.hIcon = icons[PAGE_COUNT] = SmallIcon(inst, IDI_SHEET);
    header.dwFlags = PSH_PROPSHEETPAGE | (header.hIcon ? PSH_USEHICON : 0);
    header.pszCaption = caption;
    header.nPages = (UINT)count;
    header.nStartPage = (UINT)StartPosition(included, requested_page);
    header.ppsp = (LPCPROPSHEETPAGEA)pages;
    PropertySheetA(&header);
    for (HICON icon : icons)
        if (icon) DestroyIcon(icon);
}

void SetPageTexts(HWND page, const PageText* texts, int count)
{
    char text[PAGE_TEXT_SIZE];
    for (int i = 0; i < count; ++i) {
        text[0] = 0;
        if (texts[i].fallback) LoadText(texts[i].key, texts[i].fallback, text, texts[i].size);
        SetDlgItemTextA(page, texts[i].control, text);
    }
}

// The chip file's animation beside the program, when it names one that is there.
static bool AnimationFile(char* path, size_t size)
{
    char name[ANIMATION_NAME_SIZE];
    GetPrivateProfileStringA("AVIFile", "AVIFile", "", name, sizeof name, chip_ini_path);
    if (!name[0]) return false;
    char program[PROGRAM_PATH_SIZE];
    DWORD length = GetModuleFileNameA(NULL, program, sizeof program);
    program[length < sizeof program ? length : sizeof program - 1] = 0;
    const char* slash = FindLastChar(program, '\\');
    program[slash ? slash - program + 1 : 0] = 0;
    CopyText(path, size, program);
    if (!AppendText(path, size, name)) return false;
    OFSTRUCT found;
    return OpenFile(path, &found, OF_EXIST) != HFILE_ERROR;
}

HWND CreatePageAnimation(HWND page, int control_id, int resource_id, const RECT* rect)
{
    char path[PROGRAM_PATH_SIZE + ANIMATION_NAME_SIZE];
    if (AnimationFile(path, sizeof path)) {
        HWND control = CreateAnimationControl(page, control_id, path, rect);
        if (control) return control;
    }
    // A file that does not play leaves the page with the built-in clip.
    return CreateAnimationControl(page, control_id, MAKEINTRESOURCEA(resource_id), rect);
}

HWND CreateAnimationControl(HWND parent, int control_id, LPCSTR source, const RECT* rect)
{
    InitCommonControls();
    HWND control = CreateWindowExA(0, ANIMATE_CLASSA, NULL, WS_CHILD | ACS_CENTER | ACS_TRANSPARENT, 0, 0, 0, 0,
                                   parent, (HMENU)(INT_PTR)control_id, instance, NULL);
    if (!control) return NULL;
    SetWindowPos(control, NULL, rect->left, rect->top, rect->right - rect->left, rect->bottom - rect->top,
                 SWP_NOZORDER | SWP_FRAMECHANGED);
    if (!SendMessageA(control, ACM_OPENA, 0, (LPARAM)source)) {
        DestroyWindow(control);
        return NULL;
    }
    ShowWindow(control, SW_SHOW);
    return control;
}

void ControlAnimation(HWND control, AnimationOperation operation)
{
    if (!control) return;
    switch (operation) {
    case ANIMATION_PLAY: SendMessageA(control, ACM_PLAY, (WPARAM)-1, MAKELPARAM(0, 0xFFFF)); break;
    case ANIMATION_STOP: SendMessageA(control, ACM_STOP, 0, 0); break;
    case ANIMATION_CLOSE: SendMessageA(control, ACM_OPENA, 0, 0); break;
    }
}

POINT PlaceInside(const RECT* window, const RECT* area)
{
    POINT at = {window->left, window->top};
    LONG width = window->right - window->left, height = window->bottom - window->top;
    if (at.x + width > area->right) at.x = area->right - width;
    if (at.y + height > area->bottom) at.y = area->bottom - height;
    if (at.x < area->left) at.x = area->left;
    if (at.y < area->top) at.y = area->top;
    return at;
}

// The sheet opens beside the tray and only then grows to hold its pages,
// which would take it past the screen's edge.
static void KeepSheetOnScreen(HWND sheet)
{
    RECT window, area;
    if (!GetWindowRect(sheet, &window) || !SystemParametersInfoA(SPI_GETWORKAREA, 0, &area, 0)) return;
    POINT at = PlaceInside(&window, &area);
    if (at.x != window.left || at.y != window.top)
        SetWindowPos(sheet, NULL, at.x, at.y, 0, 0, SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
}

void AnimatePage(HWND page, UINT message, LPARAM lparam, int frame_id, HWND* control)
{
    switch (message) {
    case WM_INITDIALOG: {
        KeepSheetOnScreen(GetParent(page));
        HWND frame = GetDlgItem(page, frame_id);
        RECT rect;
        GetClientRect(frame, &rect);
        MapWindowPoints(frame, page, (POINT*)&rect, 2);
        *control = CreatePageAnimation(page, IDC_PAGE_ANIMATION, IDA_PAGE_ANIMATION, &rect);
        break;
    }
    case WM_NOTIFY: {
        UINT code = ((const NMHDR*)lparam)->code;
        if (code == (UINT)PSN_SETACTIVE) ControlAnimation(*control, ANIMATION_PLAY);
        if (code == (UINT)PSN_KILLACTIVE) ControlAnimation(*control, ANIMATION_STOP);
        break;
    }
    case WM_DESTROY:
        ControlAnimation(*control, ANIMATION_STOP);
        ControlAnimation(*control, ANIMATION_CLOSE);
        *control = NULL;
        break;
    }
}
