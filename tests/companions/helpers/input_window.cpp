// A window of another process that takes the keyboard, so that a test can
// show the hook library hears input that never reaches its own process.
// Argument: the name of an event to set once the window has the focus.
#include <windows.h>

static LRESULT CALLBACK InputWindowProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    if (message == WM_DESTROY) PostQuitMessage(0);
    return DefWindowProcA(window, message, wparam, lparam);
}

int WINAPI WinMain(HINSTANCE inst, HINSTANCE previous, LPSTR arguments, int show)
{
    WNDCLASSA type = {};
    type.lpfnWndProc = InputWindowProc;
    type.hInstance = inst;
    type.lpszClassName = "CompanionsInputWindow";
    RegisterClassA(&type);
    HWND window = CreateWindowExA(0, type.lpszClassName, "input", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 200, 200, 300,
                                  200, NULL, NULL, inst, NULL);
    if (!window) return 1;
    SetForegroundWindow(window);
    SetFocus(window);
    HANDLE ready = OpenEventA(EVENT_MODIFY_STATE, FALSE, arguments);
    if (ready) {
        SetEvent(ready);
        CloseHandle(ready);
    }
    MSG message;
    while (GetMessageA(&message, NULL, 0, 0) > 0) DispatchMessageA(&message);
    return 0;
}
