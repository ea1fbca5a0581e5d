// The panel's face as the user meets it: the icon in the taskbar, its menu,
// a page chosen with the keyboard, and the way out.
#include <gtest/gtest.h>

#include <windows.h>
#include <commctrl.h>
#include <prsht.h>
#include <shellapi.h>

#include <algorithm>
#include <string>
#include <vector>

#include "system/panel.h"

namespace {

const UINT msg_tray_callback = 1224;
const int icon_id = 100, monitor_list_id = 1039, close_command = 209;

struct Search {
    DWORD process;
    const char* cls;
    HWND found;
};

BOOL CALLBACK FindShown(HWND window, LPARAM data)
{
    Search* s = (Search*)data;
    char cls[32] = "";
    DWORD process = 0;
    GetWindowThreadProcessId(window, &process);
    GetClassNameA(window, cls, sizeof cls);
    if (process != s->process || strcmp(cls, s->cls) || !IsWindowVisible(window)) return TRUE;
    s->found = window;
    return FALSE;
}

// A shown top-level window of the panel's process, once it is there.
HWND WaitShown(Panel& panel, const char* cls, DWORD ms = 10000)
{
    Search s = {panel.process.info.dwProcessId, cls, NULL};
    for (DWORD start = GetTickCount(); GetTickCount() - start < ms; Sleep(20)) {
        EnumWindows(FindShown, (LPARAM)&s);
        if (s.found) return s.found;
    }
    return NULL;
}

bool WaitGoneWindow(HWND window, DWORD ms = 10000)
{
    for (DWORD start = GetTickCount(); GetTickCount() - start < ms; Sleep(20))
        if (!IsWindow(window)) return true;
    return false;
}

// Key presses posted to a window of another process, as the keyboard would
// bring them to its queue.
void PressKeys(HWND window, std::initializer_list<UINT> keys)
{
    for (UINT key : keys) {
        PostMessageA(window, WM_KEYDOWN, key, 1);
        PostMessageA(window, WM_KEYUP, key, 0xC0000001);
    }
}

// Another process's list box: only the wide form crosses processes intact.
std::vector<std::string> ListLines(HWND list)
{
    std::vector<std::string> lines;
    LRESULT count = SendMessageW(list, LB_GETCOUNT, 0, 0);
    for (LRESULT i = 0; i < count; ++i) {
        wchar_t text[256] = L"";
        SendMessageW(list, LB_GETTEXT, i, (LPARAM)text);
        std::string line;
        for (const wchar_t* c = text; *c; ++c) line += (char)*c;
        lines.push_back(line);
    }
    return lines;
}

bool IconShown(HWND window)
{
    NOTIFYICONDATAA data = {};
    data.cbSize = NOTIFYICONDATAA_V1_SIZE;
    data.hWnd = window;
    data.uID = icon_id;
    return Shell_NotifyIconA(NIM_MODIFY, &data);
}

TEST(TraySystem, FromTheIconToTheMonitorPageAndOut)
{
    Panel panel(DefaultMachine("98"));
    ASSERT_TRUE(panel.Start("win98"));
    HWND main = panel.WaitWindow();
    ASSERT_TRUE(main != NULL);
    EXPECT_TRUE(IconShown(main));

    // The shell's click; Desktop, Information, Monitor.
    PostMessageA(main, msg_tray_callback, 0, WM_LBUTTONDOWN);
    HWND menu = WaitShown(panel, "#32768");
    ASSERT_TRUE(menu != NULL) << "no menu";
    PressKeys(menu, {VK_DOWN, VK_DOWN, VK_DOWN, VK_RETURN});

    HWND sheet = WaitShown(panel, "#32770");
    ASSERT_TRUE(sheet != NULL) << "no sheet";
    HWND page = (HWND)SendMessageA(sheet, PSM_GETCURRENTPAGEHWND, 0, 0);
    HWND list = GetDlgItem(page, monitor_list_id);
    ASSERT_TRUE(list != NULL) << "not the Monitor page";
    std::vector<std::string> lines = ListLines(list);
    const std::vector<std::string> edid = {"Year of Manufacture :", "        1998", "Max H. Image Size(cm) :",
                                           "        30", "Max V. Image Size(cm) :", "        23"};
    auto year = std::find(lines.begin(), lines.end(), edid[0]);
    ASSERT_TRUE(lines.end() - year >= (long)edid.size()) << "no EDID lines among " << lines.size();
    EXPECT_EQ(edid, std::vector<std::string>(year, year + edid.size()));
    PostMessageA(sheet, PSM_PRESSBUTTON, PSBTN_CANCEL, 0);
    ASSERT_TRUE(WaitGoneWindow(sheet));

    PostMessageA(main, WM_COMMAND, close_command, 0);
    HWND question = WaitShown(panel, "#32770");
    ASSERT_TRUE(question != NULL && GetDlgItem(question, IDYES)) << "no question";
    PostMessageA(question, WM_COMMAND, IDYES, 0);
    EXPECT_EQ(0, panel.process.WaitExit(10000));
    EXPECT_FALSE(IconShown(main));
}

}  // namespace
