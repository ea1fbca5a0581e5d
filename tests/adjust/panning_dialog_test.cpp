// The panning dialog under Wine, driven by posted mouse messages against the
// simulated card, and its pad's hit regions.
#include "adjust/adjust_resources.h"
#include "adjust/adjust_test.h"
#include "adjust/panning_dialog.h"
#include "support/gui_handles.h"

namespace {

TEST(PanningPad, HitRegionsAndPlace)
{
    static const struct { int x, y; PadElement element; } cases[] = {
        {60, 50, PAD_AUTO},   {60, 46, PAD_UP},       {30, 20, PAD_NOTHING}, {130, 120, PAD_NOTHING},
        {124, 46, PAD_UP},    {125, 46, PAD_NOTHING}, {49, 115, PAD_LEFT},   {124, 115, PAD_AUTO},
        {125, 47, PAD_RIGHT}, {50, 116, PAD_DOWN},    {49, 167, PAD_NOTHING},
    };
    for (const auto& c : cases) EXPECT_EQ(c.element, PadHit(c.x, c.y)) << c.x << "," << c.y;
    EXPECT_EQ(10 + 16, PadOrigin(10, 200, 168)) << "centred in the frame";
    EXPECT_EQ(10, PadOrigin(10, 100, 168)) << "or at its start";
}

// A point of the pad in the dialog: the pad is centred in the frame.
POINT OnPad(HWND dialog, POINT at)
{
    HWND frame = GetDlgItem(dialog, IDC_PANNING_FRAME);
    RECT r;
    GetClientRect(frame, &r);
    MapWindowPoints(frame, dialog, (POINT*)&r, 2);
    return {PadOrigin(r.left, r.right - r.left, PAD_SIZE) + at.x, PadOrigin(r.top, r.bottom - r.top, PAD_SIZE) + at.y};
}

// A step of a script: the picture the dialog shows and the retrace starts
// once it has handled all it was sent and posted itself; then what the hand
// does: press at a pad point (none: x < 0) and release, or a command.
struct Step { int picture; uint8_t cr04; unsigned vretrace; POINT press; bool release; int command; };
const POINT none = {-1, -1}, up_arrow = {87, 20}, down_arrow = {87, 140}, left_arrow = {20, 81},
            right_arrow = {150, 81}, auto_button = {87, 81};
const Step* script;
size_t script_length, step;

// The frame is teal around the pad, and the pad shows the picture.
void ExpectPainted(HWND dialog, int id)
{
    UpdateWindow(dialog);
    HDC dc = GetDC(dialog), picture = CreateCompatibleDC(dc);
    HGDIOBJ old = SelectObject(picture, LoadBitmapA(GetModuleHandleA(NULL), MAKEINTRESOURCEA(id)));
    POINT corner = OnPad(dialog, POINT{-3, -3});
    EXPECT_EQ(RGB(0, 128, 128), GetPixel(dc, corner.x, corner.y)) << step;
    for (POINT p : {up_arrow, down_arrow, left_arrow, right_arrow, auto_button})
        EXPECT_EQ(GetPixel(picture, p.x, p.y), GetPixel(dc, OnPad(dialog, p).x, OnPad(dialog, p).y)) << step;
    DeleteObject(SelectObject(picture, old));
    DeleteDC(picture);
    ReleaseDC(dialog, dc);
}

// The dialog tells its owner each time it has nothing left to do.
LRESULT CALLBACK OwnerProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    if (message != WM_ENTERIDLE || step == script_length) return DefWindowProcA(window, message, wparam, lparam);
    HWND d = (HWND)lparam;
    const Step& s = script[step];
    EXPECT_EQ(s.picture, PanningDialogState()->picture) << step;
    EXPECT_TRUE(Crtc(0x04) == s.cr04 && VerticalRetrace() == s.vretrace) << step;
    ExpectPainted(d, s.picture);
    // A press takes the focus to Cancel, here from Save, so that Enter cannot save by accident.
    if (step > 0 && script[step - 1].press.x >= 0) EXPECT_EQ(GetDlgItem(d, IDCANCEL), GetFocus()) << step;
    SetFocus(GetDlgItem(d, IDC_PANNING_SAVE));
    ++step;
    POINT at = OnPad(d, s.press);
    if (s.press.x >= 0) PostMessageA(d, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(at.x, at.y));
    if (s.release) PostMessageA(d, WM_LBUTTONUP, 0, 0);
    if (s.command) PostMessageA(d, WM_COMMAND, s.command, 0);
    return 0;
}

int RunScript(const Step* steps, size_t length)
{
    HWND owner = CreateWindowA("STATIC", "", WS_POPUP, 0, 0, 0, 0, NULL, NULL, NULL, NULL);
    SetWindowLongPtrA(owner, GWLP_WNDPROC, (LONG_PTR)OwnerProc);
    script = steps;
    script_length = length;
    step = 0;
    int result = OpenPanningDialog(owner, "Panning under test");
    DestroyWindow(owner);
    EXPECT_EQ(length, step) << "every step ran";
    return result;
}

typedef AdjustTest PanningDialogTest;

TEST_F(PanningDialogTest, ArrowsStepAutoGoesBackSaveStoresAndCancelUndoes)
{
    SetCrtc(0x04, 0x80);  // at the blank start: Right is refused
    enum { NORMAL = IDB_PAD_NORMAL, AUTO = IDB_PAD_AUTO, LEFT = IDB_PAD_LEFT };
    static const Step steps[] = {
        {NORMAL, 0x80, 771, auto_button, true, 0},  {AUTO, 0x80, 771, right_arrow, false, 0},
        {AUTO, 0x80, 771, none, true, 0},  // refused: no new picture, but AUTO is let go
        {NORMAL, 0x80, 771, left_arrow, false, 0},  {LEFT, 0x81, 771, none, true, 0},
        {NORMAL, 0x81, 771, down_arrow, true, 0},   {NORMAL, 0x81, 770, auto_button, true, 0},
        {AUTO, 0x80, 771, auto_button, true, 0},  // AUTO went back and stays up; the second lets go
        {NORMAL, 0x80, 771, up_arrow, true, 0},     {NORMAL, 0x80, 772, none, false, IDC_PANNING_SAVE},
    };
    EXPECT_EQ(1, RunScript(steps, std::size(steps)));
    int value = 0;
    EXPECT_TRUE(!StoredValue("1024x768x16x75H", &value) && beep_count == 0);
    ASSERT_TRUE(StoredValue("1024x768x16x75V", &value));
    EXPECT_TRUE(value == Crtc(0x10) + 256 * Crtc(0x07) && VerticalRetrace() == 772);
    static const Step cancelled[] = {{NORMAL, 0x80, 772, left_arrow, true, 0},
                                     {NORMAL, 0x81, 772, none, false, IDCANCEL}};
    EXPECT_EQ(0, RunScript(cancelled, 2));
    EXPECT_TRUE(Crtc(0x04) == 0x80 && !StoredValue("1024x768x16x75H", &value)) << "undone";
}

// 200 dialogs, each painted, stepped and cancelled, leave the handles as they were.
TEST_F(PanningDialogTest, DialogsKeepNoHandle)
{
    static const Step steps[] = {{IDB_PAD_NORMAL, 0x84, 771, left_arrow, true, 0},
                                 {IDB_PAD_NORMAL, 0x85, 771, none, false, IDCANCEL}};
    std::string before;
    for (int i = -2; i < 200; ++i) {
        if (i == 0) before = GuiHandles();  // the first load what stays
        ASSERT_EQ(0, RunScript(steps, 2));
    }
    EXPECT_EQ(before, GuiHandles());
}

}  // namespace
