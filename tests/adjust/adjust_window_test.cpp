// The adjustment window under Wine: keys against the simulated card, the
// save question answered in its message box, and what it draws.
#include <string.h>

#include "adjust/adjust_pattern.h"
#include "adjust/adjust_test.h"
#include "adjust/adjust_window.h"
#include "base/protocol.h"
#include "base/settings.h"
#include "hardware/multimon.h"
#include "modes/position.h"
#include "shell/startup.h"

namespace {

// The message box as the test found it, and the button it presses there.
struct Box {
    int answer, count, default_button;
    HWND last;
    char caption[128], text[128];
} box;
HHOOK cbt_hook;
HWND answerer;
const UINT MSG_ANSWER = WM_APP + 3;

BOOL CALLBACK LongestText(HWND child, LPARAM)
{
    char text[128];
    GetWindowTextA(child, text, sizeof text);
    if (strlen(text) > strlen(box.text)) strcpy(box.text, text);
    return TRUE;
}

// Posted when the box activates, so it runs in the box's own loop once
// the box has set up its buttons.
LRESULT CALLBACK AnswererProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    if (message != MSG_ANSWER) return DefWindowProcA(window, message, wparam, lparam);
    HWND b = (HWND)lparam;
    GetWindowTextA(b, box.caption, sizeof box.caption);
    EnumChildWindows(b, LongestText, 0);
    for (int id : {IDYES, IDNO, IDOK, IDCANCEL})
        if (GetDlgItem(b, id) && (GetWindowLongA(GetDlgItem(b, id), GWL_STYLE) & BS_TYPEMASK) == BS_DEFPUSHBUTTON)
            box.default_button = id;
    PostMessageA(b, WM_COMMAND, MAKEWPARAM(box.answer, BN_CLICKED), (LPARAM)GetDlgItem(b, box.answer));
    return 0;
}

LRESULT CALLBACK FindBox(int code, WPARAM wparam, LPARAM lparam)
{
    char cls[32] = "";
    if (code == HCBT_ACTIVATE) GetClassNameA((HWND)wparam, cls, sizeof cls);
    if (strcmp(cls, "#32770") == 0 && (HWND)wparam != box.last) {
        box.last = (HWND)wparam;
        ++box.count;
        PostMessageA(answerer, MSG_ANSWER, 0, wparam);
    }
    return CallNextHookEx(cbt_hook, code, wparam, lparam);
}

class AdjustWindowTest : public AdjustTest {
protected:
    void SetUp() override
    {
        AdjustTest::SetUp();
        memset(&box, 0, sizeof box);
        box.answer = IDNO;
        WNDCLASSA wc;
        memset(&wc, 0, sizeof wc);
        wc.lpfnWndProc = AnswererProc;
        wc.hInstance = GetModuleHandleA(NULL);
        wc.lpszClassName = "AdjustTestAnswerer";
        RegisterClassA(&wc);
        answerer = CreateWindowA(wc.lpszClassName, "", 0, 0, 0, 0, 0, HWND_MESSAGE, NULL, wc.hInstance, NULL);
        cbt_hook = SetWindowsHookExA(WH_CBT, FindBox, NULL, GetCurrentThreadId());
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
        return FindWindowA(adjust_window_class, NULL);
    }
    static void Press(HWND window, WPARAM key, int times = 1)
    {
        for (int i = 0; i < times; ++i) SendMessageA(window, WM_KEYDOWN, key, 1);
    }
};

TEST_F(AdjustWindowTest, EightLeftThenEscapeReturns)
{
    HWND window = Open();
    RECT monitor, got;
    GetAdapterMonitorRect(&monitor);
    GetWindowRect(window, &got);
    EXPECT_TRUE(EqualRect(&monitor, &got));
    EXPECT_FALSE(GetWindowLongA(window, GWL_STYLE) & (WS_CAPTION | WS_BORDER | WS_THICKFRAME));
    Press(window, VK_LEFT, 8);
    EXPECT_EQ(8, adjust_offset_h);
    EXPECT_EQ(0x84 + 8, Crtc(0x04));
    Press(window, VK_ESCAPE);
    EXPECT_EQ(0x84, Crtc(0x04));
    EXPECT_EQ(0, adjust_offset_h);
    EXPECT_FALSE(IsWindow(window));
}

TEST_F(AdjustWindowTest, TwentyOneStepsEachWayThenSilence)
{
    SetRoomyCrt();
    HWND window = Open();
    Press(window, VK_UP, 22);
    EXPECT_EQ(21, adjust_offset_v);
    EXPECT_EQ(0x1FFu + 21, VerticalRetrace());
    Press(window, VK_DOWN, 44);
    EXPECT_EQ(-21, adjust_offset_v);
    EXPECT_EQ(0x1FFu - 21, VerticalRetrace());
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
}

TEST_F(AdjustWindowTest, EnterAndYesSaves)
{
    HWND window = Open();
    Press(window, VK_DOWN);
    box.answer = IDYES;
    Press(window, VK_RETURN);
    EXPECT_EQ(1, box.count);
    EXPECT_STREQ("Screen Adjustment", box.caption);
    EXPECT_STREQ("Do you want to save this setting ?", box.text);
    EXPECT_EQ(IDNO, box.default_button);
    EXPECT_FALSE(IsWindow(window));
    int value = 0;
    ASSERT_TRUE(StoredValue("1024x768x16x75V", &value));
    EXPECT_EQ(Crtc(0x10) + 256 * Crtc(0x07), value);
    EXPECT_EQ(770u, VerticalRetrace()) << "the picture stays where it was moved";
    EXPECT_EQ(-1, adjust_offset_v) << "offsets are kept";
}

TEST_F(AdjustWindowTest, EnterAndNoKeepsOffsetsUntilDefault)
{
    HWND window = Open();
    Press(window, VK_RETURN);
    EXPECT_FALSE(IsWindow(window));
    EXPECT_EQ(0, box.count) << "nothing moved, nothing asked";

    window = Open();
    Press(window, VK_LEFT, 2);
    Press(window, VK_RETURN);
    EXPECT_EQ(1, box.count);
    int value;
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value));
    window = Open();
    Press(window, VK_LEFT);
    EXPECT_EQ(3, adjust_offset_h);
    EXPECT_EQ(0x87, Crtc(0x04));
    SaveSetting(SETTING_POSITION_H, 0x87);
    DestroyWindow(window);
    ResetPosition();  // the Monitor page's Default button
    EXPECT_EQ(0x84, Crtc(0x04));
    EXPECT_EQ(0, adjust_offset_h);
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value));
}

TEST_F(AdjustWindowTest, TextsFromTheTextFileAreCut)
{
    // One key serves the legend's label and the question, each cut to its size.
    UseTexts("ScreenSave=Soll diese Einstellung gespeichert werden? 0123456789abcdef\n"
             "AdjustGrp=Bildlage 0123456789012345678901234567890123456789012345678901\n"
             "ScreenUp=Nach oben hin\nScreenCancel=\n");
    HWND window = Open();
    Press(window, VK_UP);
    Press(window, VK_RETURN);
    EXPECT_EQ(49u, strlen(box.text));
    EXPECT_EQ(0, strncmp(box.text, "Soll diese", 10));
    EXPECT_EQ(49u, strlen(box.caption));
    LegendTexts texts;
    LoadLegendTexts(&texts);
    EXPECT_STREQ("Nach oben", texts.up);
    EXPECT_STREQ("Soll dies", texts.save);
    EXPECT_STREQ("", texts.cancel) << "an empty entry is an empty text";
    EXPECT_STREQ("Right", texts.right);
}

int FirstWhite(HDC dc, int x, int from, int to)
{
    for (int y = from; y <= to; ++y)
        if (GetPixel(dc, x, y) == RGB(255, 255, 255)) return y;
    return -1;
}

TEST(TestPattern, NestedRectanglesSitOnTheDiagonals)
{
    static const SIZE screens[] = {{640, 480}, {1024, 768}, {1280, 1024}, {1600, 1200}, {1280, 720}};
    for (const SIZE& screen : screens) {
        const int w = screen.cx, h = screen.cy;
        SCOPED_TRACE(testing::Message() << w << "x" << h);
        BITMAPINFO bi = {};
        bi.bmiHeader = {sizeof bi.bmiHeader, w, -h, 1, 32};
        void* bits;
        HDC dc = CreateCompatibleDC(NULL);
        HBITMAP bitmap = CreateDIBSection(dc, &bi, DIB_RGB_COLORS, &bits, NULL, 0);
        HGDIOBJ old = SelectObject(dc, bitmap);
        RECT client = {0, 0, w, h};
        DrawTestPattern(dc, &client);

        int y1 = FirstWhite(dc, 20, 2, 38);
        int y3 = FirstWhite(dc, 40, y1 + 2, y1 + 60);
        EXPECT_NEAR(20.0 * h / w, y1, 1.0);
        EXPECT_NEAR(40.0 * h / w, y3, 1.0);
        const int x = w / 2 + w / 16;  // clear of the diagonals and ellipses
        EXPECT_EQ(RGB(255, 255, 255), GetPixel(dc, x, y1));
        EXPECT_EQ(RGB(255, 255, 255), GetPixel(dc, x, y3));
        EXPECT_EQ(RGB(0, 0, 0), GetPixel(dc, x, y1 + 1));
        SelectObject(dc, old);
        DeleteObject(bitmap);
        DeleteDC(dc);
    }
}

}  // namespace
