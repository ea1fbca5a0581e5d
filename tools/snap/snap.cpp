// The tour's camera: starts the panel of a machine folder, walks it through its
// windows from outside, checks what each window shows by reading its controls,
// and photographs it from the screen into <out>\<name>.bmp, with a line
// "name<TAB>caption" in <out>\shots.txt for each picture.
//
//   snap.exe <out folder> <machine folder> <wine version> <scenario>
//   scenarios: single (one card, every window), nt (menu, Desktop, Monitor),
//              dual (two cards: menu, the second card's Desktop page), panning,
//              family:<prefix>:<card> (one card's menu and every page)
#include <windows.h>
#include <commctrl.h>
#include <prsht.h>
#include <shellapi.h>
#include <stdio.h>
#include <string.h>

#include <string>
#include <vector>

namespace {

// The panel's interface as other programs see it; these numbers never change.
const UINT tray_callback = 1224, close_command = 209, first_page_command = 220;
enum { RES_SLIDER = 1017, RES_LABEL = 1018, COLOUR_SLIDER = 1020, COLOUR_LABEL = 1021, FONT_SLIDER = 1023,
       FONT_LABEL = 1024, RATE_SLIDER = 1026, RATE_LABEL = 1027, INFO_LIST = 1020, MONITOR_ADJUST = 1023,
       INFO_AUTORUN = 1045, MONITOR_LIST = 1039, MONITOR_NT_PICTURE = 1040, PERF_SLIDER = 1050, PERF_VALUE = 1051, PANNING_SAVE = 1014,
       MESSAGE_TEXT = 0xFFFF };

std::string out_folder;
int failures;
DWORD panel_pid;
PROCESS_INFORMATION panel;

void Fail(const std::string& what)
{
    fprintf(stderr, "tour: %s\n", what.c_str());
    ++failures;
}

bool Check(bool ok, const std::string& what)
{
    if (!ok) Fail(what);
    return ok;
}

std::string Narrow(const wchar_t* text)
{
    std::string s;
    for (; *text; ++text) s += *text < 128 ? (char)*text : '?';
    return s;
}

std::string Text(HWND w)
{
    wchar_t text[512] = L"";
    DWORD_PTR r;
    SendMessageTimeoutW(w, WM_GETTEXT, 512, (LPARAM)text, SMTO_NORMAL, 5000, &r);
    return Narrow(text);
}

LRESULT Send(HWND w, UINT message, WPARAM wparam = 0, LPARAM lparam = 0)
{
    DWORD_PTR r = 0;
    return SendMessageTimeoutA(w, message, wparam, lparam, SMTO_NORMAL, 20000, &r) ? (LRESULT)r : -1;
}

std::vector<std::string> ListLines(HWND list)
{
    std::vector<std::string> lines;
    for (LRESULT i = 0, n = Send(list, LB_GETCOUNT); i < n; ++i) {
        wchar_t text[256] = L"";
        SendMessageW(list, LB_GETTEXT, i, (LPARAM)text);
        lines.push_back(Narrow(text));
    }
    return lines;
}

bool Contains(const std::vector<std::string>& lines, const char* part)
{
    for (const std::string& l : lines)
        if (l.find(part) != std::string::npos) return true;
    return false;
}

bool Start(const std::string& folder, const char* program, const char* version)
{
    std::string key = std::string("Software\\Wine\\AppDefaults\\") + program;
    HKEY defaults;
    if (RegCreateKeyExA(HKEY_CURRENT_USER, key.c_str(), 0, NULL, 0, KEY_SET_VALUE, NULL, &defaults, NULL) == 0) {
        RegSetValueExA(defaults, "Version", 0, REG_SZ, (const BYTE*)version, (DWORD)strlen(version) + 1);
        RegCloseKey(defaults);
    }
    std::string line = "\"" + folder + program + "\"";
    STARTUPINFOA start = {sizeof start};
    if (!CreateProcessA(NULL, &line[0], NULL, NULL, FALSE, 0, NULL, folder.c_str(), &start, &panel)) return false;
    panel_pid = panel.dwProcessId;
    return true;
}

bool Running() { return WaitForSingleObject(panel.hProcess, 0) == WAIT_TIMEOUT; }

// A shown top-level window of the panel of that class, other than `other`.
HWND Shown(const char* cls, HWND other = NULL, DWORD ms = 15000)
{
    for (DWORD start = GetTickCount(); GetTickCount() - start < ms && Running(); Sleep(20))
        for (HWND w = NULL; (w = FindWindowExA(NULL, w, cls, NULL));) {
            DWORD owner = 0;
            GetWindowThreadProcessId(w, &owner);
            if (owner == panel_pid && w != other && IsWindowVisible(w)) return w;
        }
    return NULL;
}

// The main window once its icon is in the taskbar.
HWND MainWindow()
{
    for (DWORD start = GetTickCount(); GetTickCount() - start < 60000 && Running(); Sleep(20)) {
        HWND w = FindWindowA("zentra", NULL);
        NOTIFYICONDATAA icon = {NOTIFYICONDATAA_V1_SIZE, w, 100};
        if (w && Send(w, WM_NULL) != -1 && Shell_NotifyIconA(NIM_MODIFY, &icon)) return w;
    }
    return NULL;
}

bool WaitGone(HWND w)
{
    for (DWORD start = GetTickCount(); IsWindow(w) && GetTickCount() - start < 10000;) Sleep(20);
    return !IsWindow(w);
}

RECT Box(HWND w)
{
    RECT r = {0, 0, 0, 0};
    GetWindowRect(w, &r);
    return r;
}

RECT Around(RECT r, int margin)
{
    return {r.left - margin, r.top - margin, r.right + margin, r.bottom + margin};
}

RECT Join(RECT a, RECT b)
{
    RECT r;
    UnionRect(&r, &a, &b);
    return r;
}

void Settle(HWND w)
{
    RedrawWindow(w, NULL, NULL, RDW_INVALIDATE | RDW_ERASE | RDW_FRAME | RDW_ALLCHILDREN | RDW_UPDATENOW);
    Send(w, WM_NULL);
    Sleep(300);  // X draws what the window painted
}

// Photographs a part of the screen. A picture of one colour fails.
bool Photograph(const char* name, RECT r, const char* caption)
{
    RECT screen = {0, 0, GetSystemMetrics(SM_CXSCREEN), GetSystemMetrics(SM_CYSCREEN)};
    long asked = (r.right - r.left) * (r.bottom - r.top);
    IntersectRect(&r, &r, &screen);
    int width = r.right - r.left, height = r.bottom - r.top;
    if (!Check(2L * width * height >= asked && width > 0, std::string(name) + ": the window is off the screen"))
        return false;
    BITMAPINFOHEADER head = {sizeof head, width, height, 1, 24, BI_RGB};
    void* bits = NULL;
    HDC screen_dc = GetDC(NULL), memory = CreateCompatibleDC(screen_dc);
    HBITMAP picture = CreateDIBSection(screen_dc, (BITMAPINFO*)&head, DIB_RGB_COLORS, &bits, NULL, 0);
    HGDIOBJ old = SelectObject(memory, picture);
    BitBlt(memory, 0, 0, width, height, screen_dc, r.left, r.top, SRCCOPY);
    GdiFlush();
    DWORD stride = (width * 3 + 3) & ~3u, size = stride * height;
    const BYTE* p = (const BYTE*)bits;
    int colours = 0;
    std::vector<DWORD> seen;
    for (DWORD y = 0; y < (DWORD)height && colours < 8; y += 3)
        for (DWORD x = 0; x < (DWORD)width && colours < 8; x += 3) {
            const BYTE* q = p + y * stride + x * 3;
            DWORD c = q[0] | q[1] << 8 | q[2] << 16;
            bool known = false;
            for (DWORD s : seen) known |= s == c;
            if (!known) seen.push_back(c), ++colours;
        }
    bool ok = Check(colours >= 4, std::string(name) + ": the picture is blank");
    BITMAPFILEHEADER file = {0x4D42, (DWORD)(sizeof file + sizeof head + size), 0, 0, sizeof file + sizeof head};
    FILE* f = fopen((out_folder + name + ".bmp").c_str(), "wb");
    if (f) {
        fwrite(&file, sizeof file, 1, f), fwrite(&head, sizeof head, 1, f), fwrite(bits, size, 1, f);
        fclose(f);
    }
    SelectObject(memory, old);
    DeleteObject(picture);
    DeleteDC(memory);
    ReleaseDC(NULL, screen_dc);
    if (!Check(f != NULL, std::string(name) + ": cannot write the picture")) return false;
    if (ok) {
        FILE* list = fopen((out_folder + "shots.txt").c_str(), "ab");
        if (list) fprintf(list, "%s\t%s\n", name, caption), fclose(list);
        printf("tour: %s (%dx%d): %s\n", name, width, height, caption);
    }
    return ok;
}

// The menu opens beside the tray icon; the picture takes in the taskbar below it.
RECT WithTaskbar(RECT r)
{
    HWND taskbar = FindWindowA("Shell_TrayWnd", NULL);
    if (!taskbar || !IsWindowVisible(taskbar)) return Around(r, 8);
    RECT bar = Box(taskbar);
    return Join(Around(r, 8), {r.left - 8, bar.top, GetSystemMetrics(SM_CXSCREEN), bar.bottom});
}

void Key(HWND w, UINT key)
{
    PostMessageA(w, WM_KEYDOWN, key, 1);
    PostMessageA(w, WM_KEYUP, key, 0xC0000001);
}

HWND OpenMenu(HWND main)
{
    // After a machine of another screen size the taskbar follows the desktop a moment late.
    HWND taskbar = FindWindowA("Shell_TrayWnd", NULL);
    for (DWORD start = GetTickCount(); taskbar && GetTickCount() - start < 5000; Sleep(50))
        if (Box(taskbar).bottom <= GetSystemMetrics(SM_CYSCREEN) && Box(taskbar).right <= GetSystemMetrics(SM_CXSCREEN))
            break;
    PostMessageA(main, tray_callback, 0, WM_LBUTTONDOWN);
    return Shown("#32768");
}

HWND Control(HWND page, int id) { return GetDlgItem(page, id); }
LRESULT Position(HWND page, int id) { return Send(Control(page, id), TBM_GETPOS); }
LRESULT Maximum(HWND page, int id) { return Send(Control(page, id), TBM_GETRANGEMAX); }

// The sheet opens beside the tray icon and grows to its pages' size, past the
// screen's edge: the camera moves it where it can be seen whole.
void Centre(HWND w)
{
    RECT r = Box(w);
    int x = (GetSystemMetrics(SM_CXSCREEN) - (r.right - r.left)) / 2;
    int y = (GetSystemMetrics(SM_CYSCREEN) - (r.bottom - r.top)) / 2;
    SetWindowPos(w, NULL, x > 0 ? x : 0, y > 0 ? y : 0, 0, 0, SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
}

HWND ShowPage(HWND sheet, int index)
{
    Centre(sheet);
    Send(sheet, PSM_SETCURSEL, index, 0);
    HWND page = (HWND)Send(sheet, PSM_GETCURRENTPAGEHWND);
    Settle(sheet);
    return page;
}

// The four sliders within their ranges and the labels saying the running mode.
bool CheckDesktop(HWND page, const char* width, const char* rate)
{
    bool ok = true;
    for (int id : {RES_SLIDER, COLOUR_SLIDER, FONT_SLIDER, RATE_SLIDER}) {
        LRESULT pos = Position(page, id), max = Maximum(page, id);
        ok &= Check(pos >= 0 && pos <= max && max > 0, "Desktop: slider " + std::to_string(id) + " at " +
                                                           std::to_string(pos) + " of 0.." + std::to_string(max));
    }
    std::string res = Text(Control(page, RES_LABEL)), refresh = Text(Control(page, RATE_LABEL));
    printf("tour:   Desktop: %s | %s | %s | %s\n", res.c_str(), Text(Control(page, COLOUR_LABEL)).c_str(),
           Text(Control(page, FONT_LABEL)).c_str(), refresh.c_str());
    ok &= Check(res.find(width) != std::string::npos, "Desktop: resolution label '" + res + "' lacks " + width);
    ok &= Check(refresh.find(rate) != std::string::npos, "Desktop: refresh label '" + refresh + "' lacks " + rate);
    return ok;
}

// Apply a resolution one step down, photograph the question, Cancel: the old mode and sliders come back.
void Confirmation(HWND sheet, HWND page)
{
    HWND slider = Control(page, RES_SLIDER);
    LRESULT before = Position(page, RES_SLIDER);
    std::string label = Text(Control(page, RES_LABEL));
    if (!Check(before > 0, "Desktop: no smaller resolution to apply")) return;
    Send(slider, TBM_SETPOS, TRUE, before - 1);
    Send(page, WM_HSCROLL, MAKEWPARAM(TB_THUMBPOSITION, before - 1), (LPARAM)slider);
    PostMessageA(sheet, PSM_PRESSBUTTON, PSBTN_APPLYNOW, 0);
    HWND box = Shown("#32770", sheet);
    if (!Check(box != NULL, "Apply: no confirmation")) return;
    std::string question = Text(GetDlgItem(box, MESSAGE_TEXT));
    DEVMODEA mode = {};
    mode.dmSize = sizeof mode;
    EnumDisplaySettingsA(NULL, ENUM_CURRENT_SETTINGS, &mode);
    Check(question.find("keep") != std::string::npos && GetDlgItem(box, IDCANCEL),
          "Apply: the question says '" + question + "'");
    Check(mode.dmPelsWidth < 1024, "Apply: the desktop is " + std::to_string(mode.dmPelsWidth) + " wide");
    Settle(box);
    std::string caption = "Apply asks whether to keep the new mode (" + std::to_string(mode.dmPelsWidth) + "x" +
                          std::to_string(mode.dmPelsHeight) + "), and takes it back on Cancel";
    Photograph("confirm", Around(Join(Box(box), Box(sheet)), 8), caption.c_str());
    PostMessageA(box, WM_COMMAND, IDCANCEL, 0);
    Check(WaitGone(box), "Apply: the confirmation stays");
    // The old mode is set again before the sliders follow: wait for them.
    for (DWORD start = GetTickCount(); GetTickCount() - start < 10000; Sleep(50))
        if (Position(page, RES_SLIDER) == before && Text(Control(page, RES_LABEL)) == label) break;
    Check(Position(page, RES_SLIDER) == before && Text(Control(page, RES_LABEL)) == label,
          "Cancel: the resolution slider is at " + std::to_string(Position(page, RES_SLIDER)) + ", was " +
              std::to_string(before));
}

void AdjustWindow(HWND page)
{
    PostMessageA(page, WM_COMMAND, MAKEWPARAM(MONITOR_ADJUST, BN_CLICKED), (LPARAM)Control(page, MONITOR_ADJUST));
    HWND adjust = Shown("ScreenAdjust");
    if (!Check(adjust != NULL, "Monitor: Adjust opens no adjustment window")) return;
    RECT r = Box(adjust);
    Check(r.right - r.left == GetSystemMetrics(SM_CXSCREEN) && r.bottom - r.top == GetSystemMetrics(SM_CYSCREEN),
          "the adjustment window does not cover the screen");
    Settle(adjust);
    Photograph("adjust", r, "The adjustment window: the arrow keys move the picture, Enter keeps it, Esc goes back");
    Key(adjust, VK_ESCAPE);
    Check(WaitGone(adjust), "Esc leaves the adjustment window open");
}

bool CloseSheet(HWND sheet)
{
    PostMessageA(sheet, PSM_PRESSBUTTON, PSBTN_CANCEL, 0);
    return Check(WaitGone(sheet), "the sheet stays open");
}

void ExitQuestion(HWND main, bool photograph)
{
    PostMessageA(main, WM_COMMAND, close_command, 0);
    HWND box = Shown("#32770");
    if (!Check(box && GetDlgItem(box, IDYES) && GetDlgItem(box, IDNO), "Close asks nothing")) return;
    if (photograph) {
        std::string text = Text(GetDlgItem(box, MESSAGE_TEXT));
        Check(!text.empty(), "the exit question has no text");
        Settle(box);
        Photograph("exit", Around(Box(box), 8), ("Close asks first: \"" + text + "\"").c_str());
    }
    PostMessageA(box, WM_COMMAND, IDYES, 0);
    Check(WaitForSingleObject(panel.hProcess, 15000) == WAIT_OBJECT_0, "Yes does not end the panel");
}

void Single(HWND main)
{
    HWND menu = OpenMenu(main);
    if (!Check(menu != NULL, "the tray icon opens no menu")) return;
    Settle(menu);
    Photograph("menu", WithTaskbar(Box(menu)), "The tray menu on a machine with one card (Windows 98)");
    // The first entry is the Desktop page.
    Key(menu, VK_DOWN), Key(menu, VK_RETURN);
    HWND sheet = Shown("#32770");
    if (!Check(sheet != NULL, "the menu's first entry opens no sheet")) return;
    HWND tabs = (HWND)Send(sheet, PSM_GETTABCONTROL);
    LRESULT pages = Send(tabs, TCM_GETITEMCOUNT);
    Check(pages >= 3, "the sheet has " + std::to_string(pages) + " pages");
    Check(Send(tabs, TCM_GETCURSEL) == 0, "the sheet opens on another page than Desktop");

    HWND page = ShowPage(sheet, 0);
    if (CheckDesktop(page, "1024", "75"))
        Photograph("desktop", Around(Box(sheet), 8), "Desktop page: resolution, colours, font size and refresh rate");

    page = ShowPage(sheet, 1);
    std::vector<std::string> info = ListLines(Control(page, INFO_LIST));
    for (const std::string& l : info) printf("tour:   Information: %s\n", l.c_str());
    std::string autorun = Text(Control(page, INFO_AUTORUN));
    if (Check(autorun.find("Windows starts") != std::string::npos, "Information: the start-up box says '" + autorun + "'"))
        Photograph("information", Around(Box(sheet), 8), "Information page: the card, its driver and the start-up choice");

    page = ShowPage(sheet, 2);
    std::vector<std::string> monitor = ListLines(Control(page, MONITOR_LIST));
    if (Check(Contains(monitor, "1998"), "Monitor: the list lacks the year of manufacture"))
        Photograph("monitor", Around(Box(sheet), 8), "Monitor page: picture adjustment, power saving, the monitor's EDID");
    AdjustWindow(page);

    // Only a chip that can tell its memory clock's limit has a Performance page.
    if (pages > 3) {
        page = ShowPage(sheet, 3);
        LRESULT pos = Position(page, PERF_SLIDER), max = Maximum(page, PERF_SLIDER);
        std::string clock = Text(Control(page, PERF_VALUE));
        printf("tour:   Performance: %s (slider %d of %d)\n", clock.c_str(), (int)pos, (int)max);
        if (Check(max > 0 && pos >= 0 && pos <= max && !clock.empty(), "Performance: no memory clock shown"))
            Photograph("performance", Around(Box(sheet), 8), "Performance page: the memory clock");
    }

    Confirmation(sheet, ShowPage(sheet, 0));
    CloseSheet(sheet);
    ExitQuestion(main, true);
}

// One card of a family: its menu and every page its chip allows, each
// photographed as <prefix>-<page>; the Information page must name the
// card's memory and the Performance page stand at the clock it shows.
void Family(HWND main, const std::string& prefix, const std::string& card)
{
    HWND menu = OpenMenu(main);
    if (!Check(menu != NULL, prefix + ": the tray icon opens no menu")) return;
    Settle(menu);
    Photograph((prefix + "-menu").c_str(), WithTaskbar(Box(menu)), ("The tray menu of " + card).c_str());
    Key(menu, VK_ESCAPE);
    WaitGone(menu);
    PostMessageA(main, WM_COMMAND, first_page_command, 0);
    HWND sheet = Shown("#32770");
    if (!Check(sheet != NULL, prefix + ": no sheet")) return;
    HWND tabs = (HWND)Send(sheet, PSM_GETTABCONTROL);
    for (int i = 0; i < (int)Send(tabs, TCM_GETITEMCOUNT); ++i) {
        HWND page = ShowPage(sheet, i);
        // The tab's text does not cross processes: the page tells itself by its controls.
        // (ids repeat across the pages' templates: each test names one only its page has)
        std::string name = Control(page, RES_SLIDER)     ? "desktop"
                           : Control(page, PERF_SLIDER)  ? "performance"
                           : Control(page, INFO_AUTORUN) ? "information"
                                                         : "monitor",
                    shown;
        std::string title = name;
        title[0] = (char)toupper(title[0]);
        if (name == "information") {
            std::vector<std::string> info = ListLines(Control(page, INFO_LIST));
            for (const std::string& l : info) printf("tour:   %s Information: %s\n", prefix.c_str(), l.c_str());
            if (!Check(Contains(info, " MB"), prefix + " Information: no memory line")) continue;
        }
        if (name == "performance") {
            std::string clock = Text(Control(page, PERF_VALUE));
            shown = ", " + clock + " MHz";
            if (!Check(Maximum(page, PERF_SLIDER) > 0 && Position(page, PERF_SLIDER) == atoi(clock.c_str()),
                       prefix + " Performance: the slider does not stand at " + clock))
                continue;
        }
        Photograph((prefix + "-" + name).c_str(), Around(Box(sheet), 8), (title + " page of " + card + shown).c_str());
    }
    CloseSheet(sheet);
    ExitQuestion(main, false);
}

void Nt(HWND main)
{
    HWND menu = OpenMenu(main);
    if (!Check(menu != NULL, "the tray icon opens no menu")) return;
    Settle(menu);
    Photograph("nt-menu", WithTaskbar(Box(menu)), "The tray menu on Windows NT 4.0");
    Key(menu, VK_ESCAPE);
    WaitGone(menu);
    PostMessageA(main, WM_COMMAND, first_page_command, 0);
    HWND sheet = Shown("#32770");
    if (!Check(sheet != NULL, "NT: no sheet")) return;
    if (CheckDesktop(ShowPage(sheet, 0), "1024", "75"))
        Photograph("nt-desktop", Around(Box(sheet), 8), "Desktop page on Windows NT 4.0");
    HWND page = ShowPage(sheet, 2);
    if (Check(IsWindowVisible(Control(page, MONITOR_NT_PICTURE)) && !IsWindowVisible(Control(page, MONITOR_LIST)),
              "NT Monitor page: the picture is not shown in place of the list"))
        Photograph("nt-monitor", Around(Box(sheet), 8), "Monitor page on Windows NT 4.0: no EDID to read, a picture");
    CloseSheet(sheet);
    ExitQuestion(main, false);
}

void Dual(HWND main)
{
    HWND menu = OpenMenu(main);
    if (!Check(menu != NULL, "the tray icon opens no menu")) return;
    // With two cards the first entries are the cards, each with its pages.
    Key(menu, VK_DOWN), Key(menu, VK_RIGHT);
    HWND pages = Shown("#32768", menu, 5000);
    if (!Check(pages != NULL, "two cards: the first entry has no submenu")) return;
    Settle(menu), Settle(pages);
    Photograph("dual-menu", WithTaskbar(Join(Box(menu), Box(pages))),
               "The tray menu with two cards (Windows 98): a submenu of pages for each card");
    Key(pages, VK_ESCAPE), Key(menu, VK_ESCAPE);
    WaitGone(menu);
    PostMessageA(main, WM_COMMAND, first_page_command + 4, 0);
    HWND sheet = Shown("#32770");
    if (!Check(sheet != NULL, "two cards: no sheet for the second card")) return;
    std::string title = Text(sheet);
    printf("tour:   second card's sheet: %s\n", title.c_str());
    if (CheckDesktop(ShowPage(sheet, 0), "800", "60"))
        Photograph("dual-desktop", Around(Box(sheet), 8), "Desktop page of the second card");
    CloseSheet(sheet);
    ExitQuestion(main, false);
}

void Panning()
{
    HWND dialog = Shown("#32770");
    if (!Check(dialog != NULL, "no panning dialog")) return;
    std::string title = Text(dialog);
    if (Check(!title.empty() && GetDlgItem(dialog, PANNING_SAVE) && GetDlgItem(dialog, IDCANCEL),
              "the panning dialog lacks its title or buttons")) {
        Settle(dialog);
        Photograph("panning", Around(Box(dialog), 8),
                   ("The panning dialog (\"" + title + "\"): the arrows move the picture").c_str());
    }
    PostMessageA(dialog, WM_COMMAND, IDCANCEL, 0);
    Check(WaitForSingleObject(panel.hProcess, 15000) == WAIT_OBJECT_0, "Cancel does not end the panning dialog");
}

}  // namespace

int main(int argc, char** argv)
{
    if (argc != 5) {
        fprintf(stderr, "usage: snap.exe <out folder> <machine folder> <wine version> <scenario>\n");
        return 2;
    }
    out_folder = std::string(argv[1]) + "\\";
    std::string folder = std::string(argv[2]) + "\\", scenario = argv[4];
    const char* program = scenario == "panning" ? "tour-panning.exe" : "vistrel-sim.exe";
    if (!Start(folder, program, argv[3])) {
        fprintf(stderr, "tour: cannot start %s%s\n", folder.c_str(), program);
        return 1;
    }
    if (scenario == "panning") {
        Panning();
    } else {
        HWND main = MainWindow();
        if (!main) Fail("the panel shows no icon");
        else if (scenario == "single") Single(main);
        else if (scenario == "nt") Nt(main);
        else if (scenario == "dual") Dual(main);
        else if (scenario.rfind("family:", 0) == 0) {
            // family:<prefix>:<the card, for the captions>
            std::string rest = scenario.substr(7);
            size_t colon = rest.find(':');
            Family(main, rest.substr(0, colon), colon == std::string::npos ? rest : rest.substr(colon + 1));
        }
        else Fail("unknown scenario " + scenario);
    }
    if (Running()) TerminateProcess(panel.hProcess, 1);
    return failures ? 1 : 0;
}
