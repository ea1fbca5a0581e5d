// The panning dialog: its hit regions, its pictures, and the dialog itself
// under Wine, driven by posted mouse messages against the simulated card.
#include <stdio.h>
#include <string.h>

#include <vector>

#include "adjust/adjust_resources.h"
#include "adjust/adjust_test.h"
#include "adjust/panning_dialog.h"
#include "hardware/adapters.h"
#include "modes/mode_list.h"
#include "shell/globals.h"

namespace {

TEST(PadHit, Regions)
{
    struct Case {
        int x, y;
        PadElement element;
    };
    static const Case cases[] = {
        {60, 50, PAD_AUTO},     {60, 46, PAD_UP},       {30, 20, PAD_NOTHING},  {130, 120, PAD_NOTHING},
        {50, 0, PAD_UP},        {124, 46, PAD_UP},      {49, 46, PAD_NOTHING},  {125, 46, PAD_NOTHING},
        {0, 47, PAD_LEFT},      {49, 115, PAD_LEFT},    {50, 47, PAD_AUTO},     {124, 115, PAD_AUTO},
        {125, 47, PAD_RIGHT},   {167, 115, PAD_RIGHT},  {50, 116, PAD_DOWN},    {124, 167, PAD_DOWN},
        {49, 116, PAD_NOTHING}, {125, 167, PAD_NOTHING},
    };
    for (const Case& c : cases) EXPECT_EQ(c.element, PadHit(c.x, c.y)) << "at " << c.x << "," << c.y;
}

TEST(PadHit, OriginCentresOrStartsAtTheFrame)
{
    EXPECT_EQ(10 + 21, PadOrigin(10, 210, 168));
    EXPECT_EQ(10, PadOrigin(10, 168, 168));
    EXPECT_EQ(10, PadOrigin(10, 150, 168));
}

// A bitmap resource of the test program as 32-bit pixels, top row first.
std::vector<COLORREF> PicturePixels(int id, int* width, int* height)
{
    std::vector<COLORREF> pixels;
    HBITMAP picture = LoadBitmapA(GetModuleHandleA(NULL), MAKEINTRESOURCEA(id));
    if (!picture) return pixels;
    BITMAP bm;
    GetObjectA(picture, sizeof bm, &bm);
    *width = bm.bmWidth;
    *height = bm.bmHeight;
    BITMAPINFO bi;
    memset(&bi, 0, sizeof bi);
    bi.bmiHeader.biSize = sizeof bi.bmiHeader;
    bi.bmiHeader.biWidth = bm.bmWidth;
    bi.bmiHeader.biHeight = -bm.bmHeight;
    bi.bmiHeader.biPlanes = 1;
    bi.bmiHeader.biBitCount = 32;
    pixels.resize((size_t)bm.bmWidth * bm.bmHeight);
    HDC dc = GetDC(NULL);
    GetDIBits(dc, picture, 0, bm.bmHeight, pixels.data(), &bi, DIB_RGB_COLORS);
    ReleaseDC(NULL, dc);
    DeleteObject(picture);
    return pixels;
}

const BITMAPINFOHEADER* StoredHeader(int id)
{
    HRSRC found = FindResourceA(GetModuleHandleA(NULL), MAKEINTRESOURCEA(id), (LPCSTR)RT_BITMAP);
    if (!found) return NULL;
    return (const BITMAPINFOHEADER*)LockResource(LoadResource(GetModuleHandleA(NULL), found));
}

TEST(PadPictures, SixteenColoursOfTheDocumentedSizes)
{
    static const int pad_ids[] = {IDB_PAD_AUTO,   IDB_PAD_DOWN,  IDB_PAD_LEFT,
                                  IDB_PAD_NORMAL, IDB_PAD_RIGHT, IDB_PAD_UP};
    for (int id : pad_ids) {
        const BITMAPINFOHEADER* h = StoredHeader(id);
        ASSERT_TRUE(h != NULL) << id;
        EXPECT_EQ(PAD_SIZE, h->biWidth) << id;
        EXPECT_EQ(PAD_SIZE, h->biHeight) << id;
        EXPECT_EQ(4, h->biBitCount) << id;
    }
    const BITMAPINFOHEADER* corner = StoredHeader(IDB_PANNING_CORNER);
    ASSERT_TRUE(corner != NULL);
    EXPECT_EQ(48, corner->biWidth);
    EXPECT_EQ(44, corner->biHeight);
    EXPECT_EQ(4, corner->biBitCount);
}

// Each pressed picture differs from the released one only inside the
// element that the hit regions give for it, so a click lands on what it shows.
TEST(PadPictures, PressedElementsMatchTheHitRegions)
{
    struct Pressed {
        int id;
        PadElement element;
    };
    static const Pressed pictures[] = {{IDB_PAD_UP, PAD_UP},
                                       {IDB_PAD_DOWN, PAD_DOWN},
                                       {IDB_PAD_LEFT, PAD_LEFT},
                                       {IDB_PAD_RIGHT, PAD_RIGHT},
                                       {IDB_PAD_AUTO, PAD_AUTO}};
    int w = 0, h = 0;
    std::vector<COLORREF> normal = PicturePixels(IDB_PAD_NORMAL, &w, &h);
    ASSERT_EQ((size_t)PAD_SIZE * PAD_SIZE, normal.size());
    for (const Pressed& p : pictures) {
        std::vector<COLORREF> pressed = PicturePixels(p.id, &w, &h);
        ASSERT_EQ(normal.size(), pressed.size());
        int changed = 0, stray = 0;
        for (int y = 0; y < PAD_SIZE; ++y)
            for (int x = 0; x < PAD_SIZE; ++x) {
                if (pressed[y * PAD_SIZE + x] == normal[y * PAD_SIZE + x]) continue;
                ++changed;
                if (PadHit(x, y) != p.element) ++stray;
            }
        EXPECT_GT(changed, 300) << "picture " << p.id << " marks its element";
        EXPECT_EQ(0, stray) << "picture " << p.id << " changes pixels outside its element";
    }
}

// Drives a modal dialog from inside its own message loop: each step runs
// once every message the dialog posted itself has been handled.
typedef void (*DialogStep)(HWND dialog);
const DialogStep* script;
int script_length, script_next;
HWND driver;
const char dialog_title[] = "Panning under test";
const UINT MSG_NEXT_STEP = WM_APP + 7;
const int settle_limit = 1000;
int settle_rounds;

HHOOK start_hook;

// The dialog is shown only once its loop finds the queue empty; the script
// starts when it is.
LRESULT CALLBACK StartWhenShown(int code, WPARAM wparam, LPARAM lparam)
{
    const CWPRETSTRUCT* call = (const CWPRETSTRUCT*)lparam;
    char title[64] = "";
    if (code == HC_ACTION && call->message == WM_SHOWWINDOW && call->wParam)
        GetWindowTextA(call->hwnd, title, sizeof title);
    if (strcmp(title, dialog_title) == 0 && script_next == 0 && !settle_rounds) {
        settle_rounds = 1;
        PostMessageA(driver, MSG_NEXT_STEP, 0, 0);
    }
    return CallNextHookEx(start_hook, code, wparam, lparam);
}

LRESULT CALLBACK DriverProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    if (message != MSG_NEXT_STEP) return DefWindowProcA(window, message, wparam, lparam);
    if ((HIWORD(GetQueueStatus(QS_POSTMESSAGE)) & QS_POSTMESSAGE) && ++settle_rounds < settle_limit) {
        PostMessageA(window, MSG_NEXT_STEP, 0, 0);
        return 0;
    }
    EXPECT_LT(settle_rounds, settle_limit) << "the dialog kept posting";
    settle_rounds = 0;
    HWND dialog = FindWindowA(MAKEINTATOM(32770), dialog_title);
    if (!dialog || script_next >= script_length) return 0;
    script[script_next++](dialog);
    if (script_next < script_length) PostMessageA(window, MSG_NEXT_STEP, 0, 0);
    return 0;
}

class PanningDialogTest : public AdjustTest {
protected:
    void SetUp() override
    {
        AdjustTest::SetUp();
        WNDCLASSA wc;
        memset(&wc, 0, sizeof wc);
        wc.lpfnWndProc = DriverProc;
        wc.hInstance = GetModuleHandleA(NULL);
        wc.lpszClassName = "PanningTestDriver";
        RegisterClassA(&wc);
        driver = CreateWindowA("PanningTestDriver", "", 0, 0, 0, 0, 0, HWND_MESSAGE, NULL, wc.hInstance, NULL);
    }
    void TearDown() override
    {
        DestroyWindow(driver);
        AdjustTest::TearDown();
    }
    template <size_t N>
    int Run(const DialogStep (&steps)[N])
    {
        script = steps;
        script_length = (int)N;
        script_next = 0;
        settle_rounds = 0;
        start_hook = SetWindowsHookExA(WH_CALLWNDPROCRET, StartWhenShown, NULL, GetCurrentThreadId());
        int result = OpenPanningDialog(NULL, dialog_title);
        UnhookWindowsHookEx(start_hook);
        EXPECT_EQ(script_length, script_next) << "every step ran";
        return result;
    }
};

RECT PadOn(HWND dialog)
{
    HWND frame = GetDlgItem(dialog, IDC_PANNING_FRAME);
    RECT r;
    GetClientRect(frame, &r);
    MapWindowPoints(frame, dialog, (POINT*)&r, 2);
    RECT pad;
    pad.left = PadOrigin(r.left, r.right - r.left, PAD_SIZE);
    pad.top = PadOrigin(r.top, r.bottom - r.top, PAD_SIZE);
    pad.right = pad.left + PAD_SIZE;
    pad.bottom = pad.top + PAD_SIZE;
    return pad;
}

void ButtonDown(HWND dialog, int pad_x, int pad_y)
{
    RECT pad = PadOn(dialog);
    PostMessageA(dialog, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(pad.left + pad_x, pad.top + pad_y));
}

void ButtonUp(HWND dialog) { PostMessageA(dialog, WM_LBUTTONUP, 0, MAKELPARAM(1, 1)); }

// Pad points inside each element.
const POINT up_arrow = {87, 20}, down_arrow = {87, 140}, left_arrow = {20, 81}, right_arrow = {150, 81},
            auto_button = {87, 81};

void Press(HWND dialog, POINT at) { ButtonDown(dialog, at.x, at.y); }

const PanningState* State() { return PanningDialogState(); }

COLORREF PicturePixel(int id, int x, int y)
{
    int w = 0, h = 0;
    std::vector<COLORREF> pixels = PicturePixels(id, &w, &h);
    if (pixels.empty()) return CLR_INVALID;
    COLORREF bgr = pixels[y * w + x];
    return RGB(GetBValue(bgr), GetGValue(bgr), GetRValue(bgr));
}

void ExpectOpened(HWND dialog)
{
    char text[128];
    GetWindowTextA(dialog, text, sizeof text);
    EXPECT_STREQ(dialog_title, text);

    HDC screen = GetDC(NULL);
    char mode[64];
    snprintf(mode, sizeof mode, "%dx%d--%d bits, 75 Hz", GetDeviceCaps(screen, HORZRES),
             GetDeviceCaps(screen, VERTRES), TrueBitsPerPixel(GetDeviceCaps(screen, BITSPIXEL)));
    ReleaseDC(NULL, screen);
    GetDlgItemTextA(dialog, IDC_PANNING_MODE, text, sizeof text);
    EXPECT_STREQ(mode, text);
    GetDlgItemTextA(dialog, IDCANCEL, text, sizeof text);
    EXPECT_STREQ("Cancel", text);
    GetDlgItemTextA(dialog, IDC_PANNING_SAVE, text, sizeof text);
    EXPECT_STREQ("Save", text);

    RECT r;
    GetWindowRect(dialog, &r);
    EXPECT_NEAR(GetSystemMetrics(SM_CXSCREEN) - r.right, r.left, 1) << "centred";
    EXPECT_NEAR(GetSystemMetrics(SM_CYSCREEN) - r.bottom, r.top, 1) << "centred";

    EXPECT_EQ(IDB_PAD_NORMAL, State()->picture);
    EXPECT_EQ(0, State()->offset_h);
    EXPECT_EQ(0, State()->offset_v);
}

// The frame is teal around the pad, and the pad shows the picture.
void ExpectPainted(HWND dialog, int picture)
{
    UpdateWindow(dialog);
    HWND frame = GetDlgItem(dialog, IDC_PANNING_FRAME);
    RECT f;
    GetClientRect(frame, &f);
    MapWindowPoints(frame, dialog, (POINT*)&f, 2);
    RECT pad = PadOn(dialog);
    EXPECT_NEAR((f.right - pad.right) - (pad.left - f.left), 0, 1) << "pad centred in the frame";
    HDC dc = GetDC(dialog);
    EXPECT_EQ(RGB(0, 128, 128), GetPixel(dc, f.left + 3, f.top + 3));
    static const POINT probes[] = {{87, 81}, {20, 81}, {87, 20}, {150, 81}, {87, 140}, {5, 5}};
    for (const POINT& p : probes)
        EXPECT_EQ(PicturePixel(picture, p.x, p.y), GetPixel(dc, pad.left + p.x, pad.top + p.y))
            << "pad pixel " << p.x << "," << p.y << " of picture " << picture;
    ReleaseDC(dialog, dc);
}

TEST_F(PanningDialogTest, ArrowsAutoAndSave)
{
    static const DialogStep steps[] = {
        [](HWND d) {
            ExpectOpened(d);
            ExpectPainted(d, IDB_PAD_NORMAL);
            Press(d, left_arrow);
        },
        [](HWND d) {
            EXPECT_EQ(0x85, Crtc(0x04));
            EXPECT_EQ(1, State()->offset_h);
            EXPECT_EQ(IDB_PAD_LEFT, State()->picture);
            EXPECT_TRUE(State()->arrow_shown);
            EXPECT_EQ(GetDlgItem(d, IDCANCEL), GetFocus()) << "the click moves the focus to Cancel";
            ExpectPainted(d, IDB_PAD_LEFT);
            ButtonUp(d);
        },
        [](HWND d) {
            EXPECT_EQ(IDB_PAD_NORMAL, State()->picture);
            EXPECT_FALSE(State()->arrow_shown);
            Press(d, down_arrow);
        },
        [](HWND d) {
            EXPECT_EQ(770u, VerticalRetrace());
            EXPECT_EQ(IDB_PAD_DOWN, State()->picture);
            ButtonUp(d);
        },
        [](HWND d) { Press(d, auto_button); },
        [](HWND d) {
            EXPECT_EQ(0x84, Crtc(0x04)) << "AUTO goes back to the start";
            EXPECT_EQ(771u, VerticalRetrace());
            EXPECT_EQ(0, State()->offset_h);
            EXPECT_TRUE(State()->auto_latched);
            EXPECT_EQ(IDB_PAD_AUTO, State()->picture);
            ButtonUp(d);
        },
        [](HWND d) {
            EXPECT_EQ(IDB_PAD_AUTO, State()->picture) << "latched through the button's release";
            ExpectPainted(d, IDB_PAD_AUTO);
            Press(d, auto_button);
        },
        [](HWND d) {
            EXPECT_FALSE(State()->auto_latched);
            EXPECT_EQ(IDB_PAD_NORMAL, State()->picture);
            EXPECT_EQ(0x84, Crtc(0x04));
            EXPECT_EQ(771u, VerticalRetrace());
            ButtonUp(d);
        },
        [](HWND d) { Press(d, up_arrow); },
        [](HWND d) {
            EXPECT_EQ(772u, VerticalRetrace());
            EXPECT_EQ(IDB_PAD_UP, State()->picture);
            ButtonUp(d);
        },
        [](HWND d) { PostMessageA(d, WM_COMMAND, IDC_PANNING_SAVE, (LPARAM)GetDlgItem(d, IDC_PANNING_SAVE)); },
    };
    EXPECT_EQ(1, Run(steps));
    int value = 0;
    ASSERT_TRUE(StoredValue("1024x768x16x75V", &value));
    EXPECT_EQ(Crtc(0x10) + 256 * Crtc(0x07), value);
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value)) << "the horizontal offset was back at 0";
    EXPECT_EQ(772u, VerticalRetrace()) << "the picture stays where it is";
}

TEST_F(PanningDialogTest, CloseBoxUndoesAndClicksOffTheArrowsDoNothing)
{
    static const DialogStep steps[] = {
        [](HWND d) {
            Press(d, right_arrow);
            ButtonUp(d);
            Press(d, right_arrow);
            ButtonUp(d);
        },
        [](HWND d) {
            EXPECT_EQ(0x82, Crtc(0x04));
            EXPECT_EQ(-2, State()->offset_h);
            ButtonDown(d, 30, 20);
            ButtonDown(d, 130, 120);
            PostMessageA(d, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(1, 1));  // outside the pad
        },
        [](HWND d) {
            EXPECT_EQ(0x82, Crtc(0x04));
            EXPECT_EQ(771u, VerticalRetrace());
            EXPECT_EQ(IDB_PAD_NORMAL, State()->picture);
            PostMessageA(d, WM_SYSCOMMAND, SC_CLOSE, 0);
        },
    };
    EXPECT_EQ(0, Run(steps));
    EXPECT_EQ(0x84, Crtc(0x04));
    int value;
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value));
    EXPECT_EQ(0, State()->offset_h);
}

TEST_F(PanningDialogTest, RefusedArrowShowsNothingAndIsSilent)
{
    SetCrtc(0x04, 0x80);  // at the blank start: Right is refused
    static const DialogStep steps[] = {
        [](HWND d) {
            Press(d, auto_button);
            ButtonUp(d);
        },
        [](HWND d) { Press(d, right_arrow); },
        [](HWND d) {
            EXPECT_EQ(0x80, Crtc(0x04));
            EXPECT_EQ(0, State()->offset_h);
            EXPECT_TRUE(State()->arrow_shown);
            EXPECT_FALSE(State()->auto_latched) << "an arrow releases AUTO";
            EXPECT_EQ(IDB_PAD_AUTO, State()->picture) << "no step, no new picture";
            ButtonUp(d);
        },
        [](HWND d) {
            EXPECT_EQ(IDB_PAD_NORMAL, State()->picture);
            PostMessageA(d, WM_COMMAND, IDCANCEL, 0);
        },
    };
    EXPECT_EQ(0, Run(steps));
    EXPECT_EQ(0, beep_count);
}

TEST_F(PanningDialogTest, StepLimitHoldsAtTwentyOne)
{
    static const DialogStep steps[] = {
        [](HWND d) {
            for (int i = 0; i < 25; ++i) {
                Press(d, left_arrow);
                ButtonUp(d);
            }
        },
        [](HWND d) {
            EXPECT_EQ(21, State()->offset_h);
            EXPECT_EQ(0x84 + 21, Crtc(0x04));
            PostMessageA(d, WM_COMMAND, IDCANCEL, 0);
        },
    };
    EXPECT_EQ(0, Run(steps));
    EXPECT_EQ(0x84, Crtc(0x04));
}

}  // namespace
