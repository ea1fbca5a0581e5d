// loupe.exe: the zoom tool the panel's menu starts. A window that shows the
// screen around the mouse pointer two, three or four times enlarged and
// follows the pointer.
//   loupe.exe "<window title>" <text file>[ 2]
// The text file (the panel's ZNTR2.INI) holds the tool's own texts in
// section LOUPE; " 2" says a second monitor is present, and the tool then
// follows the pointer over the whole virtual screen.
// Keys 2, 3, 4 or the context menu choose the zoom; Esc closes.
#include "loupe.h"

#include "base/runtime.h"

namespace {

enum {
    FOLLOW_TIMER = 1,
    FOLLOW_MS = 50,
    CMD_ZOOM = 100,    // + the zoom factor
    CMD_CLOSE = 110,
    TEXT_SIZE = 40,
    START_WIDTH = 256,
    START_HEIGHT = 192,
};

const char LOUPE_CLASS[] = "VistrelLoupe";

// Every text of the tool: key of section LOUPE, built-in English text.
struct LoupeText {
    const char* key;
    const char* english;
};
const LoupeText title_text = {"Title", "Zoom In"};
const LoupeText zoom_texts[LOUPE_MAX_ZOOM - LOUPE_MIN_ZOOM + 1] = {
    {"Zoom2", "Zoom &2x"}, {"Zoom3", "Zoom &3x"}, {"Zoom4", "Zoom &4x"},
};
const LoupeText close_text = {"Close", "&Close"};

LoupeCommand command;
int zoom;
RECT screen;
HMENU menu;

void LoadLoupeText(const LoupeText& text, char* out, int size)
{
    if (command.text_path[0])
        GetPrivateProfileStringA("LOUPE", text.key, text.english, out, size, command.text_path);
    else
        CopyText(out, size, text.english);
}

RECT ScreenArea()
{
    RECT area = {0, 0, GetSystemMetrics(SM_CXSCREEN), GetSystemMetrics(SM_CYSCREEN)};
    if (command.two_monitors) {
        // Windows 95 and NT 4.0 know no virtual screen and answer 0.
        int width = GetSystemMetrics(SM_CXVIRTUALSCREEN);
        int height = GetSystemMetrics(SM_CYVIRTUALSCREEN);
        if (width > 0 && height > 0) {
            area.left = GetSystemMetrics(SM_XVIRTUALSCREEN);
            area.top = GetSystemMetrics(SM_YVIRTUALSCREEN);
            area.right = area.left + width;
            area.bottom = area.top + height;
        }
    }
    return area;
}

HMENU BuildMenu()
{
    HMENU popup = CreatePopupMenu();
    char text[TEXT_SIZE];
    for (int z = LOUPE_MIN_ZOOM; z <= LOUPE_MAX_ZOOM; ++z) {
        LoadLoupeText(zoom_texts[z - LOUPE_MIN_ZOOM], text, sizeof text);
        AppendMenuA(popup, MF_STRING, CMD_ZOOM + z, text);
    }
    AppendMenuA(popup, MF_SEPARATOR, 0, NULL);
    LoadLoupeText(close_text, text, sizeof text);
    AppendMenuA(popup, MF_STRING, CMD_CLOSE, text);
    return popup;
}

void SetZoom(HWND window, int z)
{
    zoom = z;
    for (int i = LOUPE_MIN_ZOOM; i <= LOUPE_MAX_ZOOM; ++i)
        CheckMenuItem(menu, CMD_ZOOM + i, MF_BYCOMMAND | (i == z ? MF_CHECKED : MF_UNCHECKED));
    InvalidateRect(window, NULL, FALSE);
}

// An inverted frame around the enlarged pixel under the pointer.
void MarkPointer(HDC dc, int x, int y)
{
    int size = zoom + 2;
    PatBlt(dc, x - 1, y - 1, size, 1, DSTINVERT);
    PatBlt(dc, x - 1, y + zoom, size, 1, DSTINVERT);
    PatBlt(dc, x - 1, y, 1, zoom, DSTINVERT);
    PatBlt(dc, x + zoom, y, 1, zoom, DSTINVERT);
}

void OnPaint(HWND window)
{
    PAINTSTRUCT paint;
    HDC dc = BeginPaint(window, &paint);
    RECT client;
    GetClientRect(window, &client);
    POINT pointer;
    GetCursorPos(&pointer);
    RECT source = LoupeSource(pointer, client.right, client.bottom, zoom, screen);
    int width = source.right - source.left;
    int height = source.bottom - source.top;
    HDC screen_dc = GetDC(NULL);
    SetStretchBltMode(dc, COLORONCOLOR);
    StretchBlt(dc, 0, 0, width * zoom, height * zoom, screen_dc, source.left, source.top, width, height, SRCCOPY);
    ReleaseDC(NULL, screen_dc);
    MarkPointer(dc, (pointer.x - source.left) * zoom, (pointer.y - source.top) * zoom);
    EndPaint(window, &paint);
}

void OnContextMenu(HWND window, LPARAM where)
{
    POINT at = {(short)LOWORD(where), (short)HIWORD(where)};
    if (where == (LPARAM)-1) {   // from the keyboard
        at.x = at.y = 0;
        ClientToScreen(window, &at);
    }
    TrackPopupMenu(menu, TPM_RIGHTBUTTON, at.x, at.y, 0, window, NULL);
}

void OnKey(HWND window, WPARAM key)
{
    if (key >= '2' && key <= '4') SetZoom(window, (int)(key - '0'));
    else if (key >= VK_NUMPAD2 && key <= VK_NUMPAD4) SetZoom(window, (int)(key - VK_NUMPAD0));
    else if (key == VK_ESCAPE) DestroyWindow(window);
}

LRESULT CALLBACK LoupeProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    switch (message) {
    case WM_CREATE:
        menu = BuildMenu();
        SetZoom(window, LOUPE_MIN_ZOOM);
        SetTimer(window, FOLLOW_TIMER, FOLLOW_MS, NULL);
        return 0;
    case WM_TIMER:
        // What lies under the pointer changes even when the pointer rests.
        InvalidateRect(window, NULL, FALSE);
        return 0;
    case WM_ERASEBKGND:
        return 1;   // the picture covers the whole client area
    case WM_PAINT:
        OnPaint(window);
        return 0;
    case WM_DISPLAYCHANGE:
        screen = ScreenArea();
        return 0;
    case WM_KEYDOWN:
        OnKey(window, wparam);
        return 0;
    case WM_CONTEXTMENU:
        OnContextMenu(window, lparam);
        return 0;
    case WM_COMMAND: {
        int id = LOWORD(wparam);
        if (id == CMD_CLOSE) DestroyWindow(window);
        else if (id - CMD_ZOOM >= LOUPE_MIN_ZOOM && id - CMD_ZOOM <= LOUPE_MAX_ZOOM) SetZoom(window, id - CMD_ZOOM);
        return 0;
    }
    case WM_DESTROY:
        KillTimer(window, FOLLOW_TIMER);
        DestroyMenu(menu);
        PostQuitMessage(0);
        return 0;
    }
    return DefWindowProcA(window, message, wparam, lparam);
}

}  // namespace

int WINAPI WinMain(HINSTANCE instance, HINSTANCE previous, LPSTR arguments, int show)
{
    ParseLoupeCommand(arguments, &command);
    // Chosen again from the menu: the open loupe comes forward.
    HWND running = FindWindowA(LOUPE_CLASS, NULL);
    if (running) {
        SetForegroundWindow(running);
        return 0;
    }
    if (!command.title[0]) LoadLoupeText(title_text, command.title, sizeof command.title);
    screen = ScreenArea();

    WNDCLASSA window_class;
    memset(&window_class, 0, sizeof window_class);
    window_class.lpfnWndProc = LoupeProc;
    window_class.hInstance = instance;
    window_class.hIcon = LoadIconA(instance, MAKEINTRESOURCEA(1));
    window_class.hCursor = LoadCursorA(NULL, (LPCSTR)IDC_ARROW);
    window_class.lpszClassName = LOUPE_CLASS;
    if (!RegisterClassA(&window_class)) return 1;

    RECT frame = {0, 0, START_WIDTH, START_HEIGHT};
    AdjustWindowRectEx(&frame, WS_OVERLAPPEDWINDOW, FALSE, WS_EX_TOPMOST);
    HWND window = CreateWindowExA(WS_EX_TOPMOST, LOUPE_CLASS, command.title, WS_OVERLAPPEDWINDOW,
                                  CW_USEDEFAULT, CW_USEDEFAULT, frame.right - frame.left, frame.bottom - frame.top,
                                  NULL, NULL, instance, NULL);
    if (!window) return 1;
    ShowWindow(window, show);
    MSG message;
    while (GetMessageA(&message, NULL, 0, 0) > 0) {
        TranslateMessage(&message);
        DispatchMessageA(&message);
    }
    return 0;
}
