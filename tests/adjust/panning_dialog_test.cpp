// The panning dialog: hit regions and pictures, and the dialog under Wine
// driven by posted mouse messages against the simulated card.
#include <stdio.h>
#include <string.h>

#include <vector>

#include "adjust/adjust_resources.h"
#include "adjust/adjust_test.h"
#include "adjust/panning_dialog.h"
#include "hardware/driver_key.h"
#include "modes/mode_keys.h"
#include "modes/mode_list.h"
#include "modes/rate_list.h"

namespace {

TEST(PadHit, Regions)
{
    static const struct {
        int x, y;
        PadElement element;
    } cases[] = {
        {60, 50, PAD_AUTO},    {60, 46, PAD_UP},      {30, 20, PAD_NOTHING},  {130, 120, PAD_NOTHING},
        {124, 46, PAD_UP},     {125, 46, PAD_NOTHING}, {49, 115, PAD_LEFT},   {124, 115, PAD_AUTO},
        {125, 47, PAD_RIGHT},  {50, 116, PAD_DOWN},   {49, 167, PAD_NOTHING},
    };
    for (const auto& c : cases) EXPECT_EQ(c.element, PadHit(c.x, c.y)) << c.x << "," << c.y;
}

// A picture of the test program's resources as pixels, top row first.
std::vector<COLORREF> Pixels(int id)
{
    std::vector<COLORREF> pixels(PAD_SIZE * PAD_SIZE);
    HBITMAP picture = LoadBitmapA(GetModuleHandleA(NULL), MAKEINTRESOURCEA(id));
    BITMAPINFO bi = {};
    bi.bmiHeader = {sizeof bi.bmiHeader, PAD_SIZE, -PAD_SIZE, 1, 32};
    HDC dc = GetDC(NULL);
    int rows = picture ? GetDIBits(dc, picture, 0, PAD_SIZE, pixels.data(), &bi, DIB_RGB_COLORS) : 0;
    ReleaseDC(NULL, dc);
    DeleteObject(picture);
    if (rows != PAD_SIZE) pixels.clear();
    for (COLORREF& p : pixels) p = RGB(GetBValue(p), GetGValue(p), GetRValue(p));
    return pixels;
}

// Each pressed picture differs from the released one only inside the
// element the hit regions give for it: a click lands on what it shows.
TEST(PadPictures, PressedElementsMatchTheHitRegions)
{
    static const struct {
        int id;
        PadElement element;
    } pressed[] = {{IDB_PAD_UP, PAD_UP}, {IDB_PAD_DOWN, PAD_DOWN}, {IDB_PAD_LEFT, PAD_LEFT},
                   {IDB_PAD_RIGHT, PAD_RIGHT}, {IDB_PAD_AUTO, PAD_AUTO}};
    std::vector<COLORREF> normal = Pixels(IDB_PAD_NORMAL);
    ASSERT_FALSE(normal.empty());
    for (const auto& p : pressed) {
        std::vector<COLORREF> picture = Pixels(p.id);
        ASSERT_EQ(normal.size(), picture.size()) << p.id;
        int changed = 0, stray = 0;
        for (int i = 0; i < PAD_SIZE * PAD_SIZE; ++i)
            if (picture[i] != normal[i]) ++changed, stray += PadHit(i % PAD_SIZE, i / PAD_SIZE) != p.element;
        EXPECT_GT(changed, 300) << "picture " << p.id << " marks its element";
        EXPECT_EQ(0, stray) << "picture " << p.id << " changes pixels outside its element";
    }
    HRSRC found = FindResourceA(GetModuleHandleA(NULL), MAKEINTRESOURCEA(IDB_PAD_NORMAL), (LPCSTR)RT_BITMAP);
    ASSERT_TRUE(found != NULL);
    EXPECT_EQ(4, ((const BITMAPINFOHEADER*)LoadResource(GetModuleHandleA(NULL), found))->biBitCount) << "16 colours";
}

// Runs a script inside the modal dialog's own loop: each step once every
// message the dialog posted itself has been handled.
typedef void (*Step)(HWND dialog);
const Step* script;
int script_length, script_next, settle_rounds;
HWND driver;
HHOOK start_hook;
const char title[] = "Panning under test";
const UINT MSG_NEXT_STEP = WM_APP + 7;

LRESULT CALLBACK DriverProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    if (message != MSG_NEXT_STEP) return DefWindowProcA(window, message, wparam, lparam);
    if ((HIWORD(GetQueueStatus(QS_POSTMESSAGE)) & QS_POSTMESSAGE) && ++settle_rounds < 1000) {
        PostMessageA(window, MSG_NEXT_STEP, 0, 0);
        return 0;
    }
    settle_rounds = 0;
    HWND dialog = FindWindowA(MAKEINTATOM(32770), title);
    if (dialog && script_next < script_length) script[script_next++](dialog);
    if (script_next < script_length) PostMessageA(window, MSG_NEXT_STEP, 0, 0);
    return 0;
}

// The dialog shows itself only when its queue is empty; start then.
LRESULT CALLBACK StartWhenShown(int code, WPARAM wparam, LPARAM lparam)
{
    const CWPRETSTRUCT* call = (const CWPRETSTRUCT*)lparam;
    char text[64] = "";
    if (code == HC_ACTION && call->message == WM_SHOWWINDOW && call->wParam)
        GetWindowTextA(call->hwnd, text, sizeof text);
    if (strcmp(text, title) == 0 && script_next == 0) PostMessageA(driver, MSG_NEXT_STEP, 0, 0);
    return CallNextHookEx(start_hook, code, wparam, lparam);
}

class PanningDialogTest : public AdjustTest {
protected:
    template <size_t N>
    int Run(const Step (&steps)[N])
    {
        WNDCLASSA wc = {};
        wc.lpfnWndProc = DriverProc;
        wc.hInstance = GetModuleHandleA(NULL);
        wc.lpszClassName = "PanningTestDriver";
        RegisterClassA(&wc);
        driver = CreateWindowA(wc.lpszClassName, "", 0, 0, 0, 0, 0, HWND_MESSAGE, NULL, wc.hInstance, NULL);
        script = steps;
        script_length = (int)N;
        script_next = settle_rounds = 0;
        start_hook = SetWindowsHookExA(WH_CALLWNDPROCRET, StartWhenShown, NULL, GetCurrentThreadId());
        int result = OpenPanningDialog(NULL, title);
        UnhookWindowsHookEx(start_hook);
        DestroyWindow(driver);
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
    int left = PadOrigin(r.left, r.right - r.left, PAD_SIZE), top = PadOrigin(r.top, r.bottom - r.top, PAD_SIZE);
    return RECT{left, top, left + PAD_SIZE, top + PAD_SIZE};
}

const POINT up_arrow = {87, 20}, down_arrow = {87, 140}, left_arrow = {20, 81}, right_arrow = {150, 81},
            auto_button = {87, 81};

void Down(HWND dialog, POINT at)
{
    RECT pad = PadOn(dialog);
    PostMessageA(dialog, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(pad.left + at.x, pad.top + at.y));
}
void Up(HWND dialog) { PostMessageA(dialog, WM_LBUTTONUP, 0, 0); }
int Shown() { return PanningDialogState()->picture; }

// The frame is teal around the pad, and the pad shows the picture.
void ExpectPainted(HWND dialog, int picture)
{
    UpdateWindow(dialog);
    RECT pad = PadOn(dialog);
    std::vector<COLORREF> pixels = Pixels(picture);
    HDC dc = GetDC(dialog);
    EXPECT_EQ(RGB(0, 128, 128), GetPixel(dc, pad.left - 3, pad.top - 3));
    for (POINT p : {up_arrow, down_arrow, left_arrow, right_arrow, auto_button})
        EXPECT_EQ(pixels[p.y * PAD_SIZE + p.x], GetPixel(dc, pad.left + p.x, pad.top + p.y)) << picture;
    ReleaseDC(dialog, dc);
}

TEST_F(PanningDialogTest, ArrowsAutoTwiceAndSave)
{
    static const Step steps[] = {
        [](HWND d) {
            char text[64], want[64];
            HDC screen = GetDC(NULL);
            snprintf(want, sizeof want, "%dx%d--%d bits, 75 Hz", GetDeviceCaps(screen, HORZRES),
                     GetDeviceCaps(screen, VERTRES), TrueBitsPerPixel(GetDeviceCaps(screen, BITSPIXEL)));
            ReleaseDC(NULL, screen);
            GetDlgItemTextA(d, IDC_PANNING_MODE, text, sizeof text);
            EXPECT_STREQ(want, text);
            GetDlgItemTextA(d, IDC_PANNING_SAVE, text, sizeof text);
            EXPECT_STREQ("Save", text);
            ExpectPainted(d, IDB_PAD_NORMAL);
            Down(d, left_arrow);
        },
        [](HWND d) {
            EXPECT_EQ(0x85, Crtc(0x04));
            EXPECT_EQ(IDB_PAD_LEFT, Shown());
            ExpectPainted(d, IDB_PAD_LEFT);
            Up(d);
        },
        [](HWND d) {
            EXPECT_EQ(IDB_PAD_NORMAL, Shown());
            Down(d, down_arrow);
            Up(d);
        },
        [](HWND d) {
            EXPECT_EQ(770u, VerticalRetrace());
            Down(d, auto_button);
            Up(d);
        },
        [](HWND d) {
            EXPECT_EQ(0x84, Crtc(0x04)) << "AUTO goes back to the start";
            EXPECT_EQ(771u, VerticalRetrace());
            EXPECT_EQ(IDB_PAD_AUTO, Shown()) << "and stays up after the release";
            Down(d, auto_button);
            Up(d);
        },
        [](HWND d) {
            EXPECT_EQ(IDB_PAD_NORMAL, Shown()) << "the second AUTO only lets go";
            EXPECT_EQ(0x84, Crtc(0x04));
            Down(d, up_arrow);
            Up(d);
        },
        [](HWND d) { PostMessageA(d, WM_COMMAND, IDC_PANNING_SAVE, 0); },
    };
    EXPECT_EQ(1, Run(steps));
    int value = 0;
    ASSERT_TRUE(StoredValue("1024x768x16x75V", &value));
    EXPECT_EQ(Crtc(0x10) + 256 * Crtc(0x07), value);
    EXPECT_EQ(772u, VerticalRetrace());
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value));
}

TEST_F(PanningDialogTest, CloseBoxUndoesAndMissesDoNothing)
{
    static const Step steps[] = {
        [](HWND d) {
            for (int i = 0; i < 2; ++i) Down(d, right_arrow), Up(d);
            Down(d, POINT{30, 20});
            PostMessageA(d, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(1, 1));  // off the pad
        },
        [](HWND d) {
            EXPECT_EQ(0x82, Crtc(0x04));
            EXPECT_EQ(771u, VerticalRetrace());
            PostMessageA(d, WM_SYSCOMMAND, SC_CLOSE, 0);
        },
    };
    EXPECT_EQ(0, Run(steps));
    EXPECT_EQ(0x84, Crtc(0x04));
    int value;
    EXPECT_FALSE(StoredValue("1024x768x16x75H", &value));
}

TEST_F(PanningDialogTest, RefusedArrowIsSilentAndReleasesAuto)
{
    SetCrtc(0x04, 0x80);  // at the blank start: Right is refused
    static const Step steps[] = {
        [](HWND d) {
            Down(d, auto_button);
            Up(d);
        },
        [](HWND d) { Down(d, right_arrow); },
        [](HWND d) {
            EXPECT_EQ(0x80, Crtc(0x04));
            EXPECT_FALSE(PanningDialogState()->auto_latched);
            EXPECT_EQ(IDB_PAD_AUTO, Shown()) << "no step, no new picture";
            Up(d);
        },
        [](HWND d) {
            EXPECT_EQ(IDB_PAD_NORMAL, Shown());
            PostMessageA(d, WM_COMMAND, IDCANCEL, 0);
        },
    };
    EXPECT_EQ(0, Run(steps));
    EXPECT_EQ(0, beep_count);
}

}  // namespace
