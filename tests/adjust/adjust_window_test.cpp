// The adjustment window under Wine: its keys against the simulated card,
// its save question answered by pressing the message box's button, and
// the test pattern and legend it draws.
#include <string.h>

#include "adjust/adjust_pattern.h"
#include "adjust/adjust_test.h"
#include "adjust/adjust_window.h"
#include "adjust/position.h"
#include "hardware/multimon.h"
#include "shell/startup.h"

namespace {

// What the message box showed, and the button the test presses in it.
struct MessageBoxSeen {
    int answer;
    int count;
    HWND last;
    char caption[128];
    char text[128];
    int default_button;
    bool has_yes_no, has_ok_cancel, has_icon;
};
MessageBoxSeen seen;
HHOOK cbt_hook;

BOOL CALLBACK ReadBoxChild(HWND child, LPARAM)
{
    char cls[32], text[128];
    GetClassNameA(child, cls, sizeof cls);
    if (_stricmp(cls, "Static") != 0) return TRUE;
    if ((GetWindowLongA(child, GWL_STYLE) & SS_TYPEMASK) == SS_ICON) seen.has_icon = true;
    GetWindowTextA(child, text, sizeof text);
    if (strlen(text) > strlen(seen.text)) strcpy(seen.text, text);
    return TRUE;
}

HWND answerer;
const UINT MSG_ANSWER = WM_APP + 3;

// Runs in the message box's own loop once the box is up and has its focus.
LRESULT CALLBACK AnswererProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    if (message != MSG_ANSWER) return DefWindowProcA(window, message, wparam, lparam);
    HWND box = (HWND)lparam;
    GetWindowTextA(box, seen.caption, sizeof seen.caption);
    seen.text[0] = 0;
    EnumChildWindows(box, ReadBoxChild, 0);
    for (int id : {IDYES, IDNO})
        if ((GetWindowLongA(GetDlgItem(box, id), GWL_STYLE) & BS_TYPEMASK) == BS_DEFPUSHBUTTON) seen.default_button = id;
    seen.has_yes_no = GetDlgItem(box, IDYES) && GetDlgItem(box, IDNO);
    seen.has_ok_cancel = GetDlgItem(box, IDOK) || GetDlgItem(box, IDCANCEL);
    PostMessageA(box, WM_COMMAND, MAKEWPARAM(seen.answer, BN_CLICKED), (LPARAM)GetDlgItem(box, seen.answer));
    return 0;
}

LRESULT CALLBACK PressAnswer(int code, WPARAM wparam, LPARAM lparam)
{
    HWND box = (HWND)wparam;
    char cls[32] = "";
    if (code == HCBT_ACTIVATE) GetClassNameA(box, cls, sizeof cls);
    if (strcmp(cls, "#32770") == 0 && box != seen.last) {
        seen.last = box;
        ++seen.count;
        PostMessageA(answerer, MSG_ANSWER, 0, (LPARAM)box);
    }
    return CallNextHookEx(cbt_hook, code, wparam, lparam);
}

class AdjustWindowTest : public AdjustTest {
protected:
    void SetUp() override
    {
        AdjustTest::SetUp();
        memset(&seen, 0, sizeof seen);
        seen.answer = IDNO;
        WNDCLASSA wc;
        memset(&wc, 0, sizeof wc);
        wc.lpfnWndProc = AnswererProc;
        wc.hInstance = GetModuleHandleA(NULL);
        wc.lpszClassName = "AdjustTestAnswerer";
        RegisterClassA(&wc);
        answerer = CreateWindowA(wc.lpszClassName, "", 0, 0, 0, 0, 0, HWND_MESSAGE, NULL, wc.hInstance, NULL);
        cbt_hook = SetWindowsHookExA(WH_CBT, PressAnswer, NULL, GetCurrentThreadId());
    }
    void TearDown() override
    {
        if (HWND left = FindWindowA(adjust_window_class, NULL)) DestroyWindow(left);
        UnhookWindowsHookEx(cbt_hook);
        DestroyWindow(answerer);
        AdjustTest::TearDown();
    }
    HWND Open()
    {
        EXPECT_EQ(1, OpenAdjustWindow(NULL));
        HWND window = FindWindowA(adjust_window_class, NULL);
        EXPECT_TRUE(window != NULL);
        return window;
    }
    static void Press(HWND window, WPARAM key, int times = 1)
    {
        for (int i = 0; i < times; ++i) SendMessageA(window, WM_KEYDOWN, key, 1);
    }
};

TEST_F(AdjustWindowTest, CoversTheMonitorWithoutFrame)
{
    HWND window = Open();
    RECT want, got;
    GetAdapterMonitorRect(&want);
    GetWindowRect(window, &got);
    EXPECT_TRUE(EqualRect(&want, &got));
    LONG style = GetWindowLongA(window, GWL_STYLE);
    EXPECT_TRUE(style & WS_POPUP);
    EXPECT_FALSE(style & (WS_CAPTION | WS_BORDER | WS_THICKFRAME));
    EXPECT_TRUE(IsWindowVisible(window));
}

TEST_F(AdjustWindowTest, EightLeftThenEscapeReturns)
{
    HWND window = Open();
    Press(window, VK_LEFT, 8);
    EXPECT_EQ(8, adjust_offset_h);
    EXPECT_EQ(0x84 + 8, Crtc(0x04));
    Press(window, VK_ESCAPE);
    EXPECT_EQ(0x84, Crtc(0x04));
    EXPECT_EQ(0, adjust_offset_h);
    EXPECT_FALSE(IsWindow(window));
    EXPECT_EQ(0, seen.count);
}

TEST_F(AdjustWindowTest, TwentyOneStepsEachWayWithoutBeep)
{
    SetCrt(RoomyCrt());
    HWND window = Open();
    Press(window, VK_UP, 22);
    EXPECT_EQ(21, adjust_offset_v);
    EXPECT_EQ(0x1FFu + 21, VerticalRetrace());
    Press(window, VK_ESCAPE);
    EXPECT_EQ(0x1FFu, VerticalRetrace());

    window = Open();
    Press(window, VK_DOWN, 22);
    EXPECT_EQ(-21, adjust_offset_v);
    EXPECT_EQ(0x1FFu - 21, VerticalRetrace());
    Press(window, VK_RIGHT, 22);
    EXPECT_EQ(-21, adjust_offset_h);
    EXPECT_EQ(0x98 - 21, Crtc(0x04));
    EXPECT_EQ(0, beep_count);
}

TEST_F(AdjustWindowTest, RefusedStepBeeps)
{
    SetCrtc(0x04, 0x80);  // retrace at the blank start
    HWND window = Open();
    Press(window, VK_RIGHT);
    EXPECT_EQ(1, beep_count);
    EXPECT_EQ(0, adjust_offset_h);
    EXPECT_EQ(0x80, Crtc(0x04));
    Press(window, VK_LEFT);
    EXPECT_EQ(1, adjust_offset_h);
    EXPECT_EQ(1, beep_count);
}

TEST_F(AdjustWindowTest, OtherKeysAreIgnored)
{
    HWND window = Open();
    Press(window, 'A');
    Press(window, VK_SPACE);
    Press(window, VK_TAB);
    EXPECT_TRUE(IsWindow(window));
    EXPECT_EQ(0x84, Crtc(0x04));
    EXPECT_EQ(771u, VerticalRetrace());
}

TEST_F(AdjustWindowTest, EnterWithoutOffsetsAsksNothing)
{
    HWND window = Open();
    Press(window, VK_RETURN);
    EXPECT_FALSE(IsWindow(window));
    EXPECT_EQ(0, seen.count);
}

TEST_F(AdjustWindowTest, EnterAndYesSaves)
{
    HWND window = Open();
    Press(window, VK_DOWN);
    seen.answer = IDYES;
    Press(window, VK_RETURN);
    EXPECT_EQ(1, seen.count);
    EXPECT_STREQ("Screen Adjustment", seen.caption);
    EXPECT_STREQ("Do you want to save this setting ?", seen.text);
    EXPECT_TRUE(seen.has_yes_no);
    EXPECT_FALSE(seen.has_ok_cancel);
    EXPECT_TRUE(seen.has_icon);
    EXPECT_EQ(IDNO, seen.default_button);
    EXPECT_FALSE(IsWindow(window));

    int value = 0;
    ASSERT_TRUE(StoredValue("1024x768x16x75V", &value));
    EXPECT_EQ(Crtc(0x10) + 256 * Crtc(0x07), value);
    EXPECT_EQ(770u, VerticalRetrace()) << "the picture stays where it was moved";
    EXPECT_EQ(-1, adjust_offset_v) << "offsets are kept";
}

TEST_F(AdjustWindowTest, EnterAndNoKeepsOffsetsForNextVisit)
{
    HWND window = Open();
    Press(window, VK_LEFT, 2);
    Press(window, VK_RETURN);
    EXPECT_EQ(1, seen.count);
    EXPECT_FALSE(IsWindow(window));
    int value;
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value));
    EXPECT_EQ(0x86, Crtc(0x04));

    window = Open();
    Press(window, VK_LEFT);
    EXPECT_EQ(3, adjust_offset_h);
    Press(window, VK_ESCAPE);
    EXPECT_EQ(0x84, Crtc(0x04));

    window = Open();
    Press(window, VK_LEFT, 2);
    Press(window, VK_RETURN);
    ResetPosition();  // the Monitor page's Default button
    EXPECT_EQ(0x84, Crtc(0x04));
    EXPECT_EQ(0, adjust_offset_h);
}

TEST_F(AdjustWindowTest, QuestionTextsComeFromTheTextFileCut)
{
    UseTexts("ScreenSaveAsk=Soll diese Einstellung gespeichert werden? 0123456789abcdef\n"
             "AdjustGrp=Bildlage 0123456789012345678901234567890123456789012345678901\n"
             "ScreenSave=Sichern\n");
    HWND window = Open();
    Press(window, VK_UP);
    Press(window, VK_RETURN);
    EXPECT_EQ(49u, strlen(seen.text));
    EXPECT_EQ(0, strncmp(seen.text, "Soll diese Einstellung", 22));
    EXPECT_EQ(49u, strlen(seen.caption));
    EXPECT_EQ(0, strncmp(seen.caption, "Bildlage 0123", 13));
}

TEST_F(AdjustWindowTest, LegendTextsDefaultAndCutAtNine)
{
    LegendTexts texts;
    LoadLegendTexts(&texts);
    EXPECT_STREQ("Up", texts.up);
    EXPECT_STREQ("Down", texts.down);
    EXPECT_STREQ("Left", texts.left);
    EXPECT_STREQ("Right", texts.right);
    EXPECT_STREQ("Cancel", texts.cancel);
    EXPECT_STREQ("Save", texts.save);
    UseTexts("ScreenUp=Nach oben hin\nScreenRight=Nach rechts\nScreenSave=Speichern!\nScreenCancel=\n");
    memset(&texts, 'x', sizeof texts);
    LoadLegendTexts(&texts);
    EXPECT_STREQ("Nach oben", texts.up);
    EXPECT_STREQ("Nach rech", texts.right);
    EXPECT_STREQ("Speichern", texts.save);
    EXPECT_STREQ("", texts.cancel) << "an empty entry is an empty text";
    EXPECT_STREQ("Down", texts.down);
}

// The first white pixel of a column from y = from downwards.
static int FirstWhite(HDC dc, int x, int from, int to)
{
    for (int y = from; y <= to; ++y)
        if (GetPixel(dc, x, y) == RGB(255, 255, 255)) return y;
    return -1;
}

static bool HasColour(HDC dc, int left, int top, int right, int bottom, COLORREF colour)
{
    for (int y = top; y < bottom; ++y)
        for (int x = left; x < right; x += 1)
            if (GetPixel(dc, x, y) == colour) return true;
    return false;
}

TEST_F(AdjustWindowTest, PaintsPatternAndLegend)
{
    HWND window = Open();
    RECT client;
    GetClientRect(window, &client);
    HDC dc = GetDC(window);
    int y1 = FirstWhite(dc, 20, 2, 38);
    ASSERT_GT(y1, 0);
    EXPECT_EQ(RGB(255, 255, 255), GetPixel(dc, client.right / 2, y1)) << "nested rectangle on the diagonal";
    int legend_top = client.bottom * 4 / 5;
    EXPECT_TRUE(HasColour(dc, 0, legend_top, client.right, legend_top + 20, RGB(0, 255, 255))) << "cyan labels";
    EXPECT_TRUE(HasColour(dc, 0, legend_top, client.right, legend_top + 20, RGB(255, 255, 0))) << "yellow glyphs";
    ReleaseDC(window, dc);
}

struct PatternCanvas {
    HDC dc;
    HBITMAP bitmap;
    HGDIOBJ old;
    PatternCanvas(int width, int height)
    {
        BITMAPINFO bi;
        memset(&bi, 0, sizeof bi);
        bi.bmiHeader.biSize = sizeof bi.bmiHeader;
        bi.bmiHeader.biWidth = width;
        bi.bmiHeader.biHeight = -height;
        bi.bmiHeader.biPlanes = 1;
        bi.bmiHeader.biBitCount = 32;
        void* bits;
        dc = CreateCompatibleDC(NULL);
        bitmap = CreateDIBSection(dc, &bi, DIB_RGB_COLORS, &bits, NULL, 0);
        memset(bits, 0, (size_t)width * height * 4);
        old = SelectObject(dc, bitmap);
    }
    ~PatternCanvas()
    {
        SelectObject(dc, old);
        DeleteObject(bitmap);
        DeleteDC(dc);
    }
};

TEST(TestPattern, NestedRectanglesSitOnTheDiagonals)
{
    static const SIZE screens[] = {{640, 480}, {800, 600}, {1024, 768}, {1280, 1024}, {1600, 1200}, {1280, 720}};
    for (const SIZE& screen : screens) {
        SCOPED_TRACE(testing::Message() << screen.cx << "x" << screen.cy);
        const int w = screen.cx, h = screen.cy;
        PatternCanvas canvas(w, h);
        RECT client = {0, 0, w, h};
        DrawTestPattern(canvas.dc, &client);
        HDC dc = canvas.dc;

        int y1 = FirstWhite(dc, 20, 2, 38);
        int y3 = FirstWhite(dc, 40, y1 + 2, y1 + 60);
        EXPECT_NEAR(20.0 * h / w, y1, 1.0);
        EXPECT_NEAR(40.0 * h / w, y3, 1.0);
        // A column clear of the diagonals and ellipses.
        const int x = w / 2 + w / 16;
        EXPECT_EQ(RGB(255, 255, 255), GetPixel(dc, x, y1)) << "top of the first rectangle";
        EXPECT_EQ(RGB(255, 255, 255), GetPixel(dc, x, y3)) << "top of the second rectangle";
        EXPECT_EQ(RGB(0, 0, 0), GetPixel(dc, x, y1 + 1));

        // The circle is as high as the second rectangle and centred.
        int y4 = h - 1 - y3 + 1;
        int d = (w - (y4 - y3)) / 2;
        bool found = false;
        for (int dy = -2; dy <= 2 && !found; ++dy)
            for (int dx = -1; dx <= 1 && !found; ++dx) found = GetPixel(dc, d + dx, (y3 + y4) / 2 + dy) != 0;
        EXPECT_TRUE(found) << "left side of the circle at x " << d;
    }
}

TEST(TestPattern, SearchWithoutWhiteGivesTheCentre)
{
    PatternCanvas canvas(100, 100);
    EXPECT_EQ(40, SearchWhite(canvas.dc, 10, 40, 18));
    EXPECT_EQ(40, SearchWhite(canvas.dc, 10, 40, -3));
    SetPixel(canvas.dc, 10, 30, RGB(255, 255, 255));
    SetPixel(canvas.dc, 10, 50, RGB(255, 255, 255));
    SetPixel(canvas.dc, 10, 25, RGB(254, 255, 255));
    EXPECT_EQ(30, SearchWhite(canvas.dc, 10, 40, 18));
    EXPECT_EQ(40, SearchWhite(canvas.dc, 10, 40, 9));
}

TEST(KeyLegend, CentredUnderThePattern)
{
    LegendLayout at = ComputeLegendLayout(1024, 768, 31, 40, 16);
    EXPECT_EQ(120, at.column);
    EXPECT_EQ(16, at.glyph);
    int used = 3 * at.column + at.glyph + 31;
    EXPECT_LE(1024 - (2 * at.x0 + used), 1);
    EXPECT_GE(1024 - (2 * at.x0 + used), 0);
    EXPECT_EQ(614, at.row1_y);
    EXPECT_EQ(614 + 32, at.row2_y);
}

TEST(KeyLegend, NarrowScreenStartsAtTheEdgeWithNarrowerColumns)
{
    LegendLayout at = ComputeLegendLayout(300, 200, 31, 40, 16);
    EXPECT_EQ(0, at.x0);
    EXPECT_EQ(110, at.column);
    EXPECT_EQ(160, at.row1_y);
}

TEST(KeyLegend, GlyphsPointWhereTheirKeysMove)
{
    const int x = 100, y = 200, s = 16;
    GlyphLine lines[GLYPH_MAX_LINES];
    struct Tip {
        Glyph glyph;
        int x, y;
    };
    const Tip tips[] = {{GLYPH_UP, x + 5, y}, {GLYPH_DOWN, x + 5, y + s}, {GLYPH_LEFT, x, y + s / 2},
                        {GLYPH_RIGHT, x + s, y + s / 2}};
    for (const Tip& tip : tips) {
        ASSERT_EQ(3, GlyphLines(tip.glyph, x, y, s, lines));
        for (int i = 0; i < 3; ++i) {
            EXPECT_EQ(tip.x, lines[i].x1) << "glyph " << tip.glyph;
            EXPECT_EQ(tip.y, lines[i].y1) << "glyph " << tip.glyph;
            // Everything else lies behind the tip, within the glyph's cell.
            EXPECT_GE(lines[i].x2, x);
            EXPECT_LE(lines[i].x2, x + s);
            EXPECT_GE(lines[i].y2, y);
            EXPECT_LE(lines[i].y2, y + s);
        }
    }
    // Enter: an arrow to the left whose shaft turns up at its right end.
    ASSERT_EQ(4, GlyphLines(GLYPH_ENTER, x, y, s, lines));
    EXPECT_EQ(lines[2].x2, lines[3].x1);
    EXPECT_EQ(lines[2].y2, lines[3].y1);
    EXPECT_EQ(x + s, lines[3].x2);
    EXPECT_LT(lines[3].y2, lines[3].y1);
    EXPECT_EQ(x, lines[0].x1);
}

}  // namespace
