// The sheet's pages, titles and start page for chips that hide pages, and
// where the pages' animation comes from.
#include <gtest/gtest.h>
#include <windows.h>

#include <commctrl.h>
#include <prsht.h>

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/resource_ids.h"
#include "base/state.h"
#include "base/texts.h"
#include "chips/chips.h"
#include "pages/property_sheet.h"
#include "pages/sheet_driver.h"
#include "support/support.h"

namespace {

// A family that hides the pages of hidden_pages (bit n: page n) and has a
// settable memory clock when mclk_max is not 0.
unsigned hidden_pages;
uint32_t mclk_max;

uint32_t HidingDispatch(uint32_t command, uintptr_t argument)
{
    if (command == CMD_HIDE_PAGE) return (hidden_pages >> argument) & 1;
    if (command == CMD_GET_MCLK_MAX) return mclk_max;
    return 0;
}
const ChipRow hiding_rows[] = {{.vendor_id = 0x5333, .device_id = 0x8901, .Dispatch = HidingDispatch}};

TEST(Sheet, PagesTitlesAndStartPage)
{
    std::string caption(150, 'c');
    std::string text_ini = MakeScratchFolder("sheet") + "ZNTR2.INI";
    WriteTextFile(text_ini, "[TASKBAR]\nCAPTION=" + caption + "\nMenuA=\nMenuC=Screen\n");
    static const struct {
        unsigned hidden;
        uint32_t mclk_max;
        int requested;
        std::vector<std::string> titles;
        int start;
    } cases[] = {
        {0x1, 0, PAGE_MONITOR, {"Information", "Screen"}, 1},
        {0x1, 125, PAGE_MONITOR, {"Information", "Screen", "Performance"}, 1},
        {0x0, 0, PAGE_PERFORMANCE, {"", "Information", "Screen"}, 2},
        {0x0, 125, PAGE_PERFORMANCE, {"", "Information", "Screen", "Performance"}, 3},
        {0x4, 125, PAGE_MONITOR, {"", "Information", "Performance"}, 1},
        {0x1, 0, PAGE_DESKTOP, {"Information", "Screen"}, 0},
    };
    for (const auto& c : cases) {
        ResetProgramState(text_ini);
        adapter_count = 1;
        chip_rows = hiding_rows;
        hidden_pages = c.hidden;
        mclk_max = c.mclk_max;
        RunSheet(c.requested, {[&](HWND sheet) {
                     char title[256] = "";
                     GetWindowTextA(sheet, title, sizeof title);
                     EXPECT_EQ(caption.substr(0, 99), title);
                     EXPECT_EQ(c.titles, TabTitles(sheet)) << "hidden " << c.hidden << ", requested " << c.requested;
                     EXPECT_EQ(c.start, TabCtrl_GetCurSel(PropSheet_GetTabControl(sheet)));
                     HWND animation = GetDlgItem(CurrentPage(sheet), IDC_PAGE_ANIMATION);
                     EXPECT_TRUE(animation && IsWindowVisible(animation)) << "the page shows its animation";
                 }});
    }
    ResetAllModules();
}

// The folder of the test program, where the chip file's animation is looked for.
std::string ProgramFolder()
{
    char path[MAX_PATH];
    GetModuleFileNameA(NULL, path, sizeof path);
    *(strrchr(path, '\\') + 1) = 0;
    return path;
}

// The sources the animation controls of this thread are asked to open.
std::vector<std::string> opened;
HHOOK open_hook;

LRESULT CALLBACK RecordOpen(int code, WPARAM wparam, LPARAM lparam)
{
    const CWPSTRUCT* call = (const CWPSTRUCT*)lparam;
    if (code == HC_ACTION && call->message == ACM_OPENA && call->lParam)
        opened.push_back(IS_INTRESOURCE(call->lParam) ? "#" + std::to_string(LOWORD(call->lParam))
                                                      : std::string((const char*)call->lParam));
    return CallNextHookEx(open_hook, code, wparam, lparam);
}

TEST(PageAnimation, ChipFileNamesAFileBesideTheProgram)
{
    const std::string folder = ProgramFolder();
    const std::string clip = std::string("Z:") + VISTREL_RESOURCES "/pages.avi";
    static const struct {
        const char* entry;  // the chip file's AVIFile line
        const char* file;   // what lies beside the program under that name
        bool named_file_opened, resource_opened;
    } cases[] = {
        {"", NULL, false, true},
        {"AVIFile=absent.avi\n", NULL, false, true},
        {"AVIFile=clip.avi\n", "clip", true, false},
        // A file that does not play falls back to the built-in clip.
        {"AVIFile=broken.avi\n", "not an AVI", true, true},
    };
    HWND parent = CreateWindowA("STATIC", "", WS_POPUP, 0, 0, 200, 200, NULL, NULL, NULL, NULL);
    for (const auto& c : cases) {
        std::string chip_ini = MakeScratchFolder("avi") + "ZNTR3.INI";
        WriteTextFile(chip_ini, std::string("[AVIFile]\n") + c.entry);
        ResetProgramState("", chip_ini);
        std::string name = strchr(c.entry, '=') ? std::string(strchr(c.entry, '=') + 1, strchr(c.entry, '\n')) : "";
        if (c.file && strcmp(c.file, "clip") == 0) ASSERT_TRUE(CopyFileA(clip.c_str(), (folder + name).c_str(), FALSE));
        else if (c.file) WriteTextFile(folder + name, c.file);
        opened.clear();
        open_hook = SetWindowsHookExA(WH_CALLWNDPROC, RecordOpen, NULL, GetCurrentThreadId());
        RECT rect = {10, 10, 60, 50};
        HWND control = CreatePageAnimation(parent, IDC_PAGE_ANIMATION, IDA_PAGE_ANIMATION, &rect);
        UnhookWindowsHookEx(open_hook);
        if (c.file) DeleteFileA((folder + name).c_str());

        std::vector<std::string> expected;
        if (c.named_file_opened) expected.push_back(folder + name);
        if (c.resource_opened) expected.push_back("#149");
        EXPECT_EQ(expected, opened) << c.entry;
        ASSERT_TRUE(control != NULL) << c.entry;
        EXPECT_EQ(control, GetDlgItem(parent, IDC_PAGE_ANIMATION)) << "one control, the one that plays";
        RECT placed;
        GetWindowRect(control, &placed);
        MapWindowPoints(NULL, parent, (POINT*)&placed, 2);
        EXPECT_TRUE(EqualRect(&rect, &placed));
        ControlAnimation(control, ANIMATION_CLOSE);
        DestroyWindow(control);
    }
    DestroyWindow(parent);
    ResetAllModules();
}

}  // namespace
