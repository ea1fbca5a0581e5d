#include "adjust/panning_dialog.h"

#include "adjust/adjust_resources.h"
#include "base/adapters.h"
#include "base/runtime.h"
#include "base/state.h"
#include "base/texts.h"
#include "hardware/driver_key.h"
#include "modes/position.h"

static const char panning_template[] = "MOVESCREEN";
static const COLORREF frame_fill = RGB(0, 128, 128);

enum { MODE_TEXT_SIZE = 64, BUTTON_TEXT_SIZE = 120 };

// The pad's bands, in its own pixels; tools/make_adjust_bitmaps.py draws
// the pictures to the same lines.
static const int pad_top_band_end = 47;
static const int pad_bottom_band_start = 116;
static const int pad_left_band_end = 50;
static const int pad_right_band_start = 125;

enum PadPicture { PICTURE_NORMAL, PICTURE_AUTO, PICTURE_UP, PICTURE_DOWN, PICTURE_LEFT, PICTURE_RIGHT, PICTURE_COUNT };
static const int picture_ids[PICTURE_COUNT] = {IDB_PAD_NORMAL, IDB_PAD_AUTO, IDB_PAD_UP,
                                               IDB_PAD_DOWN,   IDB_PAD_LEFT, IDB_PAD_RIGHT};

static PanningState state;
static PadPicture shown;
static HBITMAP pictures[PICTURE_COUNT];
static RECT frame_area;  // frame 1012's client area, in the dialog's client coordinates
static RECT pad_area;

PadElement PadHit(int x, int y)
{
    bool middle_column = x >= pad_left_band_end && x < pad_right_band_start;
    if (y < pad_top_band_end) return middle_column ? PAD_UP : PAD_NOTHING;
    if (y >= pad_bottom_band_start) return middle_column ? PAD_DOWN : PAD_NOTHING;
    if (x < pad_left_band_end) return PAD_LEFT;
    return middle_column ? PAD_AUTO : PAD_RIGHT;
}

int PadOrigin(int frame_start, int frame_size, int pad_size)
{
    if (frame_size < pad_size) return frame_start;
    return frame_start + (frame_size - pad_size) / 2;
}

const PanningState* PanningDialogState() { return &state; }

static PadPicture PressedPicture(StepDirection direction)
{
    switch (direction) {
    case STEP_UP: return PICTURE_UP;
    case STEP_DOWN: return PICTURE_DOWN;
    case STEP_LEFT: return PICTURE_LEFT;
    case STEP_RIGHT: return PICTURE_RIGHT;
    }
    return PICTURE_NORMAL;
}

static WPARAM ArrowKey(PadElement element)
{
    switch (element) {
    case PAD_UP: return VK_UP;
    case PAD_DOWN: return VK_DOWN;
    case PAD_LEFT: return VK_LEFT;
    case PAD_RIGHT: return VK_RIGHT;
    default: return 0;
    }
}

static void ShowPicture(HWND dialog, PadPicture picture)
{
    if (picture == PICTURE_NORMAL && state.auto_latched) picture = PICTURE_AUTO;
    shown = picture;
    state.picture = picture_ids[picture];
    InvalidateRect(dialog, &pad_area, FALSE);
}

static void LoadPictures()
{
    for (int i = 0; i < PICTURE_COUNT; ++i) pictures[i] = LoadBitmapA(instance, MAKEINTRESOURCEA(picture_ids[i]));
}

static void FreePictures()
{
    for (HBITMAP& picture : pictures) {
        if (picture) DeleteObject(picture);
        picture = NULL;
    }
}

static void ShowModeText(HWND dialog)
{
    HDC screen = GetDC(NULL);
    int width = GetDeviceCaps(screen, HORZRES);
    int height = GetDeviceCaps(screen, VERTRES);
    int bits = TrueBitsPerPixel(GetDeviceCaps(screen, BITSPIXEL));
    ReleaseDC(NULL, screen);
    char text[MODE_TEXT_SIZE];
    FormatText(text, sizeof text, "%dx%d--%d bits, %d Hz", width, height, bits, CurrentAdapter()->refresh_hz);
    SetDlgItemTextA(dialog, IDC_PANNING_MODE, text);
}

static void ShowButtonTexts(HWND dialog)
{
    char text[BUTTON_TEXT_SIZE];
    LoadText("Cancel", "Cancel", text, sizeof text);
    SetDlgItemTextA(dialog, IDCANCEL, text);
    LoadText("Save", "Save", text, sizeof text);
    SetDlgItemTextA(dialog, IDC_PANNING_SAVE, text);
}

static void CentreOnScreen(HWND dialog)
{
    RECT r;
    GetWindowRect(dialog, &r);
    int width = r.right - r.left, height = r.bottom - r.top;
    SetWindowPos(dialog, NULL, (GetSystemMetrics(SM_CXSCREEN) - width) / 2,
                 (GetSystemMetrics(SM_CYSCREEN) - height) / 2, 0, 0, SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
}

static void PlacePad(HWND dialog)
{
    HWND frame = GetDlgItem(dialog, IDC_PANNING_FRAME);
    GetClientRect(frame, &frame_area);
    MapWindowPoints(frame, dialog, (POINT*)&frame_area, 2);
    pad_area.left = PadOrigin(frame_area.left, frame_area.right - frame_area.left, PAD_SIZE);
    pad_area.top = PadOrigin(frame_area.top, frame_area.bottom - frame_area.top, PAD_SIZE);
    pad_area.right = pad_area.left + PAD_SIZE;
    pad_area.bottom = pad_area.top + PAD_SIZE;
}

static BOOL OnInitDialog(HWND dialog, const char* title)
{
    SetWindowTextA(dialog, title ? title : "");
    ShowModeText(dialog);
    ShowButtonTexts(dialog);
    CentreOnScreen(dialog);
    state = PanningState();
    LoadPictures();
    PlacePad(dialog);
    ShowPicture(dialog, PICTURE_NORMAL);
    return TRUE;
}

static void OnPaint(HWND dialog)
{
    PAINTSTRUCT ps;
    HDC dc = BeginPaint(dialog, &ps);
    HBRUSH teal = CreateSolidBrush(frame_fill);
    FillRect(dc, &frame_area, teal);
    DeleteObject(teal);
    HBITMAP picture = pictures[shown];
    if (picture) {
        HDC source = CreateCompatibleDC(dc);
        HGDIOBJ old = SelectObject(source, picture);
        BitBlt(dc, pad_area.left, pad_area.top, PAD_SIZE, PAD_SIZE, source, 0, 0, SRCCOPY);
        SelectObject(source, old);
        DeleteDC(source);
    }
    EndPaint(dialog, &ps);
}

static void OnAuto(HWND dialog)
{
    if (state.auto_latched) {
        state.auto_latched = false;
        ShowPicture(dialog, PICTURE_NORMAL);
        return;
    }
    UndoOffsets(state.offset_h, state.offset_v);
    state.offset_h = 0;
    state.offset_v = 0;
    state.auto_latched = true;
    ShowPicture(dialog, PICTURE_AUTO);
}

static BOOL OnButtonDown(HWND dialog, LPARAM lparam)
{
    SetFocus(GetDlgItem(dialog, IDCANCEL));
    if (state.arrow_shown) {
        state.arrow_shown = false;
        ShowPicture(dialog, PICTURE_NORMAL);
    }
    POINT at = {(short)LOWORD(lparam), (short)HIWORD(lparam)};
    if (!PtInRect(&pad_area, at)) return FALSE;
    PadElement element = PadHit(at.x - pad_area.left, at.y - pad_area.top);
    if (element == PAD_AUTO) OnAuto(dialog);
    else if (element != PAD_NOTHING) PostMessageA(dialog, MSG_PAN_ARROW, ArrowKey(element), 0);
    return TRUE;
}

static void OnArrow(HWND dialog, WPARAM key)
{
    StepDirection direction;
    if (!DirectionOfKey((unsigned)key, &direction)) return;
    if (StepWithinLimit(direction, &state.offset_h, &state.offset_v) == STEP_TAKEN)
        ShowPicture(dialog, PressedPicture(direction));
    state.arrow_shown = true;
    state.auto_latched = false;
}

static void Close(HWND dialog, int result)
{
    if (result) SavePosition(state.offset_h, state.offset_v);
    else UndoOffsets(state.offset_h, state.offset_v);
    state.offset_h = 0;
    state.offset_v = 0;
    FreePictures();
    EndDialog(dialog, result);
}

static INT_PTR CALLBACK PanningDialogProc(HWND dialog, UINT message, WPARAM wparam, LPARAM lparam)
{
    switch (message) {
    case WM_INITDIALOG: return OnInitDialog(dialog, (const char*)lparam);
    case WM_PAINT: OnPaint(dialog); return TRUE;
    case WM_LBUTTONDOWN: return OnButtonDown(dialog, lparam);
    case WM_LBUTTONUP:
        if (!state.auto_latched) PostMessageA(dialog, MSG_PAN_RELEASE, 0, 0);
        return TRUE;
    case MSG_PAN_ARROW: OnArrow(dialog, wparam); return TRUE;
    case MSG_PAN_RELEASE:
        state.arrow_shown = false;
        ShowPicture(dialog, PICTURE_NORMAL);
        return TRUE;
    case WM_COMMAND:
        if (LOWORD(wparam) == IDCANCEL) Close(dialog, 0);
        else if (LOWORD(wparam) == IDC_PANNING_SAVE) Close(dialog, 1);
        else return FALSE;
        return TRUE;
    case WM_DESTROY:
        FreePictures();
        // The corner picture's control loaded its bitmap from the template
        // but does not delete it when it goes.
        if (HGDIOBJ corner = (HGDIOBJ)SendDlgItemMessageA(dialog, IDB_PANNING_CORNER, STM_SETIMAGE, IMAGE_BITMAP, 0))
            DeleteObject(corner);
        return FALSE;
    }
    return FALSE;
}

int OpenPanningDialog(HWND owner, const char* title)
{
    INT_PTR result = DialogBoxParamA(instance, panning_template, owner, PanningDialogProc, (LPARAM)title);
    return result == 1 ? 1 : 0;
}
