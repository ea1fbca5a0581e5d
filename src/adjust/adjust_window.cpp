// The adjustment window moves the picture with the arrow keys while a test
// pattern shows where its edges are; Enter keeps the place, Esc goes back.
#include "adjust/adjust_window.h"

#include "adjust/adjust_pattern.h"
#include "base/module_reset.h"
#include "base/protocol.h"
#include "base/state.h"
#include "base/texts.h"
#include "hardware/multimon.h"
#include "modes/position.h"

BOOL(WINAPI* adjust_beep)(UINT type) = MessageBeep;

enum { QUESTION_TEXT_SIZE = 50 };
static const UINT default_beep = 0xFFFFFFFF;

// The save question runs a message loop of its own; a key that reaches
// the window meanwhile must not ask again or step the picture.
static bool question_open;

static void ResetAdjustWindow()
{
    adjust_beep = MessageBeep;
    question_open = false;
}
VISTREL_MODULE_RESET(ResetAdjustWindow);

void ResetAdjustOffsets()
{
    adjust_offset_h = 0;
    adjust_offset_v = 0;
}

int OpenAdjustWindow(HWND owner)
{
    RECT monitor;
    GetAdapterMonitorRect(&monitor);
    HWND window = CreateWindowExA(0, adjust_window_class, "", WS_POPUP, monitor.left, monitor.top,
                                  monitor.right - monitor.left, monitor.bottom - monitor.top, owner, NULL, instance,
                                  NULL);
    if (!window) return 0;
    ShowWindow(window, SW_SHOW);
    UpdateWindow(window);
    return 1;
}

static void OnPaint(HWND window)
{
    // The nested rectangles are found by reading back the diagonals, which
    // only works where they have just been drawn: paint the whole window.
    InvalidateRect(window, NULL, TRUE);
    PAINTSTRUCT ps;
    HDC dc = BeginPaint(window, &ps);
    RECT client;
    GetClientRect(window, &client);
    DrawTestPattern(dc, &client);
    LegendTexts texts;
    LoadLegendTexts(&texts);
    DrawKeyLegend(dc, &client, &texts);
    EndPaint(window, &ps);
}

static void OnArrow(StepDirection direction)
{
    if (StepWithinLimit(direction, &adjust_offset_h, &adjust_offset_v) == STEP_REFUSED) adjust_beep(default_beep);
}

static void OnEnter(HWND window)
{
    if (adjust_offset_h != 0 || adjust_offset_v != 0) {
        char text[QUESTION_TEXT_SIZE], caption[QUESTION_TEXT_SIZE];
        // The legend's label shares this key; only the built-in texts differ.
        LoadText("ScreenSave", "Do you want to save this setting ?", text, sizeof text);
        LoadText("AdjustGrp", "Screen Adjustment", caption, sizeof caption);
        question_open = true;
        int answer = MessageBoxA(window, text, caption, MB_YESNO | MB_ICONQUESTION | MB_DEFBUTTON2);
        question_open = false;
        if (answer == IDYES) SavePosition(adjust_offset_h, adjust_offset_v);
    }
    DestroyWindow(window);
}

static void OnKeyDown(HWND window, WPARAM key)
{
    if (question_open) return;
    StepDirection direction;
    if (DirectionOfKey((unsigned)key, &direction)) {
        OnArrow(direction);
    } else if (key == VK_ESCAPE) {
        UndoOffsets(adjust_offset_h, adjust_offset_v);
        ResetAdjustOffsets();
        DestroyWindow(window);
    } else if (key == VK_RETURN) {
        OnEnter(window);
    }
}

LRESULT CALLBACK AdjustWindowProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    switch (message) {
    case WM_PAINT: OnPaint(window); return 0;
    case WM_KEYDOWN: OnKeyDown(window, wparam); return 0;
    }
    return DefWindowProcA(window, message, wparam, lparam);
}
