// The Desktop page: how its sliders step, and the real sheet from the simulated mode table to the card.
#include <gtest/gtest.h>
#include <windows.h>

#include <commctrl.h>

#include "base/module_reset.h"
#include "base/resource_ids.h"
#include "base/texts.h"
#include "hardware/driver_key.h"
#include "modes/mode_list.h"
#include "pages/desktop_steps.h"
#include "pages/sheet.h"
#include "support/machine.h"
#include "support/support.h"

namespace {

TEST(DesktopSteps, SlidersStayInRangeAndTheFontKeepsToItsGrid)
{
    static const struct { int code, thumb, position, maximum, settle, target; } slides[] = {
        {TB_LINEUP, 0, 2, 3, 0, 1},           {TB_PAGEUP, 0, 0, 3, 0, -1},         {TB_LINEDOWN, 0, 3, 3, 0, -1},
        {TB_PAGEDOWN, 0, 2, 3, 0, 3},         {TB_THUMBTRACK, 1, 3, 3, 1, 1},      {TB_THUMBTRACK, 3, 3, 3, 1, -1},
        {TB_THUMBPOSITION, 3, 3, 3, 0, -1},   {TB_THUMBPOSITION, 3, 3, 3, 1, 3},   {TB_THUMBPOSITION, 9, 1, 3, 1, 3},
        {TB_TOP, 0, 2, 3, 0, 0},              {TB_BOTTOM, 0, 1, 3, 0, 3},          {TB_ENDTRACK, 0, 1, 3, 1, -1},
    };
    for (const auto& s : slides)
        EXPECT_EQ(s.target, SliderTarget(s.code, s.thumb, s.position, s.maximum, s.settle != 0))
            << s.code << " " << s.thumb << " from " << s.position << " settle " << s.settle;
    static const struct { int code, thumb, dpi, target; } fonts[] = {
        {TB_PAGEUP, 0, 100, 96},    {TB_PAGEUP, 0, 96, 72},        {TB_PAGEDOWN, 0, 100, 120}, {TB_PAGEDOWN, 0, 180, 192},
        {TB_LINEUP, 0, 72, -1},     {TB_LINEDOWN, 0, 191, 192},    {TB_THUMBTRACK, 200, 150, 192},
        {TB_THUMBPOSITION, 100, 100, -1}, {TB_TOP, 0, 100, 72},   {TB_BOTTOM, 0, 100, 192}, {TB_ENDTRACK, 0, 100, -1},
    };
    for (const auto& f : fonts) EXPECT_EQ(f.target, FontTarget(f.code, f.thumb, f.dpi)) << f.code << " " << f.dpi;
}

TEST(DesktopSteps, RefreshIsTheHighestNotAboveWantedPlusOne)
{
    static const uint16_t rates[] = {60, 70, 72, 75, 85, 0};
    static const struct { const uint16_t* list; int count, wanted, rate, position, maximum; } cases[] = {
        {rates, 6, 75, 75, 3, 4}, {rates, 6, 84, 85, 4, 4}, {rates, 6, 0, 60, 0, 4}, {rates, 0, 75, 0, 0, 0},
        {rates + 5, 1, 75, 0, 0, 0}, {rates, 3, 100, 72, 2, 2},  // a full list has no end mark
    };
    for (const auto& c : cases) {
        int position = -7, maximum = -7;
        EXPECT_EQ(c.rate, ChooseRefresh(c.list, c.count, c.wanted, &position, &maximum)) << c.wanted;
        EXPECT_EQ(c.position * 100 + c.maximum, position * 100 + maximum) << c.count << " " << c.wanted;
    }
}

TEST(DesktopSteps, AboveVgaLinesTheFontFollowsTheScreen)
{
    static const struct { int height, screen_x, screen_y, dpi_x, dpi_y, changed, x, y; } cases[] = {
        {480, 96, 96, 120, 120, 0, 120, 120}, {600, 96, 96, 120, 120, 1, 96, 96}, {600, 96, 96, 96, 96, 0, 96, 96},
        {600, 100, 144, 96, 96, 1, 120, 120}, {768, 120, 96, 100, 100, 1, 120, 96},
    };
    for (const auto& c : cases) {
        int x = c.dpi_x, y = c.dpi_y;
        EXPECT_EQ(c.changed != 0, FollowScreenFont(c.height, c.screen_x, c.screen_y, &x, &y)) << c.height;
        EXPECT_EQ(c.x * 1000 + c.y, x * 1000 + y) << c.height << " " << c.screen_x;
    }
}

struct DesktopPageTest : ::testing::Test { void TearDown() override { ResetAllModules(); } };

void Slide(HWND sheet, int id, int code, int thumb = 0)
{
    SendMessageA(Page(sheet), WM_HSCROLL, MAKEWPARAM(code, thumb), (LPARAM)GetDlgItem(Page(sheet), id));
}

std::string ControlText(HWND page, int id)
{
    char text[128];
    memset(text, '#', sizeof text);
    GetDlgItemTextA(page, id, text, sizeof text);
    return text;
}

// Each slider's label, position and last position (the font's: its dpi).
std::string Shown(HWND sheet)
{
    std::string shown;
    for (int id : {IDC_DESKTOP_RES_SLIDER, IDC_DESKTOP_COLOUR_SLIDER, IDC_DESKTOP_FONT_SLIDER, IDC_DESKTOP_REFRESH_SLIDER})
        shown += (shown.empty() ? "" : " | ") + ControlText(Page(sheet), id + 1) + " @" +
                 std::to_string(SendDlgItemMessageA(Page(sheet), id, TBM_GETPOS, 0, 0)) + "/" +
                 std::to_string(SendDlgItemMessageA(Page(sheet), id, TBM_GETRANGEMAX, 0, 0));
    return shown;
}

TEST_F(DesktopPageTest, SlidersWalkTheModeTable)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect());
    static const SimListedMode modes[] = {
        {640, 480, 8, 4, {60, 72, 75, 85}}, {800, 600, 8, 5, {56, 60, 72, 76, 85}}, {800, 600, 16, 1, {60}},
        {1024, 768, 8, 5, {60, 70, 72, 75, 85}}, {1280, 1024, 8, 0, {}},
    };
    SimSetModeList(modes, sizeof modes / sizeof modes[0]);
    AdapterRecord* a = CurrentAdapter();
    a->width = 800, a->height = 600, a->bits_per_pixel = 8, a->refresh_hz = 85;
    EXPECT_TRUE(RunSheet(PAGE_DESKTOP, [](HWND sheet) {
            const char* small = "96dpi (Small Fonts) @96/192";
            EXPECT_EQ(std::string(" 800 x 600 @1/3 | 256 Color (8 bit) @0/1 | ") + small + " | 85 Hz @4/4", Shown(sheet));
            Slide(sheet, IDC_DESKTOP_FONT_SLIDER, TB_PAGEDOWN);
            EXPECT_TRUE(Enabled(sheet, apply_button));
            // A larger mode asks 10 Hz less, and the font follows the screen's again.
            Slide(sheet, IDC_DESKTOP_RES_SLIDER, TB_LINEDOWN);
            EXPECT_EQ(std::string("1024 x 768 @2/3 | 256 Color (8 bit) @0/0 | ") + small + " | 75 Hz @3/4", Shown(sheet));
            Slide(sheet, IDC_DESKTOP_RES_SLIDER, TB_LINEUP);
            EXPECT_EQ(std::string(" 800 x 600 @1/3 | 256 Color (8 bit) @0/1 | ") + small + " | 76 Hz @3/4", Shown(sheet));
            Slide(sheet, IDC_DESKTOP_COLOUR_SLIDER, TB_LINEDOWN);
            EXPECT_EQ(std::string(" 800 x 600 @0/0 | High Color (16 bit) @1/1 | ") + small + " | 60 Hz @0/0", Shown(sheet));
            Slide(sheet, IDC_DESKTOP_COLOUR_SLIDER, TB_TOP);
            Slide(sheet, IDC_DESKTOP_FONT_SLIDER, TB_THUMBTRACK, 100);
            Slide(sheet, IDC_DESKTOP_RES_SLIDER, TB_TOP);
            EXPECT_EQ(" 640 x 480 @0/3 | 256 Color (8 bit) @0/0 | 100dpi @100/192 | 60 Hz @0/3", Shown(sheet));
            // A drag moves the label alone; where it ends the rest follows.
            Slide(sheet, IDC_DESKTOP_RES_SLIDER, TB_THUMBTRACK, 3);
            EXPECT_EQ("1280 x 1024 @3/3 | 256 Color (8 bit) @0/0 | 100dpi @100/192 | 60 Hz @0/3", Shown(sheet));
            Slide(sheet, IDC_DESKTOP_RES_SLIDER, TB_THUMBPOSITION, 3);
            EXPECT_EQ(std::string("1280 x 1024 @3/3 | 256 Color (8 bit) @0/0 | ") + small + " | BIOS Default @0/0",
                      Shown(sheet));
    }));
    EXPECT_EQ(nullptr, mode_table) << "the table goes with the page";
}

TEST_F(DesktopPageTest, TitleNamesTheDriverElseTheProduct)
{
    static const struct { int windows, description; const char *texts, *title; } cases[] = {
        {SIM_WINDOWS_98, 1, "", "Card Under Test"},  {SIM_WINDOWS_NT4, 1, "", "Card Under Test"},
        {SIM_WINDOWS_98, 0, "[Setup]\nproduct=Panel Here\n", "Panel Here"}, {SIM_WINDOWS_NT4, 0, "", "Vistrel"},
    };
    for (const auto& c : cases) {
        SimCardConfig card = Card(0x5333, 0x8901);
        lstrcpyA(card.driver_desc, "Card Under Test");
        BootMachine(Machine(c.windows, {card}));
        ASSERT_EQ(1, DetectAdapters());
        std::string texts = MakeScratchFolder("desktop") + "ZNTR2.INI";
        WriteTextFile(texts, c.texts);
        lstrcpynA(text_ini_path, texts.c_str(), sizeof text_ini_path);
        char key[DRIVER_KEY_SIZE];
        ASSERT_EQ(1, FindDriverKey(key));
        HKEY driver;
        ASSERT_EQ(ERROR_SUCCESS, RegOpenKeyExA(HKEY_LOCAL_MACHINE, key, 0, KEY_SET_VALUE, &driver));
        if (!c.description) RegDeleteValueA(driver, "DriverDesc"), RegDeleteValueA(driver, "Device Description");
        RegCloseKey(driver);
        EXPECT_TRUE(RunSheet(PAGE_DESKTOP, [&](HWND sheet) {
            EXPECT_EQ(c.title, ControlText(Page(sheet), IDC_DESKTOP_TITLE)) << c.windows;
        }));
    }
}

TEST_F(DesktopPageTest, ApplyChangesTheCardAndACancelledModeComesBack)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect());
    ASSERT_EQ(768, SimGetCardMode(0).height);
    EXPECT_TRUE(RunSheet(PAGE_DESKTOP, [&](HWND sheet) {
            Slide(sheet, IDC_DESKTOP_RES_SLIDER, TB_LINEUP);
            std::string before = Shown(sheet);
            DialogAnswerer keep(IDOK);
            Apply(sheet);
            EXPECT_EQ(1, keep.answered);
            EXPECT_EQ(800, SimGetCardMode(0).width);
            EXPECT_FALSE(Enabled(sheet, apply_button));
            Slide(sheet, IDC_DESKTOP_RES_SLIDER, TB_TOP);
            EXPECT_NE(before, Shown(sheet));
            DialogAnswerer refuse(IDCANCEL);
            Apply(sheet);
            EXPECT_EQ(1, refuse.answered);
            EXPECT_EQ(800, SimGetCardMode(0).width);
            EXPECT_EQ(before, Shown(sheet));
    }));
}

}  // namespace
