// The adjustment window under Wine: keys against the simulated card, the save
// question answered in its message box, and what the window draws.
#include "adjust/adjust_pattern.h"
#include "adjust/adjust_test.h"
#include "hardware/multimon.h"
#include "support/gui_handles.h"

namespace {

// The hook answers the adjustment window's save question with `answer`, or
// with Enter (0), which takes the default button, and notes what it said.
struct { int answer, count; HWND box; char caption[64], text[64]; } question;
LRESULT CALLBACK AnswerQuestion(int code, WPARAM wparam, LPARAM lparam)
{
    HWND box = (HWND)wparam, owner = GetWindow(box, GW_OWNER);
    if (code == HCBT_ACTIVATE && box != question.box && owner && owner == FindWindowA(adjust_window_class, NULL)) {
        ++question.count;
        GetWindowTextA(question.box = box, question.caption, sizeof question.caption);
        GetDlgItemTextA(box, 0xFFFF, question.text, sizeof question.text);
        if (question.answer) PostMessageA(box, WM_COMMAND, question.answer, 0);
        else PostMessageA(box, WM_KEYDOWN, VK_RETURN, 0);
    }
    return CallNextHookEx(NULL, code, wparam, lparam);
}
const HHOOK question_hook = SetWindowsHookExA(WH_CBT, AnswerQuestion, NULL, GetCurrentThreadId());

// Presses keys, each so many times, in the window, or in a new one: the window.
HWND Keys(std::initializer_list<std::pair<WPARAM, int>> presses, HWND window = NULL)
{
    if (!window) {
        question = {question.answer};
        EXPECT_EQ(1, OpenAdjustWindow(NULL));
        window = FindWindowA(adjust_window_class, NULL);
    }
    for (auto [key, times] : presses)
        while (times--) SendMessageA(window, WM_KEYDOWN, key, 1);
    return window;
}

TEST_F(AdjustTest, ArrowsStepWithin21EachWayAndEscapeUndoes)
{
    SetRoomyCrt();
    HWND window = Keys({{VK_UP, 22}});
    EXPECT_EQ(0x1FFu + 21, VerticalRetrace());
    RECT monitor, got;
    GetAdapterMonitorRect(&monitor);
    GetWindowRect(window, &got);
    EXPECT_TRUE(EqualRect(&monitor, &got) && !(GetWindowLongA(window, GWL_STYLE) & (WS_CAPTION | WS_THICKFRAME)));
    Keys({{VK_DOWN, 44}, {VK_LEFT, 8}}, window);
    EXPECT_TRUE(VerticalRetrace() == 0x1FF - 21 && Crtc(0x04) == 0x98 + 8 && adjust_offset_v == -21);
    EXPECT_EQ(0, beep_count) << "the limit is silent";
    Keys({{VK_ESCAPE, 1}}, window);
    EXPECT_TRUE(Crtc(0x04) == 0x98 && VerticalRetrace() == 0x1FF && !adjust_offset_h && !adjust_offset_v);
    EXPECT_TRUE(!IsWindow(window) && question.count == 0);
}

// Only a move is asked about. A refused step beeps. The offsets outlive the
// window until the Monitor page's Default; the texts are cut to their buffers.
TEST_F(AdjustTest, EnterAsksWithNoAsTheDefaultAndYesStores)
{
    question.answer = 0;
    EXPECT_TRUE(!IsWindow(Keys({{VK_RETURN, 1}})) && question.count == 0);
    HWND window = Keys({{VK_RIGHT, 5}, {VK_RETURN, 1}});  // and Enter in the question
    EXPECT_TRUE(beep_count == 1 && Crtc(0x04) == 0x80 && adjust_offset_h == -4);
    EXPECT_TRUE(question.count == 1 && !IsWindow(window));
    EXPECT_STREQ("Screen Adjustment", question.caption);
    EXPECT_STREQ("Do you want to save this setting ?", question.text);
    int value;
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value));

    WriteTextFile(text_ini_path, "[TASKBAR]\nScreenSave=Soll diese Einstellung gespeichert werden? 0123456789\n"
                                 "AdjustGrp=Bildlage\nScreenUp=Nach oben hin\nScreenCancel=\n");
    question.answer = IDYES;
    Keys({{VK_DOWN, 1}, {VK_RETURN, 1}});
    EXPECT_STREQ("Soll diese Einstellung gespeichert werden? 012345", question.text);
    EXPECT_STREQ("Bildlage", question.caption);
    ASSERT_TRUE(StoredValue("1024x768x16x75V", &value));
    EXPECT_EQ(Crtc(0x10) + 256 * Crtc(0x07), value);
    ResetPosition();
    EXPECT_TRUE(VerticalRetrace() == 771 && Crtc(0x04) == 0x84 && !StoredValue("1024x768x16x75V", &value));

    LegendTexts t;  // the legend's labels share the keys
    memset(&t, '#', sizeof t);
    LoadLegendTexts(&t);
    EXPECT_EQ("Nach oben|Down|Left|Right||Soll dies",
              std::string(t.up) + "|" + t.down + "|" + t.left + "|" + t.right + "|" + t.cancel + "|" + t.save);
}

// 200 windows, each painted, stepped and closed, every other one through the save question, leave the
// handles as they were.
TEST_F(AdjustTest, WindowsKeepNoHandle)
{
    question.answer = IDNO;
    auto one = [](int i) { Keys({{VK_UP, 1}, {i % 2 ? VK_ESCAPE : VK_RETURN, 1}}); };
    one(0), one(1);  // the first load what stays: the message box's
    const std::string before = GuiHandles();
    for (int i = 0; i < 200; ++i) one(i);
    EXPECT_EQ(before, GuiHandles());
    EXPECT_FALSE(FindWindowA(adjust_window_class, NULL));
}

// The nested rectangles' corners sit on the diagonals whatever the proportions;
// the key legend is centred in the lowest fifth.
TEST(AdjustPicture, RectanglesOnTheDiagonalsAndTheLegendBelow)
{
    for (SIZE screen : {SIZE{640, 480}, SIZE{1024, 768}, SIZE{1280, 1024}, SIZE{1600, 1200}, SIZE{1280, 720}}) {
        const int w = screen.cx, h = screen.cy;
        BITMAPINFO bi = {{sizeof bi.bmiHeader, w, -h, 1, 32}};
        void* bits;
        HDC dc = CreateCompatibleDC(NULL);
        HGDIOBJ old = SelectObject(dc, CreateDIBSection(dc, &bi, DIB_RGB_COLORS, &bits, NULL, 0));
        RECT client = {0, 0, w, h};
        DrawTestPattern(dc, &client);
        auto white = [&](int x, int y) { return GetPixel(dc, x, y) == RGB(255, 255, 255); };
        int y1 = 2, y3, x = w / 2 + w / 16;  // clear of the ellipses
        while (y1 < 40 && !white(20, y1)) ++y1;
        for (y3 = y1 + 2; y3 < y1 + 60 && !white(40, y3);) ++y3;
        EXPECT_NEAR(20.0 * h / w, y1, 1.0) << w << "x" << h;
        EXPECT_NEAR(40.0 * h / w, y3, 1.0) << w << "x" << h;
        EXPECT_TRUE(white(x, y1) && white(x, y3) && !white(x, y1 + 1)) << w << "x" << h;
        LegendLayout at = ComputeLegendLayout(w, h, 30, 60, 12);  // "Right" 30 wide, sample text 60 x 12
        EXPECT_TRUE(abs(w - 2 * at.x0 - 3 * at.column - 12 - 30) <= 1 && at.row1_y >= h * 4 / 5 - 1 &&
                    at.row2_y + at.glyph <= h) << w << "x" << h;
        DeleteObject(SelectObject(dc, old));
        DeleteDC(dc);
    }
}

}  // namespace
