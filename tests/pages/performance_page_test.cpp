// The Performance page: its slider steps, and Apply, Cancel and Default on a simulated Riva TNT.
#include <gtest/gtest.h>
#include <windows.h>

#include <commctrl.h>

#include "base/adapters.h"
#include "base/resource_ids.h"
#include "base/settings.h"
#include "base/texts.h"
#include "pages/performance_page.h"
#include "pages/sheet.h"
#include "support/machine.h"
#include "support/support.h"

namespace {

TEST(PerformanceSteps, OneMegahertzAtATimeWithinTheRange)
{
    static const struct { int code, thumb, current, target; } steps[] = {
        {TB_LINEDOWN, 0, 125, -1}, {TB_BOTTOM, 0, 125, -1},     {TB_TOP, 0, 125, 100},      {TB_PAGEUP, 0, 110, 109},
        {TB_PAGEDOWN, 0, 110, 111}, {TB_LINEUP, 0, 100, -1},    {TB_THUMBTRACK, 110, 100, 110},
        {TB_THUMBPOSITION, 130, 110, 125}, {TB_THUMBTRACK, 90, 110, 100}, {TB_ENDTRACK, 0, 110, -1},
        {TB_THUMBTRACK, 110, 110, -1},
    };
    for (const auto& s : steps)
        EXPECT_EQ(s.target, MemoryClockTarget(s.code, s.thumb, s.current, 100, 125)) << s.code << " from " << s.current;
}

HWND PerfPage(HWND sheet) { return PropSheet_GetCurrentPageHwnd(sheet); }
int Shown(HWND page) { return (int)GetDlgItemInt(page, IDC_PERF_VALUE, NULL, FALSE); }
int SliderAt(HWND page) { return (int)SendDlgItemMessageA(page, IDC_PERF_SLIDER, TBM_GETPOS, 0, 0); }
int CardMhz() { return (int)(SimMemoryClockHz(0) / 1e6 + 0.5); }

void Slide(HWND page, int mhz)
{
    HWND slider = GetDlgItem(page, IDC_PERF_SLIDER);
    SendMessageA(page, WM_HSCROLL, MAKEWPARAM(TB_THUMBTRACK, mhz), (LPARAM)slider);
}

void Press(HWND page, int id) { SendMessageA(page, WM_COMMAND, MAKEWPARAM(id, BN_CLICKED), (LPARAM)GetDlgItem(page, id)); }

// First Apply kept, a second answered Cancel, then Default: the card's clock
// and the two stored values after each, and the clock is stored only once kept.
TEST(PerformancePage, ApplyCancelAndDefaultOnTheCard)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x10de, 0x0020, 1, 0)}));
    ASSERT_EQ(1, DetectAdapters());
    RefreshAdapterModes(REFRESH_AT_STARTUP);
    SaveSetting(SETTING_RESET, 0);
    std::string texts = MakeScratchFolder("performance") + "ZNTR2.INI";
    WriteTextFile(texts, "[TASKBAR]\r\nMCLKWARN=Careful (test)\r\n");
    lstrcpynA(text_ini_path, texts.c_str(), sizeof text_ini_path);
    const int before = CardMhz();
    ASSERT_TRUE(before >= 90 && before <= 123) << before;
    EXPECT_TRUE(RunSheet(PAGE_PERFORMANCE, [&](HWND sheet) {
        HWND page = PerfPage(sheet);
        EXPECT_EQ(before, Shown(page));
        EXPECT_EQ(before, SliderAt(page));
        EXPECT_EQ(90, SendDlgItemMessageA(page, IDC_PERF_SLIDER, TBM_GETRANGEMIN, 0, 0));
        EXPECT_EQ(133, SendDlgItemMessageA(page, IDC_PERF_SLIDER, TBM_GETRANGEMAX, 0, 0));
        char warning[100] = "";
        GetDlgItemTextA(page, IDC_PERF_WARNING, warning, sizeof warning);
        EXPECT_STREQ("Careful (test)", warning) << "the text file's warning";

        Slide(page, before + 10);
        EXPECT_EQ(before, CardMhz()) << "the slider alone leaves the chip";
        {
            DialogAnswerer keep(IDOK);
            int stored_while_asked = -2, card_while_asked = 0;
            keep.while_asked = [&] {
                stored_while_asked = LoadSetting(SETTING_MCLK);
                card_while_asked = CardMhz();
            };
            Press(page, IDC_PERF_APPLY);
            EXPECT_EQ(IDCANCEL, keep.default_button);
            EXPECT_EQ("Memory Clock Setting", keep.caption);
            EXPECT_EQ(-1, stored_while_asked) << "nothing stored before the answer";
            EXPECT_NEAR(before + 10, card_while_asked, 4);
        }
        int kept = CardMhz();
        EXPECT_EQ(kept, Shown(page));
        EXPECT_EQ(before + 10, LoadSetting(SETTING_MCLK));
        EXPECT_EQ(before, LoadSetting(SETTING_MCLK_DEFAULT));
        EXPECT_TRUE(CurrentAdapter()->flags & ADAPTER_INFO_STALE);

        Slide(page, 95);
        {
            DialogAnswerer refuse(IDCANCEL);
            Press(page, IDC_PERF_APPLY);
            EXPECT_EQ(1, refuse.answered);
        }
        EXPECT_NEAR(kept, CardMhz(), 1);
        EXPECT_EQ(CardMhz(), Shown(page));
        EXPECT_EQ(CardMhz(), SliderAt(page));
        EXPECT_EQ(kept, LoadSetting(SETTING_MCLK));
        EXPECT_EQ(before, LoadSetting(SETTING_MCLK_DEFAULT)) << "written once";

        CurrentAdapter()->flags &= ~(uint32_t)ADAPTER_INFO_STALE;
        Press(page, IDC_PERF_DEFAULT);
        EXPECT_NEAR(before, CardMhz(), 1);
        EXPECT_EQ(0, LoadSetting(SETTING_MCLK));
        EXPECT_TRUE(CurrentAdapter()->flags & ADAPTER_INFO_STALE);
    }));
    EXPECT_FALSE(CurrentAdapter()->flags & ADAPTER_INFO_STALE) << "cleared with the page";

    // Without a card default, Default leaves the clock alone.
    SaveSetting(SETTING_RESET, 0);
    EXPECT_TRUE(RunSheet(PAGE_PERFORMANCE, [&](HWND sheet) {
        int running = CardMhz();
        Press(PerfPage(sheet), IDC_PERF_DEFAULT);
        EXPECT_EQ(running, CardMhz());
        EXPECT_EQ(0, LoadSetting(SETTING_MCLK));
        EXPECT_FALSE(CurrentAdapter()->flags & ADAPTER_INFO_STALE);
    }));
}

}  // namespace
